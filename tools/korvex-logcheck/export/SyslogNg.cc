#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"

namespace {

std::string keys(const LineShape& shape) {
    std::string all;
    for (const LineField* const field : namedFields(shape)) {
        const std::string name = nameOf(field->kind);
        all += ' ' + name + "=${.korvex." + name + '}';
    }
    return all + " message=${.korvex.message}";
}

// Single quotes: backslashes are the expression's own. It has no single quote in it.
std::string entry(const ExportedFile& file) {
    const std::string begin = headRegex(file.shape, kPerlStyle, false);
    const std::string whole = "(?s)" + headRegex(file.shape, kPerlStyle, true) + "(?<message>.*)$";
    const std::string id = "korvex_" + file.id;
    return "\nsource s_" + id + " {\n    file(" + backslashed(file.path) +
           " follow-freq(1) flags(no-parse)\n"
           "        multi-line-mode(regexp) multi-line-timeout(5)\n"
           "        multi-line-prefix('" +
           begin +
           "'));\n};\n"
           "parser p_" +
           id + " {\n    regexp-parser(prefix(\".korvex.\") patterns('" + whole +
           "'));\n};\n"
           "rewrite r_" +
           id +
           " {\n"
           "    set(\"$(format-json --scope none host=${HOST} appender=" +
           "'" + file.appender + "'" + keys(file.shape) +
           ")\" value(\"MESSAGE\"));\n};\n"
           "log {\n    source(s_" +
           id + ");\n    if {\n        parser(p_" + id +
           ");\n"
           "    } else {\n        # no line of this layout: as it is\n"
           "        rewrite { set(\"$MESSAGE\" value(\".korvex.message\")); };\n    };\n"
           "    rewrite(r_" +
           id + ");\n    destination(d_korvex_out);\n};\n";
}

}  // namespace

std::string writeSyslogNg(const ExportedFiles& files, const std::string& source) {
    for (const ExportedFile& file : files) {
        if (file.appender.find_first_of("'\"\\$()") != std::string::npos) {
            throw Inexpressible("the name of appender " + file.appender);
        }
    }
    std::string all = "@version: 3.38\n" + remark("syslog-ng", source) +
                      "# Messages longer than log-msg-size are cut; newlines at a message's end "
                      "are lost.\n"
                      "options { log-msg-size(262144); };\n"
                      "\n"
                      "# Where the JSON goes.\n"
                      "destination d_korvex_out {\n"
                      "    network(\"127.0.0.1\" port(10514) template(\"$MESSAGE\\n\")\n"
                      "        disk-buffer(mem-buf-size(10485760) disk-buf-size(1073741824) "
                      "reliable(yes)));\n"
                      "};\n";
    for (const ExportedFile& file : files)
        all += entry(file);
    return all;
}
