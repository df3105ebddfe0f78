#include <sys/stat.h>

#include <algorithm>

#include "SameFile.h"
#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"
#include "findings/NearMiss.h"

namespace {

constexpr std::string_view kMarker = "${KORVEX_HOME}";
constexpr std::string_view kHome = "KORVEX_HOME";

// The number of the backup of `of` that the name is; 0: none.
std::uint64_t backupNumber(const std::string& name, const std::string& of) {
    if (!beginsWith(name, of + '.')) return 0;
    const std::string digits = name.substr(of.size() + 1);
    constexpr std::size_t most = 10;  // digits of 32 bits
    const bool number = !digits.empty() && digits.size() <= most && digits.front() != '0' &&
                        std::all_of(digits.begin(), digits.end(), isDigit);
    return number ? std::stoull(digits) : 0;
}

// An appender that writes to a file.
struct FileUser {
    const Appender* appender;
    Piece value;  // of its fileName
    FileIdentity file;
};

void checkShared(const std::vector<FileUser>& users, const FileUser& user, Findings& to) {
    const std::string& name = user.appender->made->fileName();
    for (const FileUser& other : users) {
        if (&other == &user) return;
        if (!isSameFile(user.file, other.file)) continue;
        const std::string& otherName = other.appender->made->fileName();
        const bool rotates =
            user.appender->made->maxFileSize() > 0 || other.appender->made->maxFileSize() > 0;
        const std::string spelling =
            name == otherName ? "" : ", which calls it " + quoted(otherName);
        tell(to, Code::FILE_SAME, user.value.place(),
             "Appender " + quoted(user.appender->name) + " writes to the same file as " +
                 quoted(other.appender->name) + spelling +
                 (rotates ? "; each rotates it by itself" : "; their lines are mixed there"));
    }
}

void checkBackup(const std::vector<FileUser>& users, const FileUser& user, Findings& to) {
    for (const FileUser& other : users) {
        const LogAppender& made = *other.appender->made;
        if (made.maxFileSize() <= 0) continue;
        const std::uint64_t number = std::max(backupNumber(user.file.canonical, other.file.entry),
                                              backupNumber(user.file.entry, other.file.entry));
        if (number == 0 || number > made.maxBackupIndex()) continue;
        tell(to, Code::FILE_BACKUP, user.value.place(),
             "this is backup " + std::to_string(number) + " of " + quoted(other.appender->name) +
                 ", whose rotation renames and overwrites it");
    }
}

bool isWordCharacter(char c) {
    return isLetter(c) || isDigit(c) || c == '_';
}

// The word that a name begins with, within signs of a variable: "$(WORD)", "%WORD%", "${env:WORD".
struct Variable {
    std::string_view word;
    std::size_t size;  // with its signs
};

Variable variableOf(std::string_view name) {
    std::size_t from = std::min(name.find_first_not_of("$%@<({["), name.size());
    if (lowered(name.substr(from, 4)) == "env:") from += 4;
    std::size_t to = from;
    while (to < name.size() && isWordCharacter(name[to]))
        ++to;
    const std::size_t end = std::min(name.find_first_not_of("}%@>)]", to), name.size());
    return {name.substr(from, to - from), end};
}

// The length of the home marker in a form that is not replaced; 0: there is none.
std::size_t otherFormOfMarker(std::string_view name) {
    if (beginsWith(name, kMarker)) return 0;
    const auto [word, size] = variableOf(name);
    if (size < name.size() && name[size] != '/') return 0;
    const bool bare = size == word.size();
    return bare ? (word == kHome ? size : 0) : (lowered(word) == lowered(kHome) ? size : 0);
}

// "${KORVEXHOME}/a.log".
std::string nearMarker(std::string_view name) {
    const auto [word, size] = variableOf(name);
    if (size == word.size() || nearestTo(word, {std::string(kHome)}).empty()) return "";
    return std::string(kMarker) + std::string(name.substr(size));
}

// The name below the home; empty where that is not likely.
std::string belowHome(std::string_view name) {
    while (beginsWith(name, "./"))
        name.remove_prefix(2);
    const bool elsewhere =
        beginsWith(name, "..") || name.find_first_of(":\\") != name.npos || name.empty();
    return elsewhere ? "" : std::string(kMarker) + '/' + std::string(name);
}

bool hasVariable(std::string_view name) {
    if (name.front() == '~') return true;
    for (std::size_t i = 0; i < name.size(); ++i) {
        if (name[i] == '$') return true;
        if (name[i] == '%' && i + 1 < name.size() && isLetter(name[i + 1])) return true;
    }
    return false;
}

bool namesDirectory(std::string_view name, const std::string& whole) {
    if (name.empty() || name.back() == '/') return true;
    const std::string_view leaf = name.substr(name.find_last_of('/') + 1);
    struct stat st {};
    return leaf == "." || leaf == ".." || (stat(whole.c_str(), &st) == 0 && S_ISDIR(st.st_mode));
}

// Names that do not mean what they look like. The first slip is told; the others follow from it.
void checkSpelling(const Appender& appender, const Piece& value, Findings& to) {
    const std::string_view name = value.text();
    const bool marked = beginsWith(name, kMarker);
    const std::string_view rest = marked ? name.substr(kMarker.size()) : name;
    const std::string marker(kMarker);
    const bool nothing = name == "\"\"" || name == "''";
    const std::string_view around = nothing ? "" : withoutQuotes(name);
    const std::string inner(around == name ? withoutLoneQuote(name) : around);
    if (inner != name) {
        return tell(to, Code::FILE_QUOTED, value.place(),
                    std::string(around == name ? "the quotation mark belongs"
                                               : "the quotation marks belong") +
                        " to the name: " + printable(name),
                    inner, value.replacedBy(inner));
    }
    if (const std::size_t form = otherFormOfMarker(name)) {
        const Piece variable = value.part(0, form);
        return tell(to, Code::FILE_HOME, value.place(),
                    "the home is ${KORVEX_HOME}; " + quoted(variable.text()) + " is not replaced",
                    marker, variable.replacedBy(marker));
    }
    if (hasVariable(rest.empty() ? "/" : rest)) {
        return tell(to, Code::FILE_VARIABLE, value.place(),
                    "only ${KORVEX_HOME}, and only in front, is replaced; the rest stays as "
                    "written: " +
                        quoted(rest),
                    marked ? "" : nearMarker(name));
    }
    if (marked && !rest.empty() && rest.front() != '/') {
        tell(to, Code::FILE_HOME, value.part(kMarker.size(), rest.size()).place(),
             "no \"/\" between ${KORVEX_HOME} and " + quoted(rest),
             isLetter(rest.front()) ? marker + "/" + std::string(rest) : "");
    }
    if (!marked && name.front() != '/') {
        tell(to, Code::FILE_RELATIVE, value.place(),
             "fileName " + quoted(name) +
                 " is relative: the file is where the program happens to be started",
             belowHome(name));
    }
    if (namesDirectory(rest, appender.made->fileName())) {
        tell(to, Code::FILE_DIRECTORY, value.place(),
             (marked && (rest.empty() || rest == "/") ? "this is the home itself, a directory"
                                                      : quoted(name) + " names a directory") +
                 ": no line is written");
    }
}

}  // namespace

void findInFiles(const Reading& reading, Findings& to) {
    std::vector<FileUser> users;
    for (const Appender& appender : reading.config.appenders) {
        const ConfigStatement* const said = lastOf(appender, "fileName");
        if (said == nullptr || said->value.empty()) continue;
        users.push_back(
            {&appender, valueOf(reading.source, *said), identityOf(appender.made->fileName())});
    }
    for (const FileUser& user : users) {
        checkSpelling(*user.appender, user.value, to);
        checkShared(users, user, to);
        checkBackup(users, user, to);
    }
}
