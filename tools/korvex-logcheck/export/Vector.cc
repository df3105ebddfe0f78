#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/TimeFormat.h"

namespace {

std::string sourceOf(const ExportedFile& file) {
    const std::string begin = yamlString(headRegex(file.shape, kRe2Style, false));
    return "  korvex_" + file.id + "_file:\n    type: file\n    include: [" +
           yamlString(file.path) +
           "]\n    multiline:\n      mode: halt_before\n      start_pattern: " + begin +
           "\n      condition_pattern: " + begin + "\n      timeout_ms: 5000\n";
}

std::string transformOf(const ExportedFile& file) {
    const std::string whole = "(?s)" + headRegex(file.shape, kRe2Style, true) + "(?P<message>.*)$";
    std::string all = "  korvex_" + file.id + ":\n    type: remap\n    inputs: [korvex_" + file.id +
                      "_file]\n    source: |\n      .appender = " + jsonString(file.appender) +
                      "\n      fields, err = parse_regex(.message, r'" + whole +
                      "')\n      if err == null {\n        . = merge!(., fields)\n"
                      "        .timestamp = parse_timestamp(.time, " +
                      jsonString(strptimeFormat(file.shape.time(), "%3f")) + ") ?? .timestamp\n";
    if (levelIsFilled(file.shape, kRe2Style)) all += "        .level = strip_whitespace!(.level)\n";
    return all + "      }\n";
}

}  // namespace

std::string writeVector(const ExportedFiles& files, const std::string& source) {
    std::string sources;
    std::string transforms;
    std::string names;
    for (const ExportedFile& file : files) {
        sources += sourceOf(file);
        transforms += transformOf(file);
        names += (names.empty() ? "korvex_" : ", korvex_") + file.id;
    }
    return remark("vector", source) + "timezone: local\nsources:\n" + sources + "transforms:\n" +
           transforms +
           "sinks:\n  korvex_out:  # where the JSON goes\n    type: console\n    inputs: [" +
           names + "]\n    encoding:\n      codec: json\n";
}
