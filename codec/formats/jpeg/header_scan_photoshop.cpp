// Thumbnails among Photoshop image resources.
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/header_scan_segments.h"

namespace pelo::jpeg {
namespace {

constexpr uint32_t kIdentifier = 14;       // "Photoshop 3.0" and a zero
constexpr uint32_t kThumbnailHeader = 28;  // bytes in front of the thumbnail's data

struct Resource {
  uint16_t id;
  int64_t size;  // without padding
};

bool is_thumbnail(const Resource& resource) {
  return (resource.id == 0x0409 || resource.id == 0x040C) && resource.size >= kThumbnailHeader;
}

// "8BIM", id, a name padded with its length byte to an even number of bytes, the size of the data.
bool next_resource(const Segment& segment, Resource& resource) {
  PELOJ_SOURCE& source = segment.source;
  if (!segment.holds(7)) return false;
  const uint8_t* head = source.take(7);
  if (std::memcmp(head, "8BIM", 4) != 0) return false;
  resource.id = load_be16(head + 4);
  const uint32_t nameRest = (head[6] & 0xFEu) + 1;
  if (!segment.holds(nameRest + 4)) return false;
  resource.size = load_be32(source.take(nameRest + 4) + nameRest);
  return resource.size <= segment.left();
}

void read_thumbnail(const Segment& segment, ThumbnailSearch& search) {
  const uint8_t* head = segment.source.take(kThumbnailHeader);
  const bool pixels = load_be32(head) == 0;
  PELOJ_THUMBNAIL thumbnail{};
  thumbnail.type = pixels ? PELOJ_THUMBNAIL_PIXELS : PELOJ_THUMBNAIL_PHOTOSHOP;
  thumbnail.layout = pixels ? 2 : 0;
  thumbnail.width = static_cast<int32_t>(load_be32(head + 4));
  thumbnail.height = static_cast<int32_t>(load_be32(head + 8));
  thumbnail.length = load_be32(head + 20);
  thumbnail.offset = segment.source.tell();
  search.accept(thumbnail);
}

}  // namespace

bool read_photoshop(const Segment& segment, ThumbnailSearch& search) {
  if (search.found.present != 0 || segment.left() < kIdentifier) return true;
  if (!segment.source.skip(kIdentifier)) return false;
  Resource resource;
  while (next_resource(segment, resource)) {
    const int64_t next = segment.source.tell() + resource.size + (resource.size & 1);
    if (is_thumbnail(resource) && segment.holds(kThumbnailHeader)) read_thumbnail(segment, search);
    if (next > segment.end) break;
    if (!segment.source.skip(next - segment.source.tell())) return false;
  }
  return true;
}

}  // namespace pelo::jpeg
