#include "Report.h"

#include <algorithm>

#include "Output.h"
#include "Sample.h"
#include "Text.h"

namespace {

std::string levelName(LogLevel level) {
    unsigned long length = 0;
    return loglevel2str(&length, level);
}

void row(const std::string& label, const std::string& text, Ink ink = Ink::PLAIN) {
    write("  " + label + std::string(label.size() < 8 ? 8 - label.size() : 1, ' '), Ink::QUIET);
    write(text, ink);
    write("\n");
}

std::string placeOf(const LogAppender& appender) {
    return appender.writesToFile() ? visible(appender.fileName()) : "standard error";
}

std::string destinations(const Configuration& config, const LogChannel& channel, bool places) {
    std::vector<std::string> all;
    for (const LogAppender* const one : Configuration::destinations(channel)) {
        std::string name = visible(config.nameOf(one));
        if (places || one == config.rootAppender.made) name += " (" + placeOf(*one) + ")";
        all.push_back(name);
    }
    return listed(all);
}

void reportChannelState(const Configuration& config, const std::string& title,
                        const LogChannel& channel) {
    write(title, Ink::TITLE);
    write("\n");
    row("level", levelName(channel.level()) + (channel.level() < EMERG ? " and above" : ""));
    row("to", destinations(config, channel, false));
    write("\n");
}

std::string limitsOf(const LogAppender& appender) {
    if (!appender.writesToFile()) return "none";
    if (appender.maxFileSize() <= 0) return "none: the file is never rotated";
    const std::string beyond = "beyond " + std::to_string(appender.maxFileSize()) + " bytes ";
    const std::uint32_t backups = appender.maxBackupIndex();
    if (backups == 0) return beyond + "the file starts again empty; no backup is kept";
    const std::string leaf = printable(appender.fileName().toLeaf());
    if (backups == 1) return beyond + "the file is rotated; 1 backup is kept: " + leaf + ".1";
    const std::string count = std::to_string(backups);
    return beyond + "the file is rotated; " + count + " backups are kept: " + leaf +
           ".1 (newest) to " + leaf + "." + count;
}

void rowsOfSample(const Sample& sample) {
    if (!sample.failure.empty())
        return row("sample", "none: the layout " + printable(sample.failure), Ink::WARNING);
    std::string line = sample.line;
    if (!line.empty() && line.back() == '\n') line.pop_back();
    const char* label = "sample";
    for (std::size_t pos = 0; pos <= line.size(); label = "") {
        const std::size_t end = std::min(line.find('\n', pos), line.size());
        row(label, printable(line.substr(pos, end - pos)), Ink::GOOD);
        pos = end + 1;
    }
}

// The first category that writes there lends its name to the sample; else the root does.
Sample sampleOf(const Configuration& config, const LogAppender& appender) {
    for (const Channel& category : config.categories) {
        if (Configuration::writesTo(*category.made, appender)) {
            return sampleLine(appender, category.name, *category.made);
        }
    }
    return sampleLine(appender, "sample", *config.root.made);
}

void reportAppender(const Configuration& config, const Appender& appender) {
    const std::vector<std::string> users = config.users(*appender.made);
    write("appender " + visible(appender.name), Ink::TITLE);
    write("\n");
    row("file", placeOf(*appender.made));
    row("limits", limitsOf(*appender.made));
    row("layout", visible(appender.made->layout().pattern()));
    rowsOfSample(sampleOf(config, *appender.made));
    row("used by", users.empty() ? "nobody" : listed(users));
    write("\n");
}

}  // namespace

void reportAll(const Configuration& config) {
    reportChannelState(config, "root", *config.root.made);
    for (const Channel& category : config.categories)
        reportChannelState(config, "category " + visible(category.name), *category.made);
    for (const Appender& appender : config.appenders)
        reportAppender(config, appender);
    const bool spokenOf = !config.rootAppender.attributes.empty();
    if (spokenOf || !config.users(*config.rootAppender.made).empty()) {
        reportAppender(config, config.rootAppender);
    }
}

void reportChannel(const Configuration& config, const std::string& name) {
    const LogChannel& channel = *LogChannel::find(name, false);
    const bool own = &channel != config.root.made;
    write("channel " + visible(name), Ink::TITLE);
    write(own ? "\n" : ": no category of its own, so the root's\n");
    for (int i = DEBUG; i <= EMERG; ++i) {
        const auto level = static_cast<LogLevel>(i);
        if (channel.passes(level)) {
            row(levelName(level), destinations(config, channel, true));
        } else {
            row(levelName(level), "dropped", Ink::QUIET);
        }
    }
    write("\n");
}
