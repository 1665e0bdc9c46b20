// What a slide show does all day: making a slide of a photograph, encoding and drawing it.
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>

#include "bench/job.h"
#include "bench/peer.h"
#include "slideshow/SlideShow.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {
namespace {

constexpr int kShowSide = 480;
constexpr int kStoredQuality = 100;
// The encoder's first buffer, as the store chooses it for such a show.
constexpr int kFirstBuffer = kShowSide * kShowSide / 10;

using Raw = std::shared_ptr<TAVIRPELO_RAWINFO>;

Raw create_raw(int width, int height) {
  return Raw(TAVIRPELO_CreateRawInfo(width, height, TAVIRPELO_RGB888), TAVIRPELO_DestroyRawInfo);
}

bool encode(const TAVIRPELO_RAWINFO* raw, int quality) {
  int size = kFirstBuffer;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(kFirstBuffer));
  bool done = buffer && TAVIRPELO_EncodeJpegToBuffer(raw, &buffer, &size, quality) == 1;
  TAVIRPELO_OsFree(buffer);
  return done;
}

peer::Size slide_size(peer::Size full) {
  return {kShowSide, kShowSide * full.height / full.width};
}

Raw make_slide(const Bytes& photograph) {
  auto* bytes = const_cast<uint8_t*>(photograph.data());
  auto length = static_cast<int>(photograph.size());
  TAVIRPELO_HINFO header{};
  if (TAVIRPELO_ParseFromBuffer(bytes, length, &header) != TAVIRPELO_FORMAT_JPEG) return nullptr;
  peer::Size size = slide_size({header.width, header.height});
  Raw raw = create_raw(size.width, size.height);
  if (!raw || TAVIRPELO_DecodeImageFromBuffer(bytes, length, raw.get(), 0) != 1) return nullptr;
  return raw;
}

// The photograph in memory to the bytes that a show stores.
void register_road(const Bytes& photograph) {
  register_job({"photograph to slide",
                [&photograph] {
                  Raw raw = make_slide(photograph);
                  return raw && encode(raw.get(), kStoredQuality);
                },
                [&photograph](int flags) {
                  peer::Size full = peer::size_of(photograph);
                  peer::Size scaled = peer::scale_at_least(full, kShowSide);
                  peer::Size size = slide_size(full);
                  Bytes large(scaled.pixels() * 3);
                  Bytes small(size.pixels() * 3);
                  if (!peer::decode(photograph, scaled, TJPF_RGB, flags, large.data())) return false;
                  peer::reduce(large.data(), scaled, small.data(), size);
                  return peer::encode(small.data(), size, kStoredQuality, flags) != 0;
                }});
}

void register_encode(const Raw& slide, int quality) {
  register_job({"encode slide q" + std::to_string(quality),
                [slide, quality] { return encode(slide.get(), quality); },
                [slide, quality](int flags) {
                  peer::Size size{static_cast<int>(slide->width), static_cast<int>(slide->height)};
                  return peer::encode(static_cast<uint8_t*>(slide->pData), size, quality, flags) != 0;
                }});
}

Bytes read_file(const char* path, long offset, size_t size) {
  Bytes bytes(size);
  std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(path, "rb"), std::fclose);
  bool read = file && std::fseek(file.get(), offset, SEEK_SET) == 0 &&
              std::fread(bytes.data(), 1, size, file.get()) == size;
  return read ? bytes : Bytes();
}

// A show with one slide in a file that the end of the program removes.
struct StoredShow {
  SlideShow show;
  std::string path = (std::filesystem::temp_directory_path() / "tavir_bench_XXXXXX").string();

  explicit StoredShow(Bytes photograph) {
    int descriptor = mkstemp(path.data());
    if (descriptor >= 0) std::fclose(fdopen(descriptor, "wb"));
    show.CreateShow(path.c_str(), kShowSide, kShowSide);
    show.AddImageToBuffer(photograph.data(), static_cast<int>(photograph.size()), "slide");
  }
  ~StoredShow() { std::filesystem::remove(path); }
};

// A stored slide to 32-bit pixels; both sides read the JPEG data from the show's file.
void register_draw(const Bytes& photograph) {
  auto stored = std::make_shared<StoredShow>(photograph);
  peer::Size size{stored->show.GetSubWidth(0), stored->show.GetSubHeight(0)};
  auto pixels = std::make_shared<Bytes>(size.pixels() * 4);
  register_job({"draw slide BGRA",
                [=] { return stored->show.GetDrawble(0, pixels->data(), size.width, size.height) == 1; },
                [=](int flags) {
                  constexpr long kData = 628 + 540;  // behind the container's and the picture's header
                  auto length = static_cast<size_t>(stored->show.GetSizeOfSubfile(0));
                  Bytes jpeg = read_file(stored->path.c_str(), kData, length);
                  return peer::decode(jpeg, size, TJPF_BGRA, flags, pixels->data());
                }});
}

}  // namespace

void register_slide_jobs(const Bytes& photograph) {
  register_draw(photograph);
  Raw slide = make_slide(photograph);
  if (slide) {
    register_encode(slide, kStoredQuality);
    register_encode(slide, 75);
  }
  register_road(photograph);
}

}  // namespace bench
