#pragma once

#include <korvex/Export.h>
#include <korvex/util/Logger/LogLevel.h>

#include <cstdarg>
#include <list>
#include <string>
#include <vector>

KORVEX_NAMESPACE(korvex) {

class CachedTm;
class LayoutPieces;
class LogAppender;
class LogChannel;
class LogFormattedDate;
class LogMsgMetadata;
class Logger;

// A message layout, compiled once from a pattern of literal text and conversions:
//
//   %m message          %n newline              %% percent sign
//   %c channel name     %p level name           %t name of the calling thread
//   %r milliseconds since epoch_timeval()       %R the same in seconds, cut
//   %u the value of clock(3)                    %d{layout} local date, see LogFormattedDate
//
// Between % and the letter may stand: a flag (- pads with blanks after the text, 0 pads with zeros
// before it), a minimum width, and a precision (".n") beyond which the text is cut. A text that was
// cut is never padded. Unknown letters and unfinished conversions print nothing.
//
// Immutable after construction. apply() may be called from several threads at once.
class LogFormat {
  public:
    // Copies and compiles the pattern. Every pattern is accepted. Throws std::bad_alloc.
    explicit LogFormat(const char* pattern);
    LogFormat(const LogFormat&) = delete;
    LogFormat& operator=(const LogFormat&) = delete;
    ~LogFormat();

    // Appends the formatted line to `out`. If the stamp is before the epoch, %r and %R print very
    // large numbers, because the difference is unsigned. Throws what LogFormattedDate::fmt throws,
    // and std::bad_alloc.
    void apply(std::string& out, const LogMsgMetadata& md, const std::string& msg) const;

    // The text of the pattern.
    const std::string& pattern() const { return _fmt; }

    // What every message goes through: the test of the level, the metadata, the channel of the
    // logger. The message goes to standard error instead if the logger is not constructed yet, if
    // its channel throws, or in a signal handler that interrupted its own thread in logging. Never
    // throw, keep errno. The second form formats as Logger::vformat does, after the test of the
    // level; %m is the errno at the call. If memory for the formatting runs out, the message is
    // dropped.
    static void do_log(Logger* logger, LogLevel level, const std::string& text) noexcept;
    static void do_log(Logger* logger, LogLevel level, const char* fmt, va_list ap) noexcept
        __attribute__((format(printf, 3, 0)));

    // Logs a message of the logging system itself on the channel "Logger". It skips the appender
    // `skip` (null for none), and the appenders that failed in the report that this thread is
    // delivering. If no appender could write the message, it goes to standard error. Never throws,
    // keeps errno.
    static void internal(const LogAppender* skip, LogLevel level, const char* fmt, ...) noexcept
        __attribute__((format(printf, 3, 4)));

    // True if a message through `logger` must go directly to standard error: logging is not
    // initialised, and `logger` is not constructed yet (a static object of a source file whose
    // initialisers have not run). Takes a lock only before initialisation.
    static bool check_for_unitialized_logger(const Logger* logger);

  private:
    struct Atom {
        enum What {
            MSG = 0,
            STR = 1,
            CATEGORY = 2,
            LEVEL = 3,
            THREADNAME = 4,
            EPOCH_MSEC = 5,
            EPOCH_SEC = 6,
            TIME_PROC = 7,
            TIME_FMT = 8
        };
        What what;
        union {
            const char* str;                // STR: points into _fmt, or at a constant
            const LogFormattedDate* fdate;  // TIME_FMT: owned by _dates
        } arg;
        unsigned long slen;  // STR: the length of arg.str
        unsigned int minw;   // shorter texts are padded
        unsigned int maxw;   // longer texts are cut; all bits set: unlimited
        char justify;        // what pads before the text; 0: blanks after it
    };
    class Compiler;
    class Line;
    friend class LayoutPieces;  // shows the atoms to the tools

    // Whether the message is to be written, and in *taker by whom: a channel, or null for standard
    // error.
    static bool findTaker(const Logger& logger, LogLevel level, LogChannel*& taker);

    Atom* new_atom();

    std::string _fmt;
    std::vector<Atom> _atoms;
    std::list<LogFormattedDate> _dates;
};

}  // KORVEX_NAMESPACE(korvex)
