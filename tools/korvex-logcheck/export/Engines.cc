#include "export/Engines.h"

const std::vector<Engine>& engines() {
    static const std::vector<Engine> all = {
        {"lnav", "lnav: a format definition, for ~/.lnav/formats/installed/", writeLnav},
        {"rsyslog", "rsyslog: inputs, rule base, JSON", writeRsyslog},
        {"syslog-ng", "syslog-ng: sources, parsers, JSON", writeSyslogNg},
        {"fluent-bit", "Fluent Bit: inputs and parsers, YAML", writeFluentBit},
        {"vector", "Vector: sources and transforms, YAML", writeVector},
        {"loki", "Loki: Promtail's scrape_configs, YAML", writeLoki},
        {"logstash", "Logstash, for Elasticsearch: inputs and grok filters", writeLogstash},
        {"pcre", "a Perl-compatible regular expression with named groups for each file", writePcre},
    };
    return all;
}

std::vector<const LineField*> namedFields(const LineShape& shape) {
    std::vector<const LineField*> fields;
    for (const LineField& field : shape.head())
        if (field.kind != LineField::TEXT && !field.repeated) fields.push_back(&field);
    return fields;
}

std::string remark(const std::string& engine, const std::string& source) {
    return "# Made by korvex-logcheck --export " + engine + " from " + source + ".\n";
}
