#include "codec/formats/jpeg/transform/reencode.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <utility>

#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "codec/formats/format.h"
#include "codec/formats/jpeg/exif/exif_writer.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/transform/requantise.h"
#include "tavirpelo/parse.h"

namespace pelo::jpeg {
namespace {

constexpr int kPasses = 5;
constexpr int kWholeSize = 1024;
constexpr int kGreyHeaders = 328, kColourHeaders = 623;  // bytes without APP1

// A JPEG as TAVIRPELO_CreateDecInfo takes it.
struct Input {
  int kind;
  void* address;
  int size;
};

// What every attempt needs.
struct Job {
  Input source;
  int width, height;
  int target;
  TAVIRPELO_APP1 app1;
  std::array<uint8_t, 4096> app1Bytes;

  const TAVIRPELO_APP1* segment() const { return app1.length > 0 ? &app1 : nullptr; }
};

enum class Outcome { kFits, kTooLarge, kFailed };

using OpenInput = std::unique_ptr<TAVIRPELO_DECINFO, int (*)(TAVIRPELO_DECINFO*)>;
OpenInput open(const Input& input) {
  return {create_dec_info(input.kind, input.address, input.size, TAVIRPELO_YUV420, 0), destroy_dec_info};
}

// Size of the picture and its orientation; false when it is no JPEG.
bool read_source(Job& job) {
  const OpenInput frame = open(job.source);
  if (frame == nullptr) return false;
  TAVIRPELO_HINFO header{};
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (parse_source(*frame, &header, detect) != TAVIRPELO_FORMAT_JPEG) return false;
  job.width = header.width;
  job.height = header.height;
  job.source.size = frame->pIO->size;
  job.app1 = {job.app1Bytes.data(), 0};
  if (!make_app1(frame.get(), &job.app1)) job.app1.length = 0;
  return true;
}

void restart(ELO_DESTINATION& destination) {
  destination.used = destination.total = 0;
}

TAVIRPELO_RAWINFO planar(int width, int height) {
  TAVIRPELO_RAWINFO image{};
  image.width = static_cast<uint32_t>(width);
  image.height = static_cast<uint32_t>(height);
  image.format = TAVIRPELO_YUV420;
  return image;
}

// ---- the same size ----

// Codes the input's coefficients with the parameters.
bool code_again(const Job& job, CoefficientSource& source, const TransformParameters& parameters,
                ELO_DESTINATION& destination) {
  const PELOJ_JDINFO& jd = source.decoder();
  const TAVIRPELO_RAWINFO image = planar(jd.frame.width, jd.frame.height);
  const TAVIRPELO_ENCOPTION options{100, job.segment(), 0};
  restart(destination);
  ELO_ENCODER* encoder = begin_bands(&image, &destination, &options, &parameters.coding);
  if (encoder == nullptr) return false;
  const auto control = source.progressive() ? requantise_progressive : requantise_sequential;
  const bool sameGrid =
      encoder->mcusAcross == source.grid().across && encoder->mcusDown == source.grid().down;
  const bool coded = sameGrid && control(&source, &parameters, encoder);
  const bool finished = finish_bands(encoder, nullptr, nullptr);
  return coded && finished;
}

// Coarser and coarser, until the result is within the target or nothing more can be done.
Outcome requantise(const Job& job, const Input& input, int width, int height,
                   ELO_DESTINATION& destination) {
  TransformParameters parameters{};
  int size = input.size, target = job.target;
  for (int pass = 0; pass < kPasses; ++pass) {
    CoefficientSource source;
    if (!source.open(input.kind, input.address, input.size, width, height)) return Outcome::kFailed;
    if (pass == 0) parameters_of_source(&source, &parameters);
    const Coarsening coarsening = set_gained_table(&parameters, updated_gain(size, target));
    if (coarsening == Coarsening::kFailed) return Outcome::kFailed;
    if (coarsening == Coarsening::kTooCoarse) return Outcome::kTooLarge;
    if (!code_again(job, source, parameters, destination)) return Outcome::kFailed;
    size = destination.total;
    if (size <= job.target) return Outcome::kFits;
    target = static_cast<int>(int64_t{target} * 921 >> 10);
  }
  return Outcome::kTooLarge;
}

// ---- a smaller size ----

// A band of planar rows, as the encoder takes it.
struct Band {
  OsBuffer<uint8_t> bytes;
  uint8_t* planes[3];

