// pelo decode: a picture becomes a portable pixmap or greymap, or bare pixels in one of the codec's
// formats.
#include <algorithm>
#include <map>
#include <memory>

#include "tools/common/arguments.h"
#include "tools/common/output.h"
#include "tools/common/pnm.h"
#include "tools/pelo/commands.h"
#include "tools/pelo/input.h"

namespace pelo_tool {
namespace {

using tool::Size;

constexpr int kMaxSide = 10000;  // pixels of a result

enum class Fit { kInside, kPad, kFill, kStretch };
enum class Kind { kPpm, kPgm, kRaw };

struct Options {
  std::string picture;
  std::string output;
  Size size;  // 0x0: the picture's own
  Fit fit = Fit::kInside;
  int rotation = 0;  // degrees, clockwise
  int mode = 0;
  uint32_t thumbnail = TAVIRPELO_THUMBNAIL_NEVER;
  Kind kind = Kind::kPpm;
  int rawFormat = TAVIRPELO_RGB888;
};

const std::map<std::string, Fit> kFits = {
    {"inside", Fit::kInside}, {"pad", Fit::kPad}, {"fill", Fit::kFill}, {"stretch", Fit::kStretch}};

const std::map<std::string, uint32_t> kThumbnails = {{"never", TAVIRPELO_THUMBNAIL_NEVER},
                                                     {"enough", TAVIRPELO_THUMBNAIL_IF_ENOUGH},
                                                     {"any", TAVIRPELO_THUMBNAIL_ANY}};

const std::map<std::string, int> kRawFormats = {
    {"rgb565", TAVIRPELO_RGB565}, {"dither", TAVIRPELO_RGB565_DITHER}, {"rgb", TAVIRPELO_RGB888},
    {"yuv420", TAVIRPELO_YUV420}, {"argb", TAVIRPELO_ARGB8888},        {"rgba", TAVIRPELO_RGBA8888},
    {"bgra", TAVIRPELO_BGRA8888}};

bool sideways(const Options& options) {
  return options.rotation % 180 != 0;
}

Size turned(Size size) {
  return {size.height, size.width};
}

// The largest size inside the box that keeps the picture's proportions, never above its own.
Size fit_inside(Size picture, Size box) {
  auto scaled = [](int side, int to, int from) {
    return std::max(1, static_cast<int>(int64_t{side} * to / from));
  };
  Size size = picture;
  if (size.width > box.width) size = {box.width, scaled(picture.height, box.width, picture.width)};
  if (size.height > box.height) size = {scaled(picture.width, box.height, picture.height), box.height};
  return size;
}

// The picture's own size as it is seen after the rotation.
Size own_size(const Options& options, const TAVIRPELO_HINFO& header) {
  const Size picture{header.width, header.height};
  return sideways(options) ? turned(picture) : picture;
}

// Size of the result, after the rotation as well.
Size result_size(const Options& options, Size own) {
  if (options.size.width == 0) return own;
  return options.fit == Fit::kInside ? fit_inside(own, options.size) : options.size;
}

// A picture of its own size is not stretched: some decoders average even then.
uint32_t option_word(const Options& options, bool ownSize) {
  uint32_t fit = options.fit == Fit::kFill             ? TAVIRPELO_FIT_FILL
                 : options.fit == Fit::kPad || ownSize ? TAVIRPELO_FIT_INSIDE
                                                       : TAVIRPELO_FIT_STRETCH;
  return fit | options.thumbnail | static_cast<uint32_t>(options.rotation / 90) << 2;
}

size_t byte_count(Size size, int format) {
  auto width = static_cast<size_t>(size.width);
  auto height = static_cast<size_t>(size.height);
  switch (format) {
    case TAVIRPELO_RGB565:
    case TAVIRPELO_RGB565_DITHER:
      return width * height * 2;
    case TAVIRPELO_RGB888:
      return width * height * 3;
    case TAVIRPELO_YUV420:
      return width * height + 2 * ((width + 1) / 2) * ((height + 1) / 2);
    default:
      return width * height * 4;
  }
}

Exit write_result(const Options& options, Size size, std::vector<uint8_t> pixels) {
  if (options.kind == Kind::kRaw) {
    return tool::write_bytes(options.output, pixels.data(), pixels.size());
  }
  const bool grey = options.kind == Kind::kPgm;
  if (grey) pixels = tool::luma_of(pixels);
  return tool::write_pnm(options.output, {size.width, size.height, grey, std::move(pixels)});
}

Exit run(const Options& options) {
  Input input;
  Exit result = input.open(options.picture);
  if (result != Exit::kDone) return result;
  int format = options.kind == Kind::kRaw ? options.rawFormat : TAVIRPELO_RGB888;
  if (format == TAVIRPELO_YUV420 && options.rotation != 0) {
    return fail(Exit::kUsage, "planes of yuv420 cannot be rotated");
  }
  bool jpegOnly = format == TAVIRPELO_YUV420 || format == TAVIRPELO_RGB565_DITHER;
  if (jpegOnly && input.format() != TAVIRPELO_FORMAT_JPEG) {
    return fail(Exit::kRefused, "{}: only a JPEG decodes to this format", options.picture);
  }
  const Size own = own_size(options, input.header());
  Size size = result_size(options, own);
  if (size.width < 1 || size.height < 1 || std::max(size.width, size.height) > kMaxSide) {
    return fail(Exit::kRefused, "{}: a result of {}x{}, sides go up to {}", options.picture, size.width,
                size.height, kMaxSide);
  }
  std::vector<uint8_t> pixels(byte_count(size, format));
  TAVIRPELO_RAWINFO raw{static_cast<uint32_t>(size.width), static_cast<uint32_t>(size.height),
                        pixels.data(), static_cast<uint32_t>(format)};
  if (!input.decode(raw, option_word(options, size.width == own.width && size.height == own.height),
                    options.mode)) {
    return fail(Exit::kRefused, "{}: this picture cannot be decoded", options.picture);
  }
  return write_result(options, size, std::move(pixels));
}

// A word of a table stands for its value.
template <class Value>
void add_choice(CLI::App& command, const std::string& name, Value& value,
                const std::map<std::string, Value>& words, const std::string& description,
                const std::string& standard) {
  auto store = [&value, &words](const std::string& word) { value = words.at(word); };
  auto* option =
      command.add_option_function<std::string>(name, store, description)->check(CLI::IsMember(words));
  if (!standard.empty()) option->default_str(standard);
}

void add_kind(CLI::App& command, const std::shared_ptr<Options>& options) {
  command.add_flag_callback(
      "--pgm", [options] { options->kind = Kind::kPgm; }, "Write luma alone, a PGM file");
  auto store = [options](const std::string& word) {
    options->kind = Kind::kRaw;
    options->rawFormat = kRawFormats.at(word);
  };
  command.add_option_function<std::string>("--raw", store, "Write bare pixels of this format")
      ->check(CLI::IsMember(kRawFormats))
      ->excludes("--pgm");
}

}  // namespace

void register_decode(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command = app.add_subcommand("decode", "Write a picture as PPM, PGM or bare pixels");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "PPM file, - for standard output")->required();
  tool::add_size_argument(*command, "-s,--size", options->size, kMaxSide,
                          "Size of the result (default: the picture's own)");
  add_choice(
      *command, "-f,--fit", options->fit, kFits,
      "inside: as large as fits, at most its own size; pad: the same, centred on black in exactly the "
      "size; fill: covers the size, cut to its centre; stretch: exactly the size",
      "inside");
  command->add_option("-r,--rotate", options->rotation, "Degrees clockwise")
      ->check(CLI::IsMember({0, 90, 180, 270}))
      ->capture_default_str();
  command->add_option("-m,--mode", options->mode, "JPEG: 0 accurate to 4 fastest")
      ->check(CLI::Range(0, 4))
      ->capture_default_str();
  add_choice(*command, "--thumbnail", options->thumbnail, kThumbnails,
             "JPEG: decode an embedded thumbnail instead: never, when it is large enough, any", "never");
  add_kind(*command, options);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool
