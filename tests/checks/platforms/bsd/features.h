#pragma once
#pragma GCC system_header
#include_next <features.h>

// A C library that is not glibc.
#undef __GLIBC__
#undef __GLIBC_MINOR__
