// The GIF stream outside the image data: screen, colour tables, extensions, image descriptors.
#pragma once

#include <cstdint>

#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

// Answers of seek_image.
constexpr int kFailed = 0;
constexpr int kImageFollows = 1;
constexpr int kTrailer = 3;

// Packs `count` (up to 256) R, G, B triples into table entries.
void pack_table(const uint8_t* rgbBytes, int count, uint32_t* table);

// Reads the signature, the logical screen descriptor and the global colour table from the source's
// start. 1, or 0 when it is no GIF or ends before.
int parse_header(TAVIRPELO_IO* source, pelo::gif::Record* record);

// Goes on to the next image's data: 1 with its descriptor, tables and minimum code size read, 3 at the
// trailer, 0 for a malformed graphic control extension or the source's end.
int seek_image(TAVIRPELO_IO* source, pelo::gif::Record* record);

}  // namespace pelo::gif
