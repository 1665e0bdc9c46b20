// Camera frames to RGB565. Chroma is looked up once for two by two pixels; luma follows in rows of
// 16-bit sums, which compilers turn into vector code.
#include <algorithm>
#include <cstddef>

#include "codec/base/byte_order.h"
#include "codec/pixel/pixel_layout.h"
#include "tavirpelo/yuv.h"

// Constants 1.402, 1.772, 0.71414 and 0.34414 in 16-bit fixed point; right shifts are arithmetic.
#define ENTRY_CRR(c) ((91881 * ((c)-127) + 32768) >> 16)
#define ENTRY_CBB(c) ((116130 * ((c)-127) + 32768) >> 16)
#define ENTRY_CRG(c) (-46802 * ((c)-127))
#define ENTRY_CBG(c) (-22554 * ((c)-127) + 32768)
#define ENTRY_RANGE(i) static_cast<uint8_t>((i) < 512 ? 0 : (i) < 768 ? (i)-512 : 255)

// Table initialisers of 256 and 1024 entries.
#define ENTRIES_4(entry, c) entry(c), entry((c) + 1), entry((c) + 2), entry((c) + 3)
#define ENTRIES_16(entry, c) \
  ENTRIES_4(entry, c), ENTRIES_4(entry, (c) + 4), ENTRIES_4(entry, (c) + 8), ENTRIES_4(entry, (c) + 12)
#define ENTRIES_64(entry, c)                                                      \
  ENTRIES_16(entry, c), ENTRIES_16(entry, (c) + 16), ENTRIES_16(entry, (c) + 32), \
      ENTRIES_16(entry, (c) + 48)
#define ENTRIES_256(entry, c)                                                      \
  ENTRIES_64(entry, c), ENTRIES_64(entry, (c) + 64), ENTRIES_64(entry, (c) + 128), \
      ENTRIES_64(entry, (c) + 192)
#define ENTRIES_1024(entry) \
  ENTRIES_256(entry, 0), ENTRIES_256(entry, 256), ENTRIES_256(entry, 512), ENTRIES_256(entry, 768)

const int32_t elo_EnCrrTab[256] = {ENTRIES_256(ENTRY_CRR, 0)};
const int32_t elo_EnCbbTab[256] = {ENTRIES_256(ENTRY_CBB, 0)};
const int32_t elo_EnCrgTab[256] = {ENTRIES_256(ENTRY_CRG, 0)};
const int32_t elo_EnCbgTab[256] = {ENTRIES_256(ENTRY_CBG, 0)};
const uint8_t elo_EnRangeTalbe[1024] = {ENTRIES_1024(ENTRY_RANGE)};

namespace pelo {
namespace {

constexpr int kRun = 256;  // pixels whose chroma is held at a time; even

// One row of chroma samples, `step` bytes apart.
struct ChromaRow {
  const uint8_t* cb;
  const uint8_t* cr;
  ptrdiff_t step;
};

// What chroma adds to each pixel of a run.
struct Additions {
  int16_t r[kRun], g[kRun], b[kRun];
};

void look_up(const ChromaRow& row, int firstPixel, int count, Additions& add) {
  for (int i = 0; i < count; i += 2) {
    const ptrdiff_t at = (firstPixel + i) / 2 * row.step;
    const size_t cb = row.cb[at], cr = row.cr[at];
    add.r[i] = add.r[i + 1] = static_cast<int16_t>(elo_EnCrrTab[cr]);
    add.g[i] = add.g[i + 1] = static_cast<int16_t>((elo_EnCrgTab[cr] + elo_EnCbgTab[cb]) >> 16);
    add.b[i] = add.b[i + 1] = static_cast<int16_t>(elo_EnCbbTab[cb]);
  }
}

// Sums lie within -512..511: clamping says what elo_EnRangeTalbe says.
constexpr int range(int value) {
  return std::clamp(value, 0, 255);
}

void convert_run(const uint8_t* luma, const Additions& add, int count, uint8_t* out) {
  for (int i = 0; i < count; ++i) {
    const int y = luma[i];
    store_le16(out + 2 * i, rgb565(range(y + add.r[i]), range(y + add.g[i]), range(y + add.b[i])));
  }
}

// Rows `y` and, when the frame has it, y + 1.
void convert_rows(const uint8_t* luma, const ChromaRow& chroma, ptrdiff_t width, int rows,
                  uint8_t* out) {
  Additions add;
  for (int first = 0; first < width; first += kRun) {
    const int count = static_cast<int>(std::min<ptrdiff_t>(kRun, width - first));
    look_up(chroma, first, count, add);
    for (int row = 0; row < rows; ++row) {
      const ptrdiff_t at = row * width + first;
      convert_run(luma + at, add, count, out + 2 * at);
    }
  }
}

// `chroma` is the first row of each plane, whose rows are chromaPitch bytes.
int convert(const uint8_t* luma, ChromaRow chroma, ptrdiff_t chromaPitch, int width, int height,
            void* out) {
  auto* words = static_cast<uint8_t*>(out);
  // The last row of an odd height goes by pixel pairs first; a width of one has none.
  const int end = width == 1 ? height & ~1 : height;
  for (ptrdiff_t y = 0; y < end; y += 2) {
    const ptrdiff_t at = y * width;
    convert_rows(luma + at, chroma, width, y + 1 < end ? 2 : 1, words + 2 * at);
    chroma.cb += chromaPitch;
    chroma.cr += chromaPitch;
  }
  return 1;
}

bool usable(const uint8_t* source, int width, int height, const void* destination) {
  return source != nullptr && destination != nullptr && width > 0 && height > 0;
}

}  // namespace
}  // namespace pelo

using namespace pelo;

int elo_OrbYUV420toRGB565(const uint8_t* source, int width, int height, void* destination) {
  if (!usable(source, width, height, destination)) return 1;
  const ptrdiff_t pitch = (ptrdiff_t{width} + 1) / 2, rows = (ptrdiff_t{height} + 1) / 2;
  const uint8_t* cb = source + ptrdiff_t{width} * height;
  return convert(source, {cb, cb + pitch * rows, 1}, pitch, width, height, destination);
}

int elo_OrbPYV0420toRGB565(const uint8_t* source, int width, int height, void* destination) {
  if (!usable(source, width, height, destination)) return 1;
  const ptrdiff_t pairs = (ptrdiff_t{width} + 1) / 2;
  const uint8_t* cr = source + ptrdiff_t{width} * height;
  return convert(source, {cr + 1, cr, 2}, 2 * pairs, width, height, destination);
}
