#include "codec/formats/gif/stream.h"

#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/formats/gif/record.h"
#include "codec/pixel/quad_sampler.h"

namespace pelo::gif {

int fill_buffer(int need, TAVIRPELO_IO* source, uint8_t* buffer, int* remaining, uint8_t** cursor) {
  if (*remaining >= need) return 1;
  if (need > kReaderBytes) return 0;
  if (*remaining > 0) std::memmove(buffer, *cursor, static_cast<size_t>(*remaining));
  *cursor = buffer;
  while (*remaining < need) {
    const int count = read_io(source, buffer + *remaining, kReaderBytes - *remaining);
    if (count < 1) return 0;
    *remaining += count;
  }
  return 1;
}

const uint8_t* take(Reader& reader, int n) {
  if (!fill_buffer(n, reader.source, reader.buffer, &reader.remaining, &reader.cursor)) {
    reader.remaining = 0;  // the rest of what was cut is no block
    return nullptr;
  }
  const uint8_t* bytes = reader.cursor;
  reader.cursor += n;
  reader.remaining -= n;
  return bytes;
}

bool skip_sub_blocks(Reader& reader) {
  for (;;) {
    const uint8_t* size = take(reader, 1);
    if (size == nullptr) return false;
    if (*size == 0) return true;
    if (take(reader, *size) == nullptr) return false;
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
const uint8_t* take_whole(Reader& reader, int n) {
  const uint8_t* bytes = take(reader, n);
  if (bytes == nullptr) refuse(Reason::kTruncated, "GIF blocks");
  return bytes;
}

// The colour table that a descriptor's flags announce. Entries it does not have are black.
bool read_table(Reader& reader, uint8_t flags, uint32_t* table) {
  const int count = 2 << (flags & 7);
  const uint8_t* bytes = take_whole(reader, 3 * count);
  if (bytes == nullptr) return false;
  std::fill_n(table, 256, 0u);
  pack_table(bytes, count, table);
  return true;
}

bool read_graphic_control(Reader& reader, GraphicControl& control) {
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
  Reader& reader = record->reader;
  reader.source = source;
  reader.remaining = 0;
  if (seek_io(source, 0, SEEK_SET) < 0) return refuse(Reason::kSource, "GIF screen");
  const uint8_t* b = take_whole(reader, 13);
  if (b == nullptr) return 0;
  if (!is_signature(b)) return refuse(Reason::kUnknownFormat, "GIF screen");
  record->screen = {load_le16(b + 6), load_le16(b + 8)};
  const uint8_t flags = b[10];
  record->backgroundIndex = b[11];
  return (flags & 0x80) == 0 || read_table(reader, flags, record->globalTable);
}

int seek_image(TAVIRPELO_IO* source, Record* record) {
  record->reader.source = source;
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

}  // namespace pelo::gif
