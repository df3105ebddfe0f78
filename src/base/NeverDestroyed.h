#pragma once

#include <new>
#include <utility>

inline namespace korvex {

// Holds an object that is built in place and never destroyed. As a function's static it is built
// at first use and still there for exit handlers and threads that outlive main.
template <class T>
class NeverDestroyed {
  public:
    template <class... Args>
    explicit NeverDestroyed(Args&&... args) {
        new (_storage) T(std::forward<Args>(args)...);
    }
    NeverDestroyed(const NeverDestroyed&) = delete;
    NeverDestroyed& operator=(const NeverDestroyed&) = delete;
    ~NeverDestroyed() = default;

    T& operator*() { return *std::launder(reinterpret_cast<T*>(_storage)); }

  private:
    alignas(T) unsigned char _storage[sizeof(T)];
};

}  // namespace korvex
