#include "Configuration.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

#include "Status.h"
#include "Text.h"
#include "base/Stream.h"
#include "util/Logger/RootObjects.h"

namespace {

[[noreturn]] void unreadable(const Pathname& file) {
    const int error = errno;
    throw Failure("cannot read " + printable(file) + ": " + std::strerror(error));
}

template <class Item>
Item* named(std::vector<Item>& items, const std::string& name) {
    const auto found = std::find_if(items.begin(), items.end(),
                                    [&](const Item& item) { return item.name == name; });
    return found == items.end() ? nullptr : &*found;
}

void hearAppender(Configuration& config, const ConfigStatement& said) {
    const LogAppender* const made = LogAppender::find(said.name, false);
    Appender* known =
        made == &rootAppender() ? &config.rootAppender : named(config.appenders, said.name);
    if (known == nullptr) {
        config.appenders.push_back({said.name, said.lineno, made, {}, {}});
        known = &config.appenders.back();
    }
    if (said.kind == ConfigStatement::ATTRIBUTE) known->attributes.push_back(said);
}

void hearCategory(Configuration& config, const ConfigStatement& said) {
    Channel* known = named(config.categories, said.name);
    if (known == nullptr) {
        config.categories.push_back({said.name, LogChannel::find(said.name, false), {}});
        known = &config.categories.back();
    }
    known->statements.push_back(said);
}

void hear(Configuration& config, const ConfigStatement& said) {
    if (said.kind == ConfigStatement::ROOT) {
        config.root.statements.push_back(said);
    } else if (said.kind == ConfigStatement::CATEGORY) {
        hearCategory(config, said);
    } else {
        hearAppender(config, said);
    }
}

}  // namespace

Configuration Configuration::read(const Pathname& file, const Pathname& home) {
    epoch_timeval();
    Configuration config;
    config.root.made = &rootChannel();
    config.rootAppender.name = "rootAppender";
    config.rootAppender.made = &::rootAppender();
    const Stream stream(file.fopen("r"));
    if (!stream) unreadable(file);
    ConfigReader reader(stream.get(), home);
    reader.setListener([&](const ConfigStatement& said) { hear(config, said); });
    reader.readAll();
    if (std::ferror(stream.get()) != 0) unreadable(file);
    reader.applyRoot();
    reader.applyCategories();
    for (Appender& appender : config.appenders)
        appender.complaints = LogAppender::find(appender.name, false)->settle();
    config.parseErrors = reader.parse_errors();
    config.openComment = reader.xml_comment_startline();
    return config;
}

const Appender* Configuration::appenderOf(const LogAppender* made) const {
    for (const Appender& appender : appenders) {
        if (appender.made == made) return &appender;
    }
    return &rootAppender;
}

std::vector<const LogAppender*> Configuration::destinations(const LogChannel& channel) {
    if (channel.appenders().empty()) return {&::rootAppender()};
    return {channel.appenders().begin(), channel.appenders().end()};
}

bool Configuration::writesTo(const LogChannel& channel, const LogAppender& appender) {
    const auto all = destinations(channel);
    return std::count(all.begin(), all.end(), &appender) > 0;
}

std::vector<const Appender*> Configuration::everyAppender() const {
    std::vector<const Appender*> all;
    for (const Appender& appender : appenders)
        all.push_back(&appender);
    all.push_back(&rootAppender);
    return all;
}

std::vector<std::string> Configuration::users(const LogAppender& appender) const {
    std::vector<std::string> names;
    const auto look = [&](const Channel& channel, const std::string& name) {
        if (writesTo(*channel.made, appender)) names.push_back(name);
    };
    look(root, "the root");
    for (const Channel& category : categories)
        look(category, visible(category.name));
    return names;
}

std::string Configuration::nameOf(const LogAppender* made) const {
    return appenderOf(made)->name;
}
