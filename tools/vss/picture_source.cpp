// Pictures on their way into a show: checks that the user understands, then the addition itself.
#include "tools/vss/picture_source.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstring>
#include <filesystem>

#include "tavirpelo/io.h"
#include "tools/common/text.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

constexpr size_t kMaxPathBytes = sizeof(subfileInfo::path) - 1;
constexpr int kMaxSourceSide = 5000;  // what the decoders take

// The part of an addition that depends on the picture alone; true when it works.
bool decodes(const SlideShow& show, const std::string& path, const TAVIRPELO_HINFO& header) {
  // The longer side is limited by the show's width or height; the other follows in proportion.
  int limit = header.width >= header.height ? show.width : show.height;
  int longer = std::max(header.width, header.height);
  int shorter = std::min(header.width, header.height);
  bool tooThin = longer > limit && static_cast<int64_t>(shorter) * limit / longer < 1;
  RawImage trial = create_canvas({limit, limit}, 0);
  return !tooThin && trial && TAVIRPELO_DecodeImageFromFile(path.c_str(), trial.get(), 0) == 1;
}

Exit check_source(const SlideShow& show, const std::string& path, TAVIRPELO_HINFO& header) {
  std::FILE* stream = TAVIRPELO_OsFopen(path.c_str(), "rb");
  if (!stream) return fail(Exit::kCannotOpen, "{}: {}", path, std::strerror(errno));
  std::fclose(stream);
  if (show.subfileCount >= SlideShow::kMaxFileSubfiles) {
    return fail(Exit::kRefused, "{}: the show is full, it holds {} pictures", show.pathName,
                SlideShow::kMaxFileSubfiles);
  }
  if (path.size() > kMaxPathBytes) {
    return fail(Exit::kRefused, "{}: longer than {} bytes", path, kMaxPathBytes);
  }
  if (TAVIRPELO_ParseFromFile(path.c_str(), &header) == TAVIRPELO_FORMAT_UNKNOWN) {
    return fail(Exit::kRefused, "{}: not a picture that can be read, or above {} pixels", path,
                kMaxSourceSide);
  }
  return Exit::kDone;
}

}  // namespace

std::string default_name(const std::string& path) {
  return std::filesystem::path(path).stem().string();
}

void print_added_heading() {
  fmt::print("{:>5}  {:<36}  {:>11}  {:>9}  {:>8}  {:>9}\n", "index", "name", "source", "stored",
             "bytes", "time");
}

Exit add_picture(SlideShow& show, const std::string& path, int index, const std::function<int()>& add) {
  TAVIRPELO_HINFO header{};
  Exit checked = check_source(show, path, header);
  if (checked != Exit::kDone) return checked;
  auto start = std::chrono::steady_clock::now();
  int result = add();
  std::chrono::duration<double, std::milli> time = std::chrono::steady_clock::now() - start;
  if (result != 1) {
    if (!decodes(show, path, header)) {
      return fail(Exit::kRefused, "{}: this picture cannot be decoded", path);
    }
    return fail(Exit::kWriteFailure, "{}: cannot be written", show.pathName);
  }
  const subfileInfo& entry = show.subfiles[index];
  fmt::print("{:>5}  {:<36}  {:>11}  {:>9}  {:>8}  {:>6.1f} ms\n", index, tool::printable(entry.name),
             fmt::format("{}x{}", header.width, header.height),
             fmt::format("{}x{}", entry.width, entry.height), show.GetSizeOfSubfile(index),
             time.count());
  return Exit::kDone;
}

}  // namespace vss
