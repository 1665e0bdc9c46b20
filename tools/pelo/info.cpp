// pelo info: format, size and what else the header tells.
#include "tools/common/text.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/exif_text.h"
#include "tools/pelo/input.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  bool json = false;
};

const char* format_name(int format) {
  switch (format) {
    case TAVIRPELO_FORMAT_JPEG:
      return "JPEG";
    case TAVIRPELO_FORMAT_BMP:
      return "BMP";
    case TAVIRPELO_FORMAT_PNG:
      return "PNG";
    case TAVIRPELO_FORMAT_GIF:
      return "GIF";
    case TAVIRPELO_FORMAT_WBMP:
      return "WBMP";
    case TAVIRPELO_FORMAT_ANIMATED_GIF:
      return "animated GIF";
    default:
      return "unknown";
  }
}

void print_text(const Options& options, int format, const TAVIRPELO_HINFO& header,
                const TAVIRPELO_EXIFINFO* exif) {
  fmt::print("{}: {}{}, {}x{}, {} frame{}, {} bytes\n", options.picture,
             header.progressive ? "progressive " : "", format_name(format), header.width, header.height,
             header.frameCount, header.frameCount == 1 ? "" : "s", header.sourceSize);
  if (header.hasThumbnail) {
    fmt::print("thumbnail: {}\n",
               header.thumbnailWidth == 0
                   ? std::string("size unknown")
                   : fmt::format("{}x{}", header.thumbnailWidth, header.thumbnailHeight));
  }
  if (exif != nullptr) fmt::print("EXIF:\n{}", exif_lines(*exif, "  "));
}

void print_json(const Options& options, int format, const TAVIRPELO_HINFO& header,
                const TAVIRPELO_EXIFINFO* exif) {
  std::string thumbnail = header.hasThumbnail
                              ? fmt::format("{{\"width\": {}, \"height\": {}}}", header.thumbnailWidth,
                                            header.thumbnailHeight)
                              : "null";
  fmt::print(
      "{{\"picture\": {}, \"format\": \"{}\", \"width\": {}, \"height\": {}, \"frames\": {}, "
      "\"bytes\": {}, \"progressive\": {},\n \"thumbnail\": {},\n \"exif\": {}}}\n",
      tool::json_text(options.picture), format_name(format), header.width, header.height,
      header.frameCount, header.sourceSize, header.progressive != 0, thumbnail,
      exif == nullptr ? "null" : exif_json(*exif));
}

Exit run(const Options& options) {
  Input input;
  Exit opened = input.open(options.picture);
  if (opened != Exit::kDone) return opened;
  tool::ExifInfo exif(input.format() == TAVIRPELO_FORMAT_JPEG ? PELOJ_CreatExifInfo(input.info())
                                                              : nullptr);
  auto print = options.json ? print_json : print_text;
  print(options, input.format(), input.header(), exif.get());
  return Exit::kDone;
}

}  // namespace

void register_info(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("info", "Print format, size, thumbnail and EXIF of a picture");
  add_picture_argument(*command, options->picture);
  command->add_flag("--json", options->json, "Print JSON");
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool
