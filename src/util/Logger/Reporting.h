#pragma once

#include <korvex/util/Logger/LogAppender.h>

#include <vector>

inline namespace korvex {

// Marks, for a scope, that this thread is delivering a report: a message of the logging system
// itself. If an appender fails meanwhile, that failure is reported too, within the scope. The
// outermost object remembers the appenders that failed, and these are not tried again before its
// scope ends. So each failure is reported once, and the reports end, however many appenders fail.
class ReportingMark {
  public:
    // `failed` is the appender whose failure is reported; null when it is no appender's.
    explicit ReportingMark(const LogAppender* failed) : _outermost(_top == nullptr) {
        if (_outermost) _top = this;
        if (failed != nullptr) _top->remember(failed);
    }
    ReportingMark(const ReportingMark&) = delete;
    ReportingMark& operator=(const ReportingMark&) = delete;
    ~ReportingMark() {
        if (_outermost) _top = nullptr;
    }

    // Whether the appender failed in the report that this thread is delivering. Then it is not
    // tried again.
    static bool hasFailed(const LogAppender* appender) {
        return _top != nullptr && _top->remembers(appender);
    }

  private:
    void remember(const LogAppender* failed) noexcept {
        try {
            _failed.push_back(failed);
        } catch (...) {  // no memory: no appender is tried; the report goes to standard error
            _everybody = true;
        }
    }
    bool remembers(const LogAppender* appender) const {
        if (_everybody) return true;
        for (const LogAppender* const failed : _failed) {
            if (failed == appender) return true;
        }
        return false;
    }

    const bool _outermost;
    bool _everybody = false;
    std::vector<const LogAppender*> _failed;

    // A plain pointer: it needs no construction and no destruction, so it works in exit handlers
    // and in ending threads.
    static inline thread_local ReportingMark* _top = nullptr;
};

}  // namespace korvex
