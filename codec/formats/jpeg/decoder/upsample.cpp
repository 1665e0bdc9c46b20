#include "codec/formats/jpeg/decoder/upsample.h"

#include <algorithm>
#include <cstring>

#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

// Writes each sample `Expand` times.
template <int Expand>
void replicate(const uint8_t* __restrict in, int count, uint8_t* __restrict out) {
  for (int i = 0; i < count; ++i) {
    for (int e = 0; e < Expand; ++e) out[Expand * i + e] = in[i];
  }
}
using Replicate = void (*)(const uint8_t*, int, uint8_t*);
constexpr Replicate kReplicate[kMaxSampling + 1] = {nullptr, replicate<1>, replicate<2>, replicate<3>,
                                                    replicate<4>};

// Input row i becomes rows i * vExpand and the following ones of the grid.
void expand_rows(PELOJ_JDINFO& jd, const Component& component, uint8_t** input, uint8_t** slot) {
  uint8_t** colour = component.colour.get();
  for (int row = 0, in = 0; row < jd.frame.vMax; ++in) {
    kReplicate[component.hExpand](input[in], component.scaledWidth, colour[in]);
    for (int e = 0; e < component.vExpand && row < jd.frame.vMax; ++e) slot[row++] = colour[in];
  }
}

// Brings the next row group of every component to the full grid.
void replicate_row_group(PELOJ_JDINFO& jd) {
  for (int c = jd.frame.componentCount - 1; c >= 0; --c) {
    Component& component = (*jd.frame.components)[static_cast<size_t>(c)];
    uint8_t** slot = component.colourRows;
    component.upsample(&jd, &component, component.samples.get() + jd.progress.rowGroup * component.v,
                       &slot);
  }
  jd.progress.readPosition = 0;
}

void advance(PELOJ_JDINFO& jd, int rows) {
  jd.progress.readPosition += rows;
  if (jd.progress.readPosition >= jd.frame.vMax) ++jd.progress.rowGroup;
}

bool choose_method(const PELOJ_JDINFO& jd, Component& component) {
  const int h = component.h;
  const int v = component.v;
  if (jd.frame.hMax % h != 0 || jd.frame.vMax % v != 0) return false;
  component.hExpand = static_cast<uint8_t>(jd.frame.hMax / h);
  component.vExpand = static_cast<uint8_t>(jd.frame.vMax / v);
  if (component.hExpand == 1 && component.vExpand == 1) {
    component.upsample = use_rows_as_they_are;
  } else if (component.hExpand == 2 && component.vExpand == 1) {
    component.upsample = replicate_h2v1;
  } else if (component.hExpand == 2 && component.vExpand == 2 && component.downsampledWidth >= 2) {
    component.upsample = replicate_h2v2;
  } else {
    component.upsample = replicate_integral;
  }
  return true;
}

int fail(const char* text) {
  log_error(text);
  return PELOJ_FAIL;
}

}  // namespace
void use_rows_as_they_are(PELOJ_JDINFO* jdInfo, Component*, uint8_t** input, uint8_t*** slot) {
  std::copy_n(input, jdInfo->frame.vMax, *slot);
}
void replicate_h2v1(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input, uint8_t*** slot) {
  expand_rows(*jdInfo, *component, input, *slot);
}
void replicate_h2v2(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input, uint8_t*** slot) {
  expand_rows(*jdInfo, *component, input, *slot);
}
void replicate_integral(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input, uint8_t*** slot) {
  expand_rows(*jdInfo, *component, input, *slot);
}

void convert_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity) {
  if (jdInfo->progress.readPosition >= jdInfo->frame.vMax) replicate_row_group(*jdInfo);
  const int rows = std::min(jdInfo->frame.vMax - jdInfo->progress.readPosition, capacity - *rowCounter);
  jdInfo->resampling.continueFlag = 1;
  while (jdInfo->resampling.continueFlag && jdInfo->output.emitted < jdInfo->output.bandEnd) {
    jdInfo->resampling.convert(jdInfo, rows);
  }
  // A band that ends inside an input row goes on with it in the next one.
  if (jdInfo->resampling.continueFlag && jdInfo->output.emitted < jdInfo->output.limit) return;
  *rowCounter += rows;
  advance(*jdInfo, rows);
}

void skip_rows_unconverted(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity) {
  if (jdInfo->progress.readPosition >= jdInfo->frame.vMax) replicate_row_group(*jdInfo);
  const int rows = std::min(jdInfo->frame.vMax - jdInfo->progress.readPosition, capacity - *rowCounter);
  *rowCounter += rows;
  advance(*jdInfo, rows);
}

uint8_t** allocate_rows(int width, int rows) {
  if (width < 1 || rows < 1) return nullptr;
  const auto stride = static_cast<size_t>(width);
  const auto count = static_cast<size_t>(rows);
  const auto row = checked_add(stride, sizeof(uint8_t*));
  const auto bytes = row ? checked_mul(*row, count) : std::nullopt;
  void* block = bytes ? os_malloc(*bytes) : nullptr;
  if (block == nullptr) {
    refuse(Reason::kNoMemory, "JPEG decoder");
    log_error("PELOJ_AllocSampleArry : malloc fail");
    return nullptr;
  }
  auto** pointers = static_cast<uint8_t**>(block);
  uint8_t* samples = static_cast<uint8_t*>(block) + count * sizeof(uint8_t*);
  // Neutral grey for components that no scan delivers.
  os_memset(samples, 128, stride * count);
  for (size_t i = 0; i < count; ++i) pointers[i] = samples + i * stride;
  return pointers;
}

int prepare_upsampling(PELOJ_JDINFO* jdInfo) {
  const int blockSize = jdInfo->sizes.scale.block_size();
  const int mcus = jdInfo->frame.mcus_across();
  for (int c = 0; c < jdInfo->frame.componentCount; ++c) {
    Component& component = (*jdInfo->frame.components)[static_cast<size_t>(c)];
    if (!choose_method(*jdInfo, component)) {
      refuse(Reason::kVariant, "JPEG decoder", "sampling factors that do not divide each other");
      return fail("PELOJ_InitUpsampler : invalid sampling");
    }
    if (component.samples) continue;  // prepared for an earlier scan
    // Whole MCUs wide: blocks beyond the last column are written too.
    component.samples.reset(allocate_rows(mcus * component.h * blockSize, component.v * blockSize));
    if (!component.samples) return fail("PELOJ_InitUpsampler : PELOJ_AllocSampleArry fail");
    if (component.upsample == use_rows_as_they_are) continue;
    component.colour.reset(allocate_rows(component.scaledWidth * component.hExpand, component.v));
    if (!component.colour) return fail("PELOJ_InitUpsampler : PELOJ_AllocSampleArry fail");
  }
  jdInfo->progress.readPosition = jdInfo->frame.vMax;
  return PELOJ_OK;
}

}  // namespace pelo::jpeg
