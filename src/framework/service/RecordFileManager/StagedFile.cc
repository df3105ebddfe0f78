#include "framework/service/RecordFileManager/StagedFile.h"

#include <cstring>
#include <new>

inline namespace korvex {

namespace {

constexpr std::size_t kStagingSize = 65536;  // bytes; more gained nothing

}  // namespace

// The file is opened last, so that errno is what that left.
StagedFile::StagedFile(const Pathname& file)
    : _staging(new (std::nothrow) char[kStagingSize]),
      _size(_staging ? kStagingSize : 0),
      _file(file.fopen("wb")) {
    if (_file) static_cast<void>(std::setvbuf(_file.get(), nullptr, _IONBF, 0));
}

bool StagedFile::handOn(const void* p, std::size_t n) {
    return n == 0 || std::fwrite(p, 1, n, _file.get()) == n;
}

bool StagedFile::flush() {
    const std::size_t used = _used;
    _used = 0;
    return handOn(_staging.get(), used);
}

bool StagedFile::write(const void* p, std::size_t n) {
    if (n > _size - _used && !flush()) return false;
    if (n > _size) return handOn(p, n);
    if (n > 0) std::memcpy(_staging.get() + _used, p, n);
    _used += n;
    return true;
}

bool StagedFile::close() {
    return flush() && std::fclose(_file.release()) == 0;
}

}  // namespace korvex
