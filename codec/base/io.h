// Input sources: one object through which a decoder reads a file, a memory block or a caller's stream.
// The functions are those behind the given names of tavirpelo/io.h, where they are documented.
#pragma once

#include "tavirpelo/decinfo.h"

namespace pelo {

TAVIRPELO_IO* open_io(int ioType, void* source, int size);
TAVIRPELO_IO* open_stream(void* context, TAVIRPELO_READFN pfRead, TAVIRPELO_SKIPFN pfSkip,
                          TAVIRPELO_RESETFN pfReset, int size);
int close_io(TAVIRPELO_IO* io);

int read_io(TAVIRPELO_IO* io, void* destination, int length);
int seek_io(TAVIRPELO_IO* io, int offset, int whence);
int tell_io(const TAVIRPELO_IO* io);

int set_read_size(TAVIRPELO_DECINFO* decInfo, int readSize);

}  // namespace pelo
