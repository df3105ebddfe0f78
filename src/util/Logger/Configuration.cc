#include <korvex/util/Logger.h>

#include "base/Assert.h"
#include "base/Stream.h"
#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/ConfigReader.h"
#include "util/Logger/EarlyLoggers.h"
#include "util/Logger/RootObjects.h"

#include <cerrno>
#include <cstdio>
#include <memory>

inline namespace korvex {

namespace {

void reportParseErrors(const Pathname& conffile, const DeferedLogConfList& parse_errors) {
    for (const DeferedLogConf& error : parse_errors) {
        LogFormat::internal(nullptr, WARN, "%s:%u: Parse error at \"%s\"", conffile.c_str(),
                            error.lineno, error.context.c_str());
    }
}

}  // namespace

void Logger::initialize() {
    EarlyLoggers::initialize();
}

bool Logger::initialize(const Pathname& conffile, const Pathname& korvexHome) {
    KORVEX_ASSERT(!logger_initialized);
    epoch_timeval();
    Stream file(conffile.fopen("r"));
    if (!file) {
        const int error = errno;
        initialize();
        errno = error;
        __extension__ LogFormat::internal(
            nullptr, ERROR, "Couldn't open log file configuration \"%s\": %m", conffile.c_str());
        return false;
    }
    ConfigReader reader(file.get(), korvexHome);
    reader.readAll();
    file.reset();
    reader.applyRoot();
    reader.applyCategories();
    initialize();
    for (const auto& [name, appender] : appenders())
        appender->finalSetup(name.c_str());
    const bool success = reader.xml_comment_startline() == ConfigLines::kNone;
    if (!success) {
        LogFormat::internal(nullptr, ERROR, "%s:%u: Unterminated XML comment started",
                            conffile.c_str(), reader.xml_comment_startline());
    }
    reportParseErrors(conffile, reader.parse_errors());
    return success;
}

bool Logger::setChannelLevel(const char* channel, const std::string& levelstr) {
    LogChannel& target = channel == nullptr ? rootChannel() : *LogChannel::find(channel, true);
    return target.changeLevel(levelstr);
}

}  // namespace korvex
