#pragma once

#include <korvex/util/Logger/LogFormat.h>

inline namespace korvex {

// Cuts a layout's pattern into its atoms. One object compiles one pattern.
class KORVEX_HIDDEN LogFormat::Compiler {
  public:
    explicit Compiler(LogFormat& format) : _format(format), _p(format._fmt.c_str()) {}

    void compile();

  private:
    void literalRuns();
    void literal(const char* from, const char* to);
    bool conversion();
    void flagAndWidths(Atom& atom);
    unsigned int number();
    bool braceArgument(const char*& begin, const char*& end);
    bool set(Atom& atom, char letter, const char* argBegin, const char* argEnd);

    LogFormat& _format;
    const char* _p;  // the next character to read; the pattern ends at its NUL
};

}  // namespace korvex
