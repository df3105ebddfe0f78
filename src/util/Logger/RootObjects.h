#pragma once

#include <korvex/util/Logger/LogAppender.h>
#include <korvex/util/Logger/LogChannel.h>
#include <korvex/util/Logger/LogFormat.h>

inline namespace korvex {

// The defaults of logging. Built at first use, never destroyed.

const LogFormat& defaultFormat();  // "%m%n"
LogAppender& rootAppender();       // standard error, laid out by defaultFormat
LogChannel& rootChannel();         // INFO, no appenders: the channel of every unbound logger

}  // namespace korvex
