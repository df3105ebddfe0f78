#pragma once

inline namespace korvex {

// A child of fork(2) inherits the locks as they were, but not the threads that would unlock them.
// So the locks of the logging system are taken before a fork, and freed in the parent and in the
// child. Objects that a line may need are built before the fork. So the child can log. An appender
// that was not made by LogAppender::find() is not included.
//
// The handlers are registered before any static initialiser runs (platform/AtFork.h). Handlers of
// the program may always log: the thread that forks holds the locks, and takes none.
class LoggingLocks {
  public:
    static void takeAll();
    static void freeAll();

  private:
    static void buildAll();
};

}  // namespace korvex
