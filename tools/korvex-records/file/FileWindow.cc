#include "file/FileWindow.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <utility>

#include "Status.h"

FileWindow::FileWindow(int fd, std::uint64_t size, std::string name, std::size_t usual,
                       std::size_t before)
    : _fd(fd), _size(size), _name(std::move(name)), _usual(usual), _before(before) {}

std::string_view FileWindow::at(std::uint64_t offset, std::uint64_t n) {
    if (n == 0) return {};
    if (offset < _start || offset + n > _start + _held) fill(offset, static_cast<std::size_t>(n));
    return {_bytes.get() + (offset - _start), static_cast<std::size_t>(n)};
}

std::uint32_t FileWindow::numberAt(std::uint64_t offset) {
    std::uint32_t number = 0;
    unsigned shift = 0;
    for (const char c : at(offset, 4)) {
        number |= static_cast<std::uint32_t>(static_cast<unsigned char>(c)) << shift;
        shift += 8;
    }
    return number;
}

void FileWindow::fill(std::uint64_t offset, std::size_t asked) {
    const auto before = static_cast<std::size_t>(std::min<std::uint64_t>(offset, _before));
    const std::size_t wanted = before + asked;
    const std::size_t capacity = std::max(wanted, _usual);
    if (_capacity < wanted || _capacity > capacity) {
        _bytes.reset();  // first, so that two large values are never held at once
        _bytes.reset(new char[capacity]);
        _capacity = capacity;
    }
    _start = offset - before;
    _held = 0;
    const std::size_t most =
        static_cast<std::size_t>(std::min<std::uint64_t>(capacity, _size - _start));
    while (_held < wanted) {
        const ssize_t got =
            pread(_fd, _bytes.get() + _held, most - _held, static_cast<off_t>(_start + _held));
        if (got < 0 && errno == EINTR) continue;
        if (got < 0) throw Failure(IO_ERROR, withErrno("cannot read " + _name));
        if (got == 0)
            throw Failure(IO_ERROR, _name + ": another program shortened it during reading");
        _held += static_cast<std::size_t>(got);
    }
}
