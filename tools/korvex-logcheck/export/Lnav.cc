#include <korvex/util/Pathname.h>

#include <map>

#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/TimeFormat.h"

namespace {

constexpr RegexStyle kLnavStyle{"(?<", true, "timestamp"};

const std::vector<std::string> kLevels = {"debug",    "info",     "notice", "warning", "error",
                                          "critical", "critical", "fatal",  "fatal"};

// lnav's levels are fewer, and one has one pattern.
std::string levels(const LineField& level) {
    std::map<std::string, std::vector<std::string>> words;
    for (const LevelWord& word : level.words)
        if (word.level <= EMERG)
            words[kLevels.at(static_cast<std::size_t>(word.level))].push_back(word.word);
    std::string all;
    for (const auto& [name, these] : words) {
        all += (all.empty() ? "" : ",\n") + std::string("      ") + jsonString(name) + ": " +
               jsonString("^(?:" + anyOf(these, kLnavStyle) + ")$");
    }
    return "    \"level-field\": \"level\",\n    \"level\": {\n" + all + "\n    },\n";
}

std::string sampleTime(const LineField& time) {
    static const std::map<char, std::string> values = {
        {'Y', "2007"},   {'m', "03"},  {'d', "05"},    {'e', " 5"},
        {'H', "14"},     {'I', "02"},  {'M', "03"},    {'S', "09"},
        {'p', "PM"},     {'b', "Mar"}, {'B', "March"}, {'a', "Mon"},
        {'A', "Monday"}, {'l', "007"}, {'z', "+0000"}, {'s', "1173103389"}};
    std::string all;
    for (const TimePart& part : time.time)
        all += part.letter == 0 ? part.text : values.at(part.letter);
    return all;
}

std::string sampleLine(const LineShape& shape, std::size_t level) {
    std::string line;
    for (const LineField& field : shape.head()) {
        if (field.kind == LineField::TEXT) line += field.text;
        if (field.kind == LineField::TIME) line += sampleTime(field);
        if (field.kind == LineField::CHANNEL) line += "net";
        if (field.kind == LineField::THREAD) line += "Main Thread";
        if (field.kind == LineField::LEVEL) {
            const LevelWord& word = field.words[level];
            line += word.before + word.word + word.behind;
        }
        if (field.kind == LineField::UPTIME_MS || field.kind == LineField::UPTIME_S ||
            field.kind == LineField::CPU_TICKS) {
            line += "2500";
        }
    }
    return line + "slow peer";
}

std::string samples(const LineShape& shape) {
    const bool hasLevel = shape.find(LineField::LEVEL) != nullptr;
    std::string all;
    for (std::size_t level = 0; level < (hasLevel ? kLevels.size() : 1); ++level) {
        all += (all.empty() ? "" : ",\n") + std::string("      {\"line\": ") +
               jsonString(sampleLine(shape, level)) +
               (hasLevel ? ", \"level\": " + jsonString(kLevels[level]) : "") + '}';
    }
    return all;
}

std::string values(const LineShape& shape) {
    std::string all;
    for (const LineField* const field : namedFields(shape)) {
        if (field->kind == LineField::TIME) continue;
        const bool isName = field->kind == LineField::CHANNEL || field->kind == LineField::THREAD;
        all += (all.empty() ? "" : ",\n") + std::string("      ") +
               jsonString(nameOf(field->kind)) + ": {\"kind\": \"string\"" +
               (isName ? ", \"identifier\": true}" : "}");
    }
    return all;
}

std::string format(const ExportedFile& file, const std::string& source) {
    const std::string leaf = Pathname(file.path).toLeaf();
    const std::string pattern = headRegex(file.shape, kLnavStyle, true) + "(?<body>.*)$";
    const LineField* const level = file.shape.find(LineField::LEVEL);
    return "  " + jsonString("korvex_" + file.id) +
           ": {\n    \"title\": " + jsonString("Appender " + file.appender) +
           ",\n    \"description\": " +
           jsonString("Made by korvex-logcheck --export lnav from " + source) +
           ",\n    \"file-pattern\": " +
           jsonString("(?:^|/)" + escaped(leaf, kLnavStyle) + "(?:\\.[0-9]+)?(?:\\.gz)?$") +
           ",\n    \"regex\": {\n      \"line\": {\"pattern\": " + jsonString(pattern) +
           "}\n    },\n    \"timestamp-format\": [" +
           jsonString(strptimeFormat(file.shape.time(), "%L")) + "],\n" +
           (level != nullptr ? levels(*level) : "") + "    \"value\": {\n" + values(file.shape) +
           "\n    },\n    \"sample\": [\n" + samples(file.shape) + "\n    ]\n  }";
}

}  // namespace

std::string writeLnav(const ExportedFiles& files, const std::string& source) {
    std::string all = "{\n  \"$schema\": \"https://lnav.org/schemas/format-v1.schema.json\"";
    for (const ExportedFile& file : files)
        all += ",\n" + format(file, source);
    return all + "\n}\n";
}
