#pragma once

#include <korvex/util/Logger/LogChannel.h>
#include <korvex/util/ThreadObj.h>

#include <map>
#include <memory>
#include <string>

inline namespace korvex {

// All channels made by name; never destroyed. setChannelLevel makes channels at any time, and
// loggers look them up when they are constructed. So this map has a lock, unlike the one of the
// appenders.
struct ChannelRegistry {
    static ChannelRegistry& instance();

    Mutex mutex;
    std::map<std::string, std::unique_ptr<LogChannel>> channels KORVEX_GUARDED_BY(mutex);
};

}  // namespace korvex
