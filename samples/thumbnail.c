/* Makes a small JPEG of a picture in any format that the library reads. */
#include <stdio.h>
#include <stdlib.h>

#include "tavirpelo/tavirpelo.h"

int main(int argc, char** argv) {
  TAVIRPELO_HINFO header;
  TAVIRPELO_RAWINFO* picture;
  int done;
  if (argc != 3) {
    fprintf(stderr, "usage: %s PICTURE THUMBNAIL.jpg\n", argv[0]);
    return 2;
  }
  if (TAVIRPELO_ParseFromFile(argv[1], &header) == TAVIRPELO_FORMAT_UNKNOWN) {
    fprintf(stderr, "%s: not a picture, error %d\n", argv[1], gTAVIRPELO_Error);
    return 1;
  }
  picture = TAVIRPELO_CreateRawInfo(160, 120, TAVIRPELO_RGB888);
  if (!picture) return 1;
  /* Scaled while it is decoded: the full picture never exists in memory. */
  done = TAVIRPELO_DecodeImageFromFile(argv[1], picture, TAVIRPELO_FIT_INSIDE) &&
         TAVIRPELO_EncodeJpegToFile(picture, argv[2], 90);
  TAVIRPELO_DestroyRawInfo(picture);
  if (!done) {
    fprintf(stderr, "%s: failed, error %d\n", argv[1], debug_PeloCodecError);
    return 1;
  }
  printf("%s: %dx%d pixels\n", argv[1], header.width, header.height);
  return 0;
}
