#pragma once

#include <korvex/util/Logger.h>

#include <string>

inline namespace korvex {

// A failure met while an appender holds its lock: put into words at once, with the errno of the
// failed call, and delivered when the lock is free, because the way of the report may lead through
// other appenders' locks.
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
        if (_pending) LogFormat::internal(_appender, _level, "%s", _text.c_str());
    }

  private:
    void note(LogLevel level, const char* fmt, const Pathname& file)
        __attribute__((format(printf, 3, 0))) {
        Logger::format(_text, fmt, file.c_str());
        _level = level;
        _pending = true;
    }

    const LogAppender* const _appender;
    bool _pending = false;
    LogLevel _level{};
    std::string _text;
};

}  // namespace korvex
