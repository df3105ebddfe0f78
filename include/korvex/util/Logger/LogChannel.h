#pragma once

#include <korvex/Export.h>
#include <korvex/util/Logger/LogLevel.h>

#include <atomic>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class LogAppender;
class LogMsgMetadata;

// What a Logger writes to: a minimum level and the appenders that receive every message that
// passes it; a channel without appenders writes to the root appender (standard error).
//
// write(), passes() and find() may be called from any thread, and so may changeLevel(); setConfig()
// belongs to start-up, before other threads log. Channels that find() made live until the process
// ends.
class LogChannel {
  public:
    // INFO and above, no appenders.
    LogChannel();
    // Copies the level and the list of appenders (not the appenders).
    LogChannel(const LogChannel& other);
    LogChannel& operator=(const LogChannel&) = delete;
    ~LogChannel() = default;

    // The channel registered under the name. When there is none: a new one that starts as a copy
    // of the root channel as it is now, if `create` is true, else the root channel. Never null.
    // Names are flat: "a.b" has no parent "a". Throws std::bad_alloc.
    static LogChannel* find(const std::string& name, bool create);
    static LogChannel* find(const char* name, bool create);

    // Applies a configuration value: words separated by blanks, tabs and commas, each a level or
    // an appender's name. The first appender replaces the present list. False when a word is
    // neither; the other words are applied all the same.
    bool setConfig(const char* cstr);

    // Sets the minimum from a level's name in upper case. False, and nothing changed, for any
    // other word.
    bool changeLevel(const std::string& word);

    // Whether a message of this level is wanted. One comparison.
    bool passes(LogLevel level) const {
        // Relaxed: the level guards no other data; a late change costs one line.
        return level >= minlevel.load(std::memory_order_relaxed);
    }

    // The minimum.
    LogLevel level() const { return minlevel.load(std::memory_order_relaxed); }
    // Where messages go, in order; empty: to the root appender. Changed by setConfig() only.
    const std::vector<LogAppender*>& appenders() const { return _appenders; }

    // Hands the message, whatever its level, to each appender in order. Throws what
    // LogAppender::write throws.
    void write(const LogMsgMetadata& mdata, const std::string& msg);

    // The same, except to dont_touch and to the appenders that have failed in the report that this
    // thread is delivering. Returns whether an appender has written all of it.
    bool write(const LogMsgMetadata& mdata, const std::string& msg, const LogAppender* dont_touch);

  private:
    bool applyConfWord(const std::string& word, bool* got_appender_p);

    std::atomic<LogLevel> minlevel;
    std::vector<LogAppender*> _appenders;  // not owned; empty: the root appender
};

}  // KORVEX_NAMESPACE(korvex)
