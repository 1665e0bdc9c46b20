// vss sheet: all pictures of a show side by side in one JPEG file.
#include <algorithm>
#include <cstdint>
#include <memory>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

constexpr int kGap = 8;           // pixels around each cell
constexpr uint8_t kPaper = 0x30;  // grey behind the pictures

struct Options {
  std::string show;
  std::string output;
  Size cell{240, 240};
  int columns = 5;
  int quality = 90;
};

int64_t extent(int cells, int side) {
  return int64_t{cells} * (side + kGap) + kGap;
}

Exit draw_all(SlideShow& show, const Options& options, TAVIRPELO_RAWINFO& sheet, int columns) {
  for (int i = 0; i < show.subfileCount; ++i) {
    int x = static_cast<int>(extent(i % columns, options.cell.width));
    int y = static_cast<int>(extent(i / columns, options.cell.height));
    if (!draw_slide(show, i, sheet, x, y, options.cell)) {
      return fail(Exit::kCannotOpen, "{}: picture {} cannot be decoded", options.show, i);
    }
  }
  return Exit::kDone;
}

Exit run(const Options& options) {
  SlideShow show;
  Exit result = open_show(show, options.show, Access::kRead);
  if (result != Exit::kDone) return result;
  if (show.subfileCount == 0) return fail(Exit::kRefused, "{}: the show is empty", options.show);
  int columns = std::min(options.columns, show.subfileCount);
  int rows = (show.subfileCount + columns - 1) / columns;
  int64_t width = extent(columns, options.cell.width);
  int64_t height = extent(rows, options.cell.height);
  if (std::max(width, height) > kMaxSide) {
    return fail(Exit::kRefused, "the sheet would be {}x{}, more than {}", width, height, kMaxSide);
  }
  RawImage sheet = create_canvas({static_cast<int>(width), static_cast<int>(height)}, kPaper);
  if (!sheet) return fail(Exit::kRefused, "no memory for a sheet of {}x{}", width, height);
  result = draw_all(show, options, *sheet, columns);
  return result == Exit::kDone ? write_jpeg(show, options.output, *sheet, options.quality) : result;
}

}  // namespace

void register_sheet(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("sheet", "Write a contact sheet of all pictures as JPEG");
  add_show_argument(*command, options->show);
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  add_size_argument(*command, "-c,--cell", options->cell, kMaxSide, "Size of a picture's cell")
      ->default_str("240x240");
  command->add_option("--columns", options->columns, "Most pictures side by side")
      ->check(CLI::Range(1, SlideShow::kMaxFileSubfiles))
      ->capture_default_str();
  add_quality_option(*command, options->quality);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss
