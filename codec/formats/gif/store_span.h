// Pixels that are computed one by one, stored into a span of the output.
#pragma once

#include <algorithm>

#include "codec/base/output_grid.h"
#include "codec/formats/gif/record.h"

namespace pelo::gif {

// Stores `count` colours that stand in a row.
inline void store_colours(StoreRgba store, const Rgba* colours, int count, uint8_t* out,
                          ptrdiff_t step) {
  store(reinterpret_cast<const uint8_t*>(colours), count, out, step);
}

// Stores the colours that `pick(i)` yields for i = span.skip, span.skip + 1, ...
template <class Pick>
void store_span(StoreRgba store, const RowSpan& span, Pick pick) {
  constexpr int kChunk = 256;
  Rgba chunk[kChunk];
  for (int done = 0; done < span.count; done += kChunk) {
    const int count = std::min(kChunk, span.count - done);
    for (int i = 0; i < count; ++i) chunk[i] = pick(span.skip + done + i);
    store_colours(store, chunk, count, span.first + done * span.step, span.step);
  }
}

}  // namespace pelo::gif
