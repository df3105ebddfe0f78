#pragma once

#include <korvex/util/Logger/LogAppender.h>

#include <vector>

inline namespace korvex {

// Marks, for its scope, that this thread is delivering a report: one of the logging system's own
// messages. An appender that fails meanwhile reports that in turn, within the scope; so the
// outermost mark remembers who has failed, and such an appender is not tried again before that
// scope ends. Each failure is told once, and any number of broken appenders come to an end.
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

    // Whether the appender has failed, and so is not to be tried, in the report that this thread is
    // delivering just now.
    static bool hasFailed(const LogAppender* appender) {
        return _top != nullptr && _top->remembers(appender);
    }

  private:
    void remember(const LogAppender* failed) noexcept {
        try {
            _failed.push_back(failed);
        } catch (...) {  // no memory: then nobody is tried, and standard error tells
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
