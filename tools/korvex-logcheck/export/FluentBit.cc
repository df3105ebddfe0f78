#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/TimeFormat.h"

namespace {

// Ruby's expressions: "m" lets the dot match newlines, "^" is at each line's begin.
std::string parserOf(const ExportedFile& file) {
    const std::string head = "\\A" + headRegex(file.shape, kPerlStyle, true).substr(1);
    return "  - name: korvex_" + file.id +
           "_line\n    format: regex\n    regex: " + yamlString(head + "(?<message>(?m:.*))\\z") +
           "\n    time_key: time\n    time_keep: true\n    time_system_timezone: true\n"
           "    time_format: " +
           yamlString(strptimeFormat(file.shape.time(), "%L")) + '\n';
}

std::string joinerOf(const ExportedFile& file) {
    const std::string begin = headRegex(file.shape, kPerlStyle, false);
    return "  - name: korvex_" + file.id +
           "\n    type: regex\n    flush_timeout: 5000\n"
           "    rules:\n      - state: start_state\n        regex: " +
           yamlString('/' + begin + '/') +
           "\n        next_state: cont\n      - state: cont\n        regex: " +
           yamlString("/^(?!" + begin.substr(1) + ")/") + "\n        next_state: cont\n";
}

std::string inputOf(const ExportedFile& file) {
    return "    - name: tail\n      tag: " + ("korvex." + file.id) +
           "\n      path: " + yamlString(file.path) +
           "\n      path_key: file\n      multiline.parser: korvex_" + file.id +
           "\n      rotate_wait: 60\n      buffer_max_size: 1M\n      skip_empty_lines: "
           "off\n";
}

std::string filterOf(const ExportedFile& file) {
    return "    - name: parser\n      match: " + ("korvex." + file.id) +
           "\n      key_name: log\n      parser: korvex_" + file.id +
           "_line\n"
           "      reserve_data: on\n";
}

}  // namespace

std::string writeFluentBit(const ExportedFiles& files, const std::string& source) {
    std::string parsers;
    std::string joiners;
    std::string inputs;
    std::string filters;
    for (const ExportedFile& file : files) {
        parsers += parserOf(file);
        joiners += joinerOf(file);
        inputs += inputOf(file);
        filters += filterOf(file);
    }
    return remark("fluent-bit", source) + "parsers:\n" + parsers + "multiline_parsers:\n" +
           joiners + "pipeline:\n  inputs:\n" + inputs + "  filters:\n" + filters +
           "  outputs:  # where the JSON goes\n    - name: stdout\n      match: 'korvex.*'\n"
           "      format: json_lines\n";
}
