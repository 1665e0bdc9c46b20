#include "slideshow/music.h"

#include <algorithm>
#include <cstdint>
#include <utility>

#include "slideshow/container_session.h"
#include "slideshow/container_undo.h"
#include "slideshow/data_shift.h"
#include "slideshow/edit_end.h"
#include "slideshow/persist.h"
#include "slideshow/subfile_table.h"

namespace pelo::slideshow {
namespace {

// Exactly `size` bytes, whatever became of the source since it was measured.
bool copy_in(SlideShow& show, FILE* source, int size) {
  const VssBytes buffer = vss_bytes(std::min(size, kMusicChunk));
  if (buffer == nullptr) return false;
  ContainerSession session(show, "r+b");
  session.seek(0);
  for (int left = size; session.good() && left > 0;) {
    const int chunk = std::min(left, kMusicChunk);
    const auto count = static_cast<size_t>(chunk);
    if (vss_fread(buffer.get(), 1, count, source) != count) session.fail();
    session.write(buffer.get(), chunk);
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
bool put_music(SlideShow& show, FILE* source, Music music) {
  const int size = music.size;
  ContainerUndo undo;
  if (!undo.remember(show, true, size) || !file_stays_small(show, undo.length(), size)) return false;

  exchange_music(show, music);
  DataShift shift;
  plan_data_up(shift, show, 0, size);
  if (shift.forth(show, INT64_MAX, 1) && copy_in(show, source, size) &&
      finish_file(show, std::max(undo.length(), data_end(show)))) {
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
  shift.add(show.musicSize, 0, size);

  if (shift.forth(show, kMusicChunk, kTries)) {
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
