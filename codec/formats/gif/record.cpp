#include "codec/formats/gif/record.h"

#include <algorithm>

#include "codec/base/axis_stepper.h"
#include "codec/base/errors.h"
#include "codec/formats/format.h"
#include "codec/pixel/row_stores.h"

namespace pelo::gif {
namespace {

constexpr int kWholePicture = -1;  // in place of a number of lines

// The least row o whose centre floor((height / 2 + o * height) / rows) is not above the screen row.
int64_t first_row(const Sampling& s, int64_t screenRow) {
  const int64_t height = s.from.height;
  return (screenRow * s.to.height - height / 2 + height - 1) / height;
}

}  // namespace

Record* new_record(void) {
  auto record = os_new<Record>();
  if (record == nullptr) return refuse(Reason::kNoMemory, "GIF decoder"), nullptr;
  record->kind = Record::kKind;
  record->reader.buffer = record->window;
  record->control.transparentIndex = -1;
  return record.release();
}

void delete_record(Record* record) {
  OsDelete{}(record);
}

bool IndexPlane::allocate(Size wanted) {
  size = wanted;
  const int64_t pixels = int64_t{wanted.width} * wanted.height;
  if (pixels == 0) return true;
  return obtain_block(pixels, "GIF picture", [&] {
    return indices.allocate(static_cast<size_t>(pixels)) &&
           painted.allocate(static_cast<size_t>(wanted.height));
  });
}

Size box_of(const Record& record) {
  return turned(record.request.buffer, record.option);
}

Size fit_screen(Size screen, Size box, uint32_t option) {
  if ((option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_STRETCH) return box;
  if (screen.width == 0) return {0, std::min(screen.height, box.height)};
  return fit_by_width(screen.width, screen.height, box);
}

bool is_reduced(const Record& record) {
  const Size screen = record.screen;
  const Size picture = record.picture;
  const bool tight = (record.option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  const Size box = tight ? picture : box_of(record);
  return box.width < screen.width && box.height < screen.height && picture.width > 0 &&
         picture.height > 0;
}

Size reduced_size(const Record& record) {
  const Size screen = record.screen;
  const Size picture = record.picture;
  if (!is_reduced(record)) return picture;
  int factor = screen.width / picture.width;
  while (screen.width % factor != 0) --factor;
  return {screen.width / factor, std::max(screen.height / factor, 1)};
}

bool set_geometry(Record& record, uint32_t option) {
  record.option = option;
  record.target = {};
  record.picture = fit_screen(record.screen, box_of(record), option);
  return set_sampling(record.sampling, record.screen, record.picture);
}

bool set_sampling(Sampling& sampling, Size from, Size to) {
  sampling.from = from;
  sampling.to = to;
  sampling.columns.reset();
  if (from == to || to.width == 0 || from.width == 0) return true;
  const auto count = static_cast<size_t>(to.width);
  if (!obtain_block(int64_t{2} * to.width, "GIF picture",
                    [&] { return sampling.columns.allocate(count); }))
    return false;
  AxisStepper stepper(from.width, to.width, from.width / 2);
  for (size_t k = 0; k < count; ++k, stepper.advance()) {
    sampling.columns[k] = static_cast<uint16_t>(stepper.position());
  }
  return true;
}

void cover_frame(Sampling& sampling, const Frame& frame) {
  const int left = std::min(frame.left, sampling.from.width);
  const int right = std::min(frame.left + frame.width, sampling.from.width);
  if (!sampling.columns) {
    const bool same = sampling.from == sampling.to;
    sampling.begin = same ? left : 0;
    sampling.end = same ? right : 0;
    return;
  }
  const uint16_t* columns = sampling.columns.data();
  const uint16_t* end = columns + sampling.columns.size();
  const auto column_from = [=](int x) {
    return static_cast<int>(std::lower_bound(columns, end, x) - columns);
  };
  sampling.begin = column_from(left);
  sampling.end = column_from(right);
}

OutputRows rows_of(const Sampling& sampling, int screenRow) {
  if (sampling.from == sampling.to) return {screenRow, screenRow + 1};
  return {static_cast<int>(first_row(sampling, screenRow)),
          static_cast<int>(first_row(sampling, int64_t{screenRow} + 1))};
}

const OutputGrid& grid_of(Record& record, void* output) {
  Target& target = record.target;
  if (target.bytes != output || target.lines != kWholePicture) {
    target = {output, kWholePicture,
              OutputGrid(output, record.request.buffer, record.picture,
                         bytes_per_pixel(record.request.format), record.option)};
  }
  return target.grid;
}

const OutputGrid& line_grid_of(Record& record, void* output) {
  Target& target = record.target;
  if (target.bytes != output || target.lines != record.lines) {
    const Placement placed = place(record.request.buffer, record.picture, record.option);
    target = {output, record.lines,
              OutputGrid(output, {placed.buffer.width, record.lines}, placed.left, 0,
                         bytes_per_pixel(record.request.format))};
  }
  return target.grid;
}

}  // namespace pelo::gif
