// Restart markers of the entropy-coded data.
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

// Reads up to the next marker, which becomes the unread one. False at the end of the source.
bool scan_for_marker(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker) {
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
      entropy.unreadMarker = code;
      return true;
    }
    marker.discardedBytes += 2;
  }
  return false;
}

}  // namespace

bool process_restart(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker, int interval) {
  EntropyState& state = *entropy.state;
  const int real = state.bits.left - state.bits.invented;
  if (real > 0) marker.discardedBytes += real / 8;
  state.bits = {};

  if (entropy.unreadMarker == 0 && !scan_for_marker(source, entropy, marker)) {
    meet_end(entropy);
    if (entropy.unreadMarker == 0) return false;
  }
  if (entropy.unreadMarker == restart_code(marker.nextRestart)) entropy.unreadMarker = 0;
  marker.nextRestart = (marker.nextRestart + 1) & 7;
  state.lastDc = {};
  entropy.eobRun = 0;
  state.restartsToGo = static_cast<uint32_t>(interval);
  if (entropy.unreadMarker == 0) state.insufficient = 0;
  return true;
}

}  // namespace pelo::jpeg
