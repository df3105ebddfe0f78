#define BENCH_WAL
#include "sqlite.cc"
