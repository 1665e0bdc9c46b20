// Lists of whole numbers on the command line: "40,-30".
#pragma once

#include <array>
#include <charconv>
#include <optional>
#include <string_view>

namespace pelo_tool {

// Exactly `Count` numbers between commas, or nothing.
template <size_t Count>
std::optional<std::array<int, Count>> parse_numbers(std::string_view text) {
  std::array<int, Count> numbers{};
  const char* at = text.data();
  const char* end = at + text.size();
  for (size_t i = 0; i < Count; ++i) {
    if (i > 0 && (at == end || *at++ != ',')) return std::nullopt;
    const auto [next, error] = std::from_chars(at, end, numbers[i]);
    if (error != std::errc()) return std::nullopt;
    at = next;
  }
  if (at != end) return std::nullopt;
  return numbers;
}

}  // namespace pelo_tool
