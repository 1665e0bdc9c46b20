// The GIF stream outside the image data: screen, colour tables, extensions and image descriptors.
#pragma once

#include <cstdint>

#include "codec/base/source.h"
#include "tavirpelo/parse.h"

namespace pelo::gif {

struct Record;

// Consumes n bytes (up to kSourceBufferSize), which stay valid until the next call; null when the source
// has fewer, which are passed over: the rest of what was cut is no block.
const uint8_t* take_block(Source& reader, int n);

// Consumes data sub-blocks up to and with the empty one; false when the source ends before.
[[nodiscard]] bool skip_sub_blocks(Source& reader);

// A given step: makes `need` bytes stand at *cursor, moving unread ones to the buffer's start and
// reading behind them. 1, or 0 when the source ends before.
int fill_buffer(int need, TAVIRPELO_IO* io, uint8_t* buffer, int* remaining, uint8_t** cursor);

// ---- blocks ----

// Answers of seek_image.
constexpr int kFailed = 0;
constexpr int kImageFollows = 1;
constexpr int kTrailer = 3;

// Packs `count` (up to 256) R, G, B triples into table entries.
void pack_table(const uint8_t* rgbBytes, int count, uint32_t* table);

// Reads the signature, the logical screen descriptor and the global colour table from the source's
// start. 1, or 0 when it is no GIF or ends before.
int parse_header(TAVIRPELO_IO* source, Record* record);

// Goes on to the next image's data: 1 with its descriptor, tables and minimum code size read, 3 at the
// trailer, 0 for a malformed graphic control extension or the source's end.
int seek_image(TAVIRPELO_IO* source, Record* record);

// ---- format detection: the screen's size, and how many images follow ----

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::gif
