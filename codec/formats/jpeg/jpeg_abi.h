// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/jpeg/header_scan.h"

// Each returns 200 at the first SOS, 201 for a refusal or when data runs out. `mode` is 2 or 8.
// PELOJ_ParseExifThumbnail looks for EXIF thumbnails alone, PELOJ_SimpleParser fills only the first
// three words. A failed scan may have filled part of the record.
TAVIRPELO_API int PELOJ_ParseFileHeader(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);
TAVIRPELO_API int PELOJ_ParseExifThumbnail(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);
TAVIRPELO_API int PELOJ_SimpleParser(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);

// The JPEG part of the header information; 1 or 0.
TAVIRPELO_API int PELOJ_GetHInfo(TAVIRPELO_IO* io, TAVIRPELO_HINFO* hinfo);
