// The chunk loop of a PNG stream (ISO/IEC 15948): every chunk's checksum is verified before it is used.
#include <algorithm>
#include <climits>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/formats/format.h"
#include "codec/formats/png/png_info.h"

namespace pelo::png {
namespace {

constexpr uint8_t kSignature[8] = {137, 'P', 'N', 'G', 13, 10, 26, 10};
constexpr uint32_t kIhdr = 0x49484452, kPlte = 0x504C5445, kIdat = 0x49444154, kIend = 0x49454E44,
                   kTrns = 0x74524E53;
constexpr const char* kStage = "PNG chunks";
constexpr int kReadFailed = 11;
constexpr uint32_t kCrcBytes = 4;
constexpr uint32_t kChunkFrame = 12;  // bytes around the data of a chunk

struct Chunk {
  uint32_t length;
  uint32_t type;
  int64_t data;  // stream position
};

int refuse_damaged(const char* detail) {
  return refuse(Reason::kDamaged, kStage, detail), kFailed;
}

int refuse_variant(const char* detail) {
  return refuse(Reason::kVariant, kStage, detail), kFailed;
}

// Bytes that a chunk must have.
bool need_whole(Source& source, uint32_t n) {
  return source.need(n) || refuse(Reason::kTruncated, kStage);
}

// Runs over type and data and compares with the stored checksum; leaves the reader behind it.
int verify(Source& source, const Chunk& chunk) {
  uint8_t type[4];
  store_be16(type, chunk.type >> 16);
  store_be16(type + 2, chunk.type);
  uint32_t crc = crc32_update(kCrcPreset, type, sizeof type);
  for (uint32_t left = chunk.length; left != 0;) {
    if (!need_whole(source, 1)) return kFailed;
    const uint32_t part = std::min(left, source.avail);
    crc = crc32_update(crc, source.take(part), part);
    left -= part;
  }
  if (!need_whole(source, kCrcBytes)) return kFailed;
  if (load_be32(source.take(kCrcBytes)) == ~crc) return kDone;
  return refuse(Reason::kDamaged, kStage, "checksum"), kCorrupt;
}

int channels(uint8_t colourType) {
  switch (colourType) {
    case kGreyAlpha:
      return 2;
    case kTruecolour:
      return 3;
    case kTruecolourAlpha:
      return 4;
    default:
      return 1;
  }
}

bool accepted_depth(uint8_t colourType, uint8_t depth) {
  const bool power = depth == 1 || depth == 2 || depth == 4 || depth == 8 || depth == 16;
  switch (colourType) {
    case kGrey:
      return power;
    case kPalette:
      return power && depth <= 8;
    case kTruecolour:
    case kGreyAlpha:
    case kTruecolourAlpha:
      return depth == 8 || depth == 16;
    default:
      return false;
  }
}

// Sides, and combinations of depth and type (table 11.1).
bool accepted(const PELOI_PNGINFO& info) {
  constexpr uint32_t kMaxSide = 0x7FFFFFFF;  // by the standard
  if (info.width == 0 || info.height == 0) return refuse(Reason::kZeroSize, kStage);
  if (info.width > kMaxSide || info.height > kMaxSide) return refuse(Reason::kDamaged, kStage, "size");
  return accepted_depth(info.colourType, info.bitDepth) ||
         refuse(Reason::kVariant, kStage, "PNG of an invalid depth");
}

int parse_ihdr(PELOI_PNGINFO& info, Source& source, uint32_t length) {
  if (length != 13) return refuse_damaged("IHDR of another length");
  if (!need_whole(source, length)) return kFailed;
  const uint8_t* p = source.take(length);
  info.width = load_uint32(p);
  info.height = load_uint32(p + 4);
  info.bitDepth = p[8];
  info.colourType = p[9];
  const uint8_t compression = p[10], filter = p[11];
  info.interlace = p[12];
  if (compression != 0 || filter != 0 || info.interlace > 1)
    return refuse_variant("PNG of an unknown compression, filter or interlace method");
  info.hasAlpha = (info.colourType & 4) != 0;
  if (!accepted(info)) return kFailed;
  const int planes = channels(info.colourType);
  info.bitsPerPixel = static_cast<uint8_t>(info.bitDepth * planes);
  info.bytesPerPixel = static_cast<uint8_t>((info.bitDepth + 7) / 8 * planes);
  // What an earlier header gave a meaning to is void.
  info.ancillaryFlags &= ~kTrnsRead;
  info.colourKey = {};
  info.paletteAlpha.fill(0xFFFF);
  info.criticalFlags = kIhdrRead;
  return kDone;
}

int parse_plte(PELOI_PNGINFO& info, Source& source, uint32_t length) {
  if ((info.criticalFlags & kIhdrRead) == 0) return refuse_damaged("PLTE before IHDR");
  if (info.colourType != kPalette) return kDone;
  if (length % 3 != 0 || length > info.palette.size()) return refuse_damaged("PLTE");
  if (!need_whole(source, length)) return kFailed;
  info.palette.fill(0);
  info.paletteAlpha.fill(0xFFFF);
  if (length != 0) std::memcpy(info.palette.data(), source.take(length), length);
  info.paletteEntries = length / 3;
  info.criticalFlags |= kPlteRead;
  return kDone;
}

int parse_trns(PELOI_PNGINFO& info, Source& source, uint32_t length) {
  if (parse_transparency(&info, &source, length, kTrns, &info.colourKey) != kDone)
    return refuse_damaged("tRNS");
  info.ancillaryFlags |= kTrnsRead;
  return kDone;
}

int note_idat(PELOI_PNGINFO& info, const Source& source, const Chunk& chunk) {
  constexpr size_t kFirstEntries = 16;
  // Streams may deliver more than they said.
  if (info.idatCount >= source.size / kChunkFrame)
    return refuse_damaged("more IDAT chunks than its size allows");
  if (info.idatCount == info.idat.size() &&
      !info.idat.grow(std::max(kFirstEntries, 2 * info.idat.size())))
    return refuse(Reason::kNoMemory, kStage), kNoMemory;
  info.idat[info.idatCount++] = {chunk.length, static_cast<uint32_t>(chunk.data)};
  info.idatLength += chunk.length;
  return kDone;
}

using ReadChunk = int (*)(PELOI_PNGINFO&, Source&, uint32_t);

// The reader of a chunk whose data are looked at here.
ReadChunk reader_of(uint32_t type) {
  switch (type) {
    case kIhdr:
      return parse_ihdr;
    case kPlte:
      return parse_plte;
    case kTrns:
      return parse_trns;
    default:
      return nullptr;
  }
}

bool read_chunk_head(Source& source, Chunk& chunk) {
  if (!need_whole(source, 8)) return false;
  const uint8_t* head = source.take(8);
  chunk.length = load_uint32(head);
  chunk.type = load_uint32(head + 4);
  chunk.data = source.tell();
  // Offsets are of 31 bits, whatever a stream that delivers more than it said may hold.
  const bool reachable = chunk.length <= source.size && chunk.data + chunk.length <= INT_MAX;
  return reachable || refuse(Reason::kTruncated, kStage);
}

// Leaves the reader behind the chunk. Only chunks whose data are wanted are visited twice.
int parse_chunk(PELOI_PNGINFO& info, Source& source, const Chunk& chunk) {
  if (const int result = verify(source, chunk); result != kDone) return result;
  if (chunk.type == kIdat) return note_idat(info, source, chunk);
  if (chunk.type == kIend) return chunk.length == 0 ? kDone : refuse_damaged("IEND with data");
  const ReadChunk read = reader_of(chunk.type);
  if (read == nullptr) return kDone;
  if (!source.move_to(chunk.data)) return refuse_damaged("a chunk out of reach");
  if (const int result = read(info, source, chunk.length); result != kDone) return result;
  if (source.skip(chunk.data + chunk.length + kCrcBytes - source.tell())) return kDone;
  return refuse_damaged("a chunk out of reach");
}

// 16-bit sample to the 16-bit key that decoded samples are compared with. A greyscale key is widened as
// its pixels are; one beyond the depth equals none.
uint16_t grey_key(uint32_t value, uint8_t depth) {
  if (depth == 16) return static_cast<uint16_t>(value >> 8);
  if (depth == 8) return static_cast<uint16_t>(value);
  if (value >> depth != 0) return kNoGrey;
  switch (depth) {
    case 1:
      return value != 0 ? 255 : 0;
    case 2:
      return static_cast<uint16_t>(value << 6 | 0x3F);
    default:
      return static_cast<uint16_t>(value << 4 | 0x0F);
  }
}

}  // namespace

uint32_t load_uint32(const uint8_t* bytes) {
  return pelo::load_be32(bytes);
}

int parse_transparency(PELOI_PNGINFO* info, Source* source, uint32_t length, uint32_t,
                       std::array<uint16_t, 3>* colourKey) {
  constexpr int kNoHeader = 3, kNotAllowed = 6;
  if ((info->criticalFlags & kIhdrRead) == 0) return kNoHeader;
  switch (info->colourType) {
    case kPalette:
      if ((info->criticalFlags & kPlteRead) == 0) return kNotAllowed;
      if (length > info->paletteEntries || !source->need(length)) return kFailed;
      for (uint32_t i = 0; i < length; ++i) info->paletteAlpha[i] = *source->take(1);
      return kDone;
    case kTruecolour:
      if (length != 6) return kNotAllowed;
      if (!source->need(length)) return kFailed;
      for (uint16_t& key : *colourKey) {
        key = static_cast<uint16_t>(pelo::load_be16(source->take(2)) >> (info->bitDepth - 8));
      }
      return kDone;
    case kGrey:
      if (length != 2) return kNotAllowed;
      if (!source->need(length)) return kFailed;
      colourKey->fill(grey_key(pelo::load_be16(source->take(2)), info->bitDepth));
      return kDone;
    default:
      return kNotAllowed;
  }
}

int refill_empty(Source* source, uint32_t need) {
  if (need > kSourceBufferSize || source->is_memory()) return kReadFailed;
  (void)source->take(source->avail);
  return source->refill(kSourceBufferSize) ? kDone : kReadFailed;
}

int refill_behind(Source* source, uint32_t need) {
  if (int64_t{need} + source->avail > kSourceBufferSize) return kReadFailed;
  return source->refill(kSourceBufferSize - source->avail) ? kDone : kReadFailed;
}

int parse_chunks(PELOI_PNGINFO* info, Source* source) {
  info->idatCount = 0;
  info->ancillaryFlags = 0;
  for (const uint8_t byte : kSignature) {
    if (!need_whole(*source, 1)) return kFailed;
    if (*source->take(1) != byte) return refuse(Reason::kUnknownFormat, kStage), kFailed;
  }
  Chunk chunk;
  do {
    if (!read_chunk_head(*source, chunk)) return kFailed;
    if (const int result = parse_chunk(*info, *source, chunk); result != kDone) return result;
  } while (chunk.length != 0);
  return kDone;
}

// ---- format detection ----

bool sniff(const uint8_t* head) {
  return std::memcmp(head, kSignature, sizeof kSignature) == 0;
}

int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  // The last byte of the height may lie behind the source's end: the buffer holds a zero there.
  if (!source.need(23)) return cut_head("PNG header");
  const uint8_t* head = source.next();
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_PNG, load_be32(head + 16), load_be32(head + 20));
}

}  // namespace pelo::png
