// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/base/source.h"

// Makes n unread bytes available by one read at the most: 2 already there, 1 after a read that delivered
// at least one byte (possibly fewer than n in all), 0 when there was nothing to read or no room for it.
TAVIRPELO_API int PELOJ_CheckBuffer(PELOJ_SOURCE* source, int n);
