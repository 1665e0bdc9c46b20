// Pictures on their way into a show: checks that the user understands, then the addition itself.
#include "tools/vss/picture_source.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdint>
#include <cstring>
#include <filesystem>

#include "tavirpelo/error.h"
#include "tavirpelo/io.h"
#include "tools/common/text.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

constexpr size_t kMaxPathBytes = sizeof(subfileInfo::path) - 1;

// Why the codec failed last, or what to say when it did not.
std::string codec_reason(const char* otherwise) {
  TAVIRPELO_ERROR error;
  return TAVIRPELO_LastError(&error) == 1 ? error.text : otherwise;
}

// The longer side is limited by the show's width or height; the other follows in proportion.
bool too_thin(const SlideShow& show, const TAVIRPELO_HINFO& header) {
  const int limit = header.width >= header.height ? show.width : show.height;
  const int longer = std::max(header.width, header.height);
  const int shorter = std::min(header.width, header.height);
  return longer > limit && static_cast<int64_t>(shorter) * limit / longer < 1;
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
    return fail(Exit::kRefused, "{}: {}", path, codec_reason("not a picture that can be read"));
  }
  if (too_thin(show, header)) {
    return fail(Exit::kRefused, "{}: {}x{}, less than a pixel wide in this show", path, header.width,
                header.height);
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
    // The codec's last step in an addition that fails later is the measuring of the new JPEG, which
    // succeeds.
    const std::string reason = codec_reason("");
    if (!reason.empty())
      return fail(Exit::kRefused, "{}: this picture cannot be decoded: {}", path, reason);
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
