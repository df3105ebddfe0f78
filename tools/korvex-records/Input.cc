#include "Input.h"

#include <korvex/util/FileDescriptor.h>

#include <unistd.h>

#include <cerrno>

#include "Progress.h"
#include "Status.h"
#include "support/TerminalQuery.h"

namespace {

// Whole-buffer reads: fewer bytes are the end, or an error that errno tells.
std::string readAll(const FileDescriptor& in, const std::string& name) {
    // Where somebody types, nothing must be drawn over it.
    if (!isTerminal(in.osdep())) progressStep("reading the input");
    std::string all;
    std::string piece(1 << 16, '\0');
    for (std::size_t got = piece.size(); got == piece.size();) {
        errno = 0;
        const int result = in.read(piece.data(), piece.size());
        got = result < 0 ? 0 : static_cast<std::size_t>(result);
        if (got < piece.size() && errno != 0) {
            throw Failure(IO_ERROR, withErrno("cannot read " + name));
        }
        all.append(piece, 0, got);
    }
    return all;
}

}  // namespace

std::string readInputFile(const std::string& name) {
    const ScopedFileDescriptor in{Pathname(name)};
    if (!in.valid()) throw Failure(IO_ERROR, withErrno("cannot open " + name));
    return readAll(in, name);
}

std::string readStandardInput() {
    return readAll(FileDescriptor(STDIN_FILENO), "standard input");
}
