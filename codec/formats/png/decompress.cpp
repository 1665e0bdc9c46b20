// The four variants of decompression: plain or interlaced images, from memory or from any other source.
#include <algorithm>
#include <cstdio>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/formats/png/png_context.h"

namespace pelo::png {
namespace {

constexpr const char* kStage = "PNG image data";
constexpr uint8_t kEmptyIend[12] = {0, 0, 0, 0, 'I', 'E', 'N', 'D', 0xAE, 0x42, 0x60, 0x82};

// Makes one IDAT chunk, followed by IEND, of all IDAT chunks inside the caller's buffer, so that their
// data can be read in one run. The room is always there: every chunk given up had twelve bytes around
// its data.
bool merge_chunks(PELOI_PNGCONTEXT& context) {
  PELOI_PNGINFO& info = context.info;
  uint8_t* const base = context.reader->buffer;
  uint8_t* const data = base + info.idat[0].offset;
  const uint8_t* const end = base + context.reader->size;
  if (info.idatLength + 4 + sizeof kEmptyIend > static_cast<uint64_t>(end - data)) return false;
  uint8_t* out = data + info.idat[0].length;
  for (size_t i = 1; i < info.idatCount; ++i) {
    std::memmove(out, base + info.idat[i].offset, info.idat[i].length);
    out += info.idat[i].length;
  }
  const auto length = static_cast<uint32_t>(info.idatLength);
  store_be32(data - 8, length);
  store_be32(out, crc32(data - 4, length + 4));
  std::memcpy(out + 4, kEmptyIend, sizeof kEmptyIend);
  info.idat[0].length = length;
  info.idatCount = 1;
  return true;
}

Result open_memory_input(PELOI_PNGCONTEXT& context) {
  if (context.inputReady) return kDone;
  if (context.info.idatCount > 1 && !merge_chunks(context))
    return refuse(Reason::kDamaged, kStage), kFailed;
  InflateInput& input = context.inflater.input();
  input.next = context.reader->buffer + context.info.idat[0].offset;
  input.end = input.next + context.info.idat[0].length;
  context.inputReady = true;
  return kDone;
}

bool refill(void* opaque) {
  auto* context = static_cast<PELOI_PNGCONTEXT*>(opaque);
  Source& reader = *context->reader.get();
  if (refill_from_chunks(context, &reader, context->idatEntry) != 1) return false;
  InflateInput& input = context->inflater.input();
  input.next = reader.next();
  input.end = input.next + reader.avail;
  return true;
}

// The source may have been moved between calls; bytes already read stay in the reader's window.
Result open_stream_input(PELOI_PNGCONTEXT& context) {
  context.reader->consumed = UINT32_MAX;  // no chunk begins there
  context.inflater.input().refill = refill;
  context.inflater.input().context = &context;
  return kDone;
}

Result result_of(InflateStop stop) {
  switch (stop) {
    case InflateStop::kCorrupt:
      return refuse(Reason::kDamaged, kStage), kCorrupt;
    case InflateStop::kInputEnded:
      return refuse(Reason::kDamaged, kStage, "cut inside the picture"), kFailed;
    case InflateStop::kNoMemory:
      return refuse(Reason::kNoMemory, kStage), kNoMemory;
    default:
      return kDone;
  }
}

// Rows go out before the reason why the decompressor stopped counts, so that a caller gets all that the
// data hold.
Result run(PELOI_PNGCONTEXT& context) {
  Inflater& inflater = context.inflater;
  for (;;) {
    if (const Result result = consume(context); result != kDone) return result;
    const InflateStop stop = context.lastStop;
    if (stop == InflateStop::kStreamEnd) return kDone;
    if (const Result result = result_of(stop); result != kDone) return result;
    if (stop == InflateStop::kBlockEnd && context.iterFlag != 0) {
      context.lastStop = InflateStop::kWindowFull;
      return kMore;
    }
    context.lastStop = inflater.run();
  }
}

Result open_decompression(PELOI_PNGCONTEXT& context) {
  if (context.inflaterOpen) return kDone;
  if (!context.inflater.open()) return refuse(Reason::kNoMemory, kStage), kNoMemory;
  if (!begin_scanlines(context)) return kNoMemory;
  context.inflaterOpen = true;
  return kDone;
}

using OpenInput = Result (*)(PELOI_PNGCONTEXT&);

int inflate_image(PELOI_PNGCONTEXT& context, uint32_t* total, OpenInput openInput) {
  Result result = open_decompression(context);
  if (result == kDone) result = openInput(context);
  if (result == kDone) result = run(context);
  *total = static_cast<uint32_t>(context.inflater.total());
  return result;
}

int inflate_interlaced(PELOI_PNGCONTEXT& context, uint32_t* total, OpenInput openInput) {
  const int result = inflate_image(context, total, openInput);
  if (result != kDone || !context.output.wholeImage) return result;
  return write_gathered_image(&context) ? kDone : kFailed;
}

}  // namespace

int refill_from_chunks(PELOI_PNGCONTEXT* context, Source* reader, uint32_t entryIndex) {
  PELOI_PNGINFO& info = context->info;
  while (entryIndex < info.idatCount && info.idat[entryIndex].length == 0) ++entryIndex;
  context->idatEntry = entryIndex;
  if (entryIndex >= info.idatCount) return 0;
  IdatEntry& entry = info.idat[entryIndex];
  if (reader->consumed != entry.offset) {
    const auto offset = pelo::checked_int(entry.offset);
    if (!offset || seek_io(reader->io, *offset, SEEK_SET) != *offset) return 0;
    reader->consumed = entry.offset;
  }
  reader->pos = reader->avail = 0;
  if (!reader->refill(std::min(entry.length, kSourceBufferSize))) return 0;
  entry.offset += reader->avail;
  entry.length -= reader->avail;
  return 1;
}

int inflate_memory(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return inflate_image(*context, total, open_memory_input);
}
int inflate_stream(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return inflate_image(*context, total, open_stream_input);
}
int inflate_interlaced_memory(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return inflate_interlaced(*context, total, open_memory_input);
}
int inflate_interlaced_stream(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return inflate_interlaced(*context, total, open_stream_input);
}

}  // namespace pelo::png
