#include "file/Input.h"

#include <korvex/util/FileDescriptor.h>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>

#include "Status.h"
#include "support/TerminalQuery.h"
#include "terminal/Progress.h"

namespace {

constexpr std::size_t kPiece = 1 << 16;

std::string shownName(const std::string& name) {
    return name == "-" ? "standard input" : name;
}

FileDescriptor openInput(const std::string& name) {
    const int fd = name == "-" ? fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 3)
                               : ::open(name.c_str(), O_RDONLY | O_CLOEXEC | O_NOCTTY);
    if (fd < 0) throw Failure(IO_ERROR, withErrno("cannot open " + shownName(name)));
    return FileDescriptor(fd);
}

// Hands each piece on. Whole-buffer reads: fewer bytes are the end, or an error that errno tells.
template <class Take>
void readPieces(const FileDescriptor& in, const std::string& name, Take take) {
    // Where somebody types, nothing must be drawn over it.
    if (!isTerminal(in.osdep())) progressStep("reading the input");
    std::string piece(kPiece, '\0');
    for (std::size_t got = piece.size(); got == piece.size();) {
        errno = 0;
        const int result = in.read(piece.data(), piece.size());
        got = result < 0 ? 0 : static_cast<std::size_t>(result);
        if (got < piece.size() && errno != 0) {
            throw Failure(IO_ERROR, withErrno("cannot read " + shownName(name)));
        }
        take(piece.data(), got);
    }
}

// Where the temporary directory cannot be written to, memory has to do.
FileDescriptor unnamedFile() {
    const char* const tmp = std::getenv("TMPDIR");
    const char* const directory = tmp != nullptr && *tmp != '\0' ? tmp : "/tmp";
    int fd = ::open(directory, O_TMPFILE | O_RDWR | O_CLOEXEC, 0600);
    if (fd < 0) fd = memfd_create("korvex-records", MFD_CLOEXEC);
    if (fd < 0) throw Failure(IO_ERROR, withErrno("cannot make a temporary file"));
    return FileDescriptor(fd);
}

// From the start on, what has been written there.
FileDescriptor copied(const FileDescriptor& in, const std::string& name) {
    ScopedFileDescriptor copy(unnamedFile());
    readPieces(in, name, [&copy](const char* bytes, std::size_t n) {
        errno = 0;
        if (n == 0 || copy.write(bytes, n) == static_cast<int>(n)) return;
        throw Failure(IO_ERROR, withErrno("cannot write a temporary file"));
    });
    if (!copy.seek_set(0)) throw Failure(IO_ERROR, withErrno("cannot rewind a temporary file"));
    return copy.release();
}

}  // namespace

std::string readInput(const std::string& name) {
    const ScopedFileDescriptor in(openInput(name));
    std::string all;
    readPieces(in, name, [&all](const char* bytes, std::size_t n) { all.append(bytes, n); });
    return all;
}

LineInput::LineInput(const std::string& name) : _name(shownName(name)) {
    ScopedFileDescriptor in(openInput(name));
    struct stat st {};
    if (!in.stat(&st)) throw Failure(IO_ERROR, withErrno("cannot look at " + _name));
    if (!S_ISREG(st.st_mode)) in = copied(in, name);
    long long size = 0;
    _file.reset(fdopen(in.osdep(), "r"));
    if (!_file) throw Failure(IO_ERROR, withErrno("cannot open " + _name));
    if (in.getSize(&size)) _size = static_cast<std::uint64_t>(size);
    in.release();
    _start = ftello(_file.get());
}

LineInput::LineInput(std::FILE* file) : _name("input"), _file(file), _start(ftello(file)) {}

LineInput::~LineInput() {
    std::free(_line);
}

void LineInput::rewind() {
    if (fseeko(_file.get(), _start, SEEK_SET) != 0) {
        throw Failure(IO_ERROR, withErrno("cannot rewind " + _name));
    }
    _read = 0;
    _number = 0;
    progressStep("parsing", _size);
}

bool LineInput::next(std::string& line) {
    ++_number;
    errno = 0;
    const ssize_t length = getline(&_line, &_capacity, _file.get());
    if (length < 0) {
        if (std::ferror(_file.get()) != 0 || errno == ENOMEM) {
            throw Failure(IO_ERROR, withErrno("cannot read " + _name));
        }
        return false;
    }
    const auto size = static_cast<std::size_t>(length);
    progressAt(_read += size);
    _wasWhole = _line[size - 1] == '\n';
    line.assign(_line, _wasWhole ? size - 1 : size);
    return true;
}
