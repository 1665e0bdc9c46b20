// Restart markers of the entropy-coded data.
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

// Reads up to the next marker, which becomes the unread one. False at the end of the source.
bool scan_for_marker(PELOJ_JDINFO& jd) {
  PELOJ_SOURCE& source = *jd.source;
  MarkerRecord& marker = *jd.marker;
  while (source_need(source, 1)) {
    if (*source_take(source, 1) != 0xFF) {
      marker.discardedBytes++;
      continue;
    }
    uint8_t code;
    do {
      if (!source_need(source, 1)) return false;
      code = *source_take(source, 1);
    } while (code == 0xFF);
    if (code != 0) {
      jd.entropy.unreadMarker = code;
      return true;
    }
    marker.discardedBytes += 2;
  }
  return false;
}

}  // namespace

int process_restart(PELOJ_JDINFO* jdInfo) {
  EntropyState& entropy = *jdInfo->entropy.state;
  MarkerRecord& marker = *jdInfo->marker;
  const int real = entropy.bits.left - entropy.bits.invented;
  if (real > 0) marker.discardedBytes += real / 8;
  entropy.bits = {};

  if (jdInfo->entropy.unreadMarker == 0 && !scan_for_marker(*jdInfo)) {
    meet_end(*jdInfo);
    if (jdInfo->entropy.unreadMarker == 0) return 0;
  }
  if (jdInfo->entropy.unreadMarker == restart_code(marker.nextRestart)) jdInfo->entropy.unreadMarker = 0;
  marker.nextRestart = (marker.nextRestart + 1) & 7;
  entropy.lastDc = {};
  jdInfo->entropy.eobRun = 0;
  entropy.restartsToGo = static_cast<uint32_t>(jdInfo->scan.restartInterval);
  if (jdInfo->entropy.unreadMarker == 0) entropy.insufficient = 0;
  return 1;
}

}  // namespace pelo::jpeg
