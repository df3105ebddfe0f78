#include "explorer/Heap.h"

#include <sys/mman.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "explorer/Races.h"
#include "explorer/Scheduler.h"

namespace schedules {

namespace {

constexpr std::size_t kPage = 4096;
constexpr std::size_t kPagesPerThread = 16384;

char* memory = nullptr;
bool guarding = false;
std::size_t used[kMaxThreads];                         // pages
std::uint32_t pagesOf[kMaxThreads * kPagesPerThread];  // by an object's first page; 0: freed

std::size_t pageNumber(const void* address) {
    return static_cast<std::size_t>(static_cast<const char*>(address) - memory) / kPage;
}

}  // namespace

void Heap::reserve() {
    void* const pages = mmap(nullptr, kMaxThreads * kPagesPerThread * kPage, PROT_READ | PROT_WRITE,
                             MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    if (pages == MAP_FAILED) {
        std::perror("mmap");
        std::exit(2);
    }
    memory = static_cast<char*>(pages);
}

void Heap::guard() {
    guarding = true;
}

bool Heap::owns(const void* address) {
    const char* const p = static_cast<const char*>(address);
    return memory != nullptr && p >= memory && p < memory + kMaxThreads * kPagesPerThread * kPage;
}

// At the end of its pages, so that what runs over does so into the next object's or beyond.
void* Heap::allocate(std::size_t size) {
    if (!guarding) return nullptr;
    const unsigned thread = Scheduler::instance().self().number;
    const std::size_t needed = (std::max<std::size_t>(size, 1) + 15) / 16 * 16;
    const std::size_t pages = (needed + kPage - 1) / kPage;
    if (used[thread] + pages > kPagesPerThread) Scheduler::instance().fail("the heap is full");
    const std::size_t first = thread * kPagesPerThread + used[thread];
    used[thread] += pages;
    pagesOf[first] = static_cast<std::uint32_t>(pages);
    return memory + (first + pages) * kPage - needed;
}

bool Heap::free(void* object, const void* caller) {
    if (!owns(object)) return false;
    const std::size_t first = pageNumber(object);
    if (pagesOf[first] == 0) Scheduler::instance().fail("an object is freed twice");
    char* const end = memory + (first + pagesOf[first]) * kPage;
    const auto size = static_cast<std::size_t>(end - static_cast<char*>(object));
    Scheduler::instance().freed(object, size);
    Races::freed(object, size, caller);
    mprotect(memory + first * kPage, pagesOf[first] * kPage, PROT_NONE);
    pagesOf[first] = 0;
    return true;
}

}  // namespace schedules

using schedules::Heap;

void* operator new(std::size_t size) {
    void* object = Heap::allocate(size);
    if (object == nullptr) object = std::malloc(size);
    if (object == nullptr) throw std::bad_alloc();
    return object;
}
void* operator new[](std::size_t size) {
    return operator new(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    return operator new(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    return operator new(size);
}
void operator delete(void* object) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
void operator delete[](void* object) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
void operator delete(void* object, std::size_t) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
void operator delete[](void* object, std::size_t) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
void operator delete(void* object, const std::nothrow_t&) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
void operator delete[](void* object, const std::nothrow_t&) noexcept {
    if (!Heap::free(object, __builtin_return_address(0))) std::free(object);
}
