// The decoder information object: creation, options, callbacks.
#include "codec/base/dec_info.h"

#include <atomic>

#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/base/os_memory.h"
#include "tavirpelo/decinfo.h"

static_assert(sizeof(void*) != 4 || sizeof(TAVIRPELO_DECINFO) == 76);
static_assert(sizeof(void*) != 4 || sizeof(TAVIRPELO_CALLBACK) == 8);

namespace pelo {
namespace {

constexpr int kDecoderVersion = 35010;

constinit std::atomic<ReleaseZoom> releaseZoom{nullptr};

// An empty object; null with gTavirError set when memory is short.
OsPtr<TAVIRPELO_DECINFO> new_dec_info() {
  record_error(ErrorWord::kObject, TAVIRPELO_ERROR_NONE);
  auto decInfo = os_new<TAVIRPELO_DECINFO>();
  if (!decInfo) record_error(ErrorWord::kObject, TAVIRPELO_ERROR_MEMORY);
  return decInfo;
}

TAVIRPELO_DECINFO* finish(OsPtr<TAVIRPELO_DECINFO> decInfo, TAVIRPELO_IO* io, int outFormat,
                          uint32_t option) {
  if (io == nullptr) return nullptr;
  decInfo->pIO = io;
  decInfo->outFormat = outFormat;
  decInfo->option = decInfo->userOption = option;
  decInfo->CheckFn = TAVIRPELO_CheckFn;
  return decInfo.release();
}

}  // namespace

void set_zoom_release(ReleaseZoom release) {
  releaseZoom.store(release);
}

TAVIRPELO_DECINFO* create_dec_info(int ioType, void* source, int size, int outFormat, uint32_t option) {
  auto decInfo = new_dec_info();
  if (!decInfo) return nullptr;
  TAVIRPELO_IO* io = open_io(ioType, source, size);
  return finish(std::move(decInfo), io, outFormat, option);
}

TAVIRPELO_DECINFO* create_dec_info_with_stream(void* context, int size, TAVIRPELO_READFN pfRead,
                                               TAVIRPELO_SKIPFN pfSkip, TAVIRPELO_RESETFN pfReset,
                                               int outFormat, uint32_t option) {
  auto decInfo = new_dec_info();
  if (!decInfo) return nullptr;
  TAVIRPELO_IO* io = open_stream(context, pfRead, pfSkip, pfReset, size);
  return finish(std::move(decInfo), io, outFormat, option);
}

int destroy_dec_info(TAVIRPELO_DECINFO* decInfo) {
  record_error(ErrorWord::kObject, decInfo == nullptr ? TAVIRPELO_ERROR_NULL : TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) return 0;
  const ReleaseZoom release = releaseZoom.load();
  if (decInfo->pZoomInfo != nullptr && release != nullptr) release(*decInfo);
  os_free(decInfo->pCallback);
  close_io(decInfo->pIO);
  os_free(decInfo);
  return 1;
}

int set_option(TAVIRPELO_DECINFO* decInfo, uint32_t option) {
  if (decInfo == nullptr) return 0;
  decInfo->option = decInfo->userOption = option;
  return 1;
}

int set_mode(TAVIRPELO_DECINFO* decInfo, int mode) {
  if (decInfo == nullptr) return 0;
  decInfo->decMode = mode < 0 ? 0 : mode > 4 ? 4 : mode;
  return 1;
}

int object_error(void) {
  return error_code(ErrorWord::kObject);
}

int decoder_version(void) {
  return kDecoderVersion;
}

int set_callback(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_PROGRESSFN function, intptr_t argument) {
  if (decInfo == nullptr) return 0;
  os_free(decInfo->pCallback);
  decInfo->pCallback = os_new<TAVIRPELO_CALLBACK>().release();
  if (decInfo->pCallback == nullptr) return 0;
  *decInfo->pCallback = {argument, function};
  return 1;
}

}  // namespace pelo
