#include "util/LoaderInfo/CommandLine.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <new>

inline namespace korvex {

// The switch --noseg is kept out of the help: it is for those who debug the server itself.
const struct poptOption LoaderInfo::CommandLine::_poptOptionsMaster[11] = {
    {"noseg", '\0', POPT_ARG_NONE | POPT_ARGFLAG_DOC_HIDDEN, nullptr, 0,
     "causes the system not to dump core on failure", nullptr},
    {"nodaemon", '\0', POPT_ARG_NONE, nullptr, 0, "causes the system not to daemonize", nullptr},
    {nullptr, 'c', POPT_ARG_STRING, nullptr, 0, "override the config path", nullptr},
    {nullptr, 'h', POPT_ARG_STRING, nullptr, 0, "override the host name", nullptr},
    {nullptr, 'i', POPT_ARG_STRING, nullptr, 0, "the name of the configuration subdir", nullptr},
    {nullptr, 'n', POPT_ARG_STRING, nullptr, 0, "the component name to start with", nullptr},
    {nullptr, 'p', POPT_ARG_INT, nullptr, 0, "the management port for soap calls", nullptr},
    {"debug", '\0', POPT_ARG_NONE, nullptr, 0, "start with debug log config", nullptr},
    {"mode", '\0', POPT_ARG_STRING, nullptr, 0, "the startup mode", nullptr},
    {nullptr, '\0', POPT_ARG_INCLUDE_TABLE, poptHelpOptions, 0, "Help options:", nullptr},
    {nullptr, '\0', 0, nullptr, 0, nullptr, nullptr},
};

LoaderInfo::CommandLine::CommandLine(int argc, const char* const* argv) {
    if (argc > 0) _arguments.assign(argv, argv + argc);
    // popt reads the second element even of an empty vector. The program's name is not used.
    if (_arguments.empty()) _arguments.emplace_back("korvexd");
    for (const std::string& argument : _arguments)
        _argv.push_back(argument.c_str());
    _argv.push_back(nullptr);

    std::copy(std::begin(_poptOptionsMaster), std::end(_poptOptionsMaster), _poptOptionsTable);
    void* const fields[] = {&_poptIsDebug, &_poptIsNodaemon,  &_poptCommonConfigPath,
                            &_poptHost,    &_poptInstallName, &_poptComponentName,
                            &_poptRpcPort, &_poptUseDebugLog, &_poptStartupMode};
    for (std::size_t i = 0; i < std::size(fields); ++i)
        _poptOptionsTable[i].arg = fields[i];

    _poptContext = poptGetContext("korvexd", static_cast<int>(_arguments.size()), _argv.data(),
                                  _poptOptionsTable, 0);
    if (_poptContext == nullptr) throw std::bad_alloc();
}

LoaderInfo::CommandLine::~CommandLine() {
    poptFreeContext(_poptContext);
    for (char* const text : {_poptCommonConfigPath, _poptHost, _poptInstallName, _poptComponentName,
                             _poptStartupMode}) {
        std::free(text);
    }
}

bool LoaderInfo::CommandLine::parse() {
    bool allKnown = true;
    for (int rc; (rc = poptGetNextOpt(_poptContext)) != -1;) {
        if (rc != POPT_ERROR_BADOPT) continue;
        allKnown = false;
        std::fprintf(stderr, "Bad Option %s\n",
                     poptBadOption(_poptContext, POPT_BADOPTION_NOALIAS));
    }
    return allKnown;
}

// Switches are set whether given or not. Other values change only if their option was given.
void LoaderInfo::CommandLine::copyTo(LoaderInfo& info) const {
    info._isDebug = _poptIsDebug != 0;
    info._isDaemon = _poptIsNodaemon == 0;
    info._useDebugLog = _poptUseDebugLog != 0;
    const auto assign = [](std::string& to, const char* text) {
        if (text != nullptr) to = text;
    };
    assign(info._commonConfigPath, _poptCommonConfigPath);
    assign(info._host, _poptHost);
    assign(info._installName, _poptInstallName);
    assign(info._componentName, _poptComponentName);
    if (_poptRpcPort != 0) info._rpcPort = _poptRpcPort;
    assign(info._startupMode, _poptStartupMode);
}

void LoaderInfo::CommandLine::printHelp() const {
    poptPrintHelp(_poptContext, stderr, 0);
}

}  // namespace korvex
