#pragma once

// Attributes for clang's thread-safety analysis (-Wthread-safety): which lock guards what, and
// which functions take and free it. For other compilers they are empty. Source:
// https://clang.llvm.org/docs/ThreadSafetyAnalysis.html
#if defined(__clang__)
#define KORVEX_THREAD_SAFETY(attribute) __attribute__((attribute))
#else
#define KORVEX_THREAD_SAFETY(attribute)
#endif

// A class whose objects are locks, and one whose objects hold a lock for a scope.
#define KORVEX_CAPABILITY(name) KORVEX_THREAD_SAFETY(capability(name))
#define KORVEX_SCOPED_CAPABILITY KORVEX_THREAD_SAFETY(scoped_lockable)
// A variable that is used only while the lock is held, and a function that is called only then.
#define KORVEX_GUARDED_BY(lock) KORVEX_THREAD_SAFETY(guarded_by(lock))
#define KORVEX_REQUIRES(...) KORVEX_THREAD_SAFETY(requires_capability(__VA_ARGS__))
#define KORVEX_REQUIRES_SHARED(...) KORVEX_THREAD_SAFETY(requires_shared_capability(__VA_ARGS__))
// A function that must not be called while the lock is held, because it takes the lock itself.
#define KORVEX_EXCLUDES(...) KORVEX_THREAD_SAFETY(locks_excluded(__VA_ARGS__))
// Functions that take a lock, may take it, and free it.
#define KORVEX_ACQUIRE(...) KORVEX_THREAD_SAFETY(acquire_capability(__VA_ARGS__))
#define KORVEX_TRY_ACQUIRE(...) KORVEX_THREAD_SAFETY(try_acquire_capability(__VA_ARGS__))
#define KORVEX_RELEASE(...) KORVEX_THREAD_SAFETY(release_capability(__VA_ARGS__))
// The same for a lock that several threads may hold at the same time.
#define KORVEX_TRY_ACQUIRE_SHARED(...) \
    KORVEX_THREAD_SAFETY(try_acquire_shared_capability(__VA_ARGS__))
#define KORVEX_RELEASE_SHARED(...) KORVEX_THREAD_SAFETY(release_shared_capability(__VA_ARGS__))
// A function that the analysis cannot follow. A comment at the function says why it is correct.
#define KORVEX_NO_THREAD_SAFETY_ANALYSIS KORVEX_THREAD_SAFETY(no_thread_safety_analysis)
