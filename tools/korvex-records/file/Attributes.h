#pragma once

#include "file/OpenFile.h"

// Gives the file `to` the owner, the mode and the extended attributes of the old one; access
// control lists are some of them. Throws Failure IO_ERROR when they cannot all be kept.
void keepAttributes(const OpenFile& old, int to);
