// Text for a terminal and for JSON.
#pragma once

#include <string>
#include <string_view>

namespace tool {

// Foreign text made harmless for a terminal: control characters become '?'.
std::string printable(std::string_view text);

// As a JSON string, quoted and escaped (RFC 8259, section 7). Bytes that are not UTF-8 become U+FFFD, so
// that the output always parses.
std::string json_text(std::string_view text);

}  // namespace tool
