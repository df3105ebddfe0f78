#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

// A piece of a file in memory, which moves along as bytes are asked for. (The file is read, not
// mapped: were it cut meanwhile, touching a mapping would kill the tool.)
class FileWindow {
  public:
    // The descriptor stays the caller's. `name` is for messages. So many bytes are read at once,
    // more where more are asked for; up to `before` of them lie before what was asked for, for who
    // goes back and forth.
    FileWindow(int fd, std::uint64_t size, std::string name, std::size_t usual = 1 << 17,
               std::size_t before = 0);

    // The file's size when it was opened.
    std::uint64_t size() const { return _size; }
    const std::string& name() const { return _name; }

    // The n bytes from `offset` on, which must lie within the size. They are there until the next
    // call. Throws Failure IO_ERROR.
    std::string_view at(std::uint64_t offset, std::uint64_t n);
    // The 32-bit little-endian number there.
    std::uint32_t numberAt(std::uint64_t offset);

  private:
    void fill(std::uint64_t offset, std::size_t asked);

    const int _fd;
    const std::uint64_t _size;
    const std::string _name;
    const std::size_t _usual;
    const std::size_t _before;
    std::unique_ptr<char[]> _bytes;
    std::size_t _capacity = 0;
    std::uint64_t _start = 0;  // of what is held
    std::size_t _held = 0;
};
