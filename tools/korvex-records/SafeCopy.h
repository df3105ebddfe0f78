#pragma once

#include <korvex/util/Pathname.h>

// The copy of the record file that stands beside it while it is replaced. It appears under its
// name only when it is whole and on the disk, so wherever it is found it can be trusted.

// Copies the file with its mode and owner. Throws Failure IO_ERROR.
void makeSafeCopy(const Pathname& file, const Pathname& copy);
// The file is whole: the copy is not needed any more.
void dropSafeCopy(const Pathname& copy);

// Gives `to` the mode and owner of `from`; false, with errno set, when it may not have them.
bool takeAttributes(const Pathname& from, const Pathname& to);

// fsync(2) of a file by name, and of the directory it is in (as far as that is possible).
bool syncFile(const Pathname& file);
void syncDirectoryOf(const Pathname& file);
