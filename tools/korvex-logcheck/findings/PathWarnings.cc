#include "PathAccess.h"
#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"

namespace {

// The line that gives the appender its file; null when it has none to be written.
const ConfigStatement* fileOf(const Appender& appender) {
    return appender.made->fileName().empty() ? nullptr : lastOf(appender, "fileName");
}

}  // namespace

// Whether log files can be written, which depends on the machine.
void findInPaths(const Reading& reading, const Writer& writer, Findings& to) {
    std::vector<WantedFile> files;
    std::vector<const ConfigStatement*> lines;
    for (const Appender& appender : reading.config.appenders) {
        const ConfigStatement* const said = fileOf(appender);
        if (said == nullptr) continue;
        const std::string& name = appender.made->fileName();
        if (beginsWith(name, "${KORVEX_HOME}")) {
            tell(to, Code::PATH_MISSING, valueOf(reading.source, *said).place(),
                 "the home is not known: give it by --home or KORVEX_HOME");
            continue;
        }
        files.push_back({name, appender.made->maxFileSize() > 0});
        lines.push_back(said);
    }
    const std::vector<AccessProblem> problems =
        writer.user ? accessProblemsOf(*writer.user, files) : accessProblems(files);
    const std::string who = writer.user ? " (as user " + printable(*writer.user) + ")" : "";
    for (const AccessProblem& problem : problems) {
        tell(to, problem.code, valueOf(reading.source, *lines[problem.file]).place(),
             problem.message + who);
    }
}
