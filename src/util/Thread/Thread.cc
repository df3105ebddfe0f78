#include <korvex/util/Thread.h>

#include "base/Assert.h"
#include "platform/AtFork.h"
#include "util/Thread/ActiveThreads.h"
#include "util/Thread/Gate.h"
#include "util/ThreadObj/CheckThreadErrors.h"
#include "util/ThreadObj/ThreadLogger.h"

#include <atomic>
#include <string>

inline namespace korvex {

const std::size_t Thread::s_stackSize = 1048576;

namespace {

constexpr char main_thread_string[] = "Main Thread";

std::atomic<bool> main_thread_created{false};

// Set up by the main thread's object; the attributes of every thread created afterwards.
pthread_attr_t s_threadAttr;

// A child of fork(2) has none of the threads that would unlock these locks. Failures under them are
// logged, so they come before the locks of the logging system.
KORVEX_REGISTERS_THREAD_LOCKS void keepLocksThroughForks() {
    pthread_atfork(&ActiveThreads::takeLocks, &ActiveThreads::freeLocks, &ActiveThreads::freeLocks);
}

void setStackSize(std::size_t bytes) {
    const int rval = pthread_attr_setstacksize(&s_threadAttr, bytes);
    if (rval == 0) return;
    std::string message;
    __extension__ Logger::format(
        message, rval, "cannot override thread stack size: pthread_attr_setstacksize(): %m");
    threadLogger().warn(message);
}

}  // namespace

// The argument of a new operating-system thread. It is not the Thread object, because that may be
// destroyed before the thread reads it.
struct KORVEX_HIDDEN Thread::Start {
    std::shared_ptr<Gate> gate;
};

Thread::Thread()
    : _name(main_thread_string),
      _did_join(true),
      _gate(std::make_shared<Gate>(this, _name)),
      _jhelp(this) {
    _token = PthreadToken::self();
    _gate->open();
    if (main_thread_created.exchange(true)) throw PthreadException("Main Thread created twice!");
    checkPtRes("pthread_attr_init", pthread_attr_init(&s_threadAttr));
    setStackSize(s_stackSize);
}

Thread::Thread(const char* thrname)
    : _name(thrname), _did_join(false), _gate(std::make_shared<Gate>(this, _name)), _jhelp(this) {
    if (!main_thread_created) throw PthreadException("Thread created before main thread!");
    start();
}

void Thread::start() {
    auto arg = std::make_unique<Start>(Start{_gate});
    const int rval = pthread_create(&_token._token, &s_threadAttr, &Thread::callMain, arg.get());
    checkPtRes("pthread_create", rval);
    if (rval != 0) return;  // with checking off: there is no thread to join
    static_cast<void>(arg.release());
    _created = true;
}

Thread::~Thread() noexcept(false) {
    if (_did_join) return;
    KORVEX_ASSERT_AS(!checkThreadErrors.load(std::memory_order_relaxed),
                     "_did_join || !checkThreadErrors");
    if (!_created) return;
    _gate->abandon();
    pthread_detach(_token._token);
}

void* Thread::callMain(void* arg) {
    const std::unique_ptr<Start> start(static_cast<Start*>(arg));
    const bool registered = ActiveThreads::add(*start->gate);
    if (Thread* const thread = start->gate->pass()) thread->main();
    if (!registered) ActiveThreads::forgetCurrent();
    return nullptr;
}

void Thread::main() {}

void Thread::go() {
    _gate->open();
}

void Thread::join() {
    KORVEX_ASSERT(!_did_join);
    _did_join = true;
    if (_created) checkPtRes("pthread_join", pthread_join(_token._token, nullptr));
}

bool Thread::isCurrent() const {
    return _token == PthreadToken::self();
}

bool Thread::operator==(const Thread& other) const {
    return _token == other._token;
}

Thread* Thread::current() {
    const Gate* const gate = ActiveThreads::current();
    return gate != nullptr ? gate->thread() : nullptr;
}

const char* Thread::currentName() {
    const Gate* const gate = ActiveThreads::current();
    return gate != nullptr ? gate->name() : main_thread_string;
}

void Thread::mainThreadDying() {
    checkThreadErrors.store(false, std::memory_order_relaxed);
}

}  // namespace korvex
