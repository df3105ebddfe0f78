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

// Whether letters among conversions of strftime are fields of Java that no word looks like: "ss",
// "HHmm".
bool hasJavaFieldsOnly(std::string_view letters);
