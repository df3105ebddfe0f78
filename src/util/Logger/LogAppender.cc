#include <korvex/util/Logger.h>

#include "base/ThreadText.h"
#include "util/Logger/AppenderOutput.h"
#include "util/Logger/AppenderReport.h"
#include "util/Logger/RootObjects.h"

inline namespace korvex {

LogAppender::LogAppender() : LogAppender(FileDescriptor()) {}

LogAppender::LogAppender(FileDescriptor fd, const LogFormat* layout)
    : _fmt(layout), _output(new Output(*this, fd)) {}

LogAppender::~LogAppender() noexcept {
    delete _output;
}

// The root appender stays what it is, whatever file name it was given.
bool LogAppender::writesToFile() const {
    return !_filename.empty() && this != &rootAppender();
}

// The report of another appender may arrive before this one's configuration is complete.
const LogFormat& LogAppender::layout() const {
    return _fmt != nullptr ? *_fmt : rootAppender().layout();
}

void LogAppender::write(const LogMsgMetadata& mdata, const std::string& msg) {
    tryWrite(mdata, msg);
}

bool LogAppender::tryWrite(const LogMsgMetadata& mdata, const std::string& msg) {
    ThreadText m;
    layout().apply(*m, mdata, msg);
    Report report(this);
    const bool written = _output->write(*m, mdata.stamp.sec(), report);
    report.deliver();
    return written;
}

}  // namespace korvex
