#include "tools/pelo/input.h"

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>

#include "tavirpelo/error.h"
#include "tavirpelo/io.h"

namespace pelo_tool {
namespace {

using tool::Exit;
using tool::fail;

struct CloseFile {
  void operator()(std::FILE* stream) const {
    if (stream != stdin) std::fclose(stream);
  }
};
using File = std::unique_ptr<std::FILE, CloseFile>;

Exit cannot_read(const std::string& path) {
  return fail(Exit::kCannotOpen, "{}: {}", path, std::strerror(errno));
}

}  // namespace

Exit read_all(const std::string& path, std::vector<uint8_t>& bytes) {
  File file(path == "-" ? stdin : TAVIRPELO_OsFopen(path.c_str(), "rb"));
  if (!file) return cannot_read(path);
  uint8_t part[65536];
  while (size_t count = std::fread(part, 1, sizeof part, file.get())) {
    bytes.insert(bytes.end(), part, part + count);
  }
  return std::ferror(file.get()) ? cannot_read(path) : Exit::kDone;
}

Exit Input::open(const std::string& path) {
  path_ = path;
  if (path == "-") {
    Exit result = read_all(path, bytes_);
    if (result != Exit::kDone) return result;
    if (bytes_.size() > INT_MAX) return fail(Exit::kRefused, "more than 2 GiB on standard input");
    info_.reset(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, bytes_.data(),
                                        static_cast<int>(bytes_.size()), TAVIRPELO_RGB888, 0));
  } else {
    File file(TAVIRPELO_OsFopen(path.c_str(), "rb"));  // only to learn why a file does not open
    if (!file) return cannot_read(path);
    info_.reset(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, path_.data(), 0, TAVIRPELO_RGB888, 0));
  }
  if (!info_) return fail(Exit::kCannotOpen, "{}: empty, or no file", path);
  if (TAVIRPELO_Parser(info_.get(), &header_) == TAVIRPELO_FORMAT_UNKNOWN) {
    TAVIRPELO_ERROR error;
    const bool known = TAVIRPELO_LastError(&error) == 1;
    return fail(Exit::kRefused, "{}: {}", path, known ? error.text : "not a picture that can be read");
  }
  return Exit::kDone;
}

bool Input::decode(TAVIRPELO_RAWINFO& raw, uint32_t option, int mode) {
  if (format() == TAVIRPELO_FORMAT_JPEG) {  // the only decoder with modes
    info_->outFormat = static_cast<int>(raw.format);
    TAVIRPELO_SetDecOption(info_.get(), option);
    TAVIRPELO_SetDecMode(info_.get(), mode);
    return TAVIRPELO_DecodeJPEG(info_.get(), raw.pData, static_cast<int>(raw.width),
                                static_cast<int>(raw.height)) == 1;
  }
  int done = path_ == "-" ? TAVIRPELO_DecodeImageFromBuffer(
                                bytes_.data(), static_cast<int>(bytes_.size()), &raw, option)
                          : TAVIRPELO_DecodeImageFromFile(path_.c_str(), &raw, option);
  return done == 1;
}

CLI::Option* add_picture_argument(CLI::App& command, std::string& path) {
  return command.add_option("picture", path, "Picture file, - for standard input")->required();
}

}  // namespace pelo_tool
