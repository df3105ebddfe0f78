#pragma once

#include <korvex/Export.h>
#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Logger/LogLevel.h>
#include <korvex/util/Pathname.h>

#include <cstdint>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class LogFormat;
class LogMsgMetadata;

// One destination of messages: a file that is rotated by size, or an open descriptor (standard
// error). Appenders made by find() live until the process ends. Several channels may share one.
//
// write() may be called from any thread. Call everything else during start-up, before other threads
// log.
class LogAppender {
  public:
    // An appender without descriptor, file, limits or layout. Throws std::bad_alloc.
    LogAppender();
    // An appender that writes to an open descriptor, which it neither owns nor closes, with a
    // layout that must outlive it; null: the root appender's. Throws std::bad_alloc.
    explicit LogAppender(FileDescriptor fd, const LogFormat* layout = nullptr);
    LogAppender(const LogAppender&) = delete;
    LogAppender& operator=(const LogAppender&) = delete;
    // Closes the file, if it opened one.
    ~LogAppender() noexcept;

    // The appender registered under that name. "rootAppender" is always there: it writes to
    // standard error. If there is none of that name, a new one is made when `create` is true, else
    // the result is null. The result is never freed. Throws std::bad_alloc.
    static LogAppender* find(const std::string& name, bool create);

    // Applies one attribute of the configuration. False, with nothing changed, if the attribute is
    // unknown or the value invalid.
    //
    //   fileName                  any path; a leading "${KORVEX_HOME}" becomes korvexHome unless
    //                             that is empty. Closes the file in use; a descriptor
    //                             given to the constructor is dropped, not closed.
    //   maxFileSize               bytes beyond which the file is rotated; 0: never. isValidUint().
    //   maxBackupIndex            how many numbered backups are kept. isValidUint(); a number
    //                             beyond 32 bits counts as 4294967295.
    //   layout                    "BasicLayout", "SimpleLayout" or "PatternLayout"
    //   layout.ConversionPattern  a LogFormat pattern
    //
    // The last call that sets the layout wins; "PatternLayout" sets none. The root appender always
    // writes to standard error: it opens, closes and rotates nothing.
    bool setAttribute(const std::string& aname, const char* val, const Pathname& korvexHome);

    // Completes the configuration when all attributes are known: without a layout it takes that of
    // the root appender, without a file it takes standard error. Logs warnings (with the name
    // `name`) for limits that cannot work. Opens the file once for a test, which creates it and
    // reports a bad path.
    void finalSetup(const char* name);

    // finalSetup() without the test open and without logging: returns the warnings ("has no
    // filename, assuming stderr"), in order. A second call returns none.
    std::vector<const char*> settle();

    // What it is configured to do. It writes to a file when it has a name for one and is not the
    // root appender.
    bool writesToFile() const;
    const Pathname& fileName() const { return _filename; }  // empty: none
    std::int64_t maxFileSize() const { return _maxSize; }   // bytes; 0 and below: never rotated
    std::uint32_t maxBackupIndex() const { return _maxBackupIndex; }
    const LogFormat& layout() const;  // the root appender's until one is set

    // Formats the message by the layout, writes it with one write(2), then rotates the file if it
    // has grown beyond its limit. Every five seconds of message time, checks by device and inode
    // whether the open file is still the one of that name; if not, closes it and opens a new one.
    // Failures, partly written lines included, are reported through LogFormat::internal when the
    // lock is free. Such a message is lost, and the next one opens the file again. The part that
    // was written of such a line counts towards the limit. If a lock cannot be taken, it writes
    // without it. Throws what LogFormat::apply throws.
    //
    // Several threads may write to a regular file at the same time; the kernel puts their lines in
    // order. The line that passes the limit is the last one of its file.
    void write(const LogMsgMetadata& mdata, const std::string& msg);

  private:
    class Output;
    class Report;

    friend class LogChannel;
    friend class LoggingLocks;

    // write(), and whether all of the line was written.
    bool tryWrite(const LogMsgMetadata& mdata, const std::string& msg);

    Pathname _filename;                 // empty: no file, only the descriptor
    std::int64_t _maxSize = 0;          // bytes; 0: never rotate
    std::uint32_t _maxBackupIndex = 0;  // number of backups kept
    const LogFormat* _fmt = nullptr;    // not owned; layouts are shared and never freed
    bool _registered = false;           // made by find(), so the lock is taken before a fork
    Output* const _output;              // owned: the descriptor, and who may write to it
};

}  // KORVEX_NAMESPACE(korvex)
