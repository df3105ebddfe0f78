#include <korvex/util/Thread.h>

#include "base/Assert.h"
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

// What a new operating-system thread is given. Not the Thread object: that may be gone before the
// thread reads it.
struct Start {
    Thread* thread;
    std::shared_ptr<void> gate;
};

void setStackSize(std::size_t bytes) {
    const int rval = pthread_attr_setstacksize(&s_threadAttr, bytes);
    if (rval == 0) return;
    std::string message;
    __extension__ Logger::format(
        message, rval, "cannot override thread stack size: pthread_attr_setstacksize(): %m");
    threadLogger().warn(message);
}

}  // namespace

Thread::Thread() : _name(main_thread_string), _did_join(true), _gate(new Gate), _jhelp(this) {
    _token = PthreadToken::self();
    _gate->open();
    if (main_thread_created.exchange(true)) throw PthreadException("Main Thread created twice!");
    checkPtRes("pthread_attr_init", pthread_attr_init(&s_threadAttr));
    setStackSize(s_stackSize);
}

Thread::Thread(const char* thrname)
    : _name(thrname), _did_join(false), _gate(new Gate), _jhelp(this) {
    if (!main_thread_created) throw PthreadException("Thread created before main thread!");
    start();
}

void Thread::start() {
    auto arg = std::make_unique<Start>(Start{this, _gate});
    const int rval = pthread_create(&_token._token, &s_threadAttr, &Thread::callMain, arg.get());
    checkPtRes("pthread_create", rval);
    if (rval != 0) return;  // with checking off: there is no thread, and none to join
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
    Thread* const thread = start->thread;
    ActiveThreads::add(thread);
    if (static_cast<Gate*>(start->gate.get())->pass()) {
        thread->main();
    } else {
        ActiveThreads::forgetCurrent();
    }
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
    return ActiveThreads::current();
}

const char* Thread::currentName() {
    const Thread* const thread = current();
    return thread != nullptr ? thread->_name : main_thread_string;
}

void Thread::mainThreadDying() {
    checkThreadErrors.store(false, std::memory_order_relaxed);
}

}  // namespace korvex
