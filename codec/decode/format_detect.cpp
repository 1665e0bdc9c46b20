// Detection by the first bytes, and what the parser learns from each format's header.
#include "codec/base/errors.h"
#include "codec/decode/format_detect.h"

#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/header_scan.h"

using namespace pelo;

namespace {

constexpr uint32_t kMaxWbmpSide = 5000;

int unreadable() {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_HEADER);
  return TAVIRPELO_FORMAT_UNKNOWN;
}

void count_frames(TAVIRPELO_HINFO* hinfo, int frames) {
  if (hinfo != nullptr) hinfo->frameCount = frames;
}

int store_size(TAVIRPELO_DECINFO& decInfo, uint32_t width, uint32_t height, int format) {
  decInfo.imageWidth = static_cast<int>(width);
  decInfo.imageHeight = static_cast<int>(height);
  return format;
}

bool read_byte(PELOJ_SOURCE& source, uint8_t& byte) {
  if (!source_need(source, 1)) return false;
  byte = *source_take(source, 1);
  return true;
}

// Bytes of a colour table by its descriptor's flags; 0 without one.
uint32_t colour_table(uint8_t flags) { return flags & 0x80 ? 3u << ((flags & 7) + 1) : 0; }

// Data sub-blocks up to and with the empty one; whole ones in the buffer when asked so.
bool skip_sub_blocks(PELOJ_SOURCE& source, bool whole) {
  uint8_t size;
  do {
    if (!source_need(source, 1)) return false;
    size = source.buffer[source.pos];
    if (whole && !source_need(source, size + 1u)) return false;
    if (!source_skip(source, size + 1)) return false;
  } while (size != 0);
  return true;
}

bool skip_image(PELOJ_SOURCE& source) {
  if (!source_need(source, 9)) return false;
  const uint8_t flags = source_take(source, 9)[8];
  return source_skip(source, colour_table(flags) + int64_t{1}) && skip_sub_blocks(source, false);
}

// Known extensions are passed whole; of others the label alone, and their bodies are scanned.
bool skip_extension(PELOJ_SOURCE& source) {
  if (!source_need(source, 2)) return false;
  const uint8_t label = *source_take(source, 1);
  const bool known = label == 0xF9 || label == 0xFE || label == 0xFF || label == 0x01;
  return !known || skip_sub_blocks(source, true);
}

// A multi-byte integer of at most `room` bytes: seven bits each, most significant first, bit 7 set on
// all but the last. 1 read, 0 too long, -1 the source ended.
int read_multi_byte(PELOJ_SOURCE& source, uint32_t& room, uint32_t& value) {
  value = 0;
  uint8_t byte;
  do {
    if (room-- == 0) return 0;
    if (!read_byte(source, byte)) return -1;
    value = value << 7 | (byte & 0x7F);
  } while (byte & 0x80);
  return 1;
}

int parse_png(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo) {
  // The last byte of the height may lie behind the source's end: the buffer holds a zero there.
  if (!source_need(source, 23)) return unreadable();
  const uint8_t* head = source.buffer + source.pos;
  count_frames(hinfo, 1);
  return store_size(decInfo, load_be32(head + 16), load_be32(head + 20), TAVIRPELO_FORMAT_PNG);
}

int parse_jpeg(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo) {
  if (hinfo == nullptr) return TAVIRPELO_FORMAT_JPEG;
  if (!PELOJ_GetHInfo(source.io, hinfo)) return unreadable();
  count_frames(hinfo, 1);
  return store_size(decInfo, static_cast<uint32_t>(hinfo->width), static_cast<uint32_t>(hinfo->height),
                    TAVIRPELO_FORMAT_JPEG);
}

int parse_bmp(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo) {
  if (!source_need(source, 26)) return unreadable();
  const uint8_t* head = source.buffer + source.pos;
  count_frames(hinfo, 1);
  return store_size(decInfo, load_le32(head + 18), load_le32(head + 22), TAVIRPELO_FORMAT_BMP);
}

}  // namespace

int __PELO_ParserGIF(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, TAVIRPELO_HINFO* hinfo) {
  if (!source_need(*source, 13)) return TAVIRPELO_FORMAT_UNKNOWN;
  const uint8_t* screen = source_take(*source, 13);
  store_size(*decInfo, load_le16(screen + 6), load_le16(screen + 8), TAVIRPELO_FORMAT_GIF);
  if (!source_skip(*source, colour_table(screen[10]))) return TAVIRPELO_FORMAT_UNKNOWN;
  int images = 0;
  for (uint8_t introducer = 0; introducer != 0x3B;) {
    if (!read_byte(*source, introducer)) return TAVIRPELO_FORMAT_UNKNOWN;
    if (introducer == 0x2C) {
      if (!skip_image(*source)) return TAVIRPELO_FORMAT_UNKNOWN;
      ++images;
    }
    if (introducer == 0x21 && !skip_extension(*source)) return TAVIRPELO_FORMAT_UNKNOWN;
  }
  count_frames(hinfo, images);
  if (images == 0) return TAVIRPELO_FORMAT_UNKNOWN;
  return images == 1 ? TAVIRPELO_FORMAT_GIF : TAVIRPELO_FORMAT_ANIMATED_GIF;
}

