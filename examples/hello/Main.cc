#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

// A command-line tool: logs by $KORVEX_HOME/etc/log-cmdline.cfg and takes the library's options.
int main(int argc, char** argv, char** envp) {
    LoaderInfo::common_main_setup(argc, argv, envp);
    LoaderInfo& info = *LoaderInfo::getInstance();
    info.populateFromCommandLine();
    Logger logger("hello");
    const int code = info.validate();
    if (code != 0) logger.fatal("%s", LoaderInfo::getErrorMessage(code));
    if (info.isError()) info.printHelp();
    if (code != 0 || info.isError()) return 1;
    logger.info("hello, %s", info.getComponentName().c_str());
    return 0;
}
