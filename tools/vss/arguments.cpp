// The argument that every subcommand takes: its check and its words in the help.
#include "tools/vss/arguments.h"

#include <fmt/format.h>

namespace vss {
namespace {

constexpr size_t kMaxPathBytes = 255;  // what a container's header holds

std::string check_path_length(const std::string& path) {
  bool fits = !path.empty() && path.size() <= kMaxPathBytes;
  return fits ? std::string() : fmt::format("a path has 1 to {} bytes", kMaxPathBytes);
}

}  // namespace

CLI::Option* add_show_argument(CLI::App& command, std::string& path) {
  CLI::Validator length(check_path_length, "", "path length");
  return command.add_option("show", path, "Slide-show file")->required()->check(length);
}

}  // namespace vss
