#pragma once

#include <korvex/Export.h>
#include <korvex/util/Logger/LogLevel.h>

#include <atomic>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class LogAppender;
class LogMsgMetadata;

// What a Logger writes to: a minimum level and a list of appenders. Every message of that level or
// above goes to each appender. A channel without appenders writes to the root appender (standard
// error).
//
// write(), passes(), find() and changeLevel() may be called from any thread. Call setConfig()
// during start-up, before other threads log. Channels made by find() live until the process ends.
class LogChannel {
  public:
    // Accepts INFO and above; has no appenders.
    LogChannel();
    // Copies the level and the list of appenders (not the appenders).
    LogChannel(const LogChannel& other);
    LogChannel& operator=(const LogChannel&) = delete;
    ~LogChannel() = default;

    // The channel registered under that name. If there is none: with `create`, a new one that
    // starts as a copy of the present root channel; without, the root channel. Never null. Names
    // are flat: "a.b" has no parent "a". Throws std::bad_alloc.
    static LogChannel* find(const std::string& name, bool create);
    static LogChannel* find(const char* name, bool create);

    // Applies a configuration value: words separated by blanks, tabs and commas. Each is a level or
    // the name of an appender. The first appender replaces the present list. False if a word is
    // neither; the other words are applied nevertheless.
    bool setConfig(const char* cstr);

    // Sets the minimum to the level with that name in upper case. For any other word the result is
    // false and nothing changes.
    bool changeLevel(const std::string& word);

    // Whether the channel accepts messages of this level. One comparison.
    bool passes(LogLevel level) const {
        // Relaxed: the level guards no other data. A change that is seen late affects one line.
        return level >= minlevel.load(std::memory_order_relaxed);
    }

    // The minimum.
    LogLevel level() const { return minlevel.load(std::memory_order_relaxed); }
    // Where messages go, in order. Empty means the root appender. Only setConfig() changes it.
    const std::vector<LogAppender*>& appenders() const { return _appenders; }

    // Gives the message, whatever its level, to each appender in order. Throws what
    // LogAppender::write throws.
    void write(const LogMsgMetadata& mdata, const std::string& msg);

    // The same, but skips `dont_touch`, and the appenders that failed in the report that this
    // thread is delivering. Returns whether an appender has written the whole line.
    bool write(const LogMsgMetadata& mdata, const std::string& msg, const LogAppender* dont_touch);

  private:
    bool applyConfWord(const std::string& word, bool* got_appender_p);

    std::atomic<LogLevel> minlevel;
    std::vector<LogAppender*> _appenders;  // not owned; empty: the root appender
};

}  // KORVEX_NAMESPACE(korvex)
