#include "codec/formats/gif/driver.h"

#include "codec/formats/gif/output.h"
#include "codec/formats/gif/rows.h"
#include "codec/formats/gif/stream.h"
#include "tavirpelo/decode.h"

namespace pelo::gif {
namespace {

constexpr const char* kStage = "GIF decoder";

// How a picture is placed: by lines, rows are delivered as they are.
uint32_t placing_option(Mode mode, uint32_t option) {
  return mode == Mode::kLines ? option & ~uint32_t{TAVIRPELO_ROTATE_MASK} : option;
}

// A record with the header read and the output's geometry computed.
OsPtr<Record> open(TAVIRPELO_DECINFO& decInfo, int width, int height, Mode mode) {
  OsPtr<Record> record(new_record());
  if (record == nullptr) return nullptr;
  decInfo.scaleDenom = 1;
  record->decInfo = &decInfo;
  record->animated = mode == Mode::kAnimated;
  record->mode = mode;
  record->request = request_of(decInfo, width, height);
  record->store = gif_storer(decInfo.outFormat);
  if (!parse_header(decInfo.pIO, record.get())) return nullptr;
  if (!set_geometry(*record, placing_option(mode, decInfo.option))) return nullptr;
  if (record->animated && !create_canvas(*record)) return nullptr;
  decInfo.imageWidth = record->screen.width;
  decInfo.imageHeight = record->screen.height;
  decInfo.outWidth = record->picture.width;
  decInfo.outHeight = record->picture.height;
  return record;
}

bool averages(Mode mode) {
  return mode == Mode::kWhole || mode == Mode::kIterative;
}

// A record that stands at the first image's data; null on failure.
OsPtr<Record> start(TAVIRPELO_DECINFO& decInfo, int width, int height, Mode mode) {
  OsPtr<Record> record = open(decInfo, width, height, mode);
  if (record == nullptr) return nullptr;
  if (seek_image(decInfo.pIO, record.get()) != kImageFollows)
    return refuse(Reason::kDamaged, kStage, "no image"), nullptr;
  if (averages(mode) && !plan_reduction(*record)) return nullptr;
  return record;
}

}  // namespace

Record* continue_or_start(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, Mode mode) {
  if (!usable(decInfo, output, width, height, kStage)) return nullptr;
  const auto same = [&](const Record& held) {
    return held.mode == mode && held.request == request_of(*decInfo, width, height);
  };
  if (!may_go_on<Record>(*decInfo, kStage, same)) return nullptr;
  if (Record* held = held_state<Record>(*decInfo)) {
    held->decInfo = decInfo;
    return held;
  }
  decInfo->pFormatInfo = start(*decInfo, width, height, mode).release();
  return held_state<Record>(*decInfo);
}

Record* make_record(TAVIRPELO_DECINFO* decInfo, int width, int height, int animated, void* output) {
  if (!usable(decInfo, output, width, height, kStage)) return nullptr;
  return open(*decInfo, width, height, animated != 0 ? Mode::kAnimated : Mode::kWhole).release();
}

int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (!usable(decInfo, output, width, height, kStage) || !may_start<Record>(*decInfo, kStage))
    return kFailure;
  const auto record = start(*decInfo, width, height, Mode::kWhole);
  if (record == nullptr) return kFailure;
  const int result = answer(decode_image(decInfo->pIO, record.get(), output));
  if (record->ended || !finish_picture(*record, output)) return kFailure;
  return result;
}

int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  if (lines < 1) return refuse(Reason::kArgument, kStage);
  const bool first = decInfo != nullptr && decInfo->pFormatInfo == nullptr;
  Record* record = continue_or_start(decInfo, output, width, height, Mode::kLines);
  if (record == nullptr) return kFailure;
  const int result = answer(decode_image_lines(decInfo->pIO, record, output, lines, first));
  if (result != kMore) release_state<Record>(*decInfo);
  return result == kFailure ? kFailure : kDone;
}

int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  const bool first = decInfo != nullptr && decInfo->pFormatInfo == nullptr;
  Record* record = continue_or_start(decInfo, output, width, height, Mode::kIterative);
  if (record == nullptr) return kFailure;
  const int result = decode_image_step(decInfo->pIO, record, output, first);
  if (result == kMore) return kMore;
  // Damaged data end the image as its last row does.
  const bool done = !first && !record->ended && finish_picture(*record, output);
  release_state<Record>(*decInfo);
  return done ? kDone : kFailure;
}

int abort(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr) return 0;
  release_state<Record>(*decInfo);
  return decInfo->pFormatInfo == nullptr;
}

}  // namespace pelo::gif
