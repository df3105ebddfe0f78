#pragma once

#include <popt.h>

#include <memory>
#include <string>
#include <vector>

// A tool's command line, read by popt.
class CommandLine {
  public:
    // `usage` stands behind the name in the help. The name counts where argv has none.
    CommandLine(const char* name, int argc, const char* const* argv, const poptOption* table,
                const char* usage);

    // What popt's functions take.
    poptContext get() const { return _context.get(); }
    // The argument of the option that was read last.
    std::string argument() const;
    // "OPTION: what is wrong with it", when poptGetNextOpt gave `code`.
    std::string complaint(int code) const;

    // These end the process with status 0.
    [[noreturn]] void showHelp() const;
    [[noreturn]] void showVersion() const;

  private:
    struct Free {
        void operator()(poptContext context) const { poptFreeContext(context); }
    };

    const char* const _name;
    std::vector<const char*> _argv;
    std::unique_ptr<poptContext_s, Free> _context;
};
