#include "reference/Shell.h"

#include <unistd.h>

#include <cerrno>

#include "Check.h"

namespace reference {

namespace {

bool has(const std::string& text, const char* characters) {
    return text.find_first_of(characters) != text.npos;
}

constexpr char kBlanks[] = " \t\n";
constexpr char kDollars[] = "\"$\\";
constexpr char kOthers[] = "#&*;=?[]|";

// A shell that runs beside us: one line to its standard input is one printf.
class Shell {
  public:
    Shell() {
        int in[2];
        int out[2];
        check(pipe(in) == 0 && pipe(out) == 0, "pipe");
        if (fork() == 0) {
            dup2(in[0], 0);
            dup2(out[1], 1);
            close(in[1]);
            close(out[0]);
            execl("/bin/sh", "sh", static_cast<char*>(nullptr));
            _exit(127);
        }
        close(in[0]);
        close(out[1]);
        _in = in[1];
        _out = out[0];
    }

    std::string read(const std::string& word) const {
        const std::string line = "printf '%s\\0' " + word + "\n";
        const auto size = static_cast<ssize_t>(line.size());
        check(again([&] { return write(_in, line.data(), line.size()); }) == size, "write");
        std::string all;
        for (char c = 'x'; c != '\0';) {
            check(again([&] { return ::read(_out, &c, 1); }) == 1, "the shell has ended");
            if (c != '\0') all += c;
        }
        return all;
    }

  private:
    // libFuzzer's alarm interrupts calls.
    template <class Call>
    static ssize_t again(const Call& call) {
        ssize_t n;
        do {
            n = call();
        } while (n < 0 && errno == EINTR);
        return n;
    }

    int _in = -1;
    int _out = -1;
};

}  // namespace

std::string quoted(const std::string& text) {
    const bool blanks = has(text, kBlanks);
    const bool apostrophe = has(text, "'");
    if (text.empty()) return "\"\"";
    if (!apostrophe && !blanks && !has(text, kDollars) && !has(text, kOthers)) return text;
    if (!apostrophe && has(text, kDollars)) return "'" + text + "'";
    std::string word;
    for (const char c : text) {
        const std::string one(1, c);
        const bool escape = has(one, kDollars) || (!blanks && (has(one, kOthers) || c == '\''));
        word += (escape ? "\\" : "") + one;
    }
    return blanks ? "\"" + word + "\"" : word;
}

std::optional<Split> split(const std::string& text) {
    std::size_t at = std::min(text.find_first_not_of(kBlanks), text.size());
    std::string word;
    while (at < text.size() && !has(text.substr(at, 1), kBlanks)) {
        const char c = text[at++];
        if (c == '\'') {
            const std::size_t close = text.find('\'', at);
            if (close == text.npos) return std::nullopt;
            word += text.substr(at, close - at);
            at = close + 1;
        } else if (c == '"') {
            for (;; ++at) {
                if (at == text.size()) return std::nullopt;
                if (text[at] == '"') break;
                if (text[at] == '\\' && ++at == text.size()) return std::nullopt;
                word += text[at];
            }
            ++at;
        } else if (c == '\\') {
            if (at == text.size()) return std::nullopt;
            word += text[at++];
        } else {
            word += c;
        }
    }
    if (word.empty()) return std::nullopt;
    return Split{word, text.substr(at)};
}

// Left alone on purpose, and special to shells.
bool isForAnyShell(const std::string& text) {
    return !has(text, "()<>{}~!`") && text.find('\0') == text.npos;
}

std::string readByShell(const std::string& word) {
    static const Shell shell;
    return shell.read(word);
}

}  // namespace reference
