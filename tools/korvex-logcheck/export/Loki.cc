#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/TimeFormat.h"

namespace {

std::string stagesOf(const ExportedFile& file) {
    const std::string whole = "(?s)" + headRegex(file.shape, kRe2Style, true) + "(?P<message>.*)$";
    std::string all = "      - multiline:\n          firstline: " +
                      yamlString(headRegex(file.shape, kRe2Style, false)) +
                      "\n          max_wait_time: 5s\n          max_lines: 100000\n"
                      "      - regex:\n          expression: " +
                      yamlString(whole) + '\n';
    if (levelIsFilled(file.shape, kRe2Style)) {
        all +=
            "      - template:\n          source: level\n          template: '{{ TrimSpace "
            ".Value }}'\n";
    }
    all += "      - timestamp:\n          source: time\n          format: " +
           yamlString(goFormat(file.shape.time())) + "\n          location: Local\n";
    std::string labels;
    std::string rest;
    for (const LineField* const field : namedFields(file.shape)) {
        const std::string line = std::string("          ") + nameOf(field->kind) + ":\n";
        const bool few = field->kind == LineField::LEVEL || field->kind == LineField::CHANNEL;
        if (field->kind != LineField::TIME) (few ? labels : rest) += line;
    }
    if (!labels.empty()) all += "      - labels:\n" + labels;
    if (!rest.empty()) all += "      - structured_metadata:\n" + rest;
    return all + "      - output:\n          source: message\n";
}

}  // namespace

std::string writeLoki(const ExportedFiles& files, const std::string& source) {
    std::string all = remark("loki", source) + "scrape_configs:\n";
    for (const ExportedFile& file : files) {
        all += "  - job_name: korvex_" + file.id +
               "\n    static_configs:\n      - targets: "
               "[localhost]\n        labels:\n          job: korvex\n          appender: " +
               yamlString(file.appender) + "\n          __path__: " + yamlString(file.path) +
               "\n    pipeline_stages:\n" + stagesOf(file);
    }
    return all;
}
