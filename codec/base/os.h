// The OS layer: the only place where the codec meets the platform's memory, files and threads. The
// functions are those behind the given names of tavirpelo/io.h, where they are documented.
#pragma once

#include <cstddef>
#include <cstdio>

namespace pelo {

// ---- memory ----

void* os_malloc(size_t size);
// `size` zero bytes; null for 0 or when memory is short. Large blocks are fresh pages of the system,
// which take no room until they are written.
void* os_zeroed(size_t size);
void* os_realloc(void* pointer, size_t size);
void os_free(void* pointer);
void* os_memcpy(void* destination, const void* source, size_t size);
void* os_memset(void* destination, int value, size_t size);

// ---- files ----

FILE* os_open(const char* path, const char* mode);
size_t os_read(void* buffer, size_t size, size_t count, FILE* stream);
size_t os_write(const void* buffer, size_t size, size_t count, FILE* stream);
int os_seek(FILE* stream, long offset, int whence);
long os_tell(FILE* stream);
int os_close(FILE* stream);

// The same for sources: an unusable stream is no error of its own.
FILE* open_file(const char* path);
int read_file(FILE* stream, void* buffer, int length);
int seek_file(FILE* stream, int offset, int whence);
int close_file(FILE* stream);

// ---- tasks ----

unsigned long os_start_thread(void* (*routine)(void*), void* argument);

}  // namespace pelo
