// The steps of reading EXIF: finding the segment, its TIFF header, the directories, one entry.
//
// How to read this room: exif_segment finds the structure, exif_directories has a table for each of its
// directories, in the terms of exif_members, and exif_thumbnail reads IFD1; exif_field bounds one entry,
// on ../tiff.h. exif_info makes and frees records. exif_writer goes the other way, from a record to a
// segment.
#pragma once

#include "codec/base/source.h"
#include "codec/formats/jpeg/tiff.h"
#include "tavirpelo/exif.h"

// One entry of a directory and where its value stands.
typedef struct PELOJ_EXIFFIELD {
  uint16_t tag;
  uint16_t type;
  uint32_t count;
  uint32_t number;       // a single SHORT or LONG; of other fields the word that leads to the value
  uint32_t length;       // bytes of the value
  const uint8_t* value;  // inside the structure; null for a single SHORT or LONG
} PELOJ_EXIFFIELD;

namespace pelo::jpeg {

// Finds the EXIF segment from the source's position on, which must be at the SOI, and reads it. 200 once
// it had a valid TIFF header; 201.
int find_and_read(PELOJ_SOURCE* cursor, TAVIRPELO_EXIFINFO* info);

// Reads `size` bytes of TIFF data whose header stands at `base` in its source. 200, or 201 for a bad
// header.
int read_structure(const uint8_t* tiff, uint32_t base, uint32_t size, TAVIRPELO_EXIFINFO* info);

// Take over the entries of a directory; return the offset of the next one, 0 when there is none, or when
// the directory does not fit or memory ran out in it.
uint32_t read_ifd0(const pelo::tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info);
uint32_t read_exif_ifd(const pelo::tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info);
uint32_t read_gps_ifd(const pelo::tiff::Structure* tiff, uint32_t offset, TAVIRPELO_GPSINFO* gps);

// Reads the twelve bytes of an entry; 1, or 0 when it is to be ignored: no type, two SHORTs, or a value
// outside the structure.
int read_field(const pelo::tiff::Structure* tiff, const uint8_t* entry, PELOJ_EXIFFIELD* field);

// Size of the JPEG that begins at `data`. 200, or 201 with the results untouched.
int jpeg_size(const uint8_t* data, uint32_t size, uint32_t* width, uint32_t* height);

constexpr uint32_t kExifIdentifierSize = 6;  // "Exif", two zeros
bool is_exif_identifier(const uint8_t* bytes);

// Takes over the entries of the thumbnail's directory.
void read_thumbnail_directory(const tiff::Structure& tiff, uint32_t offset,
                              TAVIRPELO_EXIFTHUMBNAIL& thumbnail);

// Behind the given names of the public headers, which say what they do.
TAVIRPELO_EXIFINFO* create_info_of_source(int ioType, void* source, int size);
TAVIRPELO_EXIFINFO* create_info(TAVIRPELO_DECINFO* decInfo);
TAVIRPELO_EXIFINFO* create_info_of_segment(const uint8_t* segment, int size);
int destroy_info(TAVIRPELO_EXIFINFO* info);

}  // namespace pelo::jpeg
