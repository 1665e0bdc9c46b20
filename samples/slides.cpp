// Puts pictures into a new slide show, opens it again and draws the first one.
#include <cstdint>
#include <cstdio>
#include <vector>

#include "slideshow/SlideShow.h"

int main(int argc, char** argv) {
  if (argc < 3) {
    std::fprintf(stderr, "usage: %s SHOW PICTURE...\n", argv[0]);
    return 2;
  }
  SlideShow show;
  if (show.CreateShow(argv[1], 480, 480) != 1) return 1;
  for (int i = 2; i < argc; ++i) {
    if (show.AddImageToFile(argv[i], "a picture") != 1) return 1;
  }

  SlideShow reopened;
  if (reopened.OpenShow(argv[1], 480, 480) != 1) return 1;
  for (int i = 0; i < reopened.subfileCount; ++i) {
    std::printf("%d: %dx%d, %d bytes\n", i, reopened.GetSubWidth(i), reopened.GetSubHeight(i),
                reopened.GetSizeOfSubfile(i));
  }
  int width = reopened.GetSubWidth(0);
  int height = reopened.GetSubHeight(0);
  std::vector<uint32_t> pixels(static_cast<size_t>(width) * static_cast<size_t>(height));
  if (reopened.GetDrawble(0, pixels.data(), width, height) != 1) return 1;
  std::printf("first pixel %08x\n", static_cast<unsigned>(pixels[0]));
  return 0;
}
