// From restored scanlines to the caller's pixels: size, placement, nearest-neighbour resampling.
//
// Output column k shows source column floor((floor(W/4) + k * W) / outW), rows likewise: samples sit at
// a quarter of a pixel's span. Pictures are written unrotated, clipped to the requested box; only one
// that is gathered whole is rotated.
#include <algorithm>
#include <bit>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/dec_info.h"
#include "codec/formats/png/png_context.h"
#include "codec/pixel/paint.h"
#include "codec/pixel/row_stores.h"

namespace pelo::png {
namespace {

constexpr uint32_t kGatherMask = 0x3000, kGather = 0x1000;  // option bits

bool writes(int format) {
  return format == TAVIRPELO_RGB565 || format == TAVIRPELO_RGB888 ||
         (format >= TAVIRPELO_ARGB8888 && format <= TAVIRPELO_BGRA8888);
}

bool one_to_one(const PELOI_PNGCONTEXT& context) {
  return context.info.wholeMultiple != 0;
}

// ---- one row of pixels ----

// Expands `count` pixels in runs and hands each run to store(rgba, offset, length).
template <class Store>
void for_runs(const OutputState& output, ExpandRow expand, const uint8_t* row, const uint32_t* columns,
              uint32_t begin, int count, Store store) {
  for_pixel_runs(
      count,
      [&](int first, int length, uint8_t* rgba) {
        expand(output.meaning, row, columns, begin + static_cast<uint32_t>(first), length, rgba);
      },
      store);
}

// A whole output row from a scanline of the full width.
void write_row(PELOI_PNGCONTEXT& context, const uint8_t* row, int64_t target) {
  const OutputState& output = context.output;
  if (output.store == nullptr) return;
  const RowSpan span = output.grid.span(target, 0, output.width);
  if (span.count == 0) return;
  const auto skip = static_cast<uint32_t>(span.skip);
  if (output.copiesRows) {
    const auto bytes = static_cast<size_t>(output.bytesPerPixel);
    std::memcpy(span.first, row + skip * bytes, static_cast<size_t>(span.count) * bytes);
    return;
  }
  const ExpandRow expand = output.columns ? output.expand.mapped : output.expand.consecutive;
  for_runs(output, expand, row, output.columns.data(), skip, span.count,
           [&](const uint8_t* rgba, int i, int length) {
             output.store(rgba, length, span.first + i * span.step, span.step);
           });
}

// ---- pixels of a pass ----

// At scale 1 the pixels of a pass stand at even steps in the output row.
void write_pass_row(const PELOI_PNGCONTEXT& context, const uint8_t* row, int64_t target) {
  const OutputState& output = context.output;
  const PassState& pass = context.pass;
  const RowSpan span = output.grid.span(target, 0, output.width);
  if (span.count == 0) return;
  const int64_t step = pass.columnStep, first = pass.firstColumn;
  const int64_t begin = std::max<int64_t>(0, (span.skip - first + step - 1) / step);
  const int64_t visibleEnd = int64_t{span.skip} + span.count;
  const int64_t end = std::min<int64_t>(pass.width, (visibleEnd - first + step - 1) / step);
  if (begin >= end) return;
  uint8_t* start = span.first + (first + begin * step - span.skip) * span.step;
  const auto pixelStep = static_cast<ptrdiff_t>(step * span.step);
  for_runs(output, output.expand.consecutive, row, nullptr, static_cast<uint32_t>(begin),
           static_cast<int>(end - begin), [&](const uint8_t* rgba, int i, int length) {
             output.store(rgba, length, start + i * pixelStep, pixelStep);
           });
}

// Resampled: each listed output column by itself, so that none is written (or blended) twice.
void write_pass_columns(const PELOI_PNGCONTEXT& context, const uint8_t* row, int64_t target) {
  const OutputState& output = context.output;
  const RowSpan span = output.grid.span(target, 0, output.width);
  const auto visible = [&](uint32_t column) {
    return column >= static_cast<uint32_t>(span.skip) &&
           column - static_cast<uint32_t>(span.skip) < static_cast<uint32_t>(span.count);
  };
  for_runs(output, output.expand.mapped, row, output.passColumns.data(), 0,
           static_cast<int>(context.pass.columnCount), [&](const uint8_t* rgba, int i, int length) {
             const uint32_t* targets = output.passTargets + i;
             for (int k = 0; k < length; ++k) {
               if (!visible(targets[k])) continue;
               const auto column = static_cast<ptrdiff_t>(targets[k]) - span.skip;
               output.store(rgba + 4 * k, 1, span.first + column * span.step, span.step);
             }
           });
}

void gather_pass_columns(PELOI_PNGCONTEXT& context, const uint8_t* row, size_t target) {
  OutputState& output = context.output;
  uint8_t* pixels = output.wholeImage.data() + target * output.width * 4;
  for_runs(output, output.expand.mapped, row, output.passColumns.data(), 0,
           static_cast<int>(context.pass.columnCount), [&](const uint8_t* rgba, int i, int length) {
             for (int k = 0; k < length; ++k) {
               std::memcpy(pixels + size_t{output.passTargets[i + k]} * 4, rgba + 4 * k, 4);
             }
           });
}

// First output row that shows source row y or a later one.
int64_t first_output_row(const PELOI_PNGCONTEXT& context, int64_t y) {
  const int64_t height = context.fullHeight, outHeight = context.output.height;
  const int64_t numerator = y * outHeight - height / 4;
  return numerator <= 0 ? 0 : std::min(outHeight, ceil_div(numerator, height));
}

int64_t source_row(const PELOI_PNGCONTEXT& context) {
  return int64_t{context.pass.firstRow} + int64_t{context.pass.rowStep} * context.scanline.row;
}

// The next output row of a pass's scanline.
void write_interlaced(PELOI_PNGCONTEXT& context, const uint8_t* row) {
  OutputState& output = context.output;
  const int64_t target = output.passRow++;
  if (output.wholeImage) {
    gather_pass_columns(context, row, static_cast<size_t>(target));
    return;
  }
  if (output.store != nullptr) {
    (one_to_one(context) ? write_pass_row : write_pass_columns)(context, row, target);
  }
  if (completes_row(context, source_row(context))) ++output.written;
}

// ---- set-up ----

void choose_size(PELOI_PNGCONTEXT& context) {
  const DecodeRequest& request = context.request;
  const int64_t width = context.info.width, height = context.info.height;
  const Size box = turned(request.buffer, request.option);
  const bool stretch = (request.option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_STRETCH;
  const Size size = stretch ? box : fit_by_ratio(width, height, box);
  context.output.width = static_cast<uint32_t>(size.width);
  context.output.height = static_cast<uint32_t>(size.height);
  context.info.wholeMultiple = !stretch && size.width == width && size.height == height ? 1 : 0;
}

bool map_columns(PELOI_PNGCONTEXT& context) {
  OutputState& output = context.output;
  if (!obtain_block(int64_t{output.width} * 8, "PNG picture",
                    [&] { return output.columns.allocate(output.width); }))
    return false;
  const uint32_t width = context.info.width;
  AxisStepper columns(width, output.width, width / 4);
  for (size_t k = 0; k < output.width; ++k, columns.advance()) {
    output.columns[k] = static_cast<uint32_t>(columns.position());
  }
  if (context.info.interlace == 0) return true;
  if (!output.passColumns.allocate(size_t{2} * output.width))
    return refuse(Reason::kNoMemory, "PNG picture");
  output.passTargets = output.passColumns.data() + output.width;
  return true;
}

bool reserve_whole_image(PELOI_PNGCONTEXT& context) {
  OutputState& output = context.output;
  const int64_t pixels = int64_t{output.width} * output.height;
  return obtain_block(std::min(pixels, kMaxPictureBlock) * 4, "PNG picture",
                      [&] { return output.wholeImage.allocate(static_cast<size_t>(pixels * 4)); });
}

bool gathers(const PELOI_PNGCONTEXT& context) {
  return context.info.interlace != 0 && !one_to_one(context) &&
         (context.request.option & kGatherMask) == kGather;
}

bool scanlines_are_output(const PELOI_PNGCONTEXT& context) {
  const PELOI_PNGINFO& info = context.info;
  return info.colourType == kTruecolour && info.bitDepth == 8 && !has_transparency(info) &&
         context.request.format == TAVIRPELO_RGB888 && one_to_one(context);
}

}  // namespace

Result set_up_output(PELOI_PNGCONTEXT& context) {
  OutputState& output = context.output;
  choose_size(context);
  if (output.width == 0 || output.height == 0) return kDone;
  const int format = context.request.format;
  const Alpha alpha = has_transparency(context.info) ? Alpha::kBlended : Alpha::kIgnored;
  output.store = writes(format) ? rgba_storer(format, alpha) : nullptr;
  output.bytesPerPixel = bytes_per_pixel(format);
  output.expand = expander_of(context.info);
  output.meaning = meaning_of(context.info);
  output.copiesRows = scanlines_are_output(context);
  output.rows = AxisStepper(context.info.height, output.height, context.info.height / 4);
  if (!one_to_one(context) && !map_columns(context)) return kNoMemory;
  if (gathers(context) && !reserve_whole_image(context)) return kNoMemory;
  return kDone;
}

void aim_output(PELOI_PNGCONTEXT& context, void* bytes, int lines) {
  OutputState& output = context.output;
  const DecodeRequest& request = context.request;
  const auto width = static_cast<int>(output.width), height = static_cast<int>(output.height);
  const bool tight = (request.option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  const Size shown = turned({width, height}, request.option);
  Size box = tight ? Size{width, height} : request.buffer;
  const int64_t x = tight ? 0 : (int64_t{request.buffer.width} - shown.width) / 2;
  int64_t y = tight ? 0 : (int64_t{request.buffer.height} - shown.height) / 2;
  output.base = 0;
  output.stop = 0;
  if (lines > 0) {  // the buffer receives these rows alone; an interlaced image comes whole
    output.base = output.written;
    const uint64_t stop = uint64_t{output.written} + static_cast<uint32_t>(lines);
    if (context.info.interlace == 0)
      output.stop = static_cast<uint32_t>(std::min<uint64_t>(stop, UINT32_MAX));
    box.height = lines;
    y = 0;
  }
  if (output.wholeImage) {
    output.grid =
        OutputGrid(bytes, request.buffer, {width, height}, output.bytesPerPixel, request.option);
  } else {
    output.grid = OutputGrid(bytes, box, x, y, output.bytesPerPixel);
  }
}

void begin_pass_output(PELOI_PNGCONTEXT& context) {
  OutputState& output = context.output;
  if (!output.passColumns) return;
  PassState& pass = context.pass;
  const int shift = std::countr_zero(pass.columnStep);  // steps are powers of two
  uint32_t count = 0;
  for (uint32_t k = 0; k < output.width; ++k) {
    const uint32_t column = output.columns[k] - pass.firstColumn;
    if (output.columns[k] < pass.firstColumn || (column & (pass.columnStep - 1)) != 0) continue;
    output.passColumns[count] = column >> shift;
    output.passTargets[count++] = k;
  }
  pass.columnCount = count;
}

void begin_row_output(PELOI_PNGCONTEXT& context) {
  if (context.pass.number == 0) return;
  const int64_t y = source_row(context);
  OutputState& output = context.output;
  output.passRow = one_to_one(context) ? y : first_output_row(context, y);
  output.passRowsEnd = one_to_one(context) ? y + 1 : first_output_row(context, y + 1);
}

bool has_output_row(const PELOI_PNGCONTEXT& context) {
  const OutputState& output = context.output;
  if (context.pass.number != 0) return output.passRow < output.passRowsEnd;
  return output.written < output.height && output.rows.position() == context.scanline.row;
}

namespace {

// Channels of a gathered RGB565 pixel are blended without rounding up the weight.
uint16_t blend_gathered(const uint8_t* rgba, uint32_t background) {
  const uint32_t alpha = rgba[3];
  const auto channel = [alpha](uint32_t foreground, uint32_t behind) {
    return static_cast<int>(((behind * (255 - alpha) >> 8) + (foreground * alpha >> 8)) & 0xFF);
  };
  return rgb565(channel(rgba[0], (background >> 11 & 31) << 3),
                channel(rgba[1], (background & 0x7E0) >> 3), channel(rgba[2], (background & 31) << 3));
}

void blend_gathered_row(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step) {
  for (int i = 0; i < count; ++i, rgba += 4, out += step) {
    store_le16(out, blend_gathered(rgba, load_le16(out)));
  }
}

// Of the formats without alpha only RGB565 is blended here, and only with the alpha that tRNS gives.
StoreRgba gathered_storer(const PELOI_PNGCONTEXT& context) {
  const int format = context.request.format;
  const bool blends = format == TAVIRPELO_RGB565 && (context.info.ancillaryFlags & kTrnsRead) != 0;
  return blends ? blend_gathered_row : rgba_storer(format, Alpha::kIgnored);
}

}  // namespace
void write_output_row(PELOI_PNGCONTEXT* context) {
  if (!has_output_row(*context)) return;
  OutputState& output = context->output;
  const uint8_t* row = context->scanline.finished;
  if (context->pass.number != 0) {
    write_interlaced(*context, row);
    return;
  }
  write_row(*context, row, int64_t{output.written} - output.base);
  ++output.written;
  output.rows.advance();
}

int write_gathered_image(PELOI_PNGCONTEXT* context) {
  OutputState& output = context->output;
  if (output.store == nullptr) return 1;
  const pelo::StoreRgba store = gathered_storer(*context);
  for (size_t y = 0; y < output.height; ++y) {
    if (!pelo::caller_agrees(context->decInfo, static_cast<int>(y))) return 0;
    const pelo::RowSpan span = output.grid.span(static_cast<int64_t>(y), 0, output.width);
    const uint8_t* row = output.wholeImage.data() + y * output.width * 4;
    store(row + size_t{4} * static_cast<size_t>(span.skip), span.count, span.first, span.step);
    if (!host_agrees()) return 0;
  }
  return 1;
}

}  // namespace pelo::png
