#pragma once

#include <korvex/util/FileDescriptor.h>

// A file with the process's id, locked for as long as this object lives, or the process: so there
// is one process at a time, however the one before ended. Nothing else guards a record file.
class PidFile {
  public:
    // Throws std::runtime_error, also when another process has it.
    explicit PidFile(const Pathname& path);
    // Empties the file; removing it could take it from the next process.
    ~PidFile();
    PidFile(const PidFile&) = delete;
    PidFile& operator=(const PidFile&) = delete;

  private:
    const Pathname _path;
    ScopedFileDescriptor _fd;
};
