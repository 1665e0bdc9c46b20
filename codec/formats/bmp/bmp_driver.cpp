// BMP decoding whole and row by row.
#include <climits>
#include <cstdio>

#include "codec/base/io.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/formats/format.h"

namespace pelo::bmp {
namespace {

constexpr const char* kStage = "BMP decoder";
constexpr int kIterRows = 100;
constexpr int kHeadBytes = 54;

// Rewinds the source; false for a memory source too short for the headers.
bool rewind(TAVIRPELO_IO* io) {
  seek_io(io, 0, SEEK_SET);
  return io->ioType != TAVIRPELO_IO_MEMORY || (io->pSource != nullptr && io->size >= kHeadBytes) ||
         refuse(Reason::kTruncated, "BMP header");
}

// The next rows by the bit count's decoder, which another bit count does not have; false when the caller
// ends the decode.
bool decode(PELOI_BMPRECORD& record, int rows) {
  if (const Depth* depth = depth_of(record.bitCount)) return decode_rows(record, rows, *depth) != 0;
  record.rowsDone = record.outHeight;
  return true;
}

// The record of the decode going on, or a new one; null on failure, when none is left.
PELOI_BMPRECORD* obtain(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  const auto same = [&](const PELOI_BMPRECORD& held) {
    return held.output == output && held.request == request_of(*decInfo, width, height);
  };
  if (!may_go_on<PELOI_BMPRECORD>(*decInfo, kStage, same)) return nullptr;
  auto* record = held_state<PELOI_BMPRECORD>(*decInfo);
  return record != nullptr ? record : make_record(decInfo, width, height, output);
}

}  // namespace
int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (!usable(decInfo, output, width, height, kStage) || !rewind(decInfo->pIO)) return 0;
  if (!may_start<PELOI_BMPRECORD>(*decInfo, kStage)) return 0;
  PELOI_BMPRECORD* record = make_record(decInfo, width, height, output);
  if (record == nullptr) return 0;
  const bool done = decode(*record, INT_MAX);
  delete_record(record);
  return done ? 1 : 0;
}

int decode_rows_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  if (!usable(decInfo, output, width, height, kStage)) return 0;
  if (lines < 1) return refuse(Reason::kArgument, kStage);
  if (!rewind(decInfo->pIO)) return 0;
  PELOI_BMPRECORD* record = obtain(decInfo, output, width, height);
  if (record == nullptr) return 0;
  decInfo->pFormatInfo = record;
  record->decInfo = decInfo;
  const bool goesOn = decode(*record, lines);
  if (!goesOn || record->rowsDone >= record->outHeight) release(decInfo);
  return goesOn ? 1 : 0;
}

int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  constexpr int kMore = 4;
  if (decode_rows_step(decInfo, output, width, height, kIterRows) == 0) return 0;
  return decInfo->pFormatInfo != nullptr ? kMore : 1;
}

int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  return decode_rows_step(decInfo, output, width, height, lines);
}

int abort(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr) return 0;
  release(decInfo);
  return decInfo->pFormatInfo == nullptr;
}

}  // namespace pelo::bmp
