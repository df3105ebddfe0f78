#include <cstddef>

// What else -fsanitize=thread calls: plain accesses, which are no points.

#define PLAIN(name)                             \
    extern "C" void __tsan_##name(void* where); \
    extern "C" void __tsan_##name(void*) {}
#define SIZES(name) PLAIN(name##1) PLAIN(name##2) PLAIN(name##4) PLAIN(name##8) PLAIN(name##16)

SIZES(read)
SIZES(write)
SIZES(unaligned_read)
SIZES(unaligned_write)
SIZES(volatile_read)
SIZES(volatile_write)
PLAIN(vptr_read)
PLAIN(func_entry)

extern "C" {
void __tsan_init();
void __tsan_func_exit();
void __tsan_vptr_update(void** where, void* value);
void __tsan_read_range(void* where, std::size_t size);
void __tsan_write_range(void* where, std::size_t size);

void __tsan_init() {}
void __tsan_func_exit() {}
void __tsan_vptr_update(void**, void*) {}
void __tsan_read_range(void*, std::size_t) {}
void __tsan_write_range(void*, std::size_t) {}
}
