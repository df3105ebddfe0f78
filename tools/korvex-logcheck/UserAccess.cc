#include <grp.h>
#include <pwd.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <sstream>

#include "PathAccess.h"
#include "Status.h"
#include "Text.h"

namespace {

// "FILE CODE MESSAGE" each, ended by a NUL; the messages are printable.
std::string written(const std::vector<AccessProblem>& problems) {
    std::ostringstream out;
    for (const AccessProblem& problem : problems) {
        out << problem.file << ' ' << static_cast<int>(problem.code) << ' ' << problem.message
            << '\0';
    }
    return out.str();
}

std::vector<AccessProblem> read(const std::string& text) {
    std::vector<AccessProblem> problems;
    std::istringstream in(text);
    std::size_t file = 0;
    int code = 0;
    std::string message;
    while (in >> file >> code && in.ignore() && std::getline(in, message, '\0'))
        problems.push_back({file, static_cast<Code>(code), message});
    return problems;
}

bool become(const struct passwd& user) {
    if (geteuid() != 0) return true;  // it is the user already
    return initgroups(user.pw_name, user.pw_gid) == 0 && setgid(user.pw_gid) == 0 &&
           setuid(user.pw_uid) == 0;
}

[[noreturn]] void answer(const struct passwd& user, const std::vector<WantedFile>& files, int to) {
    if (!become(user)) _exit(1);
    const std::string text = written(accessProblems(files));
    for (std::size_t done = 0; done < text.size();) {
        const ssize_t n = write(to, text.data() + done, text.size() - done);
        if (n < 0 && errno != EINTR) _exit(1);
        if (n > 0) done += static_cast<std::size_t>(n);
    }
    _exit(0);
}

std::string readAll(int from) {
    std::string text;
    char buf[4096];
    for (;;) {
        const ssize_t n = ::read(from, buf, sizeof buf);
        if (n < 0 && errno == EINTR) continue;
        if (n <= 0) return text;
        text.append(buf, static_cast<std::size_t>(n));
    }
}

[[noreturn]] void refuse(const std::string& user, const std::string& why) {
    throw Failure("cannot look as user " + printable(user) + ": " + why);
}

}  // namespace

std::vector<AccessProblem> accessProblemsOf(const std::string& user,
                                            const std::vector<WantedFile>& files) {
    const struct passwd* const entry = getpwnam(user.c_str());
    if (entry == nullptr) refuse(user, "there is none");
    if (geteuid() != 0 && geteuid() != entry->pw_uid) refuse(user, "only root can");
    int ends[2];
    if (pipe(ends) != 0) refuse(user, std::strerror(errno));
    const pid_t child = fork();
    if (child == 0) answer(*entry, files, ends[1]);
    close(ends[1]);
    const std::string text = readAll(ends[0]);
    close(ends[0]);
    int status = 0;
    while (child > 0 && waitpid(child, &status, 0) < 0 && errno == EINTR) {
    }
    if (child < 0 || status != 0) refuse(user, "the child process failed");
    return read(text);
}
