// Counts the heap that the library holds. The linker sends the program's malloc family here (--wrap);
// C++ allocations go the same way.
#include "bench/heap_meter.h"

#include <malloc.h>

#include <atomic>
#include <cstdlib>
#include <new>

extern "C" {
void* __real_malloc(size_t size);
void* __real_calloc(size_t count, size_t size);
void* __real_realloc(void* block, size_t size);
void __real_free(void* block);
void* __wrap_malloc(size_t size);
void* __wrap_calloc(size_t count, size_t size);
void* __wrap_realloc(void* block, size_t size);
void __wrap_free(void* block);
}

namespace {

std::atomic<size_t> inUse{0};
std::atomic<size_t> peak{0};

size_t held_by(void* block) {
  return block ? malloc_usable_size(block) : 0;
}

void* count(void* block) {
  size_t now = inUse += held_by(block);
  if (now > peak) peak = now;
  return block;
}

}  // namespace

void* __wrap_malloc(size_t size) {
  return count(__real_malloc(size));
}
void* __wrap_calloc(size_t n, size_t size) {
  return count(__real_calloc(n, size));
}
void* __wrap_realloc(void* block, size_t size) {
  size_t before = held_by(block);
  void* moved = __real_realloc(block, size);
  if (!moved && size != 0) return nullptr;
  inUse -= before;
  return count(moved);
}
void __wrap_free(void* block) {
  inUse -= held_by(block);
  __real_free(block);
}

void* operator new(size_t size) {
  void* block = __wrap_malloc(size ? size : 1);
  if (!block) std::abort();
  return block;
}
void* operator new(size_t size, const std::nothrow_t&) noexcept {
  return __wrap_malloc(size ? size : 1);
}
void* operator new[](size_t size) {
  return operator new(size);
}
void* operator new[](size_t size, const std::nothrow_t& tag) noexcept {
  return operator new(size, tag);
}
void operator delete(void* block) noexcept {
  __wrap_free(block);
}
void operator delete(void* block, size_t) noexcept {
  __wrap_free(block);
}
void operator delete[](void* block) noexcept {
  __wrap_free(block);
}
void operator delete[](void* block, size_t) noexcept {
  __wrap_free(block);
}

namespace bench {

size_t heap_in_use() {
  return inUse;
}
size_t heap_peak() {
  return peak;
}
void reset_heap_peak() {
  peak = inUse.load();
}

}  // namespace bench
