#pragma once

#include <korvex/util/Logger.h>

#include <cerrno>
#include <string>
#include <vector>

inline namespace korvex {

// The failures that happen while an appender holds its lock. Their text is made at once, with the
// errno of the failed call. They are delivered when the lock is free, because a report may take the
// locks of other appenders.
class KORVEX_HIDDEN LogAppender::Report {
  public:
    explicit Report(const LogAppender* appender) : _appender(appender) {}

    void error(const char* fmt, const Pathname& file) __attribute__((format(printf, 2, 0))) {
        note(ERROR, fmt, file);
    }
    void crit(const char* fmt, const Pathname& file) __attribute__((format(printf, 2, 0))) {
        note(CRIT, fmt, file);
    }
    void deliver() const {
        for (const Note& note : _notes)
            LogFormat::internal(_appender, note.level, "%s", note.text.c_str());
    }

  private:
    struct Note {
        LogLevel level;
        std::string text;
    };

    void note(LogLevel level, const char* fmt, const Pathname& file)
        __attribute__((format(printf, 3, 0))) {
        const int errnum = errno;
        _notes.push_back({level, {}});
        Logger::format(_notes.back().text, errnum, fmt, file.c_str());
    }

    const LogAppender* const _appender;
    std::vector<Note> _notes;  // a line that was cut, and then a new file that cannot be opened
};

}  // namespace korvex
