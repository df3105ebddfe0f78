#pragma once

#include <optional>
#include <string>
#include <string_view>

// Whether the text is a date as Java writes it ("yyyy-MM-dd HH:mm:ss,SSS"), and which pattern of
// strftime says the same, if one does.
struct JavaDate {
    bool isOne;
    std::string pattern;  // empty: there is none
};
JavaDate javaDate(std::string_view text);
