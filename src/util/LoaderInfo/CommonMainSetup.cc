#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>

#include <cstdio>
#include <cstdlib>

inline namespace korvex {

void LoaderInfo::common_main_setup(int argc, const char* const* argv, const char* const* /*envp*/) {
    LoaderInfo& info = *getInstance();
    info.init(argc, argv);
    info.populateFromEnvironment();
    const Pathname home = info.getKorvexHome();
    if (home.empty()) {
        std::puts("KORVEX_HOME must be set.  Stopping.");
        std::exit(-1);
    }
    // Always this file, whatever the options say: they are not parsed yet.
    const Pathname conffile = home / "etc" / "log-cmdline.cfg";
    std::printf("Using logging configuration at %s.\n", conffile.c_str());
    Logger::initialize(conffile, home);
}

}  // namespace korvex
