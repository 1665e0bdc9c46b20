// What the chunks before the pixels say (ISO/IEC 15948): header, palette, transparency, and where the
// image data lie.
#pragma once

#include <array>
#include <cstdint>

#include "codec/base/source.h"
#include "tavirpelo/parse.h"

typedef pelo::Source PELOI_PNGREADBUFFER;

namespace pelo::png {

enum ColourType : uint8_t {
  kGrey = 0,
  kTruecolour = 2,
  kPalette = 3,
  kGreyAlpha = 4,
  kTruecolourAlpha = 6
};

// Outcomes of the inner operations.
enum Result {
  kDone = 1,
  kCorrupt = 6,  // checksum, zlib or DEFLATE data
  kNoMemory = 7,
  kUnreadable = 7,  // the driver's word for a file that does not parse, which shares the code
  kFailed = 8,      // anything else: header, palette, a read or seek, cancelled
  kMore = 9,        // stopped with its state kept
  kLineMode = 10    // line mode asked of an interlaced image
};

constexpr uint32_t kTrnsRead = 0x1000;            // in ancillaryFlags
constexpr uint32_t kIhdrRead = 1, kPlteRead = 2;  // in criticalFlags
constexpr uint32_t kNoGrey = 0xFFFF;              // a colour key that no pixel equals

// Where the data of a chunk lie.
struct IdatEntry {
  uint32_t length;  // bytes not yet read
  uint32_t offset;  // stream position
};

}  // namespace pelo::png

typedef struct PELOI_PNGINFO {
  std::array<uint16_t, 3> colourKey;  // R, G, B brought to the range of decoded samples
  uint32_t wholeMultiple;             // 1: the output is the image at scale 1
  uint32_t hasAlpha;                  // 1 for colour types 4 and 6
  uint32_t width, height;
  uint8_t bitDepth, colourType, interlace;
  std::array<uint16_t, 256> paletteAlpha;
  uint64_t idatLength;               // of all chunks
  std::array<uint8_t, 768> palette;  // R, G, B; entries that the file lacks are black
  uint32_t paletteEntries;
  uint32_t ancillaryFlags, criticalFlags;
  uint8_t bitsPerPixel;
  uint8_t bytesPerPixel;                      // the filters' distance, at least 1
  pelo::OsBuffer<pelo::png::IdatEntry> idat;  // grows as chunks are found
  uint32_t idatCount;
} PELOI_PNGINFO;

namespace pelo::png {

// Reads the chunks from the source's start to the first empty chunk; their data are checked, not
// decompressed. A Result: 1, 6 (a checksum differs), 7, 8.
int parse_chunks(PELOI_PNGINFO* info, Source* source);

// Reads the `length` bytes of a tRNS chunk at the cursor into the palette's alpha or the colour key. 1;
// 3 before any IHDR; 6 for a colour type or length that allows none; 8 when the read fails or there are
// more values than palette entries. The chunk type is not looked at.
int parse_transparency(PELOI_PNGINFO* info, Source* source, uint32_t length, uint32_t chunkType,
                       std::array<uint16_t, 3>* colourKey);

// Given steps: one refill of an empty window, and one behind the unread bytes. 1, or 11 when `need`
// (more) bytes exceed 4096, the source is memory or has no more.
int refill_empty(Source* source, uint32_t need);
int refill_behind(Source* source, uint32_t need);

// A big-endian 32-bit value.
uint32_t load_uint32(const uint8_t* bytes);

// ---- the checksum of chunks: ISO 3309, reflected polynomial 0xEDB88320 ----

constexpr uint32_t kCrcPreset = 0xFFFFFFFF;

// The register after `size` more bytes. The checksum is the complement of the last register.
uint32_t crc32_update(uint32_t crc, const uint8_t* data, size_t size);

// The checksum of a byte array.
uint32_t crc32(const uint8_t* data, uint32_t length);

// ---- format detection (5.2 and 11.2.2) ----

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::png
