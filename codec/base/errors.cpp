// The process-wide error words. Each belongs to one group of operations and nobody else clears it.
#include "tavirpelo/decinfo.h"

int gTAVIRPELO_Error = TAVIRPELO_ERROR_NONE;
int gTavirError = TAVIRPELO_ERROR_NONE;
int debug_PeloCodecError = 0;
