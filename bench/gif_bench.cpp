// GIF pictures made of the photograph, against giflib with its colours expanded.
#include <gif_lib.h>

#include <algorithm>
#include <cstring>
#include <memory>

#include "bench/job.h"
#include "bench/ours.h"

namespace bench {
namespace {

constexpr peer::Size kStill{1632, 1224};
constexpr peer::Size kScreen{480, 360};
constexpr int kFrames = 12;

// The photograph at a size, as indices of the 3-3-2 palette with an ordered dither.
Bytes indices_of(const Bytes& photograph, peer::Size size) {
  const Bytes rgb = pixels_of(photograph, size, TAVIRPELO_RGB888);
  constexpr int kDither[4][4] = {{0, 8, 2, 10}, {12, 4, 14, 6}, {3, 11, 1, 9}, {15, 7, 13, 5}};
  Bytes indices(size.pixels());
  for (size_t i = 0; i < indices.size(); ++i) {
    const size_t row = i / static_cast<size_t>(size.width), column = i % static_cast<size_t>(size.width);
    const int lift = kDither[row & 3][column & 3];
    const auto level = [&](size_t channel, int steps) {
      return std::min((rgb[3 * i + channel] * steps + lift * 16) / 255, steps);
    };
    indices[i] = static_cast<uint8_t>(level(0, 7) << 5 | level(1, 7) << 2 | level(2, 3));
  }
  return indices;
}

ColorMapObject* palette() {
  ColorMapObject* map = GifMakeMapObject(256, nullptr);
  for (int i = 0; i < 256; ++i) {
    map->Colors[i] = {static_cast<GifByteType>((i >> 5) * 36),
                      static_cast<GifByteType>((i >> 2 & 7) * 36),
                      static_cast<GifByteType>((i & 3) * 85)};
  }
  return map;
}

int append(GifFileType* gif, const GifByteType* data, int length) {
  auto* out = static_cast<Bytes*>(gif->UserData);
  out->insert(out->end(), data, data + length);
  return length;
}

struct Part {
  int left, top, width, height;
};

// Rows of a picture, an image of a file that giflib writes.
void put_image(GifFileType* gif, Bytes& indices, peer::Size size, const Part& part, bool interlaced) {
  EGifPutImageDesc(gif, part.left, part.top, part.width, part.height, interlaced, nullptr);
  constexpr int kPasses[4][2] = {{0, 8}, {4, 8}, {2, 4}, {1, 2}};
  const auto put_row = [&](int y) {
    EGifPutLine(gif, indices.data() + (part.top + y) * size.width + part.left, part.width);
  };
  if (!interlaced) {
    for (int y = 0; y < part.height; ++y) put_row(y);
    return;
  }
  for (const auto& [first, step] : kPasses) {
    for (int y = first; y < part.height; y += step) put_row(y);
  }
}

// A file of whichever images `put` writes.
template <class Put>
Bytes encode(peer::Size size, Put put) {
  Bytes file;
  GifFileType* gif = EGifOpen(&file, append, nullptr);
  EGifSetGifVersion(gif, true);
  ColorMapObject* map = palette();
  EGifPutScreenDesc(gif, size.width, size.height, 8, 0, map);
  GifFreeMapObject(map);
  put(gif);
  EGifCloseFile(gif, nullptr);
  return file;
}

Bytes encode_still(const Bytes& photograph, bool interlaced) {
  Bytes indices = indices_of(photograph, kStill);
  return encode(kStill, [&](GifFileType* gif) {
    put_image(gif, indices, kStill, {0, 0, kStill.width, kStill.height}, interlaced);
  });
}

// The whole screen, then parts of it with one transparent colour.
Bytes encode_animation(const Bytes& photograph) {
  Bytes indices = indices_of(photograph, kScreen);
  return encode(kScreen, [&](GifFileType* gif) {
    for (int i = 0; i < kFrames; ++i) {
      const GraphicsControlBlock control{DISPOSE_DO_NOT, false, 5, i == 0 ? NO_TRANSPARENT_COLOR : 0};
      GifByteType block[4];
      const auto length = static_cast<int>(EGifGCBToExtension(&control, block));
      EGifPutExtension(gif, GRAPHICS_EXT_FUNC_CODE, length, block);
      const Part part =
          i == 0 ? Part{0, 0, kScreen.width, kScreen.height} : Part{10 * i, 5 * i, 320, 240};
      put_image(gif, indices, kScreen, part, false);
      std::rotate(indices.begin(), indices.begin() + 7, indices.end());
    }
  });
}

struct Input {
  const Bytes& bytes;
  size_t at = 0;
};

int read_input(GifFileType* gif, GifByteType* target, int length) {
  auto& input = *static_cast<Input*>(gif->UserData);
  const size_t count = std::min(static_cast<size_t>(length), input.bytes.size() - input.at);
  std::memcpy(target, input.bytes.data() + input.at, count);
  input.at += count;
  return static_cast<int>(count);
}

// Stores a row's colours as R, G, B, and an A when `bytes` is 4.
template <int bytes>
void expand(const GifByteType* row, int count, const ColorMapObject& map, int transparent,
            uint8_t* out) {
  for (int i = 0; i < count; ++i, out += bytes) {
    if (row[i] == transparent) continue;
    const GifColorType& c = map.Colors[row[i]];
    out[0] = c.Red;
    out[1] = c.Green;
    out[2] = c.Blue;
    if (bytes == 4) out[3] = 255;
  }
}

template <int bytes>
void expand_image(const SavedImage& image, const GifFileType& gif, int transparent, uint8_t* out) {
  const GifImageDesc& place = image.ImageDesc;
  for (int y = 0; y < place.Height; ++y) {
    expand<bytes>(image.RasterBits + y * place.Width, place.Width, *gif.SColorMap, transparent,
                  out + ((place.Top + y) * gif.SWidth + place.Left) * bytes);
  }
}

// All images by giflib; `each` sees them one after another.
template <class Each>
bool slurp(const Bytes& file, Each each) {
  Input input{file};
  GifFileType* gif = DGifOpen(&input, read_input, nullptr);
  const bool read = gif != nullptr && DGifSlurp(gif) == GIF_OK;
  for (int i = 0; read && i < gif->ImageCount; ++i) each(*gif, i);
  if (gif != nullptr) DGifCloseFile(gif, nullptr);
  return read;
}

bool still_by_giflib(const Bytes& file, Bytes& out) {
  return slurp(file, [&](const GifFileType& gif, int i) {
    expand_image<3>(gif.SavedImages[i], gif, NO_TRANSPARENT_COLOR, out.data());
  });
}

// Frames composed on a canvas and copied out.
bool frames_by_giflib(const Bytes& file, Bytes& out) {
  Bytes canvas(out.size());
  return slurp(file, [&](const GifFileType& gif, int i) {
    GraphicsControlBlock control{0, false, 0, NO_TRANSPARENT_COLOR};
    DGifSavedExtensionToGCB(const_cast<GifFileType*>(&gif), i, &control);
    expand_image<4>(gif.SavedImages[i], gif, control.TransparentColor, canvas.data());
    std::memcpy(out.data(), canvas.data(), out.size());
  });
}

bool frames(const Bytes& file, Bytes& out) {
  TAVIRPELO_DECINFO* info = open(file, TAVIRPELO_RGBA8888);
  if (info == nullptr) return false;
  int answer;
  do {
    answer = TAVIRPELOI_DecodeAGIF(info, out.data(), kScreen.width, kScreen.height);
  } while (answer == 1);
  TAVIRPELO_DestroyDecInfo(info);
  return answer == 3;
}

}  // namespace

void register_gif_jobs(const Bytes& photograph) {
  for (const bool interlaced : {false, true}) {
    auto file = std::make_shared<Bytes>(encode_still(photograph, interlaced));
    auto out = std::make_shared<Bytes>(kStill.pixels() * 3);
    register_job(
        {interlaced ? "GIF interlaced RGB" : "GIF 2 MP RGB",
         [=] { return decode(TAVIRPELOI_DecodeGIF, *file, TAVIRPELO_RGB888, 0, kStill, out->data()); },
         [file, out](int) { return still_by_giflib(*file, *out); }});
    if (interlaced) continue;
    // The peer has no reduction of its own: it decodes whole, and then picks pixels.
    auto small = std::make_shared<Bytes>(kScreen.pixels() * 3);
    register_job({"GIF 2 MP to a slide",
                  [=] {
                    return decode(TAVIRPELOI_DecodeGIF, *file, TAVIRPELO_RGB888, 0, kScreen,
                                  small->data());
                  },
                  [file, out, small](int) {
                    if (!still_by_giflib(*file, *out)) return false;
                    peer::reduce(out->data(), kStill, small->data(), kScreen);
                    return true;
                  }});
  }
  auto file = std::make_shared<Bytes>(encode_animation(photograph));
  auto out = std::make_shared<Bytes>(kScreen.pixels() * 4);
  register_job({"GIF of 12 frames RGBA", [file, out] { return frames(*file, *out); },
                [file, out](int) { return frames_by_giflib(*file, *out); }});
}

}  // namespace bench
