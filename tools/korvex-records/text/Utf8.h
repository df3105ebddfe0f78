#pragma once

#include <cstddef>
#include <string>
#include <string_view>

// The length in bytes of the UTF-8 character that begins here, which goes to `character`; 0 when
// there is none. Overlong forms and surrogates are none.
std::size_t utf8Character(std::string_view bytes, char32_t& character);

// Whether all of it is UTF-8.
bool isUtf8(std::string_view bytes);

// Whether a terminal may obey it instead of showing it.
bool isControl(char32_t character);

// A character that may be (no surrogate, at most U+10FFFF).
void appendUtf8(std::string& out, char32_t character);
