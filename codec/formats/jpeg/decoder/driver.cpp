#include "codec/formats/jpeg/decoder/driver.h"

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/headers.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/rows.h"
#include "codec/formats/jpeg/decoder/scans.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

constexpr const char* kStage = "JPEG decoder";

int fail(const char* text) {
  log_error(text);
  return PELOJ_FAIL;
}

// Blocks and samples of a component in the picture (T.81 A.1.1, A.2.4).
void lay_out(const Frame& frame, Scale scale, Component& component) {
  // At most kMaxSide * kMaxSampling each.
  const int w = frame.width * component.h;
  const int h = frame.height * component.v;
  component.blocksWide = ceil_div(w, 8 * frame.hMax);
  component.blocksHigh = ceil_div(h, 8 * frame.vMax);
  component.downsampledWidth = ceil_div(w, frame.hMax);
  component.downsampledHeight = ceil_div(h, frame.vMax);
  component.scaledWidth = ceil_div(component.downsampledWidth * scale.numerator, 1 << scale.shift);
}

// What a decode wants of the object that it runs on.
void take_wishes(PELOJ_JDINFO& jd, TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE* source,
                 const PELOJ_REQUEST& request) {
  jd.source = source;
  jd.decInfo = &decInfo;
  jd.checkFn = decInfo.CheckFn;
  jd.outFormat = decInfo.outFormat;
  jd.decMode = decInfo.decMode;
  // A planar picture is never turned: its planes have no common pixel step.
  jd.rotation = jd.outFormat == TAVIRPELO_YUV420 ? 0u : decInfo.option & TAVIRPELO_ROTATE_MASK;
  jd.sizes.buffer = jd.sizes.output = {request.width, request.height};
}

// Headers to output position; false with a line in the log.
bool initialize(PELOJ_JDINFO& jd, PELOJ_REQUEST& request) {
  const int parsed = parse_header(&jd);
  request.imageWidth = jd.frame.width;
  request.imageHeight = jd.frame.height;
  request.componentCount = jd.frame.componentCount;
  if (parsed != PELOJ_OK) return log_error("PELOJ_Initialize : PELOJ_ParseHeader fail"), false;
  if (jd.frame.width == 0 || jd.frame.height == 0) {
    refuse(Reason::kZeroSize, kStage);
    return log_error("PELOJ_Initialize : image width, hegiht is zero"), false;
  }
  jd.sizes = choose_sizes(jd.frame, jd.marker->frameType,
                          {jd.sizes.buffer, jd.rotation, jd.decInfo->option, jd.decMode});
  if (start_decompression(&jd) != PELOJ_OK) {
    return log_error("PELOJ_Initialize : PELOJ_StartDecompression fail"), false;
  }
  jd.decInfo->outWidth = jd.sizes.output.width;
  jd.decInfo->outHeight = jd.sizes.output.height;
  set_output(jd, request.outBuffer, jd.decInfo->option);
  if (!prepare_resampling(jd.sizes, jd.resampling)) {
    refuse(Reason::kNoMemory, kStage);
    return log_error("PELOJ_Initialize : malloc fail"), false;
  }
  jd.decInfo->imageWidth = jd.frame.width;
  jd.decInfo->imageHeight = jd.frame.height;
  return true;
}

// A decoder ready for its first row; empty with the reason in `error`.
Decoder start(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE* source, PELOJ_REQUEST& request, int& error) {
  Decoder decoder = os_new<PELOJ_JDINFO>();
  if (!decoder) {
    error = TAVIRPELO_ERROR_MEMORY;
    refuse(Reason::kNoMemory, kStage);
    log_error("PELOJ_Initialize : malloc fail");
    return nullptr;
  }
  take_wishes(*decoder, decInfo, source, request);
  if (initialize(*decoder, request)) return decoder;
  error = TAVIRPELO_ERROR_DECODE;
  refuse(Reason::kDamaged, kStage);
  return nullptr;
}

