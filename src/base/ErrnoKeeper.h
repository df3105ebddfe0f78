#pragma once

#include <cerrno>

inline namespace korvex {

// Puts errno back to what it was when this object was built, on every way out of the scope.
class ErrnoKeeper {
  public:
    ErrnoKeeper() = default;
    ErrnoKeeper(const ErrnoKeeper&) = delete;
    ErrnoKeeper& operator=(const ErrnoKeeper&) = delete;
    ~ErrnoKeeper() { errno = _saved; }

    int saved() const { return _saved; }

  private:
    const int _saved = errno;
};

}  // namespace korvex
