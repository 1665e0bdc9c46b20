// From decompressed bytes to restored scanlines, of plain images and of the seven passes of Adam7.
#include <algorithm>
#include <cstring>
#include <utility>

#include "codec/base/dec_info.h"
#include "codec/formats/png/png_context.h"

namespace pelo::png {
namespace {

// ISO/IEC 15948, 8.2: where each pass starts, and its steps.
struct Adam7 {
  uint8_t firstColumn, columnStep, firstRow, rowStep;
};
constexpr Adam7 kPasses[8] = {{0, 1, 0, 1}, {0, 8, 0, 8}, {4, 8, 0, 8}, {0, 4, 4, 8},
                              {2, 4, 0, 4}, {0, 2, 2, 4}, {1, 2, 0, 2}, {0, 1, 1, 2}};

size_t row_bytes(const PELOI_PNGINFO& info) {
  return static_cast<size_t>((uint64_t{info.bitsPerPixel} * info.width + 7) / 8);
}

void begin_pass(PELOI_PNGCONTEXT& context, int number) {
  const Adam7& pass = kPasses[number];
  context.pass = {number,          context.info.width, context.info.height, pass.firstColumn,
                  pass.columnStep, pass.firstRow,      pass.rowStep,        0};
  ScanlineState& scanline = context.scanline;
  scanline.rowBytes = row_bytes(context.info);
  scanline.row = 0;
  scanline.filled = 0;
  std::memset(scanline.above, 0, scanline.rowBytes + 1);  // nothing stands above a pass
  if (number != 0) begin_pass_output(context);
}

// False when there is none.
bool next_pass(PELOI_PNGCONTEXT& context) {
  for (int number = context.pass.number + 1; number <= 7; ++number) {
    if (set_pass_size(&context, context.fullWidth, context.fullHeight, number) == 0) continue;
    begin_pass(context, number);
    return true;
  }
  return false;
}

bool interlaced(const PELOI_PNGCONTEXT& context) {
  return context.pass.number != 0;
}

bool at_end(PELOI_PNGCONTEXT& context) {
  if (context.scanline.row < context.pass.height) return false;
  return !interlaced(context) || !next_pass(context);
}

// Restores the row just received.
void finish_scanline(PELOI_PNGCONTEXT& context) {
  ScanlineState& scanline = context.scanline;
  unfilter_row(&context, scanline.current + 1, scanline.above + 1, scanline.rowBytes);
  scanline.finished = scanline.current + 1;
  std::swap(scanline.current, scanline.above);
  scanline.filled = 0;
  begin_row_output(context);
}

// Asks before a row of the caller's buffer changes. The rows of a gathered image get there at its end.
bool may_write(const PELOI_PNGCONTEXT& context) {
  const OutputState& output = context.output;
  return output.wholeImage || caller_agrees(context.decInfo, static_cast<int>(output.written));
}

// The output rows of the finished scanline, as far as the caller wants them now.
Result write_pending(PELOI_PNGCONTEXT& context) {
  const OutputState& output = context.output;
  while (context.scanline.finished != nullptr && has_output_row(context)) {
    if (!may_write(context)) return kFailed;
    write_output_row(&context);
    if (output.stop != 0 && output.written >= output.stop && output.written < output.height)
      return kMore;
    if (!host_agrees()) return kFailed;
  }
  if (context.scanline.finished != nullptr) {
    context.scanline.finished = nullptr;
    ++context.scanline.row;
  }
  return kDone;
}

}  // namespace

bool begin_scanlines(PELOI_PNGCONTEXT& context) {
  ScanlineState& scanline = context.scanline;
  const uint64_t rowBytes = (uint64_t{context.info.bitsPerPixel} * context.info.width + 7) / 8;
  const auto rowSize = static_cast<size_t>(rowBytes) + 1;
  if (!obtain_block(static_cast<int64_t>(2 * (rowBytes + 1 + context.info.width)), "PNG rows",
                    [&] { return scanline.rows.allocate(2 * rowSize); }))
    return false;
  scanline.current = scanline.rows.data();
  scanline.above = scanline.rows.data() + rowSize;
  context.fullWidth = context.info.width;
  context.fullHeight = context.info.height;
  if (context.info.interlace == 0) {
    begin_pass(context, 0);
    return true;
  }
  return next_pass(context);
}

bool completes_row(const PELOI_PNGCONTEXT& context, int64_t sourceRow) {
  for (int number = context.pass.number + 1; number <= 7; ++number) {
    const Adam7& pass = kPasses[number];
    if (context.fullWidth > pass.firstColumn && sourceRow % pass.rowStep == pass.firstRow) return false;
  }
  return true;
}

bool host_agrees() {
  int status = 0;
  TAVIRPELO_CheckExStatus(&status);
  if (status > 0) TAVIRPELO_OsSleep(status);
  return status >= 0 || refuse(Reason::kCancelled, "writing rows");
}

Result consume(PELOI_PNGCONTEXT& context) {
  Inflater& inflater = context.inflater;
  for (;;) {
    if (const Result result = write_pending(context); result != kDone) return result;
    if (at_end(context)) {
      inflater.take(inflater.unread_size());
      return kDone;
    }
    ScanlineState& scanline = context.scanline;
    const size_t rowSize = scanline.rowBytes + 1;
    const size_t count = std::min(rowSize - scanline.filled, inflater.unread_size());
    if (count == 0) return kDone;
    std::memcpy(scanline.current + scanline.filled, inflater.unread(), count);
    inflater.take(count);
    scanline.filled += count;
    if (scanline.filled == rowSize) finish_scanline(context);
  }
}

void unfilter_row(PELOI_PNGCONTEXT* context, uint8_t* row, const uint8_t* previousRow, size_t rowBytes) {
  unfilter(row[-1], row, previousRow, rowBytes, context->info.bytesPerPixel);
}

uint32_t set_pass_size(PELOI_PNGCONTEXT* context, uint32_t fullWidth, uint32_t fullHeight, int pass) {
  PELOI_PNGINFO& info = context->info;
  info.width = info.height = 0;
  if (pass < 1 || pass > 7) return 0;
  const Adam7& p = kPasses[pass];
  // ceil((full - first) / step)
  info.width =
      static_cast<uint32_t>((uint64_t{fullWidth} + p.columnStep - 1 - p.firstColumn) / p.columnStep);
  info.height = static_cast<uint32_t>((uint64_t{fullHeight} + p.rowStep - 1 - p.firstRow) / p.rowStep);
  info.interlace = static_cast<uint8_t>(pass);
  return info.height == 0 ? 0 : static_cast<uint32_t>(row_bytes(info));
}

}  // namespace pelo::png
