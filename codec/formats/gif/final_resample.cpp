#include "codec/base/errors.h"
#include "codec/formats/gif/output.h"
#include "codec/pixel/quad_sampler.h"
#include "codec/pixel/row_stores.h"

namespace pelo::gif {
namespace {

// Four channels of 16 bits: red in the low one, alpha in the high one. Sums of four samples fit.
constexpr uint64_t wide_lanes(Rgba c) {
  return c.r | uint64_t{c.g} << 16 | uint64_t{c.b} << 32 | uint64_t{c.a} << 48;
}

constexpr Rgba average_of_four(uint64_t sums) {
  return {static_cast<uint8_t>(sums >> 2), static_cast<uint8_t>(sums >> 18),
          static_cast<uint8_t>(sums >> 34), static_cast<uint8_t>(sums >> 50)};
}

// The samples of a plane; what the image did not paint counts as zero.
class Samples {
 public:
  explicit Samples(const Record& record)
      : plane_(record.plane), begin_(record.sampling.begin), end_(record.sampling.end) {
    for (int i = 0; i < 256; ++i) lanes_[i] = wide_lanes(record.palette[i]);
  }

  void select_rows(int64_t upper, int64_t lower) {
    rows_[0] = row(upper);
    rows_[1] = row(lower);
  }
  uint64_t at(int64_t column) const {
    if (column < begin_ || column >= end_) return 0;
    uint64_t sum = 0;
    for (const uint8_t* indices : rows_) sum += indices != nullptr ? lanes_[indices[column]] : 0;
    return sum;
  }

 private:
  const uint8_t* row(int64_t y) const {
    return plane_.painted[static_cast<size_t>(y)] ? plane_.row(static_cast<int>(y)) : nullptr;
  }

  const IndexPlane& plane_;
  int begin_, end_;
  uint64_t lanes_[256];
  const uint8_t* rows_[2] = {};
};

// Enlarging, copying and reducing alike: at equal sizes both points are the pixel itself.
bool resample(Record& record, Size target, const OutputGrid& grid) {
  const Size source = record.plane.size;
  Samples samples(record);
  QuarterPoints rows(source.height, target.height);
  for (int y = 0; y < target.height; ++y, rows.advance()) {
    if (!may_write(record, 1)) return false;
    samples.select_rows(rows.first(), rows.second());
    const RowSpan span = grid.span(y, 0, target.width);
    QuarterPoints columns(source.width, target.width, quarter_phases(source.width), span.skip);
    store_span(record.store, span, [&](int) {
      const uint64_t sums = samples.at(columns.first()) + samples.at(columns.second());
      columns.advance();
      return average_of_four(sums);
    });
  }
  return true;
}

}  // namespace

bool plan_reduction(Record& record) {
  const Size reduced = reduced_size(record);
  if (record.store == nullptr || !is_reduced(record)) return true;
  if (reduced == record.picture) {  // sampling straight into the output gives the same pixels
    return record.plane.painted.allocate(static_cast<size_t>(record.picture.height)) ||
           refuse(Reason::kNoMemory, "GIF picture");
  }
  return set_sampling(record.sampling, record.screen, reduced) && record.plane.allocate(reduced);
}

// A picture that is not turned fills the whole box when that is smaller on both sides.
bool finish_picture(Record& record, void* output) {
  const Size reduced = record.plane.size;
  if (!record.plane.indices) {
    clear_unpainted_rows(record, output);
    return true;
  }
  const Size buffer = record.request.buffer;
  const bool upright = (record.option & TAVIRPELO_ROTATE_MASK) == TAVIRPELO_ROTATE_0;
  const bool tight = (record.option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  if (upright && !tight && buffer.width < reduced.width && buffer.height < reduced.height) {
    return resample(record, buffer,
                    OutputGrid(output, buffer, 0, 0, bytes_per_pixel(record.request.format)));
  }
  return resample(record, record.picture, grid_of(record, output));
}

}  // namespace pelo::gif
