// Reads the environment and the command line, and says what came of it.
#include <korvex/util/LoaderInfo.h>

#include <cstdio>

int main(int argc, char** argv) {
    LoaderInfo& info = *LoaderInfo::getInstance();
    info.init(argc, argv);
    info.populateFromEnvironment();
    info.populateFromCommandLine();
    if (info.isError()) return 2;
    if (const int code = info.validate()) {
        std::fprintf(stderr, "%s\n", LoaderInfo::getErrorMessage(code));
        return 1;
    }
    std::printf("%s, port %d, mode \"%s\",%s daemon,%s debug log, %s\n",
                info.getComponentName().c_str(), info.getPort(), info.getStartupMode().c_str(),
                info.getDaemon() ? "" : " no", info.getUseDebugLog() ? "" : " no",
                info.getInstallConfigPath().c_str());
}
