// Text as a JSON string.
#pragma once

#include <string>
#include <string_view>

namespace tool {

// Quoted and escaped. Bytes that are not UTF-8 become U+FFFD, so that the output always parses.
std::string json_text(std::string_view text);

}  // namespace tool
