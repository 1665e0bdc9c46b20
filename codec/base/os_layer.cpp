// The OS layer: the only place where the codec meets the platform's memory, files and threads.

// On 32-bit systems as well a file with a large inode number can be asked what it is.
#define _FILE_OFFSET_BITS 64

#include <fcntl.h>
#include <pthread.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "codec/base/os.h"
#include "codec/base/os_memory.h"
#include "platform/fault_injection.h"
#include "tavirpelo/io.h"

namespace pelo {

using faults::allocations;

namespace {

bool usable(const FILE* stream) {
  return stream != nullptr && stream != TAVIRPELO_INVALID_FILE;
}

bool reads_only(const char* mode) {
  return mode[0] == 'r' && std::strchr(mode, '+') == nullptr;
}

// Says in errno why not.
bool regular(const struct stat& status) {
  if (S_ISREG(status.st_mode)) return true;
  errno = S_ISDIR(status.st_mode) ? EISDIR : ESPIPE;
  return false;
}

// Only what has a length and can be read at any place is a source. Directories open, but their reads
// fail; a pipe makes the opening wait for a writer, a device may act on it and need not end. What takes
// the file's place after the first look is opened without waiting, and found out by the second.
FILE* open_regular(const char* path, const char* mode) {
  struct stat status;
  if (stat(path, &status) != 0 || !regular(status)) return nullptr;
  const int descriptor = open(path, O_RDONLY | O_NONBLOCK | O_NOCTTY);
  if (descriptor < 0) return nullptr;
  const bool sound =
      fstat(descriptor, &status) == 0 && regular(status) && fcntl(descriptor, F_SETFL, 0) == 0;
  FILE* stream = sound ? fdopen(descriptor, mode) : nullptr;
  if (stream == nullptr) {
    const int reason = errno;
    (void)close(descriptor);
    errno = reason;
  }
  return stream;
}

}  // namespace

// ---- memory ----

void* os_malloc(size_t size) {
  if (size == 0 || allocations.hit()) return nullptr;
  return std::malloc(size);
}

void* os_zeroed(size_t size) {
  if (size == 0 || allocations.hit()) return nullptr;
  return std::calloc(1, size);
}

void os_free(void* pointer) {
  std::free(pointer);
}

void* os_realloc(void* pointer, size_t size) {
  if (allocations.hit()) return nullptr;
  return std::realloc(pointer, size);
}

// The C functions may not be given null even for no bytes.
void* os_memcpy(void* destination, const void* source, size_t size) {
  return size == 0 ? destination : std::memcpy(destination, source, size);
}

void* os_memset(void* destination, int value, size_t size) {
  return size == 0 ? destination : std::memset(destination, value, size);
}

// ---- files ----

FILE* os_open(const char* path, const char* mode) {
  if (path == nullptr) return nullptr;
  return reads_only(mode) ? open_regular(path, mode) : std::fopen(path, mode);
}

size_t os_read(void* buffer, size_t size, size_t count, FILE* stream) {
  return std::fread(buffer, size, count, stream);
}

size_t os_write(const void* buffer, size_t size, size_t count, FILE* stream) {
  return std::fwrite(buffer, size, count, stream);
}

int os_seek(FILE* stream, long offset, int whence) {
  return std::fseek(stream, offset, whence);
}

long os_tell(FILE* stream) {
  return std::ftell(stream);
}

int os_close(FILE* stream) {
  return std::fclose(stream);
}

FILE* open_file(const char* path) {
  FILE* stream = os_open(path, "rb");
  return stream != nullptr ? stream : TAVIRPELO_INVALID_FILE;
}

int read_file(FILE* stream, void* buffer, int length) {
  if (!usable(stream) || buffer == nullptr || length < 1) return 0;
  return static_cast<int>(os_read(buffer, 1, static_cast<size_t>(length), stream));
}

// A refused seek is not an error of its own: the caller compares the position with what it asked for.
int seek_file(FILE* stream, int offset, int whence) {
  if (!usable(stream)) return -1;
  (void)os_seek(stream, offset, whence);
  const long position = os_tell(stream);
  return position < 0 || position > INT_MAX ? -1 : static_cast<int>(position);
}

int close_file(FILE* stream) {
  return usable(stream) ? os_close(stream) : EOF;
}

// ---- tasks ----

unsigned long os_start_thread(void* (*routine)(void*), void* argument) {
  pthread_t thread;
  if (pthread_create(&thread, nullptr, routine, argument) != 0) return 0;
  return static_cast<unsigned long>(thread);
}

}  // namespace pelo
