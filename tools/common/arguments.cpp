// Arguments that commands of several programs take: their checks and their words in the help.
#include "tools/common/arguments.h"

#include <fmt/format.h>

#include <charconv>
#include <optional>
#include <string_view>

namespace tool {
namespace {

std::optional<int> parse_side(std::string_view text, int maxSide) {
  int value = 0;
  auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  bool whole = error == std::errc() && end == text.data() + text.size();
  if (!whole || value < 1 || value > maxSide) return std::nullopt;
  return value;
}

std::optional<Size> parse_size(std::string_view text, int maxSide) {
  size_t cross = text.find('x');
  if (cross == std::string_view::npos) return std::nullopt;
  std::optional<int> width = parse_side(text.substr(0, cross), maxSide);
  std::optional<int> height = parse_side(text.substr(cross + 1), maxSide);
  if (!width || !height) return std::nullopt;
  return Size{*width, *height};
}

}  // namespace

CLI::Option* add_size_argument(CLI::App& command, const std::string& name, Size& size, int maxSide,
                               const std::string& description) {
  auto store = [&size, maxSide](const std::string& text) {
    std::optional<Size> parsed = parse_size(text, maxSide);
    if (!parsed) {
      throw CLI::ValidationError(text, fmt::format("a size is WIDTHxHEIGHT, each 1 to {}", maxSide));
    }
    size = *parsed;
  };
  return command.add_option_function<std::string>(name, store, description)->type_name("WxH");
}

CLI::Option* add_quality_option(CLI::App& command, int& quality) {
  return command.add_option("-q,--quality", quality, "JPEG quality")
      ->check(CLI::Range(1, 100))
      ->capture_default_str();
}

}  // namespace tool
