#include "codec/formats/gif/stream.h"

#include <algorithm>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/formats/format.h"
#include "codec/formats/gif/record.h"
#include "codec/pixel/quad_sampler.h"

namespace pelo::gif {

int fill_buffer(int need, TAVIRPELO_IO* io, uint8_t* buffer, int* remaining, uint8_t** cursor) {
  if (*remaining >= need) return 1;
  if (need > static_cast<int>(kSourceBufferSize)) return 0;
  const auto avail = static_cast<uint32_t>(std::max(*remaining, 0));
  const auto pos = avail == 0 ? 0 : static_cast<uint32_t>(*cursor - buffer);
  Source source{io, 0, 0, pos, avail, buffer};
  const bool filled = source.need(static_cast<uint32_t>(need));
  *remaining = static_cast<int>(source.avail);
  *cursor = buffer + source.pos;
  return filled ? 1 : 0;
}

const uint8_t* take_block(Source& reader, int n) {
  const auto count = static_cast<uint32_t>(n);
  const bool whole = reader.need(count);
  const uint8_t* bytes = reader.take(whole ? count : reader.avail);
  return whole ? bytes : nullptr;
}

bool skip_sub_blocks(Source& reader) {
  for (;;) {
    const uint8_t* size = take_block(reader, 1);
    if (size == nullptr) return false;
    if (*size == 0) return true;
    if (take_block(reader, *size) == nullptr) return false;
  }
}

namespace {

constexpr uint8_t kImageSeparator = 0x2C;
constexpr uint8_t kExtensionIntroducer = 0x21;
constexpr uint8_t kTrailerByte = 0x3B;
constexpr uint8_t kPlainText = 0x01;
constexpr uint8_t kGraphicControl = 0xF9;
constexpr uint8_t kComment = 0xFE;
constexpr uint8_t kApplication = 0xFF;

bool is_digit(uint8_t c) {
  return c >= '0' && c <= '9';
}

// Any two digits and a letter are a version: 87a and 89a differ in nothing that matters here.
bool is_signature(const uint8_t* b) {
  return b[0] == 'G' && b[1] == 'I' && b[2] == 'F' && is_digit(b[3]) && is_digit(b[4]) && b[5] >= 'A' &&
         b[5] <= 'z';
}

// Bytes that a block must have.
const uint8_t* take_whole(Source& reader, int n) {
  const uint8_t* bytes = take_block(reader, n);
  if (bytes == nullptr) refuse(Reason::kTruncated, "GIF blocks");
  return bytes;
}

// Bytes of the colour table that a descriptor's flags announce; 0 without one.
int colour_table(uint8_t flags) {
  return flags & 0x80 ? 3 << ((flags & 7) + 1) : 0;
}

// Reads a colour table that is there. Entries it does not have are black.
bool read_table(Source& reader, uint8_t flags, uint32_t* table) {
  const int size = colour_table(flags);
  const uint8_t* bytes = take_whole(reader, size);
  if (bytes == nullptr) return false;
  std::fill_n(table, 256, 0u);
  pack_table(bytes, size / 3, table);
  return true;
}

bool read_graphic_control(Source& reader, GraphicControl& control) {
  const uint8_t* b = take_whole(reader, 6);  // size, flags, delay, transparent index, terminator
  if (b == nullptr) return false;
  if (b[0] != 4 || b[5] != 0) return refuse(Reason::kDamaged, "GIF blocks", "graphic control");
  control.disposal = b[1] >> 2 & 7;
  control.transparent = (b[1] & 1) != 0;
  control.delay = load_le16(b + 2) * 10;
  control.transparentIndex = control.transparent ? b[4] : -1;
  return true;
}

// Of an unknown extension the label alone is passed.
bool read_extension(Record& record) {
  const uint8_t* label = take_whole(record.reader, 1);
  if (label == nullptr) return false;
  switch (*label) {
    case kGraphicControl:
      return read_graphic_control(record.reader, record.control);
    case kPlainText:
    case kComment:
    case kApplication:
      return skip_sub_blocks(record.reader) || refuse(Reason::kTruncated, "GIF blocks");
    default:
      return true;
  }
}

bool read_image_descriptor(Record& record) {
  const uint8_t* b = take_whole(record.reader, 9);
  if (b == nullptr) return false;
  record.frame = {load_le16(b), load_le16(b + 2), load_le16(b + 4), load_le16(b + 6)};
  const uint8_t flags = b[8];
  record.interlacePass = flags >> 6 & 1;
  record.currentRow = 0;
  record.colours = record.globalTable;
  if (flags & 0x80) {
    if (!read_table(record.reader, flags, record.localTable)) return false;
    record.colours = record.localTable;
  }
  const uint8_t* size = take_whole(record.reader, 1);
  if (size == nullptr) return false;
  record.minimumCodeSize = *size;
  return true;
}

}  // namespace

void pack_table(const uint8_t* rgbBytes, int count, uint32_t* table) {
  for (int i = 0; i < count; ++i, rgbBytes += 3) {
    table[i] = pack_lanes(rgbBytes[0], rgbBytes[1], rgbBytes[2]);
  }
}

int parse_header(TAVIRPELO_IO* source, Record* record) {
  Source& reader = record->reader;
  if (seek_io(source, 0, SEEK_SET) < 0) return refuse(Reason::kSource, "GIF screen");
  reader.attach(source);
  const uint8_t* b = take_whole(reader, 13);
  if (b == nullptr) return 0;
  if (!is_signature(b)) return refuse(Reason::kUnknownFormat, "GIF screen");
  record->screen = {load_le16(b + 6), load_le16(b + 8)};
  const uint8_t flags = b[10];
  record->backgroundIndex = b[11];
  return (flags & 0x80) == 0 || read_table(reader, flags, record->globalTable);
}

int seek_image(TAVIRPELO_IO* source, Record* record) {
  record->reader.io = source;
  for (;;) {
    const uint8_t* introducer = take_whole(record->reader, 1);
    if (introducer == nullptr) return kFailed;
    switch (*introducer) {
      case kImageSeparator:
        return read_image_descriptor(*record) ? kImageFollows : kFailed;
      case kTrailerByte:
        return kTrailer;
      case kExtensionIntroducer:
        if (!read_extension(*record)) return kFailed;
        break;
      default:
        break;
    }
  }
}

// ---- format detection ----

namespace {

bool skip_image(Source& source) {
  if (!source.need(9)) return false;
  const uint8_t flags = source.take(9)[8];
  if (!source.skip(colour_table(flags) + int64_t{1})) return false;  // and the minimum code size
  uint8_t size;
  do {
    if (!source.need(1)) return false;
    size = *source.next();
    if (!source.skip(size + 1)) return false;
  } while (size != 0);
  return true;
}

// Known extensions are passed whole; of others the label alone, and their bodies are scanned.
bool skip_extension(Source& source) {
  if (!source.need(2)) return false;
  const uint8_t label = *source.take(1);
  const bool known =
      label == kGraphicControl || label == kComment || label == kApplication || label == kPlainText;
  return !known || skip_sub_blocks(source);
}

// Images up to the trailer; negative when the source ends before it.
int count_images(Source& source) {
  for (int images = 0;;) {
    if (!source.need(1)) return -1;
    switch (*source.take(1)) {
      case kImageSeparator:
        if (!skip_image(source)) return -1;
        ++images;
        break;
      case kExtensionIntroducer:
        if (!skip_extension(source)) return -1;
        break;
      case kTrailerByte:
        return images;
      default:
        break;
    }
  }
}

}  // namespace

bool sniff(const uint8_t* head) {
  return head[0] == 'G' && head[1] == 'I' && head[2] == 'F';
}

int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (!source.need(13)) {
    return refuse(Reason::kTruncated, "GIF screen"), TAVIRPELO_FORMAT_UNKNOWN;
  }
  const uint8_t* screen = source.take(13);
  found(decInfo, nullptr, TAVIRPELO_FORMAT_GIF, load_le16(screen + 6), load_le16(screen + 8));
  const int images = source.skip(colour_table(screen[10])) ? count_images(source) : -1;
  if (images < 0) return refuse(Reason::kTruncated, "GIF blocks", "a GIF without its end"), 0;
  if (hinfo != nullptr) hinfo->frameCount = images;
  if (images == 0) return refuse(Reason::kDamaged, "GIF blocks", "a GIF without an image"), 0;
  return images == 1 ? TAVIRPELO_FORMAT_GIF : TAVIRPELO_FORMAT_ANIMATED_GIF;
}

}  // namespace pelo::gif
