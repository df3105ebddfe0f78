#pragma once

#include <korvex/Export.h>
#include <korvex/XmlNode.h>
#include <korvex/util/Pathname.h>

#include <sys/types.h>

#include <cstdint>
#include <ctime>
#include <memory>
#include <string>

KORVEX_NAMESPACE(korvex) {

// How the process was started: its directories (from the environment), its options (from the
// command line, by popt), its id and start time. There is one instance for the process. The main
// thread fills it in before other threads exist; afterwards it is only read. It has no locks.
class LoaderInfo {
  public:
    // The one instance, built at the first call and never destroyed. Throws std::bad_alloc.
    static LoaderInfo* getInstance();

    // Everything empty, false or 0.
    LoaderInfo();
    // Copies everything except getKorvexDb(), getStartupMode(), and the state of the command-line
    // parser. These stay as they are in the target (empty in a new copy).
    LoaderInfo(const LoaderInfo& other);
    LoaderInfo& operator=(const LoaderInfo& other);
    ~LoaderInfo();

    // Compares everything except the node and the state of the parser. So a copy is not equal to
    // its source if the source has a database directory or a start-up mode.
    bool operator==(const LoaderInfo& other) const;

    // Sets the defaults ("korvexd", "etc", "myinstall", port 8089, debug and daemon true, debug
    // log false), the process id and the start time. Copies the command line and prepares its
    // parsing. Leaves the two directories, the host and the start-up mode unchanged. May be called
    // again. Throws std::bad_alloc.
    void init(int argc, const char* const* argv);
    // Takes KORVEX_HOME and KORVEX_DB where they are set. Repeated and trailing separators are
    // removed; if that changed a value, it is also written back to the environment.
    void populateFromEnvironment();
    // Parses the command line prepared by init():
    //
    //     --noseg      getDebug() is true; without it, false
    //     --nodaemon   getDaemon() is false; without it, true
    //     --debug      getUseDebugLog() is true; without it, false
    //     -c PATH, -h HOST, -i INSTALL, -n COMPONENT, -p PORT, --mode MODE
    //
    // An unknown option is reported on standard error and sets isError(). Other errors of popt are
    // ignored. --help and --usage print popt's help and end the process with status 0. Does nothing
    // before init().
    void populateFromCommandLine();
    // Writes popt's help to standard error. Does nothing before init().
    void printHelp();

    // Checks whether this start-up information can be used: 0, or the negative code of the first
    // failure. Reads the file system, changes nothing.
    int validate() const;
    // The message for a code of validate(); "" for any other. The text is never freed.
    static const char* getErrorMessage(int code);
    // Whether there was an unknown option since init().
    bool isError() const { return _optionsError; }

    Pathname getKorvexHome() const { return _korvexHome; }           // installation home
    Pathname getKorvexDb() const { return _korvexDb; }               // database directory
    std::string getComponentName() const { return _componentName; }  // the component to run as
    std::string getInstallName() const { return _installName; }      // configuration subdirectory
    std::string getStartupMode() const { return _startupMode; }      // free text
    std::string getHost() const { return _host; }                    // override; usually empty
    std::int32_t getPort() const { return _rpcPort; }                // management port
    pid_t getPid() const { return _pid; }                   // the process that called init()
    time_t getStartupTime() const { return _startupTime; }  // seconds since the epoch
    bool getDebug() const { return _isDebug; }              // do not dump core on failure
    bool getDaemon() const { return _isDaemon; }            // run as a daemon
    bool getUseDebugLog() const { return _useDebugLog; }  // start with the debug log configuration

    // The configuration node of the component, by reference.
    const XmlNode& getCommonComponentNode() const { return _commonComponentNode; }
    XmlNode& getCommonComponentNode() { return _commonComponentNode; }
    // Stores a copy.
    void setCommonComponentNode(const XmlNode& node);

    // The configuration directory ("etc" below the home, or what -c names), and that of this
    // installation below it.
    Pathname getCommonConfigPath() const;
    Pathname getInstallConfigPath() const;

    // The first call in main() of a command-line tool. Calls init() and populateFromEnvironment(),
    // and initialises logging by etc/log-cmdline.cfg below the home. Prints the path of that file
    // on standard output. If there is no home, prints a message there and ends the process with
    // status 255. Neither parses the command line nor validates. `envp` is not used.
    static void common_main_setup(int argc, const char* const* argv, const char* const* envp);

  private:
    class CommandLine;

    static LoaderInfo* _instance;

    Pathname _korvexHome;
    Pathname _korvexDb;
    std::string _componentName;
    Pathname _commonConfigPath;
    std::string _installName;
    std::int32_t _rpcPort = 0;
    pid_t _pid = 0;
    time_t _startupTime = 0;
    std::string _host;
    XmlNode _commonComponentNode;
    bool _isDebug = false;
    bool _useDebugLog = false;
    bool _isDaemon = false;
    std::string _startupMode;
    std::unique_ptr<CommandLine> _commandLine;  // null before init()
    bool _optionsError = false;
};

}  // KORVEX_NAMESPACE(korvex)
