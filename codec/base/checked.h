// Size arithmetic for counts that come from input: a sum or product that does not fit is an answer, not
// a wrap.
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <optional>

namespace pelo {

// The largest block that the size fields of a picture may ask for: bigger canvases and rows are refused
// as if memory were short.
constexpr int64_t kMaxPictureBlock = int64_t{256} << 20;

// n / d rounded up, for n >= 0 and d >= 1.
template <class N, class D>
constexpr auto ceil_div(N n, D d) {
  return n / d + (n % d != 0);
}

// a * b, or nothing when it exceeds size_t.
[[nodiscard]] constexpr std::optional<size_t> checked_mul(size_t a, size_t b) {
  if (b != 0 && a > std::numeric_limits<size_t>::max() / b) return std::nullopt;
  return a * b;
}

// a + b, or nothing when it exceeds size_t.
[[nodiscard]] constexpr std::optional<size_t> checked_add(size_t a, size_t b) {
  if (a > std::numeric_limits<size_t>::max() - b) return std::nullopt;
  return a + b;
}

// The value as an int, or nothing when it does not fit.
[[nodiscard]] constexpr std::optional<int> checked_int(int64_t value) {
  if (value < std::numeric_limits<int>::min() || value > std::numeric_limits<int>::max()) {
    return std::nullopt;
  }
  return static_cast<int>(value);
}

}  // namespace pelo
