#include <algorithm>
#include <cstring>
#include <iterator>
#include <string_view>

#include "codec/base/errors.h"
#include "codec/decode/decode.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/formats/gif/driver.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/png/png_driver.h"
#include "tavirpelo/decode.h"

namespace pelo {
namespace {

constexpr const char* kStage = "format detection";

// No two sniffs agree on a source, so the order does not matter.
constexpr Format kFormats[] = {
    {jpeg::sniff, jpeg::parse_head, jpeg::decode, TAVIRPELO_FORMAT_JPEG, 0},
    {png::sniff, png::parse_head, png::decode, TAVIRPELO_FORMAT_PNG, 0},
    {gif::sniff, gif::parse_head, gif::decode, TAVIRPELO_FORMAT_GIF, TAVIRPELO_FORMAT_ANIMATED_GIF},
    {bmp::sniff, bmp::parse_head, bmp::decode, TAVIRPELO_FORMAT_BMP, 0},
    {bmp::sniff_wbmp, bmp::parse_wbmp_head, bmp::decode_wbmp, TAVIRPELO_FORMAT_WBMP, 0},
};

// Files that people take for pictures which we read: the bytes at a place in their heads.
struct Foreign {
  uint32_t at;
  std::string_view bytes;
  const char* name;
};
constexpr Foreign kForeign[] = {
    {4, "ftypheic", "HEIC"}, {4, "ftypheix", "HEIC"},   {4, "ftypmif1", "HEIC"},
    {4, "ftypheim", "HEIC"}, {4, "ftypavif", "AVIF"},   {4, "ftypavis", "AVIF"},
    {8, "WEBP", "WebP"},     {0, {"II*\0", 4}, "TIFF"}, {0, {"MM\0*", 4}, "TIFF"},
    {4, "ftypqt", "MOV"},    {4, "moov", "MOV"},        {4, "ftyp", "MP4"},
    {0, "%PDF", "PDF"},      {0, "<svg", "SVG"},        {0, "<?xml", "SVG"},
};

// The first bytes of a source, kept while its head is parsed.
struct Start {
  uint8_t bytes[16];
  uint32_t count;

  explicit Start(const Source& source) : count(std::min<uint32_t>(source.avail, sizeof bytes)) {
    std::memcpy(bytes, source.next(), count);
  }
  bool has(const Foreign& foreign) const {
    const size_t length = foreign.bytes.size();
    return count >= foreign.at + length &&
           std::memcmp(bytes + foreign.at, foreign.bytes.data(), length) == 0;
  }
};

// Says what a source looks like that none of our formats has.
int refuse_foreign(const Start& start) {
  const auto* foreign = std::find_if(std::begin(kForeign), std::end(kForeign),
                                     [&](const Foreign& candidate) { return start.has(candidate); });
  if (foreign != std::end(kForeign)) {
    refuse(Reason::kForeignFormat, kStage, foreign->name);
  } else {
    refuse(Reason::kUnknownFormat, kStage);
  }
  return TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace

const Format* format_of(int code) {
  for (const Format& format : kFormats) {
    if (code != 0 && (code == format.code || code == format.animatedCode)) return &format;
  }
  return nullptr;
}

int detect(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  // Shorter sources reach their format's own checks; the buffer is zero behind them.
  if (!source.need(kSniffBytes) && source.avail == 0) return cut_head(kStage);
  const Start start(source);
  const uint8_t* head = source.next();
  for (const Format& format : kFormats) {
    if (!format.sniff(head)) continue;
    const int code = format.parse(decInfo, source, hinfo);
    // Wireless bitmaps have no signature: films begin with zeros too, and pass for one of no width.
    const bool empty = decInfo.imageWidth == 0 || decInfo.imageHeight == 0;
    if (code == TAVIRPELO_FORMAT_UNKNOWN || (code == TAVIRPELO_FORMAT_WBMP && empty))
      refuse_foreign(start);
    return code;
  }
  return refuse_foreign(start);
}

int parse(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NULL);
    return TAVIRPELO_FORMAT_UNKNOWN;
  }
  return parse_source(*decInfo, hinfo, detect);
}

}  // namespace pelo
