#pragma once

inline namespace korvex {

// A child of fork(2) has the locks as they were and none of the threads that would free them. So
// the logging system's are taken before a fork and freed on both sides of it, and whatever else a
// line may need is built before: the child can log. An appender that was not made by
// LogAppender::find() is its owner's business.
//
// Arranged for before any static initialiser runs (platform/AtFork.h). Handlers of the program may
// log, whenever they run: the forking thread has the locks then and takes none.
class LoggingLocks {
  public:
    static void takeAll();
    static void freeAll();

  private:
    static void buildAll();
};

}  // namespace korvex
