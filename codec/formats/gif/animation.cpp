#include <algorithm>
#include <cstring>

#include "codec/base/checked.h"
#include "codec/formats/format.h"
#include "codec/formats/gif/driver.h"
#include "codec/formats/gif/output.h"
#include "codec/formats/gif/rows.h"
#include "codec/formats/gif/stream.h"
#include "tavirpelo/decode.h"

namespace pelo::gif {
namespace {

constexpr int kRestoreBackground = 2;
constexpr int kRestorePrevious = 3;

Rgba* canvas_row(Record& record, int row) {
  return record.canvas.data() + static_cast<size_t>(row) * static_cast<size_t>(record.screen.width);
}

// Paints the row's colours; transparent ones leave what is there.
void paint(const Record& record, Rgba* target, int count) {
  const uint8_t* indices = record.line.data() + record.lzw.start;
  if (record.control.transparentIndex < 0) {
    for (int i = 0; i < count; ++i) target[i] = record.palette[indices[i]];
    return;
  }
  for (int i = 0; i < count; ++i) {
    if (indices[i] != record.control.transparentIndex) target[i] = record.palette[indices[i]];
  }
}

// What "restore to background" leaves: nothing under a transparent image, else the screen's background.
Rgba background(const Record& record) {
  if (record.control.transparentIndex >= 0) return {};
  const uint32_t lanes = record.globalTable[record.backgroundIndex];
  return {static_cast<uint8_t>(lanes >> 20), static_cast<uint8_t>(lanes >> 10),
          static_cast<uint8_t>(lanes), 255};
}

bool write_canvas_rows(Record& record, void* output, int begin, int end) {
  for (int row = begin; row < std::min(end, record.screen.height); ++row) {
    record.currentRow = row;
    record.rowSource = canvas_row(record, row);
    if (!write_screen_row(record, output)) return false;
  }
  return true;
}

// The frame's first step: the rows above the image, and everything ready for its own.
int start_frame(Record& record, void* output) {
  record.rowsWritten = 0;
  if (!write_canvas_rows(record, output, 0, record.frame.top)) return kFailure;
  record.inImage = true;
  return decode_image_step(record.reader.io, &record, output, 1);
}

// The frame's last step: the rows below the image, and what comes next.
int finish_frame(Record& record, void* output) {
  const int below = record.frame.top + record.frame.height;
  if (!write_canvas_rows(record, output, below, record.screen.height)) return kFailure;
  record.inImage = false;
  return seek_image(record.reader.io, &record);
}

int step(Record& record, void* output) {
  if (!record.inImage) return start_frame(record, output);
  const int result = decode_image_step(record.reader.io, &record, output, 0);
  return result == kDone ? finish_frame(record, output) : result;
}

}  // namespace

bool create_canvas(Record& record) {
  const int64_t pixels = int64_t{record.screen.width} * record.screen.height;
  if (pixels == 0) return true;
  return obtain_block(pixels * int64_t{sizeof(Rgba)}, "GIF canvas", [&] {
    return record.canvas.allocate(static_cast<size_t>(pixels)) &&
           record.frameRow.allocate(static_cast<size_t>(record.screen.width));
  });
}

int compose_row(Record* record) {
  if (record->currentRow >= record->screen.height || record->screen.width == 0) return 1;
  const int width = record->screen.width;
  const int left = std::min(record->frame.left, width);
  const int count = std::min(record->frame.width, width - left);
  Rgba* canvas = canvas_row(*record, record->currentRow);
  const int disposal = record->control.disposal;
  if (disposal != kRestoreBackground && disposal != kRestorePrevious) {
    paint(*record, canvas + left, count);  // what is shown stays
    record->rowSource = canvas;
    return 1;
  }
  Rgba* shown = record->frameRow.data();
  std::copy_n(canvas, width, shown);
  paint(*record, shown + left, count);
  if (disposal == kRestoreBackground) std::fill_n(canvas + left, count, background(*record));
  record->rowSource = shown;
  return 1;
}

int decode_frame_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  Record* record = continue_or_start(decInfo, output, width, height, Mode::kAnimated);
  if (record == nullptr) return kFailure;
  const int result = answer(step(*record, output));
  if (result != kMore && result != kImageFollows) release_state<Record>(*decInfo);
  return result;
}

int decode_frame(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  int result;
  do {
    result = decode_frame_step(decInfo, output, width, height);
  } while (result == kMore);
  return result;
}

int abort_animation(TAVIRPELO_DECINFO* decInfo) {
  return abort(decInfo);
}

}  // namespace pelo::gif
