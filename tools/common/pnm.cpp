#include "tools/common/pnm.h"

#include <fmt/format.h>

#include <algorithm>
#include <cctype>

#include "tools/common/output.h"

namespace tool {
namespace {

// The header's words: decimal numbers between white space and comments, which run to the line's end.
class Header {
 public:
  explicit Header(const std::vector<uint8_t>& bytes) : bytes_(bytes) {}

  // A number up to `limit`; nothing for anything else.
  std::optional<int> number(int limit) {
    skip_space();
    if (!is_digit()) return std::nullopt;
    int value = 0;
    for (; is_digit(); ++at_) {
      value = value * 10 + (bytes_[at_] - '0');
      if (value > limit) return std::nullopt;
    }
    return value;
  }
  // Behind the single white space that ends the header.
  size_t end() const { return at_ + 1; }

 private:
  bool is_digit() const { return at_ < bytes_.size() && std::isdigit(bytes_[at_]); }
  void skip_space() {
    bool comment = false;
    for (; at_ < bytes_.size(); ++at_) {
      comment = comment ? bytes_[at_] != '\n' : bytes_[at_] == '#';
      if (!comment && !std::isspace(bytes_[at_])) return;
    }
  }

  const std::vector<uint8_t>& bytes_;
  size_t at_ = 2;
};

constexpr int kMaxSide = 65535;

}  // namespace

std::optional<Pnm> parse_pnm(const std::vector<uint8_t>& bytes) {
  if (bytes.size() < 2 || bytes[0] != 'P' || (bytes[1] != '5' && bytes[1] != '6')) return std::nullopt;
  Header header(bytes);
  std::optional<int> width = header.number(kMaxSide);
  std::optional<int> height = header.number(kMaxSide);
  std::optional<int> maximum = header.number(255);
  if (!width || !height || !maximum || *width == 0 || *height == 0 || *maximum == 0) return std::nullopt;
  Pnm picture{*width, *height, bytes[1] == '5', {}};
  uint64_t size =
      uint64_t{static_cast<uint32_t>(*width)} * static_cast<uint32_t>(*height) * (picture.grey ? 1 : 3);
  if (header.end() > bytes.size() || size > bytes.size() - header.end()) return std::nullopt;
  auto first = bytes.begin() + static_cast<std::ptrdiff_t>(header.end());
  picture.pixels.assign(first, first + static_cast<std::ptrdiff_t>(size));
  if (*maximum == 255) return picture;
  for (uint8_t& sample : picture.pixels) {
    sample = static_cast<uint8_t>((std::min<int>(sample, *maximum) * 255 + *maximum / 2) / *maximum);
  }
  return picture;
}

Exit write_pnm(const std::string& path, const Pnm& picture) {
  std::string header =
      fmt::format("P{}\n{} {}\n255\n", picture.grey ? 5 : 6, picture.width, picture.height);
  std::vector<uint8_t> bytes(header.begin(), header.end());
  bytes.insert(bytes.end(), picture.pixels.begin(), picture.pixels.end());
  return write_bytes(path, bytes.data(), bytes.size());
}

std::vector<uint8_t> luma_of(const std::vector<uint8_t>& rgb) {
  std::vector<uint8_t> grey(rgb.size() / 3);
  for (size_t i = 0; i < grey.size(); ++i) {
    grey[i] = static_cast<uint8_t>(
        (299 * rgb[3 * i] + 587 * rgb[3 * i + 1] + 114 * rgb[3 * i + 2] + 500) / 1000);
  }
  return grey;
}

}  // namespace tool
