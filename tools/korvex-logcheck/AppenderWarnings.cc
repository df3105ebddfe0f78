#include <algorithm>
#include <cstdint>
#include <limits>
#include <string_view>

#include "Findings.h"
#include "Text.h"

namespace {

constexpr std::string_view kHomeMarker = "${KORVEX_HOME}";

// The last accepted line of an attribute; null without one.
const ConfigStatement* lastOf(const Appender& appender, std::string_view attribute) {
    const ConfigStatement* last = nullptr;
    for (const ConfigStatement& said : appender.attributes) {
        if (said.accepted && said.attribute == attribute) last = &said;
    }
    return last;
}

std::string called(const Appender& appender) {
    return "Appender " + quoted(appender.name);
}

void checkTrailing(const ConfigStatement& said, Findings& to) {
    if (!said.accepted || said.value.empty()) return;
    const char last = said.value.back();
    const char* what = nullptr;
    if (last == ' ' || last == '\t') what = "the blank behind it";
    if (last == '#') what = "the \"#\" that follows it directly";
    if (last == '\r') what = "the carriage return of a line that ends as on Windows";
    if (what == nullptr) return;
    warn(to, said.lineno, said.attribute + " keeps " + what + ": " + quoted(said.value));
}

void checkRepeated(const Appender& appender, Findings& to) {
    for (const ConfigStatement& said : appender.attributes) {
        const ConfigStatement* const last = lastOf(appender, said.attribute);
        if (!said.accepted || last == &said) continue;
        warn(to, said.lineno,
             said.attribute + " of " + quoted(appender.name) + " is set again on line " +
                 std::to_string(last->lineno));
    }
}

void checkFileName(const Appender& appender, Findings& to) {
    const ConfigStatement* const said = lastOf(appender, "fileName");
    if (said == nullptr || said->value.empty()) return;
    const std::string_view name = said->value;
    const bool marked = name.substr(0, kHomeMarker.size()) == kHomeMarker;
    const std::string_view rest = marked ? name.substr(kHomeMarker.size()) : name;
    if (marked && !rest.empty() && rest.front() != '/') {
        warn(to, said->lineno, "no \"/\" between ${KORVEX_HOME} and " + quoted(rest));
    }
    if (rest.find('$') != rest.npos) {
        warn(to, said->lineno,
             "only ${KORVEX_HOME}, and only in front, is replaced; the rest stays as written: " +
                 quoted(rest));
    } else if (!marked && name.front() != '/') {
        warn(to, said->lineno,
             "fileName " + quoted(name) +
                 " is relative: the file is where the program happens to be started");
    }
}

// A limit with nothing to limit is told on its own line, the rest where the appender begins.
void checkSetup(const Appender& appender, Findings& to) {
    for (const std::string_view complaint : appender.complaints) {
        const ConfigStatement* said = nullptr;
        if (complaint.find("has maxBackupIndex") == 0) said = lastOf(appender, "maxBackupIndex");
        if (complaint.find("has maxSize") == 0) said = lastOf(appender, "maxFileSize");
        warn(to, said != nullptr ? said->lineno : appender.lineno,
             called(appender) + ' ' + std::string(complaint));
    }
    const ConfigStatement* const size = lastOf(appender, "maxFileSize");
    if (size != nullptr && appender.made->maxFileSize() < 0) {
        warn(to, size->lineno, "maxFileSize " + size->value + " is too large: it is no limit");
    }
}

void checkUse(const Configuration& config, const Appender& appender, Findings& to) {
    if (isLevelWord(appender.name)) {
        warn(to, appender.lineno,
             called(appender) + " is spelt like a level: no category can name it");
    }
    if (config.users(*appender.made).empty()) {
        warn(to, appender.lineno, called(appender) + " is used by nobody");
    }
}

void checkRootAppender(const Appender& appender, Findings& to) {
    for (const ConfigStatement& said : appender.attributes) {
        if (!said.accepted || said.attribute.find("layout") == 0) continue;
        warn(to, said.lineno,
             said.attribute + " of \"rootAppender\" has no effect: it stays on standard error");
    }
}

void checkShared(const Configuration& config, const Appender& appender, Findings& to) {
    for (const Appender& other : config.appenders) {
        if (&other == &appender) return;
        if (appender.made->fileName().empty()) return;
        if (other.made->fileName() != appender.made->fileName()) continue;
        warn(to, lastOf(appender, "fileName")->lineno,
             called(appender) + " writes to the same file as " + quoted(other.name) +
                 "; each rotates it by itself");
    }
}

}  // namespace

void findInAppenders(const Configuration& config, Findings& to) {
    for (const Appender& appender : config.appenders) {
        for (const ConfigStatement& said : appender.attributes)
            checkTrailing(said, to);
        checkRepeated(appender, to);
        checkFileName(appender, to);
        checkSetup(appender, to);
        checkUse(config, appender, to);
        checkShared(config, appender, to);
    }
    for (const ConfigStatement& said : config.rootAppender.attributes)
        checkTrailing(said, to);
    checkRootAppender(config.rootAppender, to);
}
