// Getting pictures back: stored JPEG data, and pixels for the application's bitmaps.
#include <climits>
#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/codec_objects.h"
#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/subfile_table.h"
#include "slideshow/vss_wrappers.h"

using namespace pelo::slideshow;

namespace {

// Bytes of the pixel array; 0 for a size that no Java array holds.
size_t pixel_bytes(int width, int height) {
  if (width < 1 || height < 1) return 0;
  const int64_t pixels = int64_t{width} * height;
  return pixels > INT_MAX || pixels > static_cast<int64_t>(SIZE_MAX / 4)
             ? 0
             : static_cast<size_t>(pixels) * 4;
}

int draw(int ioType, void* source, int size, void* pixels, int width, int height) {
  const size_t bytes = pixel_bytes(width, height);
  if (bytes == 0 || pixels == nullptr) return 0;
  const DecInfo decInfo(TAVIRPELO_CreateDecInfo(ioType, source, size, TAVIRPELO_BGRA8888, 0));
  if (!decInfo) return 0;
  TAVIRPELO_HINFO header;
  const int format = TAVIRPELO_Parser(decInfo.get(), &header);
  vss_memset(pixels, 0, bytes);  // transparent around a fitted picture
  // Wireless bitmaps are not drawn: their decoder writes no pixels with alpha.
  return format != TAVIRPELO_FORMAT_WBMP &&
         TAVIRPELO_DecodeParsed(decInfo.get(), pixels, width, height) != 0;
}

}  // namespace

int SlideShow::GetSubWidth(int index) const {
  return valid_index(*this, index) ? display_size(*this, subfiles[index]).width : 0;
}

int SlideShow::GetSubHeight(int index) const {
  return valid_index(*this, index) ? display_size(*this, subfiles[index]).height : 0;
}

int SlideShow::GetSubfile(int index, void* buffer) {
  if (!valid_index(*this, index) || buffer == nullptr) return 0;
  ContainerSession session(*this, "rb");
  session.seek(int64_t{subfiles[index].offset} + kSubfileHeaderSize);
  session.read(buffer, int64_t{subfiles[index].size} - kSubfileHeaderSize);
  return session.close() ? 1 : 0;
}

int SlideShow::GetImage(int index, void* buffer) {
  return mode == kFileMode ? GetSubfile(index, buffer) : 0;
}

int SlideShow::GetDrawble(int index, void* pixels, int drawWidth, int drawHeight) {
  if (!valid_index(*this, index) || pixels == nullptr || pixel_bytes(drawWidth, drawHeight) == 0)
    return 0;
  int drawn;
  if (mode == kFileMode) {
    const int size = GetSizeOfSubfile(index);
    const VssBytes jpeg = vss_bytes(size);
    if (!jpeg || !GetImage(index, jpeg.get())) return 0;
    drawn = draw(TAVIRPELO_IO_MEMORY, jpeg.get(), size, pixels, drawWidth, drawHeight);
  } else {
    drawn = draw(TAVIRPELO_IO_FILE, subfiles[index].path, 0, pixels, drawWidth, drawHeight);
  }
  if (drawn) lastIndex = index;
  return drawn;
}

int SlideShow::GetDrawbleToBuffer(void* bytes, int length, void* pixels, int drawWidth, int drawHeight) {
  if (mode != kMemoryMode || bytes == nullptr || length < 1) return 0;
  return draw(TAVIRPELO_IO_MEMORY, bytes, length, pixels, drawWidth, drawHeight);
}
