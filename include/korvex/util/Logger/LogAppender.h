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
// error). Appenders that find() made live until the process ends and may be shared by channels.
//
// write() may be called from any thread; everything else belongs to start-up, before other threads
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

    // "rootAppender" is the process's own appender on standard error; any other name the appender
    // registered under it. When there is none, a new one is made if `create` is true, else the
    // result is null. The result is never freed. Throws std::bad_alloc.
    static LogAppender* find(const std::string& name, bool create);

    // Applies one attribute of the configuration; false, and nothing changed, when the attribute
    // is unknown or the value unacceptable.
    //
    //   fileName                  any path; a leading "${KORVEX_HOME}" becomes korvexHome unless
    //                             that is empty. Closes the file in use; a descriptor
    //                             that was handed in is let go, not closed.
    //   maxFileSize               bytes beyond which the file is rotated; 0: never. isValidUint().
    //   maxBackupIndex            how many numbered backups are kept. isValidUint(); a number
    //                             beyond 32 bits counts as 4294967295.
    //   layout                    "BasicLayout", "SimpleLayout" or "PatternLayout"
    //   layout.ConversionPattern  a LogFormat pattern
    //
    // The last line that sets the layout wins; "PatternLayout" sets none. The root appender stays
    // on standard error whatever it is told: it opens, closes and rotates nothing.
    bool setAttribute(const std::string& aname, const char* val, const Pathname& korvexHome);

    // Completes the configuration once all attributes are known: the root appender's layout where
    // none was given, standard error where there is no file, warnings (naming the appender `name`)
    // for limits that cannot work, and a test open that creates the file and reports a bad path.
    void finalSetup(const char* name);

    // finalSetup() without the test open and without logging: says what is to be said of the
    // appender ("has no filename, assuming stderr"), in order. A second call finds nothing left.
    std::vector<const char*> settle();

    // What it is configured to do. It writes to a file when it has a name for one and is not the
    // root appender.
    bool writesToFile() const;
    const Pathname& fileName() const { return _filename; }  // empty: none
    std::int64_t maxFileSize() const { return _maxSize; }   // bytes; 0 and below: never rotated
    std::uint32_t maxBackupIndex() const { return _maxBackupIndex; }
    const LogFormat& layout() const;  // the root appender's until one is set

    // Lays the message out and writes it with one write(2), after that rotating a file that has
    // grown beyond its limit. Every five seconds of message time the file's identity is checked
    // (device and inode), so that a file moved away is left and a new one made. Failures, a line
    // that could be written only in part among them, are reported through LogFormat::internal once
    // the lock is released; the message is lost then, and the next one opens the file again. What
    // was written of such a line counts towards the limit. Takes no notice of a lock that fails.
    // Throws what LogFormat::apply throws.
    //
    // Threads write to a regular file at the same time; the kernel puts their lines one behind the
    // other. The line that passes the limit is the last one of its file.
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
