#pragma once

#include <korvex/util/Logger/LogAppender.h>

inline namespace korvex {

// Marks, for its scope, that this thread is reporting a failure of `appender` (null: a problem
// that is no appender's), so that the report goes round every appender that has failed already
// and two broken appenders cannot report into each other for ever.
class ReportingMark {
  public:
    explicit ReportingMark(const LogAppender* appender) : _appender(appender), _below(_top) {
        _top = this;
    }
    ReportingMark(const ReportingMark&) = delete;
    ReportingMark& operator=(const ReportingMark&) = delete;
    ~ReportingMark() { _top = _below; }

    // Whether this thread is reporting a failure of the appender.
    static bool covers(const LogAppender* appender) {
        for (const ReportingMark* mark = _top; mark != nullptr; mark = mark->_below) {
            if (mark->_appender == appender) return true;
        }
        return false;
    }

  private:
    const LogAppender* const _appender;
    const ReportingMark* const _below;

    // A plain pointer: it needs no construction and no destruction, so it works in exit handlers
    // and in ending threads.
    static inline thread_local const ReportingMark* _top = nullptr;
};

}  // namespace korvex
