// Set-up of a BMP decode: headers, palette, bit fields, and the picture's place in the output.
#include <algorithm>
#include <climits>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/base/geometry.h"
#include "codec/base/io.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/formats/format.h"
#include "codec/pixel/quad_sampler.h"
#include "codec/pixel/row_stores.h"

namespace pelo::bmp {
namespace {

constexpr const char* kStage = "BMP header";
constexpr int64_t kHeadBytes = 54;
constexpr int64_t kFileHeader = 14;
constexpr uint8_t kCoreHeader = 12;  // header of 16-bit sizes and three-byte palette entries
constexpr uint32_t kBitFields = 3;

// Bytes [offset, offset + count) of a file or memory source; false when it ends before.
bool read_at(TAVIRPELO_IO* io, int64_t offset, uint8_t* out, int64_t count) {
  if (offset + count > io->size) return refuse(Reason::kTruncated, kStage);
  if (io->ioType == TAVIRPELO_IO_MEMORY) {
    std::memcpy(out, static_cast<const uint8_t*>(io->pSource) + offset, static_cast<size_t>(count));
    return true;
  }
  const auto target = static_cast<int>(offset);
  if (io->ioType != TAVIRPELO_IO_FILE) return refuse(Reason::kSource, kStage);
  return (seek_io(io, target, SEEK_SET) == target &&
          read_io(io, out, static_cast<int>(count)) == count) ||
         refuse(Reason::kTruncated, kStage);
}

// ---- headers ----

const char* name_of_header(uint8_t size) {
  switch (size) {
    case 108:
      return "BMP with a 108-byte header";
    case 124:
      return "BMP with a 124-byte header";
    default:
      return "BMP with a header of unknown size";
  }
}

bool read_sizes(PELOI_BMPRECORD& record, const uint8_t* head) {
  const uint8_t headerSize = head[kFileHeader];
  int64_t height;
  if (headerSize == kCoreHeader) {
    record.width = load_le16(head + 18);
    height = load_le16(head + 20);
    record.bitCount = load_le16(head + 24);
  } else if (headerSize == 40 || (headerSize >= 56 && headerSize <= 64)) {
    record.width = static_cast<int32_t>(load_le32(head + 18));
    height = static_cast<int32_t>(load_le32(head + 22));
    record.bitCount = load_le16(head + 28);
    record.compression = load_le32(head + 30);
  } else {
    TAVIRPELO_PrintMessage("__ValorenBmpInitialize : invalid BMP head size");
    return refuse(Reason::kVariant, kStage, name_of_header(headerSize));
  }
  record.topDown = height < 0;
  height = record.topDown ? -height : height;
  record.height = static_cast<int>(std::min<int64_t>(height, INT_MAX));
  if (record.width == 0 || height == 0) return refuse(Reason::kZeroSize, kStage);
  return (record.width > 0 && height <= INT_MAX) || refuse(Reason::kDamaged, kStage, "size");
}

// Run lengths, JPEG and PNG inside are not decoded; bit fields have 16 bits.
bool accepted_compression(const PELOI_BMPRECORD& record) {
  switch (record.compression) {
    case 1:
    case 2:
      return refuse(Reason::kVariant, kStage, "BMP with run lengths");
    case 4:
    case 5:
      return refuse(Reason::kVariant, kStage, "BMP around a JPEG or PNG");
    case kBitFields:
      return record.bitCount == 16 ||
             refuse(Reason::kVariant, kStage, "BMP with bit fields of other than 16 bits");
    default:
      return true;
  }
}

bool known_bit_count(int bitCount) {
  return bitCount == 1 || bitCount == 4 || bitCount == 8 || bitCount == 16 || bitCount == 24 ||
         bitCount == 32;
}

// The entries between the header and the pixels.
bool read_palette(PELOI_BMPRECORD& record, TAVIRPELO_IO* io, uint8_t headerSize) {
  const int64_t entryBytes = headerSize == kCoreHeader ? 3 : 4;
  const int64_t start = kFileHeader + headerSize;
  const int64_t entries = (int64_t{record.dataOffset} - start) / entryBytes;
  if (entries < 1) return refuse(Reason::kDamaged, kStage, "no palette");
  if (start + entries * entryBytes > io->size) return refuse(Reason::kTruncated, kStage);
  uint8_t bytes[256 * 4];
  const int64_t kept = std::min<int64_t>(entries, 256);
  if (!read_at(io, start, bytes, kept * entryBytes)) return false;
  for (int64_t i = 0; i < kept; ++i) {
    const uint8_t* bgr = bytes + i * entryBytes;
    record.colours.palette[static_cast<size_t>(i)] = {bgr[2], bgr[1], bgr[0], 255};
  }
  return true;
}

struct FieldLayout {
  PELOI_BMPCOLOURS::Field red, green, blue;
};
constexpr FieldLayout kFieldLayouts[] = {{{0xF800, 0}, {0x07E0, 0}, {0x001F, 0}},   // 5-6-5
                                         {{0x0F00, 4}, {0x00F0, 3}, {0x000F, 1}},   // 4-4-4
                                         {{0x7C00, 1}, {0x03E0, 1}, {0x001F, 0}}};  // 5-5-5

bool read_fields(PELOI_BMPRECORD& record, TAVIRPELO_IO* io) {
  uint32_t masks[3] = {0x7C00, 0x03E0, 0x001F};
  if (record.compression != 0) {
    uint8_t bytes[12];
    if (!read_at(io, kHeadBytes, bytes, sizeof bytes)) return false;
    for (size_t i = 0; i < 3; ++i) masks[i] = load_le32(bytes + 4 * i);
  }
  for (const FieldLayout& layout : kFieldLayouts) {
    if (masks[0] != layout.red.mask || masks[1] != layout.green.mask || masks[2] != layout.blue.mask)
      continue;
    record.colours.red = layout.red;
    record.colours.green = layout.green;
    record.colours.blue = layout.blue;
    return true;
  }
  return refuse(Reason::kVariant, kStage, "BMP with uncommon bit fields");
}

bool read_headers(PELOI_BMPRECORD& record, TAVIRPELO_IO* io) {
  uint8_t head[kHeadBytes];
  if (!read_at(io, 0, head, kHeadBytes)) return false;
  if (head[0] != 'B' || head[1] != 'M') return refuse(Reason::kUnknownFormat, kStage);
  record.dataOffset = load_le32(head + 10);
  if (!read_sizes(record, head) || !accepted_compression(record)) return false;
  for (auto& colour : record.colours.palette) colour = {0, 0, 0, 255};
  if (record.bitCount == 1 || record.bitCount == 4 || record.bitCount == 8) {
    return read_palette(record, io, head[kFileHeader]);
  }
  return record.bitCount != 16 || read_fields(record, io);
}

// ---- output ----

void choose_size(PELOI_BMPRECORD& record) {
  const Size box = turned(record.request.buffer, record.request.option);
  const Size picture{record.width, record.height};
  Size out = box;
  if ((record.request.option & TAVIRPELO_FIT_MASK) != TAVIRPELO_FIT_STRETCH) {
    record.oneToOne = picture.width <= box.width && picture.height <= box.height;
    out = fit_by_width(picture.width, picture.height, box);
  }
  record.outWidth = out.width;
  record.outHeight = out.height;
}

bool prepare_resizing(PELOI_BMPRECORD& record) {
  if (record.oneToOne) return true;
  const auto width = static_cast<size_t>(record.outWidth);
  const auto allocate = [&] {
    return record.columns.allocate(2 * width) && record.accumulators.allocate(width);
  };
  if (!obtain_block(int64_t{record.outWidth} * 8, "BMP picture", allocate)) return false;
  QuarterPoints columns(record.width, record.outWidth);
  for (size_t x = 0; x < width; ++x, columns.advance()) {
    record.columns[x] = static_cast<uint32_t>(columns.first());
    record.columns[width + x] = static_cast<uint32_t>(columns.second());
  }
  return true;
}

bool prepare_rows(PELOI_BMPRECORD& record, TAVIRPELO_IO* io) {
  if (!known_bit_count(record.bitCount)) return true;  // nothing will be decoded
  const int64_t rowSize = row_size(record.width, record.bitCount);
  if (rowSize > INT_MAX) return refuse(Reason::kBlockLimit, "BMP picture");
  const RowLayout layout{record.dataOffset, rowSize, record.width, record.bitCount};
  return record.reader.open(io, layout, io->readSize) &&
         (record.outWidth == 0 || record.outHeight == 0 || prepare_resizing(record));
}

}  // namespace
PELOI_BMPRECORD* make_record(TAVIRPELO_DECINFO* decInfo, int width, int height, void* output) {
  auto record = pelo::os_new<PELOI_BMPRECORD>();
  if (record == nullptr) return refuse(Reason::kNoMemory, kStage), nullptr;
  if (decInfo->pIO == nullptr || !read_headers(*record, decInfo->pIO)) return nullptr;
  record->kind = PELOI_BMPRECORD::kKind;
  record->output = output;
  record->request = request_of(*decInfo, width, height);
  record->decInfo = decInfo;
  decInfo->scaleDenom = 1;
  decInfo->imageWidth = record->width;
  decInfo->imageHeight = record->height;
  choose_size(*record);
  if (!prepare_rows(*record, decInfo->pIO)) return nullptr;
  decInfo->outWidth = record->outWidth;
  decInfo->outHeight = record->outHeight;
  record->grid = pelo::OutputGrid(output, {width, height}, {record->outWidth, record->outHeight},
                                  pelo::bytes_per_pixel(decInfo->outFormat), decInfo->option);
  return record.release();
}

void delete_record(PELOI_BMPRECORD* record) {
  pelo::OsDelete{}(record);
}

int release(TAVIRPELO_DECINFO* decInfo) {
  pelo::release_state<PELOI_BMPRECORD>(*decInfo);
  return 1;
}

// ---- format detection ----

bool sniff(const uint8_t* head) {
  return head[0] == 'B' && head[1] == 'M';
}

int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (!source.need(26)) return cut_head("BMP header");
  const uint8_t* head = source.next();
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_BMP, load_le32(head + 18), load_le32(head + 22));
}

}  // namespace pelo::bmp
