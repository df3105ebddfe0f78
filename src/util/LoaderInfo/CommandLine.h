#pragma once

#include <korvex/util/LoaderInfo.h>

#include <popt.h>

#include <string>
#include <vector>

inline namespace korvex {

// What popt needs to parse the command line: the option table, the fields that receive the values,
// and the parsing context. popt keeps pointers into the argument vector and the table, so they are
// kept here.
class KORVEX_HIDDEN LoaderInfo::CommandLine {
  public:
    CommandLine(int argc, const char* const* argv);
    CommandLine(const CommandLine&) = delete;
    CommandLine& operator=(const CommandLine&) = delete;
    ~CommandLine();

    // Parses to the end; whether all options were known.
    bool parse();
    // Copies what was received.
    void copyTo(LoaderInfo& info) const;
    void printHelp() const;

  private:
    static const struct poptOption _poptOptionsMaster[11];

    std::vector<std::string> _arguments;
    std::vector<const char*> _argv;
    struct poptOption _poptOptionsTable[11];
    poptContext _poptContext = nullptr;

    int _poptIsDebug = 0;
    int _poptUseDebugLog = 0;
    int _poptIsNodaemon = 0;
    char* _poptCommonConfigPath = nullptr;  // this and the other texts: popt's, by malloc
    char* _poptHost = nullptr;
    char* _poptInstallName = nullptr;
    char* _poptComponentName = nullptr;
    int _poptRpcPort = 0;
    char* _poptStartupMode = nullptr;
};

}  // namespace korvex
