// BMP decoding whole and row by row.
#include <climits>
#include <cstdio>

#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/formats/bmp/bmp_record.h"

namespace pelo::bmp {
namespace {

constexpr const char* kStage = "BMP decoder";
constexpr int kIterRows = 100;
constexpr int kHeadBytes = 54;

bool usable(const TAVIRPELO_DECINFO* decInfo, const void* output, int width, int height) {
  return (decInfo != nullptr && decInfo->pIO != nullptr && output != nullptr && width >= 0 &&
          height >= 0) ||
         refuse(Reason::kArgument, kStage);
}

// Rewinds the source; false for a memory source too short for the headers.
bool rewind(TAVIRPELO_IO* io) {
  seek_io(io, 0, SEEK_SET);
  return io->ioType != TAVIRPELO_IO_MEMORY || (io->pSource != nullptr && io->size >= kHeadBytes) ||
         refuse(Reason::kTruncated, "BMP header");
}

bool same_request(const PELOI_BMPRECORD& record, const TAVIRPELO_DECINFO& decInfo, const void* output,
                  int width, int height) {
  return record.output == output && record.requestWidth == width && record.requestHeight == height &&
         record.outFormat == decInfo.outFormat && record.option == decInfo.option;
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
  if (decInfo->pFormatInfo == nullptr) {
    return make_record(decInfo, width, height, output);
  }
  auto* record = held_state<PELOI_BMPRECORD>(*decInfo);
  if (record != nullptr && same_request(*record, *decInfo, output, width, height)) return record;
  release(decInfo);
  return refuse(Reason::kRequestChanged, kStage), nullptr;
}

}  // namespace
int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (!usable(decInfo, output, width, height) || !rewind(decInfo->pIO)) return 0;
  release(decInfo);
  if (decInfo->pFormatInfo != nullptr)  // another format's
    return refuse(Reason::kRequestChanged, kStage);
  PELOI_BMPRECORD* record = make_record(decInfo, width, height, output);
  if (record == nullptr) return 0;
  const bool done = decode(*record, INT_MAX);
  delete_record(record);
  return done ? 1 : 0;
}

int decode_rows_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  if (!usable(decInfo, output, width, height)) return 0;
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
