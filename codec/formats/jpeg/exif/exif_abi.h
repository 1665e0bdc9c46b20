// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/jpeg/exif/exif_reader.h"
#include "codec/formats/jpeg/exif/exif_writer.h"

// Finds the EXIF segment from the source's position on, which must be at the SOI, and reads it. 200 once
// it had a valid TIFF header; 201.
TAVIRPELO_API int PELOJ_GetExifInfo(PELOJ_SOURCE* cursor, TAVIRPELO_EXIFINFO* info);

// Reads `size` bytes of TIFF data whose header stands at `base` in its source. 200, or 201 for a bad
// header.
TAVIRPELO_API int PELOJ_ReadExifInfo(const uint8_t* tiff, uint32_t base, uint32_t size,
                                     TAVIRPELO_EXIFINFO* info);

// Take over the entries of a directory; return the offset of the next one, 0 when there is none, or when
// the directory does not fit or memory ran out in it.
TAVIRPELO_API uint32_t PELOJ_Read0thIFDInfo(const pelo::tiff::Structure* tiff, uint32_t offset,
                                            TAVIRPELO_EXIFINFO* info);
TAVIRPELO_API uint32_t PELOJ_ReadExifIFDInfo(const pelo::tiff::Structure* tiff, uint32_t offset,
                                             TAVIRPELO_EXIFINFO* info);
TAVIRPELO_API uint32_t PELOJ_ReadGpsIFDInfo(const pelo::tiff::Structure* tiff, uint32_t offset,
                                            TAVIRPELO_GPSINFO* gps);

// Reads the twelve bytes of an entry; 1, or 0 when it is to be ignored: no type, two SHORTs, or a value
// outside the structure.
TAVIRPELO_API int PELOJ_ReadExifField(const pelo::tiff::Structure* tiff, const uint8_t* entry,
                                      PELOJ_EXIFFIELD* field);

// Size of the JPEG that begins at `data`. 200, or 201 with the results untouched.
TAVIRPELO_API int PELOJ_GetJPEGResolution(const uint8_t* data, uint32_t size, uint32_t* width,
                                          uint32_t* height);

// Store 4 or 2 bytes, least significant first.
TAVIRPELO_API void __elo_WriteLONG_LE(uint8_t* dst, uint32_t value);
TAVIRPELO_API void __elo_WriteSHORT_LE(uint8_t* dst, uint32_t value);
// Copies a text with its terminator; returns the bytes written.
TAVIRPELO_API uint32_t __elo_WriteASCII_String(uint8_t* dst, const char* text);

// Each writes the twelve bytes of an entry and returns where the next one goes. Values that the entry
// has no room for go to base + *position, which advances. Nothing is checked: the caller provides the
// space.
TAVIRPELO_API uint8_t* __elo_WriteSHORTTag(uint8_t* entry, uint16_t tag, uint32_t value);
TAVIRPELO_API uint8_t* __elo_WriteLONGTag(uint8_t* entry, uint16_t tag, uint32_t value);
TAVIRPELO_API uint8_t* __elo_WriteRATIONALTag(uint8_t* entry, uint8_t* base, uint32_t* position,
                                              uint16_t tag, uint32_t numerator, uint32_t denominator);
// The text goes to the value area even when it is short, although TIFF has values of up to four bytes in
// the entry: readers understand texts from four characters on. A null text: count 0, offset 0.
TAVIRPELO_API uint8_t* __elo_WriteASCIITag(uint8_t* entry, uint8_t* base, uint32_t* position,
                                           uint16_t tag, const char* text);

// Writes IFD0, and IFD1 for a thumbnail, into `tiff`, which has room for them; returns the bytes
// written. 0, and nothing written, for more than the 65,527 that a segment carries.
TAVIRPELO_API uint32_t __elo_CreateExif(uint8_t* tiff, const ELO_EXIFCONTENT* content);

// Writes an APP1 segment that carries the orientation of the source's EXIF to app1->data, which holds at
// least PELO_APP1_SIZE writable bytes, and its length to app1->length. 1, or 0 when the source has no
// readable EXIF. The source is left anywhere.
TAVIRPELO_API int pelo_get_app1_mark(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_APP1* app1);
