#include <korvex/util/Logger.h>

#include "base/NeverDestroyed.h"
#include "util/Logger/AppenderOutput.h"
#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/AppenderReport.h"
#include "util/Logger/RootObjects.h"

#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <string_view>
#include <vector>

inline namespace korvex {

LayoutList& layouts() {
    static NeverDestroyed<LayoutList> instance;
    return *instance;
}

namespace {

constexpr std::string_view shome = "${KORVEX_HOME}";

Pathname expandHome(std::string_view val, const Pathname& korvexHome) {
    if (korvexHome.empty() || val.substr(0, shome.size()) != shome) {
        return Pathname(std::string(val));
    }
    return Pathname(korvexHome + std::string(val.substr(shome.size())));
}

const LogFormat* makeLayout(const char* pattern) {
    layouts().push_back(std::make_unique<const LogFormat>(pattern));
    return layouts().back().get();
}

// The layout of that name; null for "PatternLayout", whose pattern is an attribute of its own.
// False when there is no such name.
bool findNamedLayout(std::string_view name, const LogFormat*& layout) {
    layout = nullptr;
    if (name == "BasicLayout") {
        static const LogFormat* const bl = makeLayout("%R %p %c %m%n");
        layout = bl;
        return true;
    }
    if (name == "SimpleLayout") {
        static const LogFormat* const sl = makeLayout("%-8p: %m%n");
        layout = sl;
        return true;
    }
    return name == "PatternLayout";
}

// A number beyond 32 bits is more backups than anybody has: it counts as the largest.
std::uint32_t saturated(const char* digits) {
    const unsigned long long n = std::strtoull(digits, nullptr, 10);
    constexpr unsigned long long most = std::numeric_limits<std::uint32_t>::max();
    return static_cast<std::uint32_t>(std::min(n, most));
}

}  // namespace

bool LogAppender::setAttribute(const std::string& aname, const char* val,
                               const Pathname& korvexHome) {
    if (aname == "fileName") {
        if (this != &rootAppender()) _output->replace(FileDescriptor());
        _filename = expandHome(val, korvexHome);
        return true;
    }
    if (aname == "maxFileSize") {
        if (!isValidUint(val)) return false;
        // Beyond the signed range the limit turns negative and so, like 0, is none.
        _maxSize = static_cast<std::int64_t>(std::strtoull(val, nullptr, 10));
        return true;
    }
    if (aname == "maxBackupIndex") {
        if (!isValidUint(val)) return false;
        _maxBackupIndex = saturated(val);
        return true;
    }
    if (aname == "layout") {
        const LogFormat* named = nullptr;
        if (!findNamedLayout(val, named)) return false;
        if (named != nullptr) _fmt = named;
        return true;
    }
    if (aname == "layout.ConversionPattern") {
        _fmt = makeLayout(val);
        return true;
    }
    return false;
}

std::vector<const char*> LogAppender::settle() {
    std::vector<const char*> warnings;
    if (_fmt == nullptr) _fmt = &rootAppender().layout();
    if (_filename.empty()) {
        if (!_output->valid()) {
            warnings.push_back("has no filename, assuming stderr");
            _output->replace(FileDescriptor(STDERR_FILENO));
        }
        if (_maxBackupIndex != 0) {
            warnings.push_back("has maxBackupIndex set without specifying a filename, ignoring");
            _maxBackupIndex = 0;
        }
        if (_maxSize > 0) {
            warnings.push_back("has maxSize set without specifying a filename, ignoring");
            _maxSize = 0;
        }
    }
    if (_maxBackupIndex != 0 && _maxSize == 0) {
        warnings.push_back("has maxBackupIndex set without specifying maxSize, ignoring");
        _maxBackupIndex = 0;
    }
    return warnings;
}

void LogAppender::finalSetup(const char* name) {
    for (const char* const warning : settle())
        LogFormat::internal(this, WARN, "Appender \"%s\" %s", name, warning);
    if (writesToFile()) {
        Report report(this);
        _output->testOpen(report);
        report.deliver();
    }
}

}  // namespace korvex
