#include "export/Engines.h"
#include "export/Quote.h"
#include "export/Regex.h"
#include "export/RuleBase.h"

namespace {

// What all files share. A line of JSON for a message: where it goes is one action.
std::string preamble(const std::string& source) {
    return remark("rsyslog", source) +
           "# Messages longer than maxMessageSize are cut. rsyslog's state of reading stands in\n"
           "# global(workDirectory=...). While it joins lines, rsyslog 8 loses the last message of "
           "a\n"
           "# file that is rotated at once; where messages have one line each, take startmsg.regex "
           "out.\n"
           "global(maxMessageSize=\"256k\")\n"
           "module(load=\"imfile\")\n"
           "module(load=\"mmnormalize\")\n"
           "\n"
           "# Where the JSON goes. No queue.timeoutEnqueue: with a long one, a queue that is full\n"
           "# waits for itself, for ever.\n"
           "template(name=\"korvex_json\" type=\"string\" string=\"%$!korvex%\\n\")\n"
           "ruleset(name=\"korvex_out\") {\n"
           "    action(type=\"omfwd\" target=\"127.0.0.1\" port=\"10514\" protocol=\"tcp\"\n"
           "        template=\"korvex_json\" action.resumeRetryCount=\"-1\"\n"
           "        queue.type=\"disk\" queue.filename=\"korvex_out\" queue.size=\"5000000\"\n"
           "        queue.saveOnShutdown=\"on\" queue.checkpointInterval=\"1\")\n"
           "}\n";
}

// The time in one piece, names without padding.
std::string repairs(const RuleBase& base) {
    std::string time = "$!korvex!time1";
    std::string pieces = "        unset $!korvex!time1;\n";
    for (std::size_t i = 0; i < base.timeJoints.size(); ++i) {
        const std::string piece = "$!korvex!time" + std::to_string(i + 2);
        time += " & " + backslashed(base.timeJoints[i]) + " & " + piece;
        pieces += "        unset " + piece + ";\n";
    }
    std::string all = "        set $!korvex!time = " + time + ";\n" + pieces;
    for (const std::string& name : base.padded)
        all += "        set $!korvex!" + name + " = ltrim(rtrim($!korvex!" + name + "));\n";
    return all;
}

std::string rulesetOf(const ExportedFile& file) {
    const RuleBase base = ruleBaseOf(file.shape);
    std::string rules;
    for (const std::string& rule : base.rules)
        rules += (rules.empty() ? "" : ",\n") + std::string("        ") + backslashed(rule);
    return "\nruleset(name=\"korvex_" + file.id + "\") {\n" +
           "    action(type=\"mmnormalize\" path=\"$!korvex\" rule=[\n" + rules + "\n    ])\n" +
           "    if $parsesuccess == \"OK\" then {\n" + repairs(base) +
           "    } else {\n"
           "        set $!korvex!message = $msg;  # no line of this layout: as it is\n"
           "    }\n"
           "    set $!korvex!host = $hostname;\n    set $!korvex!offset = $!metadata!fileoffset;\n "
           "   set $!korvex!appender = " +
           backslashed(file.appender) +
           ";\n"
           "    call korvex_out\n"
           "}\n";
}

std::string inputOf(const ExportedFile& file) {
    return "input(type=\"imfile\" file=" + backslashed(file.path) + " tag=\"korvex_" + file.id +
           "\" ruleset=\"korvex_" + file.id +
           "\"\n    startmsg.regex=" + backslashed(headRegex(file.shape, kPosixStyle, false)) +
           "\n    escapeLF=\"off\" addMetadata=\"on\" readTimeout=\"5\")\n";
}

}  // namespace

std::string writeRsyslog(const ExportedFiles& files, const std::string& source) {
    std::string all = preamble(source);
    for (const ExportedFile& file : files)
        all += rulesetOf(file) + inputOf(file);
    return all;
}
