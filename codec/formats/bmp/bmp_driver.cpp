// BMP decoding whole and row by row.
#include <climits>
#include <cstdio>

#include "codec/formats/bmp/bmp_record.h"

namespace pelo::bmp {
namespace {

constexpr int kIterRows = 100;
constexpr int kHeadBytes = 54;

bool usable(const TAVIRPELO_DECINFO* decInfo, const void* output, int width, int height) {
  return decInfo != nullptr && decInfo->pIO != nullptr && output != nullptr && width >= 0 && height >= 0;
}

// Rewinds the source; false for a memory source too short for the headers.
bool rewind(TAVIRPELO_IO* io) {
  TAVIRPELO_Seek_IO(io, 0, SEEK_SET);
  return io->ioType != TAVIRPELO_IO_MEMORY || (io->pSource != nullptr && io->size >= kHeadBytes);
}

bool same_request(const PELOI_BMPRECORD& record, const TAVIRPELO_DECINFO& decInfo, const void* output,
                  int width, int height) {
  return record.output == output && record.requestWidth == width && record.requestHeight == height &&
         record.outFormat == decInfo.outFormat && record.option == decInfo.option;
}

// The next rows by the bit count's decoder, which another bit count does not have; false when the caller
// ends the decode.
bool decode(PELOI_BMPRECORD& record, int rows) {
  switch (record.bitCount) {
    case 1:
      return PELOI_BMP_Decode1bitBMP(&record, rows) != 0;
    case 4:
      return PELOI_BMP_Decode4bitBMP(&record, rows) != 0;
    case 8:
      return PELOI_BMP_Decode8bitBMP(&record, rows) != 0;
    case 16:
      return PELOI_BMP_Decode16bitBMP(&record, rows) != 0;
    case 24:
      return PELOI_BMP_Decode24bitBMP(&record, rows) != 0;
    case 32:
      return PELOI_BMP_Decode32bitBMP(&record, rows) != 0;
    default:
      record.rowsDone = record.outHeight;
      return true;
  }
}

// The record of the decode going on, or a new one; null on failure, when none is left.
PELOI_BMPRECORD* obtain(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (decInfo->pFormatInfo == nullptr) {
    return PELOI_BMP_Initialize(decInfo, width, height, output);
  }
  auto* record = held_state<PELOI_BMPRECORD>(*decInfo);
  if (record != nullptr && same_request(*record, *decInfo, output, width, height)) return record;
  PELOI_BMP_DestroyBMP(decInfo);
  return nullptr;
}

}  // namespace
}  // namespace pelo::bmp

using namespace pelo::bmp;

int TAVIRPELOI_DecodeBMP(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (!usable(decInfo, output, width, height) || !rewind(decInfo->pIO)) return 0;
  PELOI_BMP_DestroyBMP(decInfo);
  if (decInfo->pFormatInfo != nullptr) return 0;  // another format's
  PELOI_BMPRECORD* record = PELOI_BMP_Initialize(decInfo, width, height, output);
  if (record == nullptr) return 0;
  const bool done = decode(*record, INT_MAX);
  PELOI_BMP_DeleteDecInfo(record);
  return done ? 1 : 0;
}

int TAVIRPELOI_DecodeBMPIterLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                 int lines) {
  if (!usable(decInfo, output, width, height) || lines < 1 || !rewind(decInfo->pIO)) return 0;
  PELOI_BMPRECORD* record = obtain(decInfo, output, width, height);
  if (record == nullptr) return 0;
  decInfo->pFormatInfo = record;
  record->decInfo = decInfo;
  const bool goesOn = decode(*record, lines);
  if (!goesOn || record->rowsDone >= record->outHeight) PELOI_BMP_DestroyBMP(decInfo);
  return goesOn ? 1 : 0;
}

int TAVIRPELOI_DecodeBMPIter(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  constexpr int kMore = 4;
  if (TAVIRPELOI_DecodeBMPIterLine(decInfo, output, width, height, kIterRows) == 0) return 0;
  return decInfo->pFormatInfo != nullptr ? kMore : 1;
}

int TAVIRPELOI_DecodeBMPLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                             int lines) {
  return TAVIRPELOI_DecodeBMPIterLine(decInfo, output, width, height, lines);
}

int TAVIRPELOI_AbortBMPIter(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr) return 0;
  PELOI_BMP_DestroyBMP(decInfo);
  return decInfo->pFormatInfo == nullptr;
}
