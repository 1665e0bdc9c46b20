#include "slideshow/vss_wrappers.h"

#include <fcntl.h>
#include <unistd.h>

#include <limits>

#include "platform/fault_injection.h"
#include "tavirpelo/io.h"

namespace {

bool fails() {
  return pelo::faults::containerCalls.hit();
}

}  // namespace

// ---- files ----

FILE* vss_fopen(const char* path, const char* mode) {
  return fails() ? nullptr : TAVIRPELO_OsFopen(path, mode);
}

size_t vss_fread(void* buffer, size_t size, size_t count, FILE* stream) {
  return fails() ? 0 : TAVIRPELO_OsFread(buffer, size, count, stream);
}

// A write that fails may still have written some of its bytes, and the injected failure does.
size_t vss_fwrite(const void* buffer, size_t size, size_t count, FILE* stream) {
  if (!fails()) return TAVIRPELO_OsFwrite(buffer, size, count, stream);
  (void)TAVIRPELO_OsFwrite(buffer, 1, size * count / 2, stream);
  return 0;
}

int vss_fseek(FILE* stream, long offset, int whence) {
  return fails() ? -1 : TAVIRPELO_OsFseek(stream, offset, whence);
}

long vss_ftell(FILE* stream) {
  return fails() ? -1 : TAVIRPELO_OsFtell(stream);
}

int vss_fflush(FILE* stream) {
  return fails() ? EOF : std::fflush(stream);
}

// The stream is gone whatever the result says.
int vss_fclose(FILE* stream) {
  const bool failed = fails();
  const int result = TAVIRPELO_OsFclose(stream);
  return failed ? EOF : result;
}

int vss_unlink(const char* path) {
  return fails() ? -1 : unlink(path);
}

// ---- memory ----

void* vss_malloc(size_t size) {
  return TAVIRPELO_OsMalloc(size);
}

void vss_free(void* pointer) {
  TAVIRPELO_OsFree(pointer);
}

void* vss_realloc(void* pointer, size_t size) {
  return TAVIRPELO_OsRealloc(pointer, size);
}

void* vss_memcpy(void* destination, const void* source, size_t size) {
  return TAVIRPELO_OsMemcpy(destination, source, size);
}

void* vss_memset(void* destination, int value, size_t size) {
  return TAVIRPELO_OsMemset(destination, value, size);
}

namespace pelo::slideshow {

VssBytes vss_bytes(int64_t size) {
  if (size < 1 || static_cast<uint64_t>(size) > std::numeric_limits<size_t>::max()) return nullptr;
  return VssBytes(static_cast<uint8_t*>(vss_malloc(static_cast<size_t>(size))));
}

bool truncate_file(const char* path, int64_t length) {
  const int descriptor = fails() ? -1 : open(path, O_RDWR);
  if (descriptor < 0) return false;
  const bool cut = !fails() && ftruncate(descriptor, static_cast<off_t>(length)) == 0;
  (void)close(descriptor);  // nothing was written through it
  return cut;
}

}  // namespace pelo::slideshow
