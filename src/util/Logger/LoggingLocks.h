#pragma once

inline namespace korvex {

// A child of fork(2) has the locks as they were and none of the threads that would free them. So
// the logging system's are taken before a fork and freed on both sides of it: the child can log.
// An appender that was not made by LogAppender::find() is its owner's business.
class LoggingLocks {
  public:
    // Arranges for that, by pthread_atfork(3), at the first call.
    static void keepThroughForks();

  private:
    static void takeAll();
    static void freeAll();
};

}  // namespace korvex
