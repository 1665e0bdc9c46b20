// The music of a show: noted by its path and size, and in file mode kept in front of the container.
#include <algorithm>
#include <climits>
#include <cstdint>
#include <utility>

#include "slideshow/SlideShow.h"
#include "slideshow/codec_objects.h"
#include "slideshow/container_edit.h"
#include "slideshow/container_format.h"
#include "slideshow/subfile_table.h"
#include "slideshow/vss_wrappers.h"

using namespace pelo::slideshow;

namespace {

constexpr int kMusicChunk = 131072;  // bytes copied or moved at a time

// Bytes behind the data of which the way back has a copy in memory: room for hundreds of end marks.
constexpr int kTailInMemory = 4096;

// Exactly `size` bytes, whatever became of the source since it was measured.
bool copy_in(ContainerSession& session, FILE* source, int size, uint8_t* buffer) {
  session.seek(0);
  for (int left = size; session.good() && left > 0;) {
    const int chunk = std::min(left, kMusicChunk);
    const auto count = static_cast<size_t>(chunk);
    if (vss_fread(buffer, 1, count, source) != count) session.fail();
    session.write(buffer, chunk);
    left -= chunk;
  }
  return session.flush();
}

// What a show notes of its music.
struct Music {
  char name[kTextSize] = {};
  int size = 0;  // bytes; 0 without music
};

// Makes the show note `music`, and gives back in it what was noted before. In file mode the offsets
// follow.
void exchange_music(SlideShow& show, Music& music) {
  std::swap(show.musicName, music.name);
  std::swap(show.musicSize, music.size);
  if (show.mode == SlideShow::kFileMode) place_subfiles(show, 0);
}

// Puts music.size bytes of `source`, which stands at its start, in front of everything else. False with
// the show as it was and the container put back.
//
// The music lands where header and pictures were: their data moves away first, their headers are written
// anew. The new end mark goes behind whatever the file holds then; little music does not reach the old
// mark and leaves some of it.
//
// A foreign file may have megabytes between its data and its mark, and as many bytes of them as the
// music has are written over. What memory does not keep of these for the way back waits behind the new
// mark, where the last step cuts the file.
bool put_music(SlideShow& show, FILE* source, Music music) {
  const int size = music.size;
  const int inMemory = std::min(size, kTailInMemory);
  ContainerEdit edit(show);
  if (!edit.remember(true, inMemory)) return false;
  const int64_t tail = data_end(show) + inMemory;
  const int64_t aside = std::clamp<int64_t>(edit.old_length() - tail, 0, size - inMemory);
  if (!file_stays_small(show, edit.old_length() + aside, size + aside)) return false;

  exchange_music(show, music);
  const int64_t end = std::max(edit.old_length(), data_end(show));
  if (aside > 0) edit.shift().add(tail, end + kEndMarkSize, aside, kMusicChunk);
  plan_data_up(edit.shift(), show, 0, size);
  if (edit.move(1, std::min(size, kMusicChunk)) &&
      copy_in(edit.session(), source, size, edit.shift().spare()) && edit.finish(end)) {
    return true;
  }
  edit.roll_back();
  exchange_music(show, music);
  return false;
}

// As put_music, but what is to go is damaged when a step fails twice. Everything behind the music moves
// to the front, old end marks included.
bool take_music(SlideShow& show) {
  ContainerEdit edit(show);
  if (!edit.remember(true, 0)) return false;
  const int64_t size = edit.old_length() - show.musicSize;
  edit.shift().add(show.musicSize, 0, size, kMusicChunk);

  if (edit.move(kTries)) {
    Music music;
    exchange_music(show, music);
    if (edit.finish(size)) return true;
    exchange_music(show, music);
  }
  edit.roll_back();
  return false;
}

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
