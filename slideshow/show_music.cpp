// The music of a show: noted by its path and size, and in file mode kept in the container.
#include <climits>
#include <memory>

#include "slideshow/SlideShow.h"
#include "slideshow/music.h"
#include "slideshow/text_field.h"
#include "slideshow/vss_wrappers.h"

using namespace pelo::slideshow;

namespace {

struct CloseStream {
  void operator()(FILE* stream) const { (void)vss_fclose(stream); }
};
using Stream = std::unique_ptr<FILE, CloseStream>;

// Bytes of the file, whose stream then stands at its start again; 0 when a show cannot hold it.
int measure(FILE* stream) {
  if (vss_fseek(stream, 0, SEEK_END) != 0) return 0;
  const long size = vss_ftell(stream);
  if (size < 1 || size > INT_MAX || vss_fseek(stream, 0, SEEK_SET) != 0) return 0;
  return static_cast<int>(size);
}

}  // namespace

int SlideShow::AddMusic(const char* musicPath) {
  if (mode == kFree || musicSize != 0 || !usable_path(musicPath)) return 0;
  const Stream source(vss_fopen(musicPath, "rb"));
  if (!source) return 0;
  Music music;
  set_text(music.name, musicPath);
  music.size = measure(source.get());
  if (music.size == 0) return 0;
  if (mode == kFileMode) return put_music(*this, source.get(), music) ? 1 : 0;
  exchange_music(*this, music);
  return 1;
}

int SlideShow::RemoveMusic() {
  if (mode == kFree || musicSize == 0) return 0;
  if (mode == kFileMode) return take_music(*this) ? 1 : 0;
  Music none;
  exchange_music(*this, none);
  return 1;
}

int SlideShow::GetMusic(char* buffer) const {
  return buffer == nullptr || mode == kFree || musicSize == 0 ? 0 : copy_text(buffer, musicName);
}
