#include "Stop.h"

#include <unistd.h>

#include "Failure.h"

Stop::Stop() {
    int ends[2];
    if (pipe(ends) != 0) throw systemFailure("cannot make a pipe");
    _readEnd = FileDescriptor(ends[0]);
    _writeEnd = FileDescriptor(ends[1]);
}
