#pragma once

#include <korvex/Export.h>
#include <korvex/util/Logger/LogLevel.h>
#include <korvex/util/Timeval.h>

KORVEX_NAMESPACE(korvex) {

class Logger;

// The facts about one message that the layouts need. A plain value; it does not own its logger.
class LogMsgMetadata {
  public:
    // Takes the current time as the stamp of the message. `logger` must outlive this object. Aborts
    // if the clock fails, as Timeval does.
    LogMsgMetadata(const Logger* logger, LogLevel msgLevel) : category(logger), level(msgLevel) {}

    CurrentTimeval stamp;    // when the message was logged
    const Logger* category;  // the logger that emitted it; its name is printed as the category
    LogLevel level;          // its severity
};

}  // KORVEX_NAMESPACE(korvex)
