#include "tools/common/output.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace tool {
namespace {

bool write_all(std::FILE* stream, const uint8_t* bytes, size_t size) {
  return std::fwrite(bytes, 1, size, stream) == size;
}

}  // namespace

Exit write_bytes(const std::string& path, const uint8_t* bytes, size_t size) {
  // A failure is told when standard output is flushed, at the program's end.
  if (path == "-") return write_all(stdout, bytes, size) ? Exit::kDone : Exit::kWriteFailure;
  std::FILE* stream = std::fopen(path.c_str(), "wb");
  if (!stream) return fail(Exit::kWriteFailure, "{}: {}", path, std::strerror(errno));
  bool written = write_all(stream, bytes, size);
  bool closed = std::fclose(stream) == 0;
  if (!written || !closed) return fail(Exit::kWriteFailure, "{}: {}", path, std::strerror(errno));
  return Exit::kDone;
}

}  // namespace tool
