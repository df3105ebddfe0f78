#pragma once

#include <string>

namespace testsupport {

// A terminal, seen from its other side. Line feeds come as they are written.
class Terminal {
  public:
    explicit Terminal(unsigned short columns = 80);
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;
    ~Terminal();

    // In a child: makes it the descriptor fd.
    void becomes(int fd) const;
    // In a child: makes it descriptors 0 to 2 and the one that it is controlled by, as a shell
    // wants it.
    void takeOver() const;

    // The device that others can open.
    std::string name() const;

    void type(const std::string& text) const;
    // Waits until it shows the text, for half a minute; false when it still does not.
    bool shows(const std::string& text);
    // All that it has shown, when nobody writes to it any more.
    std::string shown();
    // All that is known so far.
    const std::string& seen() const { return _seen; }
    void forget() { _seen.clear(); }

  private:
    // False when nothing came within the time.
    bool look(int milliseconds);

    int _other;
    int _own;  // held open, so that what is written stays to be read
    std::string _seen;
};

}  // namespace testsupport
