// The given names of this room; each forwards to the room's own function.
#include "codec/base/base_abi.h"

#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/base/geometry.h"
#include "codec/base/io.h"
#include "codec/base/os.h"
#include "tavirpelo/io.h"

using namespace pelo;

void* TAVIRPELO_OsMalloc(size_t size) {
  return pelo::os_malloc(size);
}

void TAVIRPELO_OsFree(void* pointer) {
  pelo::os_free(pointer);
}

void* TAVIRPELO_OsRealloc(void* pointer, size_t size) {
  return pelo::os_realloc(pointer, size);
}

void* TAVIRPELO_OsMemcpy(void* destination, const void* source, size_t size) {
  return pelo::os_memcpy(destination, source, size);
}

void* TAVIRPELO_OsMemset(void* destination, int value, size_t size) {
  return pelo::os_memset(destination, value, size);
}

FILE* TAVIRPELO_OsFopen(const char* path, const char* mode) {
  return pelo::os_open(path, mode);
}

size_t TAVIRPELO_OsFread(void* buffer, size_t size, size_t count, FILE* stream) {
  return pelo::os_read(buffer, size, count, stream);
}

size_t TAVIRPELO_OsFwrite(const void* buffer, size_t size, size_t count, FILE* stream) {
  return pelo::os_write(buffer, size, count, stream);
}

int TAVIRPELO_OsFseek(FILE* stream, long offset, int whence) {
  return pelo::os_seek(stream, offset, whence);
}

long TAVIRPELO_OsFtell(FILE* stream) {
  return pelo::os_tell(stream);
}

int TAVIRPELO_OsFclose(FILE* stream) {
  return pelo::os_close(stream);
}

FILE* TAVIRPELO_OpenFile(const char* path) {
  return pelo::open_file(path);
}

int TAVIRPELO_ReadFile(FILE* stream, void* buffer, int length) {
  return pelo::read_file(stream, buffer, length);
}

int TAVIRPELO_SeekFile(FILE* stream, int offset, int whence) {
  return pelo::seek_file(stream, offset, whence);
}

int TAVIRPELO_CloseFile(FILE* stream) {
  return pelo::close_file(stream);
}

TAVIRPELO_IO* TAVIRPELO_Open_IO(int ioType, void* source, int size) {
  return pelo::open_io(ioType, source, size);
}

TAVIRPELO_IO* TAVIRPELO_Open_Stream(void* context, TAVIRPELO_READFN pfRead, TAVIRPELO_SKIPFN pfSkip,
                                    TAVIRPELO_RESETFN pfReset, int size) {
  return pelo::open_stream(context, pfRead, pfSkip, pfReset, size);
}

int TAVIRPELO_Read_IO(TAVIRPELO_IO* io, void* destination, int length) {
  return pelo::read_io(io, destination, length);
}

int TAVIRPELO_Seek_IO(TAVIRPELO_IO* io, int offset, int whence) {
  return pelo::seek_io(io, offset, whence);
}

int TAVIRPELO_Tell_IO(const TAVIRPELO_IO* io) {
  return pelo::tell_io(io);
}

int TAVIRPELO_Close_IO(TAVIRPELO_IO* io) {
  return pelo::close_io(io);
}

int TAVIRPELO_SetStreamReadSize(TAVIRPELO_DECINFO* decInfo, int readSize) {
  return pelo::set_read_size(decInfo, readSize);
}

TAVIRPELO_DECINFO* TAVIRPELO_CreateDecInfo(int ioType, void* source, int size, int outFormat,
                                           uint32_t option) {
  begin_operation();
  return pelo::create_dec_info(ioType, source, size, outFormat, option);
}

TAVIRPELO_DECINFO* TAVIRPELO_CreateDecInfoWithStream(void* context, int size, TAVIRPELO_READFN pfRead,
                                                     TAVIRPELO_SKIPFN pfSkip, TAVIRPELO_RESETFN pfReset,
                                                     int outFormat, uint32_t option) {
  begin_operation();
  return pelo::create_dec_info_with_stream(context, size, pfRead, pfSkip, pfReset, outFormat, option);
}

int TAVIRPELO_DestroyDecInfo(TAVIRPELO_DECINFO* decInfo) {
  return pelo::destroy_dec_info(decInfo);
}

int TAVIRPELO_SetDecOption(TAVIRPELO_DECINFO* decInfo, uint32_t option) {
  return pelo::set_option(decInfo, option);
}

int TAVIRPELO_SetDecMode(TAVIRPELO_DECINFO* decInfo, int mode) {
  return pelo::set_mode(decInfo, mode);
}

int TAVIRPELO_GetErrorCode() {
  return pelo::object_error();
}

int PELOJ_GetVersion() {
  return pelo::decoder_version();
}

int PELOJ_SetCallback(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_PROGRESSFN function, intptr_t argument) {
  return pelo::set_callback(decInfo, function, argument);
}

int PELOJ_CheckBuffer(PELOJ_SOURCE* source, int n) {
  return pelo::check_buffer(source, n);
}

int PELO_GetMaxDecRatio(int needed, int available) {
  return pelo::max_dec_ratio(needed, available);
}

unsigned long TAVIRPELO_OsThreadCreate(void* (*routine)(void*), void* argument) {
  return pelo::os_start_thread(routine, argument);
}

// ---- what a host may put its own in place of: the library calls these by their given names ----

void TAVIRPELO_OsSleep(int) {}

void TAVIRPELO_CheckExStatus(int* status) {
  if (status != nullptr) *status = 0;
}

void TAVIRPELO_PrintMessage(const char*) {}
