#pragma once

#include <korvex/util/Logger/LogChannel.h>
#include <korvex/util/ThreadObj.h>

#include <map>
#include <memory>
#include <string>

inline namespace korvex {

// Every channel made by name; never destroyed. Channels are made at any time by setChannelLevel and
// looked up by loggers being built, so this map, unlike the appenders', has a lock.
struct ChannelRegistry {
    static ChannelRegistry& instance();

    Mutex mutex;
    std::map<std::string, std::unique_ptr<LogChannel>> channels KORVEX_GUARDED_BY(mutex);
};

}  // namespace korvex
