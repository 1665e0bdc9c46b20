#include "tools/pelo/jpeg_input.h"

#include <climits>

#include "tools/pelo/input.h"

namespace pelo_tool {

Exit read_jpeg(const std::string& path, std::vector<uint8_t>& bytes, TAVIRPELO_HINFO& header) {
  const Exit result = read_all(path, bytes);
  if (result != Exit::kDone) return result;
  const bool small = !bytes.empty() && bytes.size() <= INT_MAX;
  const int format =
      small ? elo_parse_from_buffer(bytes.data(), static_cast<int>(bytes.size()), &header) : 0;
  if (format != TAVIRPELO_FORMAT_JPEG) return fail(Exit::kRefused, "{}: not a JPEG", path);
  return Exit::kDone;
}

}  // namespace pelo_tool
