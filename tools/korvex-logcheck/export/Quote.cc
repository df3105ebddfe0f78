#include "export/Quote.h"

#include <cstdio>

std::string jsonString(const std::string& text) {
    std::string all = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') {
            all += '\\';
            all += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char buf[7];
            std::snprintf(buf, sizeof buf, "\\u%04x", static_cast<unsigned char>(c));
            all += buf;
        } else {
            all += c;
        }
    }
    return all + '"';
}

std::string backslashed(const std::string& text) {
    std::string all = "\"";
    for (const char c : text) {
        if (c == '"' || c == '\\') all += '\\';
        all += c;
    }
    return all + '"';
}

std::string yamlString(const std::string& text) {
    std::string all = "'";
    for (const char c : text)
        all += c == '\'' ? "''" : std::string(1, c);
    return all + '\'';
}
