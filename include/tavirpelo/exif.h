/* EXIF: what a camera noted in a JPEG's APP1 segment (CIPA DC-008, TIFF 6.0). */
#ifndef TAVIRPELO_EXIF_H
#define TAVIRPELO_EXIF_H

#include <stdint.h>

#include "tavirpelo/decinfo.h"

typedef struct TAVIRPELO_RATIONAL {
  uint32_t numerator;
  uint32_t denominator; /* as stored: may be 0 */
} TAVIRPELO_RATIONAL;

typedef struct TAVIRPELO_SRATIONAL {
  int32_t numerator;
  int32_t denominator;
} TAVIRPELO_SRATIONAL;

/* Values of the orientation member: where the stored picture's first row and column are seen. */
enum {
  TAVIRPELO_ORIENTATION_ABSENT = 0,
  TAVIRPELO_ORIENTATION_NORMAL = 1,
  TAVIRPELO_ORIENTATION_FLIP_HORIZONTAL = 2,
  TAVIRPELO_ORIENTATION_ROTATE_180 = 3,
  TAVIRPELO_ORIENTATION_FLIP_VERTICAL = 4,
  TAVIRPELO_ORIENTATION_TRANSPOSE = 5,
  TAVIRPELO_ORIENTATION_ROTATE_90 = 6, /* to be seen upright, turn it 90 degrees clockwise */
  TAVIRPELO_ORIENTATION_TRANSVERSE = 7,
  TAVIRPELO_ORIENTATION_ROTATE_270 = 8
};

/* The embedded thumbnail, from the second directory (IFD1). */
typedef struct TAVIRPELO_EXIFTHUMBNAIL {
  uint32_t present; /* 1 when its length is known and not 0 */
  uint32_t width;   /* pixels; of a JPEG thumbnail from its own header when that can be read */
  uint32_t height;
  uint32_t compression; /* 6 JPEG, 0 uncompressed strips, else tag 259 */
  uint32_t photometric; /* tag 262 */
  uint32_t length;      /* bytes */
  uint32_t tag4173;
  uint32_t planarConfig; /* tag 284 */
  uint32_t offset;       /* of its bytes from the start of the file (or of the segment buffer) */
  uint32_t reserved;
} TAVIRPELO_EXIFTHUMBNAIL;

/* The GPS directory; in comments the GPS tags. */
typedef struct TAVIRPELO_GPSINFO {
  uint8_t version[4];              /* 0 */
  char latitudeRef[4];             /* 1: "N" or "S"; two bytes of padding, so always terminated */
  TAVIRPELO_RATIONAL latitude[3];  /* 2: degrees, minutes, seconds */
  char longitudeRef[4];            /* 3: "E" or "W" */
  TAVIRPELO_RATIONAL longitude[3]; /* 4 */
  uint8_t altitudeRef;             /* 5: 0 above sea level, 1 below */
  uint8_t padding[3];
  TAVIRPELO_RATIONAL altitude;     /* 6: metres */
  TAVIRPELO_RATIONAL timeStamp[3]; /* 7: hours, minutes, seconds, UTC */
  char* mapDatum;                  /* 18 */
  uint8_t* processingMethod;       /* 27: processingMethodLength bytes without a terminator */
  char dateStamp[11];              /* 29: "YYYY:MM:DD" */
  uint32_t processingMethodLength;
} TAVIRPELO_GPSINFO;

/* All members are 0 or null when the picture does not tell. Strings are terminated copies that belong to
 * the object; in comments the tags. */
typedef struct TAVIRPELO_EXIFINFO {
  uint32_t reserved1;
  uint32_t bitsPerSample[3];        /* 258 */
  uint32_t compression;             /* 259 */
  char* make;                       /* 271 */
  char* model;                      /* 272 */
  uint32_t orientation;             /* 274 */
  TAVIRPELO_RATIONAL xResolution;   /* 282 */
  TAVIRPELO_RATIONAL yResolution;   /* 283 */
  uint32_t resolutionUnit;          /* 296: 2 inch, 3 centimetre */
  char* software;                   /* 305 */
  uint32_t ycbcrPositioning;        /* 531 */
  char* rights;                     /* 33432 */
  TAVIRPELO_RATIONAL exposureTime;  /* 33434: seconds */
  uint8_t* exifVersion;             /* 36864: four characters without a terminator */
  char* captureTime;                /* 36867: "YYYY:MM:DD HH:MM:SS" */
  char* digitizingTime;             /* 36868 */
  uint32_t flash;                   /* 37385 */
  uint32_t colourSpace;             /* 40961 */
  uint32_t pixelXDimension;         /* 40962 */
  uint32_t pixelYDimension;         /* 40963 */
  uint32_t exposureMode;            /* 41986 */
  uint32_t whiteBalance;            /* 41987 */
  TAVIRPELO_RATIONAL digitalZoom;   /* 41988 */
  TAVIRPELO_RATIONAL focalLength;   /* 37386: millimetres */
  uint32_t isoSpeed;                /* 34855: a single value; of several, where they are stored */
  TAVIRPELO_SRATIONAL exposureBias; /* 37380: EV */
  TAVIRPELO_RATIONAL fNumber;       /* 33437 */
  TAVIRPELO_SRATIONAL shutterSpeed; /* 37377: APEX */
  uint32_t reserved2;
  TAVIRPELO_EXIFTHUMBNAIL thumbnail;
  TAVIRPELO_GPSINFO* gps; /* null when the picture has no GPS directory */
} TAVIRPELO_EXIFINFO;

/* Reads the EXIF segment of a JPEG file, or of `size` bytes in memory, which may be released afterwards.
 * Null for a missing argument, a source that cannot be read, no EXIF segment, a TIFF header that is
 * none, or when memory is short; a line in the log tells which of the last three. Directories are read
 * as far as they make sense: entries of another type or count than the standard's, or with values
 * outside the segment, leave their members 0. */
TAVIRPELO_API TAVIRPELO_EXIFINFO* TAVIRPELO_CreateJpegExifInfoFromFile(const char* path);
TAVIRPELO_API TAVIRPELO_EXIFINFO* TAVIRPELO_CreateJpegExifInfoFromBuffer(const void* buffer, int size);

/* Frees the object and all it owns; 1, or 0 for null. */
TAVIRPELO_API int TAVIRPELO_DestroyJpegExifInfo(TAVIRPELO_EXIFINFO* info);

/* The same without argument checks. */
TAVIRPELO_API TAVIRPELO_EXIFINFO* elo_create_jpeg_exifinfo_from_file(const char* path);
TAVIRPELO_API TAVIRPELO_EXIFINFO* elo_create_jpeg_exifinfo_from_buffer(const void* buffer, int size);
TAVIRPELO_API int elo_destory_jpeg_exifinfo(TAVIRPELO_EXIFINFO* info);

/* ---- for callers with a source or a segment of their own ---- */

/* From the object's source, wherever it stands; it is then left anywhere. Null as above. */
TAVIRPELO_API TAVIRPELO_EXIFINFO* PELOJ_CreatExifInfo(TAVIRPELO_DECINFO* decInfo);

/* From a buffer that begins with the APP1 marker itself. Null when it holds no EXIF segment. */
TAVIRPELO_API TAVIRPELO_EXIFINFO* PELOJ_CreatExifInfoUseExifBuffer(const uint8_t* segment, int size);

TAVIRPELO_API int PELOJ_DestroyExifInfo(TAVIRPELO_EXIFINFO* info);

#endif
