#include "codec/formats/gif/head.h"

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"

namespace pelo::gif {
namespace {

// Bytes of a colour table by its descriptor's flags; 0 without one.
uint32_t colour_table(uint8_t flags) {
  return flags & 0x80 ? 3u << ((flags & 7) + 1) : 0;
}

// Data sub-blocks up to and with the empty one; whole ones in the buffer when asked so.
bool skip_sub_blocks(Source& source, bool whole) {
  uint8_t size;
  do {
    if (!source.need(1)) return false;
    size = *source.next();
    if (whole && !source.need(size + 1u)) return false;
    if (!source.skip(size + 1)) return false;
  } while (size != 0);
  return true;
}

bool skip_image(Source& source) {
  if (!source.need(9)) return false;
  const uint8_t flags = source.take(9)[8];
  return source.skip(colour_table(flags) + int64_t{1}) && skip_sub_blocks(source, false);
}

// Known extensions are passed whole; of others the label alone, and their bodies are scanned.
bool skip_extension(Source& source) {
  if (!source.need(2)) return false;
  const uint8_t label = *source.take(1);
  const bool known = label == 0xF9 || label == 0xFE || label == 0xFF || label == 0x01;
  return !known || skip_sub_blocks(source, true);
}

// Images up to the trailer; negative when the source ends before it.
int count_images(Source& source) {
  for (int images = 0;;) {
    if (!source.need(1)) return -1;
    switch (*source.take(1)) {
      case 0x2C:
        if (!skip_image(source)) return -1;
        ++images;
        break;
      case 0x21:
        if (!skip_extension(source)) return -1;
        break;
      case 0x3B:
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
