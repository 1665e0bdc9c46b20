// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/jpeg_abi.h"

#include "tavirpelo/api.h"
#include "tavirpelo/parse.h"

using namespace pelo;
using namespace pelo::jpeg;

int PELOJ_ParseFileHeader(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return jpeg::scan_file_header(source, mode, result);
}

int PELOJ_ParseExifThumbnail(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return jpeg::scan_exif_thumbnail(source, mode, result);
}

int PELOJ_SimpleParser(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return jpeg::scan_size(source, mode, result);
}

int PELOJ_GetHInfo(TAVIRPELO_IO* io, TAVIRPELO_HINFO* hinfo) {
  return jpeg::header_info(io, hinfo);
}
