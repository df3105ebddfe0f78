#pragma once

#include <sys/mman.h>

#include <functional>
#include <new>

#include "support/Faults.h"

namespace testsupport {

// Runs body in a child that dies of SIGKILL at its k-th such call, before the call is made; false
// when it came to its end before. Other deaths are failures of the test.
bool killAtCall(Call call, unsigned long k, const std::function<void()>& body);

// The same at some moment, `microseconds` after the child began.
bool killAfter(unsigned microseconds, const std::function<void()>& body);

// A T that parent and children share; zero at first.
template <class T>
class Shared {
  public:
    Shared() : _p(new (map()) T()) {}
    Shared(const Shared&) = delete;
    Shared& operator=(const Shared&) = delete;
    ~Shared() { munmap(_p, sizeof(T)); }

    T* operator->() const { return _p; }

  private:
    static void* map() {
        return mmap(nullptr, sizeof(T), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0);
    }

    T* const _p;
};

}  // namespace testsupport