  bool allocate(int width) {
    const size_t luma = size_t{16} * static_cast<size_t>(width);
    const size_t chroma = 8 * ((static_cast<size_t>(width) + 1) / 2);
    if (!bytes.allocate(luma + 2 * chroma)) return false;
    planes[0] = bytes.data();
    planes[1] = planes[0] + luma;
    planes[2] = planes[1] + chroma;
    return true;
  }
  void clear() { std::memset(bytes.data(), 0, bytes.size()); }
};

bool code_bands(PELOJ_JDINFO* decoder, ELO_ENCODER* encoder, Band& band, int height) {
  for (int row = 0; row < height; row += 16) {
    band.clear();
    if (!decode_strip(decoder, band.planes, std::min(16, height - row))) return false;
    if (!encode_band(encoder, band.bytes.data(), nullptr)) {
      end_strips(decoder);
      return false;
    }
  }
  end_strips(decoder);
  return true;
}

bool planar_source(const PELOJ_JDINFO& jd) {
  return jd.frame.colourSpace == ColourSpace::kYcc || jd.frame.colourSpace == ColourSpace::kGrey;
}

// Reduced sizes, each three quarters of the one before, from the ratio on.
Outcome reduce(const Job& job, int ratio, ELO_DESTINATION& destination) {
  ELO_DESTINATION reduced{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  Outcome outcome = Outcome::kTooLarge;
  while (outcome == Outcome::kTooLarge) {
    const int width = static_cast<int>(int64_t{ratio} * job.width >> 10);
    const int height = static_cast<int>(int64_t{ratio} * job.height >> 10);
    outcome = Outcome::kFailed;
    if (width == 0 || height == 0) break;
    restart(reduced);
    if (!resize_within(job.source.address, job.source.size, job.source.kind, width, height,
                       job.segment(), &reduced)) {
      break;
    }
    if (reduced.total <= job.target) {
      restart(destination);
      const bool copied =
          append(destination, reduced.buffer, static_cast<size_t>(reduced.total)) && finish(destination);
      outcome = copied ? Outcome::kFits : Outcome::kFailed;
      break;
    }
    outcome = requantise(job, {TAVIRPELO_IO_MEMORY, reduced.buffer, reduced.total}, width, height,
                         destination);
    ratio = ratio * 768 >> 10;
  }
  discard(reduced);
  return outcome;
}

bool encode_within(const Input& source, int target, ELO_DESTINATION& destination) {
  Job job{};
  job.source = source;
  job.target = target;
  if (job.target < kGreyHeaders || !read_source(job)) return false;
  if (job.target < kGreyHeaders + job.app1.length) return false;
  const int ratio = scale_for_target(job.width, job.height, job.target);
  Outcome outcome = Outcome::kTooLarge;
  if (ratio == kWholeSize) outcome = requantise(job, job.source, job.width, job.height, destination);
  // Reduced pictures are coded in colour.
  if (outcome == Outcome::kTooLarge && job.target >= kColourHeaders + job.app1.length) {
    outcome = reduce(job, ratio, destination);
  }
  return outcome == Outcome::kFits;
}

// ---- to a file ----

// Room for the target and some more; without memory it starts empty.
ELO_DESTINATION working_memory(int target) {
  const int64_t capacity =
      std::clamp<int64_t>(int64_t{target} * 1200 / 1024, kDestinationStep, INT_MAX / 2);
  ELO_DESTINATION work{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  work.buffer = static_cast<uint8_t*>(os_malloc(static_cast<size_t>(capacity)));
  if (work.buffer != nullptr) work.capacity = static_cast<int>(capacity);
  return work;
}

bool write_out(const ELO_DESTINATION& work, FILE* file) {
  const auto count = static_cast<size_t>(work.total);
  return os_write(work.buffer, 1, count, file) == count;
}

// The file is opened last: it may be the source.
bool write_out(const ELO_DESTINATION& work, const char* path) {
  FILE* file = os_open(path, "wb");
  if (file == nullptr) return false;
  const bool written = write_out(work, file);
  const bool closed = os_close(file) == 0;
  return written && closed;
}

}  // namespace

int scale_for_target(int width, int height, int target) {
  const int64_t estimate = int64_t{width} * height * 12 / 160;
  if (estimate <= target) return kWholeSize;
  const int64_t percent = int64_t{100} * target / estimate;
  // The largest ratio with ratio^2 <= 1024^2 * percent / 100.
  int64_t ratio = 0;
  for (int64_t bit = 512; bit != 0; bit >>= 1) {
    if ((ratio + bit) * (ratio + bit) * 100 <= percent * kWholeSize * kWholeSize) ratio += bit;
  }
  return static_cast<int>(ratio);
}

int resize_within(void* source, int size, int kind, int width, int height, const TAVIRPELO_APP1* app1,
                  ELO_DESTINATION* destination) {
  const OpenInput frame = open({kind, source, size});
  Band band;
  if (frame == nullptr || !band.allocate(width)) return 0;
  PELOJ_JDINFO* decoder = begin_strips(frame.get(), width, height, TAVIRPELO_YUV420);
  if (decoder == nullptr) return 0;
  const TAVIRPELO_RAWINFO image = planar(width, height);
  const TAVIRPELO_ENCOPTION options{50, app1, 0};
  ELO_ENCODER* encoder =
      planar_source(*decoder) ? begin_bands(&image, destination, &options, nullptr) : nullptr;
  if (encoder == nullptr) {
    end_strips(decoder);
    return 0;
  }
  const bool coded = code_bands(decoder, encoder, band, height);
  const bool finished = finish_bands(encoder, nullptr, nullptr);
  return coded && finished;
}

int encode_within_target(void* source, int size, int kind, ELO_DESTINATION* destination, int target) {
  const Input input{kind, source, size};
  if (destination->kind == ELO_TO_MEMORY) return encode_within(input, target, *destination);
  ELO_DESTINATION work = working_memory(target);
  const bool done = encode_within(input, target, work) && write_out(work, destination->file);
  destination->total = work.total;
  discard(work);
  return done;
}

int reencode_to_buffer(void* source, int size, int kind, uint8_t** buffer, int* outSize, int target) {
  ELO_DESTINATION destination{ELO_TO_MEMORY, std::max(*outSize, 0), 0, 0, nullptr, *buffer};
  if (*buffer == nullptr) destination.capacity = 0;
  const int done = encode_within_target(source, size, kind, &destination, target);
  if (!done) discard(destination);
  *buffer = destination.buffer;
  *outSize = destination.total;
  return done;
}

int reencode_to_file(void* source, int size, int kind, const char* path, int target) {
  ELO_DESTINATION work = working_memory(target);
  const bool done = encode_within({kind, source, size}, target, work) && write_out(work, path);
  discard(work);
  return done;
}

}  // namespace pelo::jpeg
