#include <korvex/util/LoaderInfo.h>

#include "util/LoaderInfo/CommandLine.h"

#include <unistd.h>

#include <cstdlib>

inline namespace korvex {

LoaderInfo* LoaderInfo::_instance = nullptr;

namespace {

void set_path_from_envvar(Pathname& path, const char* name) {
    const char* const value = std::getenv(name);
    if (value == nullptr) return;
    Pathname tidy(value);
    tidy.removeDoubleSeps();
    tidy.removeTrailingSeps();
    // Child processes get the cleaned path too.
    if (tidy != value) setenv(name, tidy.c_str(), 1);
    path = tidy;
}

}  // namespace

LoaderInfo* LoaderInfo::getInstance() {
    if (_instance == nullptr) _instance = new LoaderInfo;
    return _instance;
}

LoaderInfo::LoaderInfo() = default;

LoaderInfo::~LoaderInfo() = default;

LoaderInfo::LoaderInfo(const LoaderInfo& other) {
    *this = other;
}

LoaderInfo& LoaderInfo::operator=(const LoaderInfo& other) {
    if (this == &other) return *this;
    _korvexHome = other._korvexHome;
    _componentName = other._componentName;
    _commonConfigPath = other._commonConfigPath;
    _installName = other._installName;
    _rpcPort = other._rpcPort;
    _pid = other._pid;
    _startupTime = other._startupTime;
    _host = other._host;
    _commonComponentNode = other._commonComponentNode;
    _isDebug = other._isDebug;
    _isDaemon = other._isDaemon;
    _useDebugLog = other._useDebugLog;
    return *this;
}

bool LoaderInfo::operator==(const LoaderInfo& other) const {
    return _korvexHome == other._korvexHome && _korvexDb == other._korvexDb &&
           _componentName == other._componentName && _commonConfigPath == other._commonConfigPath &&
           _installName == other._installName && _rpcPort == other._rpcPort && _pid == other._pid &&
           _startupTime == other._startupTime && _host == other._host &&
           _isDebug == other._isDebug && _isDaemon == other._isDaemon &&
           _startupMode == other._startupMode && _useDebugLog == other._useDebugLog;
}

void LoaderInfo::init(int argc, const char* const* argv) {
    _optionsError = false;
    _componentName = "korvexd";
    _commonConfigPath = "etc";
    _installName = "myinstall";
    _rpcPort = 8089;
    _pid = getpid();
    _startupTime = time(nullptr);
    _isDebug = true;
    _isDaemon = true;
    _useDebugLog = false;
    _commandLine = std::make_unique<CommandLine>(argc, argv);
}

void LoaderInfo::populateFromEnvironment() {
    set_path_from_envvar(_korvexHome, "KORVEX_HOME");
    set_path_from_envvar(_korvexDb, "KORVEX_DB");
}

void LoaderInfo::populateFromCommandLine() {
    if (!_commandLine) return;
    if (!_commandLine->parse()) _optionsError = true;
    _commandLine->copyTo(*this);
}

void LoaderInfo::printHelp() {
    if (_commandLine) _commandLine->printHelp();
}

void LoaderInfo::setCommonComponentNode(const xml::node& node) {
    _commonComponentNode = node;
}

Pathname LoaderInfo::getCommonConfigPath() const {
    return _korvexHome / _commonConfigPath;
}

Pathname LoaderInfo::getInstallConfigPath() const {
    return getCommonConfigPath() / _installName;
}

}  // namespace korvex
