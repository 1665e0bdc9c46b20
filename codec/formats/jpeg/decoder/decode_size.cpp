#include <algorithm>

#include "codec/formats/jpeg/decoder/headers.h"

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

Sizes choose_sizes(const Frame& frame, FrameType type, const SizeWishes& wishes) {
  const Size image{frame.width, frame.height};
  const Size request = turned(wishes.buffer, wishes.rotation);
  Sizes sizes{};
  sizes.buffer = wishes.buffer;
  sizes.output = sizes.target = fit_output(image, request, wishes.option);

  sizes.scale = mode_scale(covering_scale(image, sizes.output), wishes.decMode);
  if (type == FrameType::kProgressive && sizes.scale == kThreeEighths) sizes.scale = kHalf;
  // The smallest transform still yields a sample of a picture narrower than its block.
  sizes.scaled = {std::max(sizes.scale.of(image.width), 1), std::max(sizes.scale.of(image.height), 1)};
  sizes.exact = sizes.scaled.width == sizes.output.width && sizes.scaled.height == sizes.output.height;

  sizes.used = sizes.scaled;
  if ((wishes.option & TAVIRPELO_FIT_MASK) != TAVIRPELO_FIT_FILL) return sizes;
  // Filling: the centre of the picture, cut to the request.
  const auto crop = [](int requested, int out, int scaled, int& target, int& used, int& offset) {
    if (out <= requested) return;
    target = requested;
    used = static_cast<int>((out - 1 + int64_t{requested} * scaled) / out);
    offset = (scaled - used) >> 1;
  };
  crop(request.width, sizes.output.width, sizes.scaled.width, sizes.target.width, sizes.used.width,
       sizes.cropX);
  crop(request.height, sizes.output.height, sizes.scaled.height, sizes.target.height, sizes.used.height,
       sizes.cropY);
  return sizes;
}

}  // namespace pelo::jpeg