// Passes the rows above the wanted part; false when the picture ends there.
bool skip_rows(PELOJ_JDINFO& jd) {
  const RowFunction process = row_function(jd);
  jd.progress.skipping = 1;
  while (jd.progress.rowsDone < jd.sizes.cropY) {
    int rows = 0;
    const int status = process(&jd, &rows, 1);
    if (status == PELOJ_IMAGE_DONE || status == PELOJ_FAIL || rows == 0) {
      return refuse(Reason::kTruncated, kStage, "above the wanted part");
    }
    jd.progress.rowsDone += rows;
  }
  // Sampling positions count from the first row that is shown.
  jd.progress.skipping = 0;
  jd.progress.rowsDone = 0;
  return true;
}

// From one pass over the data, or from all scans row by row. Damage ends a picture, or coarsens it; it
// does not fail.
int decode_rows(PELOJ_JDINFO& jd) {
  if (needs_all_scans(jd)) {
    // A scan that is cut must not hide what the others have of its rows.
    jd.entropy.endIsMarker = 1;
    if (list_scans(jd) != PELOJ_OK) return PELOJ_FAIL;
  }
  if (!skip_rows(jd)) return 0;
  if (show_rows(jd) != PELOJ_FAIL) return PELOJ_OK;
  if (!stores_coefficients(jd)) {
    begin_operation();  // the rows so far are the picture: nothing to complain of
    return PELOJ_OK;
  }
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_DECODE);
  log_error(jd.sizes.scale == kFull ? "PELOJ_DecodeImage : PELOJ_ProgCompleteProcessData fail"
                                    : "PELOJ_DecodeImage : PELOJ_ProgCompleteProcessData_resize fail");
  return 0;
}

}  // namespace

void clear_decoder(PELOJ_JDINFO* jdInfo) {
  if (jdInfo == nullptr) return;
  const int width = jdInfo->frame.width;
  const int height = jdInfo->frame.height;
  const int components = jdInfo->frame.componentCount;
  jdInfo->~PELOJ_JDINFO();
  new (jdInfo) PELOJ_JDINFO();
  // A refused header still tells its size.
  jdInfo->frame.width = width;
  jdInfo->frame.height = height;
  jdInfo->frame.componentCount = components;
}

int start_decompression(PELOJ_JDINFO* jdInfo) {
  if (!choose_converter(jdInfo->frame.colourSpace, jdInfo->sizes, jdInfo->decMode, jdInfo->resampling)) {
    return fail("PELOJ_StartDecompression : unsupported color space");
  }
  for (int c = 0; c < jdInfo->frame.componentCount; ++c) {
    lay_out(jdInfo->frame, jdInfo->sizes.scale, (*jdInfo->frame.components)[static_cast<size_t>(c)]);
  }
  jdInfo->progress.imcuRows = jdInfo->frame.mcus_down();
  if (prepare_upsampling(jdInfo->frame, jdInfo->sizes.scale, jdInfo->progress) != PELOJ_OK) {
    return fail("PELOJ_StartDecompression : PELOJ_InitUpsampler fail");
  }
  if (prepare_before_scan(jdInfo) != PELOJ_OK) {
    return fail("PELOJ_StartDecompression : PELOJ_InitDecBeforeScan fail");
  }
  return PELOJ_OK;
}

PELOJ_JDINFO* initialize_decoder(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                 PELOJ_REQUEST* request) {
  int error = TAVIRPELO_ERROR_NONE;
  Decoder decoder = start(*decInfo, source, *request, error);
  if (error == TAVIRPELO_ERROR_MEMORY) record_error(ErrorWord::kDecoding, error);
  return decoder.release();
}

int decode_image(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, PELOJ_REQUEST* request) {
  int error = TAVIRPELO_ERROR_DECODE;
  const Decoder decoder = start(*decInfo, source, *request, error);
  if (!decoder || !first_scan_suffices(*decoder)) {
    record_error(ErrorWord::kDecoding, error);
    return fail("PELOJ_DecodeImage : PELOJ_Initialize fail");
  }
  return decode_rows(*decoder);
}

int decode_frame(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, void* outBuffer, int reqWidth,
                 int reqHeight) {
  PELOJ_REQUEST request{outBuffer, reqWidth, reqHeight, 0, 0, 0};
  if (decode_image(decInfo, source, &request) == PELOJ_OK) return 1;
  log_error("PELOJ_ValorenDecodeFrame : PELOJ_DecodeImage fail");
  return 0;
}

}  // namespace pelo::jpeg
