// Decoding a JPEG band by band: the decode driver's steps with the caller's planes changing in between.
#include "codec/formats/jpeg/strips/strips.h"

#include <memory>
#include <utility>

#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/rows.h"
#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {
namespace {

struct DeleteSource {
  void operator()(PELOJ_SOURCE* source) const {
    os_free(source->buffer);
    os_free(source);
  }
};
// The reader and its buffer, which the state only points at.
using OwnedSource = std::unique_ptr<PELOJ_SOURCE, DeleteSource>;

OwnedSource new_source(TAVIRPELO_IO* io) {
  OwnedSource source(os_new<PELOJ_SOURCE>().release());
  OsBuffer<uint8_t> buffer;
  if (!source || !buffer.allocate(kSourceBufferSize)) return nullptr;
  *source = {io, 0, static_cast<uint32_t>(io->size), 0, 0, buffer.release()};
  return source;
}

// A driver that stretches to the requested size. Rotation is left out: it would turn each band by
// itself.
Decoder start_driver(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE* source, int width, int height) {
  PELOJ_REQUEST request{nullptr, width, height, 0, 0, 0};
  const uint32_t option = decInfo.option | TAVIRPELO_FIT_STRETCH;
  decInfo.option = option & ~uint32_t{TAVIRPELO_ROTATE_MASK};
  Decoder state(initialize_decoder(&decInfo, source, &request));
  decInfo.option = option;
  return state;
}

bool prepare_scans(PELOJ_JDINFO& state) {
  if (needs_all_scans(state)) return list_strip_scans(&state) == PELOJ_OK;
  return first_scan_suffices(state);
}

// Frees what a complete picture no longer needs. A cleared state counts as complete.
void release_buffers(PELOJ_JDINFO& state) {
  PELOJ_SOURCE* source = state.source;
  clear_decoder(&state);
  state.source = source;
}

void release(PELOJ_JDINFO* state) {
  const OwnedSource source(state->source);
  const Decoder decoder(state);
}

}  // namespace

PELOJ_JDINFO* begin_strips(TAVIRPELO_DECINFO* decInfo, int width, int height, int outFormat) {
  if (decInfo == nullptr || width < 1 || height < 1) return nullptr;
  if (seek_io(decInfo->pIO, 0, SEEK_SET) < 0) return nullptr;
  OwnedSource source = new_source(decInfo->pIO);
  if (!source) return nullptr;
  decInfo->outFormat = outFormat;
  Decoder state = start_driver(*decInfo, source.get(), width, height);
  if (!state || !prepare_scans(*state)) return nullptr;
  // From here on the state owns its reader.
  static_cast<void>(source.release());
  return state.release();
}

int list_strip_scans(PELOJ_JDINFO* state) {
  return list_scans(*state);
}

int decode_strip(PELOJ_JDINFO* state, uint8_t* const* planes, int rows) {
  if (state == nullptr) return 0;
  // Stretching never crops, so that no rows have to be passed before the first one.
  if (rows < 1 || state->progress.rowsDone >= state->sizes.used.height) return 1;
  set_band(*state, planes, rows);
  const bool progressive = state->marker->frameType == FrameType::kProgressive;
  const int status = show_rows(*state);
  if (status == PELOJ_FAIL) {
    if (progressive) record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_DECODE);
    release(state);
    return 0;
  }
  if (status == PELOJ_IMAGE_DONE) {
    state->progress.rowsDone = state->sizes.used.height;
    if (progressive) release_buffers(*state);
  }
  return 1;
}

void end_strips(PELOJ_JDINFO* state) {
  if (state != nullptr) release(state);
}

}  // namespace pelo::jpeg
