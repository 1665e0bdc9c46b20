#include "codec/formats/png/png_driver.h"

#include <algorithm>

#include "codec/base/errors.h"
#include "codec/base/io.h"

namespace pelo::png {
namespace {

constexpr const char* kStage = "PNG decoder";

// Attaches the reader to the start of a source: memory is read where it is. False when memory is short
// or the source cannot be moved.
bool open_reader(BufferedSource& reader, TAVIRPELO_IO* io) {
  constexpr const char* kReading = "PNG source";
  if (io == nullptr) return refuse(Reason::kArgument, kReading);
  if (io->ioType == TAVIRPELO_IO_MEMORY) {
    reader.open(static_cast<uint8_t*>(io->pSource), static_cast<uint32_t>(std::max(io->size, 0)));
    return io->pSource != nullptr || refuse(Reason::kEmpty, kReading);
  }
  if (!reader.open(io)) return refuse(Reason::kNoMemory, kReading);
  return seek_io(io, 0, SEEK_SET) == 0 || refuse(Reason::kSource, kReading);
}

// The state of a first call: reader, header, output.
Result begin(PELOI_PNGCONTEXT& context, TAVIRPELO_DECINFO& decInfo) {
  if (!open_reader(context.reader, decInfo.pIO)) return kNoMemory;
  if (parse_chunks(&context.info, context.reader.get()) != kDone) return kUnreadable;
  const PELOI_PNGINFO& info = context.info;
  if (info.width == 0 || info.height == 0)
    return refuse(Reason::kDamaged, kStage, "no header"), kUnreadable;
  if (info.idatCount == 0) return refuse(Reason::kDamaged, kStage, "no image data"), kUnreadable;
  if (info.colourType == kPalette && (info.criticalFlags & kPlteRead) == 0)
    return refuse(Reason::kDamaged, kStage, "no palette"), kUnreadable;
  decInfo.imageWidth = static_cast<int>(info.width);
  decInfo.imageHeight = static_cast<int>(info.height);
  const Result result = set_up_output(context);
  decInfo.outWidth = static_cast<int>(context.output.width);
  decInfo.outHeight = static_cast<int>(context.output.height);
  return result;
}

// The object's state: the one it holds when the request is the same, else a new one.
Result obtain(TAVIRPELO_DECINFO& decInfo, const DecodeRequest& request, PELOI_PNGCONTEXT*& context) {
  const auto same = [&](const PELOI_PNGCONTEXT& held) { return held.request == request; };
  if (!may_go_on<PELOI_PNGCONTEXT>(decInfo, kStage, same)) return kFailed;
  context = held_state<PELOI_PNGCONTEXT>(decInfo);
  if (context != nullptr) return kDone;
  context = os_new<PELOI_PNGCONTEXT>().release();
  if (context == nullptr) return refuse(Reason::kNoMemory, kStage), kNoMemory;
  context->kind = PELOI_PNGCONTEXT::kKind;
  decInfo.pFormatInfo = context;
  context->request = request;
  return begin(*context, decInfo);
}

int decompress(PELOI_PNGCONTEXT& context) {
  using Decompress = int (*)(PELOI_PNGCONTEXT*, uint32_t*);
  constexpr Decompress kVariants[2][2] = {{inflate_memory, inflate_stream},
                                          {inflate_interlaced_memory, inflate_interlaced_stream}};
  const size_t interlaced = context.info.interlace != 0 ? 1 : 0;
  const size_t streaming = context.reader->is_memory() ? 0 : 1;
  uint32_t total = 0;
  return kVariants[interlaced][streaming](&context, &total);
}

bool accepts_lines(const PELOI_PNGCONTEXT& context, int lines) {
  if (context.info.interlace == 0 || lines == 0) return true;
  const uint32_t height = context.inflaterOpen ? context.fullHeight : context.info.height;
  return static_cast<uint32_t>(lines) == height;
}

int decode(TAVIRPELO_DECINFO& decInfo, void* output, const DecodeRequest& request, int lines) {
  PELOI_PNGCONTEXT* context;
  if (const Result result = obtain(decInfo, request, context); result != kDone) return result;
  if (context->output.width == 0 || context->output.height == 0) return kDone;
  if (!accepts_lines(*context, lines))
    return refuse(Reason::kArgument, kStage, "rows of an interlaced PNG"), kLineMode;
  if (!context->reader->is_memory()) context->reader->io = decInfo.pIO;
  context->decInfo = &decInfo;
  context->iterFlag = decInfo.pngIterFlag != 0 ? 1 : 0;
  aim_output(*context, output, lines);
  return decompress(*context);
}

// The codes of the public operations: 1 complete, 4 more to come, 0 failed.
int public_result(int result) {
  return result == kDone ? 1 : result == kMore ? 4 : 0;
}

int start(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines, int iterFlag) {
  if (!usable(decInfo, output, width, height, kStage)) return 0;
  if (lines < 0) return refuse(Reason::kArgument, kStage);
  decInfo->scaleDenom = 1;
  decInfo->pngIterFlag = iterFlag;
  return public_result(decode_request(decInfo, output, width, height, lines));
}

}  // namespace

int decode_request(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  const int result = decode(*decInfo, output, request_of(*decInfo, width, height), lines);
  if (result != kMore) release(decInfo);
  return result;
}

int release(TAVIRPELO_DECINFO* decInfo) {
  pelo::release_state<PELOI_PNGCONTEXT>(*decInfo);
  return 1;
}

int needs_alpha(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr || decInfo->pIO == nullptr) return 0;
  const auto context = pelo::os_new<PELOI_PNGCONTEXT>();
  if (context == nullptr || !open_reader(context->reader, decInfo->pIO)) return 0;
  // What was read before a failure decides.
  static_cast<void>(parse_chunks(&context->info, context->reader.get()));
  release(decInfo);
  const bool carriesAlpha = (context->info.colourType & 4) != 0;
  return carriesAlpha || (context->info.ancillaryFlags & kTrnsRead) != 0;
}

int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (decInfo == nullptr) return refuse(Reason::kArgument, kStage);
  release(decInfo);
  return start(decInfo, output, width, height, 0, 0);
}

int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  return start(decInfo, output, width, height, lines, 0);
}

int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  return start(decInfo, output, width, height, 0, 1);
}

int end_decode(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr) return 0;
  release(decInfo);
  return decInfo->pFormatInfo == nullptr;
}

int abort(TAVIRPELO_DECINFO* decInfo) {
  return end_decode(decInfo);
}

}  // namespace pelo::png
