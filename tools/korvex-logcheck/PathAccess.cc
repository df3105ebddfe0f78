#include "PathAccess.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "Text.h"

namespace {

constexpr int kMostLinks = 40;

struct Answer {
    bool good;
    Code code;
    std::string message;
};

const Answer kGood = {true, Code::COUNT, ""};

std::string reason() {
    return std::strerror(errno);
}

std::string directoryOf(const std::string& name) {
    const std::size_t sep = name.find_last_of('/');
    if (sep == name.npos) return ".";
    return sep == 0 ? "/" : name.substr(0, sep);
}

bool mayUse(const std::string& name, int mode) {
    return faccessat(AT_FDCWD, name.c_str(), mode, AT_EACCESS) == 0;
}

Answer unreachable(const std::string& name) {
    return {false, Code::PATH_DENIED, quoted(name) + " cannot be reached: " + reason()};
}

// The highest directory that is missing.
std::string firstMissing(const std::string& directory) {
    std::string missing = directory;
    struct stat st {};
    for (;;) {
        const std::string above = directoryOf(missing);
        if (above == missing || above == "." || stat(above.c_str(), &st) == 0) return missing;
        missing = above;
    }
}

Answer askDirectory(const std::string& directory) {
    struct stat st {};
    if (stat(directory.c_str(), &st) != 0) {
        if (errno == ENOENT) {
            return {false, Code::PATH_MISSING,
                    "there is no directory " + quoted(firstMissing(directory)) +
                        ": no line is written"};
        }
        if (errno != ENOTDIR) return unreachable(directory);
    } else if (S_ISDIR(st.st_mode)) {
        if (mayUse(directory, W_OK | X_OK)) return kGood;
        return {false, Code::PATH_DENIED,
                "no file can be made in " + quoted(directory) + ": " + reason()};
    }
    return {false, Code::PATH_NO_DIRECTORY, quoted(directory) + " is no directory"};
}

// In a directory as /tmp is, the owner of a file alone renames it.
bool isHeldByOwner(const std::string& directory, const std::string& name) {
    struct stat above {};
    struct stat entry {};
    if (stat(directory.c_str(), &above) != 0 || lstat(name.c_str(), &entry) != 0) return false;
    const uid_t user = geteuid();
    return (above.st_mode & S_ISVTX) != 0 && user != 0 && user != above.st_uid &&
           user != entry.st_uid;
}

Answer askRotation(const WantedFile& file) {
    if (!file.rotates) return kGood;
    const std::string directory = directoryOf(file.name);
    const bool usable = mayUse(directory, W_OK | X_OK);
    if (usable && !isHeldByOwner(directory, file.name)) return kGood;
    return {
        false, Code::PATH_NO_ROTATION,
        (usable ? quoted(file.name) + " cannot be renamed: only its owner can, in this directory"
                : "nothing can be renamed in " + quoted(directory) + ": " + reason()) +
            "; the file grows beyond maxFileSize"};
}

Answer askExisting(const WantedFile& file, const struct stat& st) {
    if (S_ISDIR(st.st_mode)) {
        return {false, Code::PATH_NO_DIRECTORY, quoted(file.name) + " is a directory"};
    }
    if (!mayUse(file.name, W_OK)) {
        return {false, Code::PATH_DENIED, quoted(file.name) + " cannot be written: " + reason()};
    }
    return askRotation(file);
}

Answer ask(const WantedFile& file, int links) {
    struct stat st {};
    if (stat(file.name.c_str(), &st) == 0) return askExisting(file, st);
    if (errno != ENOENT && errno != ENOTDIR) return unreachable(file.name);
    char target[4096];
    const ssize_t size = readlink(file.name.c_str(), target, sizeof target);
    if (size <= 0 || links == 0) return askDirectory(directoryOf(file.name));
    // A link to what is not there yet: that is made.
    const std::string to(target, static_cast<std::size_t>(size));
    const std::string name = to.front() == '/' ? to : directoryOf(file.name) + '/' + to;
    const Answer answer = ask({name, false}, links - 1);
    return answer.good ? askRotation(file) : answer;
}

}  // namespace

std::vector<AccessProblem> accessProblems(const std::vector<WantedFile>& files) {
    std::vector<AccessProblem> problems;
    for (std::size_t i = 0; i < files.size(); ++i) {
        const Answer answer = ask(files[i], kMostLinks);
        if (!answer.good) problems.push_back({i, answer.code, answer.message});
    }
    return problems;
}
