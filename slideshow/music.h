// The music in front of a container: taking it in and out.
#pragma once

#include "slideshow/SlideShow.h"
#include "slideshow/text_field.h"

namespace pelo::slideshow {

constexpr int kMusicChunk = 131072;  // bytes copied or moved at a time

// What a show notes of its music.
struct Music {
  char name[kTextSize] = {};
  int size = 0;  // bytes; 0 without music
};

// Makes the show note `music`, and gives back in it what was noted before. In file mode the offsets
// follow.
void exchange_music(SlideShow& show, Music& music);

// File mode, and the show has no music: puts music.size bytes of `source`, which stands at its start, in
// front of everything else. False with the show as it was and the container put back.
[[nodiscard]] bool put_music(SlideShow& show, FILE* source, Music music);

// File mode, and the show has music. False as for put_music, but see SlideShow::RemoveMusic.
[[nodiscard]] bool take_music(SlideShow& show);

}  // namespace pelo::slideshow
