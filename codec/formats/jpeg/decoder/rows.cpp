#include "codec/formats/jpeg/decoder/rows.h"

#include <algorithm>
#include <cstring>

#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
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

// Brings the next row group of every component to the full grid.
void replicate_row_group(const Frame& frame, Progress& progress) {
  for (int c = frame.componentCount - 1; c >= 0; --c) {
    Component& component = (*frame.components)[static_cast<size_t>(c)];
    uint8_t** input = component.samples.get() + progress.rowGroup * component.v;
    if (component.on_full_grid()) {
      use_rows_as_they_are(frame.vMax, input, component.colourRows);
    } else {
      replicate_rows(component, frame.vMax, input, component.colourRows);
    }
  }
  progress.readPosition = 0;
}

// Full-grid rows at hand, as many as are left of a capacity: the row group's, or the next one's.
int rows_at_hand(const Frame& frame, Progress& progress, int left) {
  if (progress.readPosition >= frame.vMax) replicate_row_group(frame, progress);
  return std::min(frame.vMax - progress.readPosition, left);
}

void advance(Progress& progress, int vMax, int rows) {
  progress.readPosition += rows;
  if (progress.readPosition >= vMax) ++progress.rowGroup;
}

bool set_expansion(const Frame& frame, Component& component) {
  if (frame.hMax % component.h != 0 || frame.vMax % component.v != 0) return false;
  component.hExpand = static_cast<uint8_t>(frame.hMax / component.h);
  component.vExpand = static_cast<uint8_t>(frame.vMax / component.v);
  return true;
}

int fail(const char* text) {
  log_error(text);
  return PELOJ_FAIL;
}

// One row function: how it decodes, and what it says.
struct RowDecoder {
  int (*decodeRow)(PELOJ_JDINFO*);
  const char* aborted;
  const char* failed;
};

// Decodes the next iMCU row into the sample rows. Returns its status, 201 for a failure.
int fill_sample_rows(PELOJ_JDINFO& jd, const RowDecoder& function) {
  if (jd.checkFn != nullptr && jd.checkFn(jd.decInfo, jd.output.emitted, jd.progress.rowsDone) == 0) {
    refuse(Reason::kCancelled, "JPEG decoder");
    log_error(function.aborted);
    return PELOJ_FAIL;
  }
  const int before = jd.progress.imcuRow;
  const int status = function.decodeRow(&jd);
  if (status == PELOJ_ROW_FAIL) {
    refuse(Reason::kDamaged, "JPEG decoder");
    log_error(function.failed);
    return PELOJ_FAIL;
  }
  jd.progress.lastImcuDecoded = status == PELOJ_IMAGE_DONE;
  jd.progress.bufferFull = jd.progress.imcuRow != before;
  jd.progress.rowGroup = 0;
  return status;
}

int process(PELOJ_JDINFO& jd, const RowDecoder& function, int* rowCounter, int rowsWanted) {
  int status = 0;
  if (!jd.progress.bufferFull) {
    status = fill_sample_rows(jd, function);
    if (status == PELOJ_FAIL || !jd.progress.bufferFull) return status;
  }
  (jd.progress.skipping ? skip_rows_unconverted : convert_rows)(&jd, rowCounter, rowsWanted);
  if (jd.progress.rowGroup < jd.sizes.scale.block_size()) return 0;
  jd.progress.bufferFull = 0;
  return jd.progress.lastImcuDecoded ? PELOJ_IMAGE_DONE : 0;
}

}  // namespace

void use_rows_as_they_are(int vMax, uint8_t** input, uint8_t** grid) {
  std::copy_n(input, vMax, grid);
}

// Input row i becomes rows i * vExpand and the following ones of the grid.
void replicate_rows(const Component& component, int vMax, uint8_t** input, uint8_t** grid) {
  uint8_t** colour = component.colour.get();
  for (int row = 0, in = 0; row < vMax; ++in) {
    kReplicate[component.hExpand](input[in], component.scaledWidth, colour[in]);
    for (int e = 0; e < component.vExpand && row < vMax; ++e) grid[row++] = colour[in];
  }
}

