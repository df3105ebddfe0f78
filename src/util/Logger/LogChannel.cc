#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/Logger/LogChannel.h>
#include <korvex/util/Logger/LogMsgMetadata.h>

#include "base/NeverDestroyed.h"
#include "util/Logger/ChannelRegistry.h"
#include "util/Logger/LevelWords.h"
#include "util/Logger/LoggingLock.h"
#include "util/Logger/Reporting.h"
#include "util/Logger/RootObjects.h"

#include <cstring>
#include <memory>

inline namespace korvex {

ChannelRegistry& ChannelRegistry::instance() {
    static NeverDestroyed<ChannelRegistry> registry;
    return *registry;
}

LogChannel::LogChannel() : minlevel(INFO) {}

LogChannel::LogChannel(const LogChannel& other)
    : minlevel(other.minlevel.load(std::memory_order_relaxed)), _appenders(other._appenders) {}

LogChannel* LogChannel::find(const std::string& name, bool create) {
    ChannelRegistry& known = ChannelRegistry::instance();
    const LoggingLock lock(known.mutex);
    const auto found = known.channels.find(name);
    if (found != known.channels.end()) return found->second.get();
    if (!create) return &rootChannel();
    auto channel = std::make_unique<LogChannel>(rootChannel());
    return known.channels.emplace(name, std::move(channel)).first->second.get();
}

LogChannel* LogChannel::find(const char* name, bool create) {
    return find(std::string(name), create);
}

bool LogChannel::setConfig(const char* cstr) {
    static constexpr char separators[] = " \t,";
    bool got_appender = false;
    bool ok = true;
    for (const char* p = cstr + std::strspn(cstr, separators); *p != '\0';) {
        const std::size_t length = std::strcspn(p, separators);
        if (!applyConfWord(std::string(p, length), &got_appender)) ok = false;
        p += length;
        p += std::strspn(p, separators);
    }
    return ok;
}

// A level's name is always a level, even where an appender bears the same name.
bool LogChannel::applyConfWord(const std::string& word, bool* got_appender_p) {
    if (changeLevel(word)) return true;
    LogAppender* const appender = LogAppender::find(word, false);
    if (appender == nullptr) return false;
    if (!*got_appender_p) {
        _appenders.clear();
        *got_appender_p = true;
    }
    _appenders.push_back(appender);
    return true;
}

bool LogChannel::changeLevel(const std::string& word) {
    for (const LevelWord& entry : kLevelWords) {
        if (entry.word == word) {
            minlevel.store(entry.level, std::memory_order_relaxed);
            return true;
        }
    }
    return false;
}

void LogChannel::write(const LogMsgMetadata& mdata, const std::string& msg) {
    if (_appenders.empty()) rootAppender().write(mdata, msg);
    for (LogAppender* const appender : _appenders)
        appender->write(mdata, msg);
}

bool LogChannel::write(const LogMsgMetadata& mdata, const std::string& msg,
                       const LogAppender* dont_touch) {
    bool written = false;
    const auto offer = [&](LogAppender& appender) {
        if (&appender == dont_touch || ReportingMark::hasFailed(&appender)) return;
        if (appender.tryWrite(mdata, msg)) written = true;
    };
    if (_appenders.empty()) offer(rootAppender());
    for (LogAppender* const appender : _appenders)
        offer(*appender);
    return written;
}

}  // namespace korvex
