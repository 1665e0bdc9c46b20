#include "codec/formats/jpeg/decoder/decode_size.h"

#include <algorithm>

namespace pelo::jpeg {
namespace {

int to_int(int64_t value) {
  return static_cast<int>(std::min<int64_t>(value, INT32_MAX));
}

}  // namespace

Size fit_output(Size image, Size request, uint32_t option) {
  const uint32_t fit = option & TAVIRPELO_FIT_MASK;
  Size out = image;
  if (image.width <= request.width && image.height <= request.height) {
    if (fit == TAVIRPELO_FIT_STRETCH) out = request;
  } else {
    const int byWidth = to_int(int64_t{request.width} * image.height / image.width);
    const int byHeight = to_int(int64_t{request.height} * image.width / image.height);
    const bool sameShape = (byWidth == request.height || byHeight == request.width) &&
                           image.width >= request.width && image.height >= request.height;
    if (sameShape || fit == TAVIRPELO_FIT_STRETCH) {
      out = request;
    } else {
      if (image.width > request.width) out = {request.width, byWidth};
      if (fit == TAVIRPELO_FIT_FILL) {
        if (out.height < request.height) out = {byHeight, request.height};
        if (out.width > image.width || out.height > image.height) out = image;
      } else if (out.height > request.height) {
        out = {byHeight, request.height};
      }
    }
  }
  return {std::max(out.width, 1), std::max(out.height, 1)};
}

Scale covering_scale(Size image, Size output) {
  const bool byHeight = int64_t{output.height} * image.width > int64_t{output.width} * image.height;
  const int target = byHeight ? output.height : output.width;
  const int size = byHeight ? image.height : image.width;
  for (const Scale scale : {kEighth, kQuarter, kThreeEighths, kHalf}) {
    if (target <= scale.of(size)) return scale;
  }
  return kFull;
}

Scale mode_scale(Scale scale, int decMode) {
  constexpr Scale kSteps[] = {kFull, kHalf, kThreeEighths, kQuarter, kEighth};
  const auto step = std::find(std::begin(kSteps), std::end(kSteps), scale) - std::begin(kSteps);
  switch (decMode) {
    case 2:
      return kSteps[std::min<ptrdiff_t>(step + 1, 4)];
    case 3:
      return step == 0 ? kThreeEighths : step == 1 ? kQuarter : kEighth;
    case 4:
      return kEighth;
    default:
      return scale;
  }
}

void choose_sizes(PELOJ_JDINFO& jd, uint32_t option) {
  const Size image{jd.imageWidth, jd.imageHeight};
  const Size request = turned({jd.bufferWidth, jd.bufferHeight}, jd.rotation);
  const Size output = fit_output(image, request, option);
  jd.outWidth = output.width;
  jd.outHeight = output.height;

  jd.scale = mode_scale(covering_scale(image, output), jd.decMode);
  if (jd.marker->frameType == FrameType::kProgressive && jd.scale == kThreeEighths) jd.scale = kHalf;
  // The smallest transform still yields a sample of a picture narrower than its block.
  jd.scaledWidth = std::max(jd.scale.of(image.width), 1);
  jd.scaledHeight = std::max(jd.scale.of(image.height), 1);
  jd.exact = jd.scaledWidth == jd.outWidth && jd.scaledHeight == jd.outHeight;

  jd.usedWidth = jd.scaledWidth;
  jd.usedHeight = jd.scaledHeight;
  jd.cropX = jd.cropY = 0;
  jd.targetWidth = jd.outWidth;
  jd.targetHeight = jd.outHeight;
  if ((option & TAVIRPELO_FIT_MASK) != TAVIRPELO_FIT_FILL) return;
  // Filling: the centre of the picture, cut to the request.
  const auto crop = [](int request1, int out, int scaled, int& target, int& used, int& offset) {
    if (out <= request1) return;
    target = request1;
    used = static_cast<int>((out - 1 + int64_t{request1} * scaled) / out);
    offset = (scaled - used) >> 1;
  };
  crop(request.width, jd.outWidth, jd.scaledWidth, jd.targetWidth, jd.usedWidth, jd.cropX);
  crop(request.height, jd.outHeight, jd.scaledHeight, jd.targetHeight, jd.usedHeight, jd.cropY);
}

}  // namespace pelo::jpeg
