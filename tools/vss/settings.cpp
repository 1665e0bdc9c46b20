// vss settings: shows a show's settings, after changing those that are given.
#include <memory>
#include <optional>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Setting {
  const char* name;
  int SlideShowFields::*field;
  bool flag;  // 0 or 1 only
  const char* description;
};

constexpr Setting kSettings[] = {
    {"interval", &SlideShowFields::interval, false, "Time between pictures, in the player's units"},
    {"effect", &SlideShowFields::effectType, false, "Transition effect, the player's code"},
    {"shuffle", &SlideShowFields::shuffle, true, "1 for random order"},
    {"loop", &SlideShowFields::loop, true, "1 to start over at the end"},
    {"direction", &SlideShowFields::screenDirection, true, "Screen direction, 0 or 1"},
};
constexpr size_t kCount = std::size(kSettings);

struct Options {
  std::string show;
  std::optional<int> values[kCount];
};

Exit run(const Options& options) {
  bool change = false;
  for (const auto& value : options.values) change |= value.has_value();
  SlideShow show;
  Exit opened = open_show(show, options.show, change ? Access::kEdit : Access::kRead);
  if (opened != Exit::kDone) return opened;
  for (size_t i = 0; i < kCount; ++i) {
    int& field = show.*kSettings[i].field;
    field = options.values[i].value_or(field);
  }
  if (change && show.writeVssHeader("r+b") != 1) {
    return fail(Exit::kWriteFailure, "{}: cannot be written", options.show);
  }
  for (const Setting& setting : kSettings) fmt::print("{} {}\n", setting.name, show.*setting.field);
  return Exit::kDone;
}

}  // namespace

void register_settings(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("settings", "Show the settings, or change some");
  add_show_argument(*command, options->show);
  for (size_t i = 0; i < kCount; ++i) {
    const Setting& setting = kSettings[i];
    CLI::Option* option =
        command->add_option(std::string("--") + setting.name, options->values[i], setting.description);
    if (setting.flag) option->check(CLI::Range(0, 1));
  }
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss
