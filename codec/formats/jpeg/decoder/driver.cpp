#include "codec/formats/jpeg/decoder/driver.h"

#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/convert.h"
#include "codec/formats/jpeg/decoder/decode_size.h"
#include "codec/formats/jpeg/decoder/markers.h"
#include "codec/formats/jpeg/decoder/progressive.h"
#include "codec/formats/jpeg/decoder/row_process.h"
#include "codec/formats/jpeg/decoder/scan_list.h"
#include "codec/formats/jpeg/decoder/scan_setup.h"
#include "codec/formats/jpeg/decoder/upsample.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

constexpr const char* kStage = "JPEG decoder";

int fail(const char* text) {
  log_error(text);
  return PELOJ_FAIL;
}

int divide_up(int64_t a, int64_t b) {
  return static_cast<int>((a + b - 1) / b);
}

// Blocks and samples of a component in the picture (T.81 A.1.1, A.2.4).
void lay_out(const PELOJ_JDINFO& jd, Component& component) {
  const int64_t w = int64_t{jd.imageWidth} * component.h;
  const int64_t h = int64_t{jd.imageHeight} * component.v;
  component.blocksWide = divide_up(w, 8 * jd.hMax);
  component.blocksHigh = divide_up(h, 8 * jd.vMax);
  component.downsampledWidth = divide_up(w, jd.hMax);
  component.downsampledHeight = divide_up(h, jd.vMax);
  component.scaledWidth =
      divide_up(int64_t{component.downsampledWidth} * jd.scale.numerator, 1 << jd.scale.shift);
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
  jd.bufferWidth = jd.outWidth = request.width;
  jd.bufferHeight = jd.outHeight = request.height;
}

// Headers to output position; false with a line in the log.
bool initialize(PELOJ_JDINFO& jd, PELOJ_REQUEST& request) {
  const int parsed = parse_header(&jd, 0);
  request.imageWidth = jd.imageWidth;
  request.imageHeight = jd.imageHeight;
  request.componentCount = jd.componentCount;
  if (parsed != PELOJ_OK) return log_error("PELOJ_Initialize : PELOJ_ParseHeader fail"), false;
  if (jd.imageWidth == 0 || jd.imageHeight == 0) {
    refuse(Reason::kZeroSize, kStage);
    return log_error("PELOJ_Initialize : image width, hegiht is zero"), false;
  }
  choose_sizes(jd, jd.decInfo->option);
  if (start_decompression(&jd) != PELOJ_OK) {
    return log_error("PELOJ_Initialize : PELOJ_StartDecompression fail"), false;
  }
  jd.decInfo->outWidth = jd.outWidth;
  jd.decInfo->outHeight = jd.outHeight;
  set_output(jd, request.outBuffer, jd.decInfo->option);
  if (!prepare_resampling(jd)) {
    refuse(Reason::kNoMemory, kStage);
    return log_error("PELOJ_Initialize : malloc fail"), false;
  }
  jd.decInfo->imageWidth = jd.imageWidth;
  jd.decInfo->imageHeight = jd.imageHeight;
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
  jd.skipping = 1;
  while (jd.rowsDone < jd.cropY) {
    int rows = 0;
    const int status = process(&jd, &rows, 1);
    if (status == PELOJ_IMAGE_DONE || status == PELOJ_FAIL || rows == 0) {
      return refuse(Reason::kTruncated, kStage, "above the wanted part");
    }
    jd.rowsDone += rows;
  }
  // Sampling positions count from the first row that is shown.
  jd.skipping = 0;
  jd.rowsDone = 0;
  return true;
}

// From one pass over the data, or from all scans row by row. Damage ends a picture, or coarsens it; it
// does not fail.
int decode_rows(PELOJ_JDINFO& jd) {
  if (needs_all_scans(jd)) {
    // A scan that is cut must not hide what the others have of its rows.
    jd.endIsMarker = 1;
    if (list_scans(jd) != PELOJ_OK) return PELOJ_FAIL;
  }
  if (!skip_rows(jd)) return 0;
  if (show_rows(jd) != PELOJ_FAIL) return PELOJ_OK;
  if (!stores_coefficients(jd)) {
    begin_operation();  // the rows so far are the picture: nothing to complain of
    return PELOJ_OK;
  }
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_DECODE);
  log_error(jd.scale == kFull ? "PELOJ_DecodeImage : PELOJ_ProgCompleteProcessData fail"
                              : "PELOJ_DecodeImage : PELOJ_ProgCompleteProcessData_resize fail");
  return 0;
}

}  // namespace
void clear_decoder(PELOJ_JDINFO* jdInfo) {
  if (jdInfo == nullptr) return;
  const int width = jdInfo->imageWidth;
  const int height = jdInfo->imageHeight;
  const int components = jdInfo->componentCount;
  jdInfo->~PELOJ_JDINFO();
  new (jdInfo) PELOJ_JDINFO();
  // A refused header still tells its size.
  jdInfo->imageWidth = width;
  jdInfo->imageHeight = height;
  jdInfo->componentCount = components;
}

int start_decompression(PELOJ_JDINFO* jdInfo) {
  if (!choose_converter(*jdInfo)) {
    return fail("PELOJ_StartDecompression : unsupported color space");
  }
  for (int c = 0; c < jdInfo->componentCount; ++c) {
    lay_out(*jdInfo, (*jdInfo->components)[static_cast<size_t>(c)]);
  }
  jdInfo->imcuRows = divide_up(jdInfo->imageHeight, 8 * jdInfo->vMax);
  if (prepare_upsampling(jdInfo) != PELOJ_OK) {
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
