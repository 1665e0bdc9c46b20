// Pictures of every format in shows: stored as JPEG in a file, drawn from their sources in memory.
#include <gtest/gtest.h>

#include "slideshow/SlideShow.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/gif_builder.h"
#include "tests/support/png_builder.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

// 24 x 16 pixels of 24 bits, from the last row up or from the first one down.
Bytes bmp(bool topDown) {
  Bytes file(54 + 24 * 16 * 3);
  file[0] = 'B', file[1] = 'M', file[10] = 54, file[14] = 40, file[18] = 24, file[22] = 16,
  file[28] = 24;
  if (topDown) file[22] = 0xF0, file[23] = file[24] = file[25] = 0xFF;
  for (size_t i = 54; i < file.size(); ++i) file[i] = static_cast<uint8_t>(i / 7 % 2 ? 40 : 200);
  return file;
}

struct Kind {
  const char* name;
  Bytes file;
  bool drawn;  // from its source
};

std::vector<Kind> kinds() {
  Bytes wbmp{0, 0, 24, 16};
  wbmp.resize(4 + 3 * 16, 0x5A);
  GifFile animation = sample_gif(24, 16, 4);
  animation.images.push_back(animation.images[0]);
  return {{"JPEG", sample_jpeg(24, 16), true},
          {"PNG", build_png(random_png_image(1, 2, 8, 24, 16, false, false)), true},
          {"PNG with alpha", build_png(random_png_image(2, 6, 16, 24, 16, true, false)), true},
          {"GIF", sample_gif(24, 16, 4, true).bytes(), true},
          {"animated GIF", animation.bytes(), true},
          {"BMP", bmp(false), true},
          {"top-down BMP", bmp(true), true},
          {"WBMP", wbmp, false}};
}

TEST(ShowFormats, EveryFormatFromFilesAndBuffers) {
  for (Kind& kind : kinds()) {
    const TempFile container, source("_source");
    source.write(kind.file);
    SlideShow stored, noted;
    ASSERT_EQ(1, stored.CreateShow(container.c_str(), 480, 480));
    ASSERT_EQ(1, noted.CreateShow(nullptr, 480, 480));
    EXPECT_EQ(1, stored.AddImageToFile(source.c_str(), kind.name)) << kind.name;
    Bytes copy = kind.file;  // a decoder may rework it
    EXPECT_EQ(1, stored.AddImageToBuffer(copy.data(), static_cast<int>(copy.size()), kind.name))
        << kind.name;
    EXPECT_EQ(1, noted.AddImageToFile(source.c_str(), kind.name)) << kind.name;

    const Contents pictures = reopened(container);
    ASSERT_EQ(2u, pictures.size()) << kind.name;
    EXPECT_EQ(pictures[0], pictures[1]) << kind.name;
    for (SlideShow* show : {&stored, &noted}) EXPECT_EQ(24, show->GetSubWidth(0)) << kind.name;
    std::vector<uint32_t> fromFile(24 * 16), fromSource(24 * 16);
    EXPECT_EQ(1, stored.GetDrawble(0, fromFile.data(), 24, 16)) << kind.name;
    EXPECT_EQ(kind.drawn ? 1 : 0, noted.GetDrawble(0, fromSource.data(), 24, 16)) << kind.name;
    EXPECT_EQ(0xFFu, fromFile[0] >> 24);
    EXPECT_NE(std::vector<uint32_t>(24 * 16, fromFile[0]), fromFile) << kind.name;
  }
}

}  // namespace
}  // namespace tests
