#include "slideshow/music.h"

#include <algorithm>
#include <cstdint>
#include <utility>

#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/container_undo.h"
#include "slideshow/data_shift.h"
#include "slideshow/edit_end.h"
#include "slideshow/persist.h"
#include "slideshow/subfile_table.h"

namespace pelo::slideshow {
namespace {

// Bytes behind the data of which the way back has a copy in memory: room for hundreds of end marks.
constexpr int kTailInMemory = 4096;

// Exactly `size` bytes, whatever became of the source since it was measured.
bool copy_in(SlideShow& show, FILE* source, int size, uint8_t* buffer) {
  ContainerSession session(show, "r+b");
  session.seek(0);
  for (int left = size; session.good() && left > 0;) {
    const int chunk = std::min(left, kMusicChunk);
    const auto count = static_cast<size_t>(chunk);
    if (vss_fread(buffer, 1, count, source) != count) session.fail();
    session.write(buffer, chunk);
    left -= chunk;
  }
  return session.close();
}

}  // namespace

void exchange_music(SlideShow& show, Music& music) {
  std::swap(show.musicName, music.name);
  std::swap(show.musicSize, music.size);
  if (show.mode == SlideShow::kFileMode) place_subfiles(show, 0);
}

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
  ContainerUndo undo;
  if (!undo.remember(show, true, inMemory)) return false;
  const int64_t tail = data_end(show) + inMemory;
  const int64_t aside = std::clamp<int64_t>(undo.length() - tail, 0, size - inMemory);
  if (!file_stays_small(show, undo.length() + aside, size + aside)) return false;

  exchange_music(show, music);
  const int64_t end = std::max(undo.length(), data_end(show));
  DataShift shift;
  if (aside > 0) shift.add(tail, end + kEndMarkSize, aside, kMusicChunk);
  plan_data_up(shift, show, 0, size);
  if (shift.forth(show, 1, std::min(size, kMusicChunk)) && copy_in(show, source, size, shift.spare()) &&
      finish_file(show, end)) {
    return true;
  }
  shift.back(show);
  undo.put_back(show);
  exchange_music(show, music);
  return false;
}

// Everything behind the music moves to the front, old end marks included.
bool take_music(SlideShow& show) {
  ContainerUndo undo;
  if (!undo.remember(show, true, 0)) return false;
  const int64_t size = undo.length() - show.musicSize;
  DataShift shift;
  shift.add(show.musicSize, 0, size, kMusicChunk);

  if (shift.forth(show, kTries)) {
    Music music;
    exchange_music(show, music);
    if (finish_file(show, size)) return true;
    exchange_music(show, music);
  }
  shift.back(show);
  undo.put_back(show);
  return false;
}

}  // namespace pelo::slideshow
