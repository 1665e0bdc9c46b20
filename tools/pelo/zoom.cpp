// pelo zoom: the views that a viewer with a small display would show, one picture file each.
#include <algorithm>
#include <array>
#include <map>
#include <memory>

#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"
#include "tools/pelo/numbers.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  std::vector<std::string> words;
  std::string prefix = "view";
  tool::Size display;
  int budget = 32;  // MiB
  int factor = 1;
  int rotation = 0;  // degrees, clockwise
};

const std::map<std::string, int> kControls = {
    {"in", TAVIRPELO_ZOOM_IN},          {"out", TAVIRPELO_ZOOM_OUT},   {"up", TAVIRPELO_ZOOM_UP},
    {"down", TAVIRPELO_ZOOM_DOWN},      {"left", TAVIRPELO_ZOOM_LEFT}, {"right", TAVIRPELO_ZOOM_RIGHT},
    {"refresh", TAVIRPELO_ZOOM_REFRESH}};

struct Action {
  std::string word;
  int control = -1;              // of kControls
  std::array<int, 3> numbers{};  // of the other words
};

template <size_t Count>
bool take_numbers(const std::string& text, Action& action) {
  const auto numbers = parse_numbers<Count>(text);
  if (numbers) std::copy(numbers->begin(), numbers->end(), action.numbers.begin());
  return numbers.has_value();
}

// Complains about words that say nothing.
Exit parse_actions(const std::vector<std::string>& words, std::vector<Action>& actions) {
  for (size_t at = 0; at < words.size(); ++at) {
    Action action{words[at]};
    const auto control = kControls.find(action.word);
    bool known = control != kControls.end();
    if (known) {
      action.control = control->second;
    } else if (at + 1 < words.size()) {
      const std::string& values = words[++at];
      known = (action.word == "pan" && take_numbers<2>(values, action)) ||
              (action.word == "jump" && take_numbers<3>(values, action)) ||
              (action.word == "ratio" && take_numbers<1>(values, action));
    }
    if (!known) return fail(Exit::kUsage, "'{}' is no control, or lacks its numbers", action.word);
    actions.push_back(action);
  }
  return Exit::kDone;
}

// A zoom with its display; views are numbered as they are drawn.
class Viewer {
 public:
  Viewer(const Options& options, TAVIRPELO_DECINFO* info)
      : options_(options),
        info_(info),
        pixels_(static_cast<size_t>(width()) * static_cast<size_t>(height()) * 3) {}

  bool start() {
    info_->outFormat = TAVIRPELO_RGB888;
    TAVIRPELO_SetDecOption(
        info_, TAVIRPELO_THUMBNAIL_NEVER | static_cast<uint32_t>(options_.rotation / 90) << 4);
    return TAVIRPELO_StartZoom(info_, nullptr, 0, 0, pixels_.data(), width(), height(), 0x404040,
                               options_.budget << 20, options_.factor, -1) == 1;
  }

  int act(const Action& action) {
    const int first = action.numbers[0], second = action.numbers[1];
    if (action.control >= 0) {
      return TAVIRPELO_ControlZoom(info_, pixels_.data(), width(), height(), action.control);
    }
    if (action.word == "pan") {
      return TAVIRPELO_PanPosition(info_, pixels_.data(), width(), height(), first, second);
    }
    if (action.word == "jump") {
      return TAVIRPELO_JumpZoom(info_, pixels_.data(), width(), height(), action.numbers.data());
    }
    return TAVIRPELO_ZoomRatio(info_, pixels_.data(), width(), height(), first);
  }

  Exit write(const std::string& action, int result) {
    int x = 0, y = 0, ratio = 0;
    TAVIRPELO_GetZoomStatus(info_, &x, &y, &ratio);
    const std::string path = fmt::format("{}{:03}.ppm", options_.prefix, count_++);
    fmt::print("{}: {}, {} percent at {},{}{}\n", path, action, ratio, x, y,
               result == 2 ? ", limit" : "");
    return tool::write_pnm(path, {width(), height(), false, pixels_});
  }

 private:
  int width() const { return options_.display.width; }
  int height() const { return options_.display.height; }

  const Options& options_;
  TAVIRPELO_DECINFO* info_;
  std::vector<uint8_t> pixels_;
  int count_ = 0;
};

Exit run(const Options& options) {
  std::vector<Action> actions;
  const Exit parsed = parse_actions(options.words, actions);
  if (parsed != Exit::kDone) return parsed;
  Input input;
  const Exit opened = input.open(options.picture);
  if (opened != Exit::kDone) return opened;
  if (input.format() != TAVIRPELO_FORMAT_JPEG) {
    return fail(Exit::kRefused, "{}: only a JPEG can be zoomed", options.picture);
  }
  Viewer viewer(options, input.info());
  if (!viewer.start()) {
    return fail(Exit::kRefused, "{}: cannot be decoded within this budget", options.picture);
  }
  Exit written = viewer.write("start", 1);
  for (const Action& action : actions) {
    if (written != Exit::kDone) break;
    const int result = viewer.act(action);
    written = viewer.write(action.word, result);
  }
  return written;
}

}  // namespace

void register_zoom(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("zoom", "Zoom and pan over a JPEG, and write each view as PPM");
  add_picture_argument(*command, options->picture);
  command->add_option(
      "control", options->words,
      "in, out, up, down, left, right, refresh, pan X,Y, jump LEVEL,X,Y, ratio PERCENT; one "
      "after the other");
  tool::add_size_argument(*command, "-d,--display", options->display, tool::kMaxSide,
                          "Size of the display")
      ->required();
  command->add_option("-o,--output", options->prefix, "What the files' names begin with")
      ->capture_default_str();
  command->add_option("--budget", options->budget, "Memory for the zoom image, MiB")
      ->check(CLI::Range(1, 2047))
      ->capture_default_str();
  command->add_option("--factor", options->factor, "Largest size, in sizes of the picture")
      ->check(CLI::Range(1, 64))
      ->capture_default_str();
  command->add_option("-r,--rotate", options->rotation, "Degrees clockwise")
      ->check(CLI::IsMember({0, 90, 180, 270}))
      ->capture_default_str();
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool
