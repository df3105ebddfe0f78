// Logs untrusted text, so that it stays in one line and has no control characters.
#include <korvex/util/Logger.h>

#include <cstdio>
#include <string_view>

static Logger logger("escape");

// Printable ASCII as it is; a backslash doubled; every other byte as \x and two hex digits.
static std::string escaped(std::string_view text) {
    std::string out;
    for (const char c : text) {
        char hex[8];
        std::snprintf(hex, sizeof hex, "\\x%02x", static_cast<unsigned char>(c));
        if (c == '\\')
            out += "\\\\";
        else if (c >= ' ' && c <= '~')
            out += c;
        else
            out += hex;
    }
    return out;
}

int main() {
    const std::string name = "Eve\nWARN audit: all is well\033[2J 100%n";
    logger.info("login of \"%s\"", escaped(name).c_str());
    logger.info(escaped(name));  // a std::string: no % in it counts
}
