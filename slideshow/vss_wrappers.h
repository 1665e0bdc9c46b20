// The store's own door to files and memory: one line each over the OS layer, and the place where tests
// make the k-th file call fail.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>

FILE* vss_fopen(const char* path, const char* mode);
size_t vss_fread(void* buffer, size_t size, size_t count, FILE* stream);
size_t vss_fwrite(const void* buffer, size_t size, size_t count, FILE* stream);
int vss_fseek(FILE* stream, long offset, int whence);
long vss_ftell(FILE* stream);
int vss_fflush(FILE* stream);
int vss_fclose(FILE* stream);
int vss_unlink(const char* path);

// One allocator with the codec, whose encoder replaces the buffer that the store hands it. Null for size
// 0.
void* vss_malloc(size_t size);
void vss_free(void* pointer);
void* vss_realloc(void* pointer, size_t size);
void* vss_memcpy(void* destination, const void* source, size_t size);
void* vss_memset(void* destination, int value, size_t size);

namespace pelo::slideshow {

struct VssFree {
  void operator()(void* pointer) const { vss_free(pointer); }
};
using VssBytes = std::unique_ptr<uint8_t[], VssFree>;

// `size` uninitialised bytes; empty for a size below 1 or when memory is short.
[[nodiscard]] VssBytes vss_bytes(int64_t size);

// Cuts the file at `path` to `length` bytes.
[[nodiscard]] bool truncate_file(const char* path, int64_t length);

}  // namespace pelo::slideshow
