// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/exif/exif_abi.h"

#include "codec/base/errors.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/encode.h"
#include "tavirpelo/exif.h"

using namespace pelo;
using namespace pelo::jpeg;

int PELOJ_GetExifInfo(PELOJ_SOURCE* cursor, TAVIRPELO_EXIFINFO* info) {
  return jpeg::find_and_read(cursor, info);
}

int PELOJ_ReadExifInfo(const uint8_t* data, uint32_t base, uint32_t size, TAVIRPELO_EXIFINFO* info) {
  return jpeg::read_structure(data, base, size, info);
}

uint32_t PELOJ_Read0thIFDInfo(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info) {
  return jpeg::read_ifd0(tiff, offset, info);
}

uint32_t PELOJ_ReadExifIFDInfo(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info) {
  return jpeg::read_exif_ifd(tiff, offset, info);
}

uint32_t PELOJ_ReadGpsIFDInfo(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_GPSINFO* gps) {
  return jpeg::read_gps_ifd(tiff, offset, gps);
}

int PELOJ_ReadExifField(const tiff::Structure* tiff, const uint8_t* entry, PELOJ_EXIFFIELD* field) {
  return jpeg::read_field(tiff, entry, field);
}

int PELOJ_GetJPEGResolution(const uint8_t* data, uint32_t size, uint32_t* width, uint32_t* height) {
  return jpeg::jpeg_size(data, size, width, height);
}

void __elo_WriteLONG_LE(uint8_t* dst, uint32_t value) {
  jpeg::write_le32(dst, value);
}

void __elo_WriteSHORT_LE(uint8_t* dst, uint32_t value) {
  jpeg::write_le16(dst, value);
}

uint32_t __elo_WriteASCII_String(uint8_t* dst, const char* text) {
  return jpeg::write_text(dst, text);
}

uint8_t* __elo_WriteSHORTTag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return jpeg::write_short_tag(entry, tag, value);
}

uint8_t* __elo_WriteLONGTag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return jpeg::write_long_tag(entry, tag, value);
}

uint8_t* __elo_WriteRATIONALTag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                                uint32_t numerator, uint32_t denominator) {
  return jpeg::write_rational_tag(entry, base, position, tag, numerator, denominator);
}

uint8_t* __elo_WriteASCIITag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                             const char* text) {
  return jpeg::write_ascii_tag(entry, base, position, tag, text);
}

int pelo_get_app1_mark(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_APP1* app1) {
  return jpeg::make_app1(decInfo, app1);
}

uint32_t __elo_CreateExif(uint8_t* tiff, const ELO_EXIFCONTENT* content) {
  return jpeg::create_exif(tiff, content);
}

TAVIRPELO_EXIFINFO* PELOJ_CreatExifInfo(TAVIRPELO_DECINFO* decInfo) {
  return jpeg::create_info(decInfo);
}

TAVIRPELO_EXIFINFO* PELOJ_CreatExifInfoUseExifBuffer(const uint8_t* segment, int size) {
  return jpeg::create_info_of_segment(segment, size);
}

int PELOJ_DestroyExifInfo(TAVIRPELO_EXIFINFO* info) {
  return jpeg::destroy_info(info);
}

TAVIRPELO_EXIFINFO* elo_create_jpeg_exifinfo_from_file(const char* path) {
  return create_info_of_source(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0);
}

TAVIRPELO_EXIFINFO* elo_create_jpeg_exifinfo_from_buffer(const void* buffer, int size) {
  return create_info_of_source(TAVIRPELO_IO_MEMORY, const_cast<void*>(buffer), size);
}

int elo_destory_jpeg_exifinfo(TAVIRPELO_EXIFINFO* info) {
  return destroy_info(info);
}

TAVIRPELO_EXIFINFO* TAVIRPELO_CreateJpegExifInfoFromFile(const char* path) {
  begin_operation();
  return path == nullptr ? nullptr : elo_create_jpeg_exifinfo_from_file(path);
}

TAVIRPELO_EXIFINFO* TAVIRPELO_CreateJpegExifInfoFromBuffer(const void* buffer, int size) {
  begin_operation();
  return buffer == nullptr || size == 0 ? nullptr : elo_create_jpeg_exifinfo_from_buffer(buffer, size);
}

int TAVIRPELO_DestroyJpegExifInfo(TAVIRPELO_EXIFINFO* info) {
  return info == nullptr ? 0 : elo_destory_jpeg_exifinfo(info);
}
