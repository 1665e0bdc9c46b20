#include "tools/common/text.h"

#include <fmt/format.h>

namespace tool {
namespace {

// Bytes of the well-formed UTF-8 sequence at the start of `text` (RFC 3629, section 4); 0 when there is
// none.
size_t sequence_length(std::string_view text) {
  auto byte = [text](size_t i) { return static_cast<unsigned char>(text[i]); };
  unsigned char first = byte(0);
  size_t length = first < 0x80   ? 1
                  : first < 0xC2 ? 0
                  : first < 0xE0 ? 2
                  : first < 0xF0 ? 3
                  : first < 0xF5 ? 4
                                 : 0;
  if (length > text.size()) return 0;
  for (size_t i = 1; i < length; ++i) {
    if ((byte(i) & 0xC0) != 0x80) return 0;
  }
  // Overlong forms, surrogates and values above U+10FFFF are told by the second byte.
  if ((first == 0xE0 && byte(1) < 0xA0) || (first == 0xED && byte(1) > 0x9F) ||
      (first == 0xF0 && byte(1) < 0x90) || (first == 0xF4 && byte(1) > 0x8F)) {
    return 0;
  }
  return length;
}

}  // namespace

std::string printable(std::string_view text) {
  std::string result(text);
  for (char& c : result) {
    auto byte = static_cast<unsigned char>(c);
    if (byte < 0x20 || byte == 0x7F) c = '?';
  }
  return result;
}

std::string json_text(std::string_view text) {
  std::string result = "\"";
  while (!text.empty()) {
    size_t length = sequence_length(text);
    auto first = static_cast<unsigned char>(text[0]);
    if (length == 0) {
      result += "\\ufffd";
    } else if (first < 0x20) {
      result += fmt::format("\\u{:04x}", first);
    } else {
      if (first == '"' || first == '\\') result += '\\';
      result += text.substr(0, length);
    }
    text.remove_prefix(length == 0 ? 1 : length);
  }
  return result + '"';
}

}  // namespace tool
