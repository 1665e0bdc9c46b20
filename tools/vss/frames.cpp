// vss frames: every frame of a GIF as it is shown, a PPM file each.
#include <filesystem>
#include <memory>

#include "tools/common/codec_objects.h"
#include "tools/common/pnm.h"
#include "tools/vss/commands.h"

namespace vss {
namespace {

constexpr int64_t kMaxPixels = int64_t{64} << 20;  // of a screen that the decoder takes
constexpr int kAnother = 1, kLast = 3;             // answers of the decoder

struct Options {
  std::string gif;
  std::string folder;
};

Exit open_gif(const std::string& path, tool::DecInfo& info) {
  info.reset(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path.c_str()), 0,
                                     TAVIRPELO_RGB888, TAVIRPELO_FIT_INSIDE));
  if (!info) return fail(Exit::kCannotOpen, "{}: cannot be opened", path);
  const int format = TAVIRPELO_Parser(info.get(), nullptr);
  if (format != TAVIRPELO_FORMAT_GIF && format != TAVIRPELO_FORMAT_ANIMATED_GIF) {
    return fail(Exit::kRefused, "{}: not a GIF", path);
  }
  const int64_t pixels = int64_t{info->imageWidth} * info->imageHeight;
  if (pixels < 1 || pixels > kMaxPixels) {
    return fail(Exit::kRefused, "{}: a screen of {}x{} pixels", path, info->imageWidth,
                info->imageHeight);
  }
  return Exit::kDone;
}

Exit make_folder(const std::string& folder) {
  std::error_code error;
  std::filesystem::create_directories(folder, error);
  return error ? fail(Exit::kWriteFailure, "{}: {}", folder, error.message()) : Exit::kDone;
}

Exit run(const Options& options) {
  tool::DecInfo info;
  Exit result = open_gif(options.gif, info);
  if (result == Exit::kDone) result = make_folder(options.folder);
  if (result != Exit::kDone) return result;
  tool::Pnm picture{info->imageWidth, info->imageHeight, false, {}};
  picture.pixels.resize(size_t{3} * static_cast<size_t>(picture.width) *
                        static_cast<size_t>(picture.height));
  int answer = kAnother;
  for (int frame = 0; answer == kAnother; ++frame) {
    answer = TAVIRPELOI_DecodeAGIF(info.get(), picture.pixels.data(), picture.width, picture.height);
    if (answer != kAnother && answer != kLast) {
      return fail(Exit::kRefused, "{}: frame {} cannot be decoded", options.gif, frame);
    }
    const std::string name = fmt::format("frame-{:03}.ppm", frame);
    const std::string path = (std::filesystem::path(options.folder) / name).string();
    result = tool::write_pnm(path, picture);
    if (result != Exit::kDone) return result;
    fmt::print("{}\n", path);
  }
  return Exit::kDone;
}

}  // namespace

void register_frames(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("frames", "Write each frame of a GIF as a PPM file");
  command->add_option("gif", options->gif, "GIF file, animated or not")->required();
  command->add_option("folder", options->folder, "Folder for the files, made when missing")->required();
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace vss