void convert_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity) {
  const int rows = rows_at_hand(jdInfo->frame, jdInfo->progress, capacity - *rowCounter);
  jdInfo->resampling.continueFlag = 1;
  while (jdInfo->resampling.continueFlag && jdInfo->output.emitted < jdInfo->output.bandEnd) {
    jdInfo->resampling.convert(jdInfo, rows);
  }
  // A band that ends inside an input row goes on with it in the next one.
  if (jdInfo->resampling.continueFlag && jdInfo->output.emitted < jdInfo->output.limit) return;
  *rowCounter += rows;
  advance(jdInfo->progress, jdInfo->frame.vMax, rows);
}

void skip_rows_unconverted(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity) {
  const int rows = rows_at_hand(jdInfo->frame, jdInfo->progress, capacity - *rowCounter);
  *rowCounter += rows;
  advance(jdInfo->progress, jdInfo->frame.vMax, rows);
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

int prepare_upsampling(Frame& frame, Scale scale, Progress& progress) {
  const int blockSize = scale.block_size();
  const int mcus = frame.mcus_across();
  for (int c = 0; c < frame.componentCount; ++c) {
    Component& component = (*frame.components)[static_cast<size_t>(c)];
    if (!set_expansion(frame, component)) {
      refuse(Reason::kVariant, "JPEG decoder", "sampling factors that do not divide each other");
      return fail("PELOJ_InitUpsampler : invalid sampling");
    }
    if (component.samples) continue;  // prepared for an earlier scan
    // Whole MCUs wide: blocks beyond the last column are written too.
    component.samples.reset(allocate_rows(mcus * component.h * blockSize, component.v * blockSize));
    if (!component.samples) return fail("PELOJ_InitUpsampler : PELOJ_AllocSampleArry fail");
    if (component.on_full_grid()) continue;
    component.colour.reset(allocate_rows(component.scaledWidth * component.hExpand, component.v));
    if (!component.colour) return fail("PELOJ_InitUpsampler : PELOJ_AllocSampleArry fail");
  }
  progress.readPosition = frame.vMax;
  return PELOJ_OK;
}

RowFunction row_function(const PELOJ_JDINFO& jd) {
  const bool full = jd.sizes.scale == kFull;
  if (stores_coefficients(jd)) {
    return full ? process_progressive_rows : process_progressive_rows_scaled;
  }
  return full ? process_rows : process_rows_scaled;
}

int show_rows(PELOJ_JDINFO& jd) {
  const RowFunction process = row_function(jd);
  while (jd.progress.rowsDone < jd.sizes.used.height && jd.output.emitted < jd.output.bandEnd) {
    int rows = 0;
    const int status = process(&jd, &rows, 1);
    jd.progress.rowsDone += rows;
    if (status == PELOJ_FAIL || status == PELOJ_IMAGE_DONE) return status;
    if (rows == 0) break;
  }
  return jd.progress.rowsDone < jd.sizes.used.height && jd.output.emitted < jd.output.limit
             ? 0
             : PELOJ_IMAGE_DONE;
}

int process_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_imcu_row, "PELOJ_ProcessData : pJDInfo->CheckFn fail",
                  "PELOJ_ProcessData : PELOJ_DecodeSingleiMcu fail"},
                 rowCounter, rowsWanted);
}

int process_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_imcu_row_scaled, "PELOJ_ProcessData_resize : pJDInfo->CheckFn fail",
                  "PELOJ_ProcessData_resize : PELOJ_DecodeSingleiMcu_resize fail"},
                 rowCounter, rowsWanted);
}

int process_progressive_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_progressive_row, "PELOJ_ProgProcessData : pJDInfo->CheckFn fail",
                  "PELOJ_ProgCompleteProcessData : PELOJ_ProgIDct fail"},
                 rowCounter, rowsWanted);
}

int process_progressive_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted) {
  return process(*jdInfo,
                 {decode_progressive_row, "PELOJ_ProgCompleteProcessData_resize : pJDInfo->CheckFn fail",
                  "PELOJ_ProgCompleteProcessData_resize : PELOJ_ProgIDct fail"},
                 rowCounter, rowsWanted);
}

}  // namespace pelo::jpeg
