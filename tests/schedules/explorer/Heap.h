#pragma once

#include <cstddef>

namespace schedules {

// The run's heap: every object has pages of its own, which nobody may touch once it is freed, the
// C and C++ libraries included. Addresses depend on nothing but what their thread has allocated, so
// that runs can be compared.
class Heap {
  public:
    // Sets memory aside; once, in the explorer.
    static void reserve();
    // From now on objects are guarded; in a run.
    static void guard();

    // Null when the heap is not guarding yet: then malloc(3) does.
    static void* allocate(std::size_t size);
    // False: not an object of this heap.
    static bool free(void* object, const void* caller);
    // Whether the address is, or has been, an object's.
    static bool owns(const void* address);
};

}  // namespace schedules
