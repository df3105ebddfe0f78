#include <cstdlib>
#include <cstring>

#include "explorer/Heap.h"
#include "points/Wrap.h"

// The library's own uses of malloc(3), so that they are guarded too.

SCHEDULES_REAL(void*, calloc, (size_t, size_t));
SCHEDULES_REAL(void, free, (void*));

SCHEDULES_WRAP(void*, calloc, (size_t n, size_t size)) {
    void* const block = schedules::Heap::allocate(n * size);
    return block != nullptr ? block : __real_calloc(n, size);
}

SCHEDULES_WRAP(void, free, (void* block)) {
    if (!schedules::Heap::free(block, SCHEDULES_CALLER)) __real_free(block);
}
