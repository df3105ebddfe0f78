#pragma once

inline namespace korvex {

// Prints "FILE:LINE: failed assertion `CONDITION'" to standard error and aborts.
[[noreturn]] void assertionFailed(const char* file, unsigned line, const char* condition) noexcept;

}  // namespace korvex

// For programming errors; always on. The condition's own text is what is printed.
#define KORVEX_ASSERT(condition) KORVEX_ASSERT_AS(condition, #condition)

// The same with another text than that of the condition in the code.
#define KORVEX_ASSERT_AS(condition, text) \
    ((condition) ? static_cast<void>(0) : ::korvex::assertionFailed(__FILE__, __LINE__, text))
