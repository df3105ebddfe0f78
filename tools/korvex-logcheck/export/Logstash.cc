#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/TimeFormat.h"

namespace {

// Logstash takes strings as they are written: no escapes, and no quote of their own kind. The
// expressions have none.
std::string inputOf(const ExportedFile& file) {
    return "    file {\n        path => \"" + file.path + "\"\n        tags => [\"korvex_" +
           file.id + "\"]\n        add_field => { \"appender\" => \"" + file.appender +
           "\" }\n        codec => multiline {\n            pattern => '" +
           headRegex(file.shape, kPerlStyle, false) +
           "'\n            negate => true\n            what => \"previous\"\n"
           "            auto_flush_interval => 5\n            max_lines => 100000\n        }\n"
           "    }\n";
}

std::string filterOf(const ExportedFile& file) {
    const std::string head = "\\A" + headRegex(file.shape, kPerlStyle, true).substr(1);
    return "    if \"korvex_" + file.id +
           "\" in [tags] {\n        grok {\n"
           "            match => { \"message\" => '" +
           head +
           "%{KORVEX_MESSAGE:message}\\z' }\n"
           "            pattern_definitions => { \"KORVEX_MESSAGE\" => '(?m:.*)' }\n"
           "            overwrite => [\"message\"]\n        }\n        date {\n"
           "            match => [\"time\", \"" +
           javaFormat(file.shape.time()) + "\"]\n        }\n    }\n";
}

}  // namespace

std::string writeLogstash(const ExportedFiles& files, const std::string& source) {
    std::string inputs;
    std::string filters;
    for (const ExportedFile& file : files) {
        if ((file.path + file.appender).find_first_of("\"\\") != std::string::npos) {
            throw Inexpressible("a quote or a backslash in the name of a file or an appender");
        }
        inputs += inputOf(file);
        filters += filterOf(file);
    }
    return remark("logstash", source) + "input {\n" + inputs + "}\nfilter {\n" + filters +
           "}\noutput {\n    # where the JSON goes\n    stdout { codec => json_lines }\n}\n";
}
