#include <korvex/util/LoaderInfo.h>

inline namespace korvex {

int LoaderInfo::validate() const {
    const Pathname common = getCommonConfigPath();
    const Pathname install = getInstallConfigPath();
    if (_korvexHome.empty()) return -1;
    if (_korvexDb.empty()) return -2;
    if (common.empty() || install.empty()) return -3;
    if (!_korvexHome.isAbsolute()) return -4;
    if (!_korvexDb.isAbsolute()) return -5;
    if (!common.isAbsolute() || !install.isAbsolute()) return -6;
    if (!_korvexHome.exists()) return -7;
    if (!_korvexDb.exists()) return -8;
    if (!common.exists() || !install.exists()) return -9;
    if (!_korvexHome.isDir()) return -10;
    if (!_korvexDb.isDir()) return -11;
    if (!common.isDir() || !install.isDir()) return -12;
    if (_componentName.empty()) return -15;
    if (_installName.empty()) return -16;
    return 0;
}

// The codes -13, -14 and -17 have messages although validate() never returns them; other programs
// look them up.
const char* LoaderInfo::getErrorMessage(int code) {
    switch (code) {
        case -1:
            return "The environment variable KORVEX_HOME must not be empty.";
        case -2:
            return "The environment variable KORVEX_DB must not be empty.";
        case -3:
            return "The common config path must be defined in the config file.";
        case -4:
            return "The environment variable KORVEX_HOME must not be a relative path.";
        case -5:
            return "The environment variable KORVEX_DB must not be a relative path.";
        case -6:
            return "The common config path must not be a relative path.";
        case -7:
            return "The environment variable KORVEX_HOME must point to an existing path.";
        case -8:
            return "The environment variable KORVEX_DB must point to an existing path.";
        case -9:
            return "The common config path must point at an existing path.";
        case -10:
            return "The environment variable KORVEX_HOME must point to a directory.";
        case -11:
            return "The environment variable KORVEX_DB must point to a directory.";
        case -12:
            return "The common config path must point to a directory.";
        case -13:
            return "The environment variable KORVEX_HOME must point to a directory that's writable "
                   "the process.";
        case -14:
            return "The environment variable KORVEX_DB must point to a directory that's writable "
                   "the process.";
        case -15:
            return "The component name must not be empty.";
        case -16:
            return "The install name must not be empty.";
        case -17:
            return "The component name was too large for spread.";
        default:
            return "";
    }
}

}  // namespace korvex