int __PELO_ParserWBMP(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source) {
  if (source->size <= 3) return TAVIRPELO_FORMAT_UNKNOWN;
  if (!source_need(*source, 2)) return unreadable();
  source_take(*source, 2);
  // Both fields end within 17 bytes of the two that open the file.
  uint32_t room = 17;
  uint32_t size[2];
  for (uint32_t& side : size) {
    const int result = read_multi_byte(*source, room, side);
    if (result < 0) return unreadable();
    if (result == 0) return TAVIRPELO_FORMAT_UNKNOWN;
  }
  store_size(*decInfo, size[0], size[1], TAVIRPELO_FORMAT_WBMP);
  return size[0] <= kMaxWbmpSide && size[1] <= kMaxWbmpSide ? TAVIRPELO_FORMAT_WBMP
                                                            : TAVIRPELO_FORMAT_UNKNOWN;
}

int PELO_Parse(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, TAVIRPELO_HINFO* hinfo) {
  // Shorter sources reach their format's own checks; the buffer is zero behind them.
  if (PELOJ_CheckBuffer(source, 8) == 0) return unreadable();
  constexpr uint8_t kPngTail[7] = {'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A};
  const uint8_t* b = source->buffer + source->pos;
  if (b[0] == 'G' && b[1] == 'I' && b[2] == 'F') return __PELO_ParserGIF(decInfo, source, hinfo);
  if (b[0] == 0x89 && std::memcmp(b + 1, kPngTail, 7) == 0) return parse_png(*decInfo, *source, hinfo);
  if (b[0] == 0xFF && b[1] == 0xD8) return parse_jpeg(*decInfo, *source, hinfo);
  if (b[0] == 0x00) {
    if (b[1] >= 0x80) return TAVIRPELO_FORMAT_UNKNOWN;
    count_frames(hinfo, 1);
    return __PELO_ParserWBMP(decInfo, source);
  }
  if (b[0] == 'B' && b[1] == 'M') return parse_bmp(*decInfo, *source, hinfo);
  return TAVIRPELO_FORMAT_UNKNOWN;
}

int TAVIRPELO_Parser(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NULL);
    return TAVIRPELO_FORMAT_UNKNOWN;
  }
  if (hinfo != nullptr) *hinfo = {};
  BufferedSource source;
  if (!source.open(decInfo->pIO)) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_MEMORY);
    return TAVIRPELO_FORMAT_UNKNOWN;
  }
  if (TAVIRPELO_Seek_IO(decInfo->pIO, 0, SEEK_SET) < 0) return TAVIRPELO_FORMAT_UNKNOWN;
  decInfo->imageFormat = PELO_Parse(decInfo, source.get(), hinfo);
  if (hinfo != nullptr) {
    hinfo->width = decInfo->imageWidth;
    hinfo->height = decInfo->imageHeight;
    hinfo->sourceSize = static_cast<int>(source->size);
  }
  return decInfo->imageFormat;
}

namespace {

// Parses a fresh object's source; the record's source size stays as the caller left it.
int parse_once(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* record) {
  if (decInfo == nullptr) return TAVIRPELO_FORMAT_UNKNOWN;
  TAVIRPELO_HINFO header;
  const int format = TAVIRPELO_Parser(decInfo, &header);
  TAVIRPELO_DestroyDecInfo(decInfo);
  if (record != nullptr) {
    header.sourceSize = record->sourceSize;
    *record = header;
  }
  return format;
}

int refuse(int code) {
  record_error(ErrorWord::kCodec, code);
  return TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace

int elo_parse_from_file(const char* path, TAVIRPELO_HINFO* record) {
  return parse_once(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0, 0, 0), record);
}

int elo_parse_from_buffer(void* buffer, int size, TAVIRPELO_HINFO* record) {
  return parse_once(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, buffer, size, 0, 0), record);
}

int TAVIRPELO_ParseFromFile(const char* path, TAVIRPELO_HINFO* record) {
  if (path == nullptr || record == nullptr) return refuse(TAVIRPELO_CODEC_ARGUMENT);
  *record = {};
  return elo_parse_from_file(path, record);
}

int TAVIRPELO_ParseFromBuffer(void* buffer, int size, TAVIRPELO_HINFO* record) {
  if (buffer == nullptr || record == nullptr) return refuse(TAVIRPELO_CODEC_ARGUMENT);
  if (size == 0) return refuse(TAVIRPELO_CODEC_SIZE);
  *record = {};
  return elo_parse_from_buffer(buffer, size, record);
}
