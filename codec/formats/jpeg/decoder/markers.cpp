#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/headers.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

using enum Marker;

constexpr const char* kStage = "JPEG headers";

// Notes why headers are refused. Behind the first scan the picture has begun, and what cannot be read is
// left out of it. Always false.
bool refuse_header(const PELOJ_JDINFO& jd, Reason reason, const char* detail = nullptr) {
  if (!jd.marker->sawSos) refuse(reason, kStage, detail);
  return false;
}
bool cut(const PELOJ_JDINFO& jd) {
  return refuse_header(jd, Reason::kTruncated);
}
bool no_memory(const PELOJ_JDINFO& jd) {
  return refuse_header(jd, Reason::kNoMemory);
}

// Consumes n bytes into `bytes`; false when the source ends first.
bool read(PELOJ_JDINFO& jd, void* bytes, uint32_t n) {
  if (!source_need(*jd.source, n)) return cut(jd);
  std::memcpy(bytes, source_take(*jd.source, n), n);
  return true;
}

bool skip(PELOJ_JDINFO& jd, uint32_t n) {
  return source_skip(*jd.source, n) || cut(jd);
}

// The bytes of a segment behind its length.
bool open_segment(PELOJ_JDINFO& jd, uint32_t& left) {
  return (source_need(*jd.source, 2) || cut(jd)) && segment_length(*jd.source, left);
}

constexpr const char* kComponents = "neither one nor three components";

// SOF0, SOF2 (T.81 B.2.2).
bool read_frame(PELOJ_JDINFO& jd, Marker code) {
  MarkerRecord& marker = *jd.marker;
  uint8_t head[8];
  if (marker.frameType != FrameType::kNone || !read(jd, head, 8)) return false;
  const FrameHead frame = load_frame_head(head + 2);
  jd.frame.height = frame.height;
  jd.frame.width = frame.width;
  const int count = head[7];
  if (frame.precision != 8 || frame.height > kMaxSide || frame.width > kMaxSide) {
    return refuse_frame(frame, kStage);
  }
  if (count == 4) return refuse(Reason::kCmyk, kStage);
  if (count != 1 && count != 3) refuse(Reason::kVariant, kStage, kComponents);
  if (count > kMaxComponents || load_be16(head) != 8 + 3 * count) return false;

  jd.frame.components = os_new<std::array<Component, kMaxComponents>>();
  if (!jd.frame.components) return no_memory(jd);
  jd.frame.componentCount = count;
  for (int i = 0; i < count; ++i) {
    uint8_t bytes[3];
    if (!read(jd, bytes, 3)) return false;
    Component& component = (*jd.frame.components)[static_cast<size_t>(i)];
    component.index = static_cast<uint8_t>(i);
    component.id = bytes[0];
    component.h = bytes[1] >> 4;
    component.v = bytes[1] & 15;
    component.quantTable = bytes[2];
    if (component.h < 1 || component.h > kMaxSampling || component.v < 1 || component.v > kMaxSampling) {
      return false;
    }
    marker.componentIds[static_cast<size_t>(i)] = component.id;
    jd.frame.hMax = std::max<int>(jd.frame.hMax, component.h);
    jd.frame.vMax = std::max<int>(jd.frame.vMax, component.v);
  }
  marker.frameType = code == kSof0 ? FrameType::kBaseline : FrameType::kProgressive;
  return true;
}

// DHT (T.81 B.2.4.2): every definition takes a slot of its own.
bool read_huffman_tables(PELOJ_JDINFO& jd) {
  uint32_t left;
  jd.marker->sawDht = 1;
  if (!open_segment(jd, left)) return false;
  while (left > 0) {
    uint8_t head[17];
    if (left < 17 || jd.tables.rawCount >= kTablePoolSize || !read(jd, head, 17)) return false;
    const bool isAc = (head[0] & 0x10) != 0;
    const uint8_t number = isAc ? head[0] - 0x10 : head[0];
    if (number > 3) return false;

    auto table = os_new<HuffmanSpec>();
    if (!table) return no_memory(jd);
    uint32_t total = 0;
    for (size_t i = 1; i <= 16; ++i) total += table->counts[i] = head[i];
    left -= 17;
    if (total > 256 || total > left || !read(jd, table->symbols.data(), total)) return false;
    left -= total;
    (isAc ? jd.tables.acRaw : jd.tables.dcRaw)[number] = table.get();
    jd.tables.rawPool[jd.tables.rawCount++] = std::move(table);
  }
  return true;
}

// Puts a table in its place. The one before it stays while a component that is still to be shown has it.
void replace_quant_table(PELOJ_JDINFO& jd, OsPtr<QuantTable> table, size_t number) {
  OsPtr<QuantTable>& place = jd.tables.quant[number];
  for (int c = 0; c < jd.frame.componentCount; ++c) {
    if (place && (*jd.frame.components)[static_cast<size_t>(c)].table == place.get())
      jd.tables.replacedQuant[jd.tables.replacedCount++] = std::move(place);
  }
  place = std::move(table);
}

// DQT (T.81 B.2.4.1), 8-bit tables.
bool read_quant_tables(PELOJ_JDINFO& jd) {
  uint32_t left;
  if (!open_segment(jd, left)) return false;
  while (left > 0) {
    uint8_t bytes[65];
    if (left < 65 || !read(jd, bytes, 65) || bytes[0] > 3) return false;
    auto table = os_new<QuantTable>();
    if (!table) return no_memory(jd);
    for (size_t i = 0; i < 64; ++i) table->value[PELOJ_NATURAL_ORDER[i]] = bytes[1 + i];
    replace_quant_table(jd, std::move(table), bytes[0]);
    left -= 65;
  }
  jd.marker->sawDqt = 1;
  return true;
}

bool read_restart_interval(PELOJ_JDINFO& jd) {
  uint8_t bytes[4];
  if (!read(jd, bytes, 4) || load_be16(bytes) != 4) return false;
  jd.scan.restartInterval = load_be16(bytes + 2);
  return true;
}

// APPn, COM, DNL: skipped, but for what an APP14 ends with.
bool read_application(PELOJ_JDINFO& jd, Marker code) {
  uint32_t left;
  if (!open_segment(jd, left)) return false;
  if (code == kApp0) jd.marker->sawApp0 = 1;
  if (code != kApp14) return skip(jd, left);
  jd.marker->sawApp14 = 1;
  if (left == 0) return true;
  return skip(jd, left - 1) && read(jd, &jd.marker->transform, 1);
}

Component* find_component(PELOJ_JDINFO& jd, uint8_t id) {
  for (int i = 0; i < jd.frame.componentCount; ++i) {
    Component& component = (*jd.frame.components)[static_cast<size_t>(i)];
    if (component.id == id) return &component;
  }
  return nullptr;
}

// A progressive scan's band must stay inside a block (T.81 G.1.1.1.1).
bool valid_band(const PELOJ_JDINFO& jd) {
  if (jd.scan.ss > jd.scan.se || jd.scan.se > 63 || jd.scan.ah > 13 || jd.scan.al > 13) return false;
  return jd.scan.ss == 0 ? jd.scan.se == 0 : jd.scan.componentCount == 1;
}

// SOS (T.81 B.2.3).
bool read_scan(PELOJ_JDINFO& jd) {
  uint8_t head[3];
  if (jd.marker->frameType == FrameType::kNone) {
    const bool foreign = jd.marker->foreign != Reason::kNone;
    return foreign && refuse(jd.marker->foreign, kStage);
  }
  if (!read(jd, head, 3)) return false;
  const int count = head[2];
  if (count < 1 || count > kMaxComponents || load_be16(head) != 6 + 2 * count) return false;
  jd.scan.componentCount = count;
  for (int i = 0; i < count; ++i) {
    uint8_t bytes[2];
    if (!read(jd, bytes, 2)) return false;
    Component* component = find_component(jd, bytes[0]);
    const auto begin = jd.scan.components.begin();
    // A component twice in a scan would be decoded twice and leave another undecoded.
    if (component == nullptr || std::find(begin, begin + i, component) != begin + i) return false;
    component->dcTable = bytes[1] >> 4;
    component->acTable = bytes[1] & 15;
    jd.scan.components[static_cast<size_t>(i)] = component;
    jd.scan.lastComponent = component->index;
  }
  uint8_t band[3];
  if (!read(jd, band, 3)) return false;
  jd.scan.ss = band[0];
  jd.scan.se = band[1];
  jd.scan.ah = band[2] >> 4;
  jd.scan.al = band[2] & 15;
  if (jd.marker->frameType == FrameType::kBaseline) {
    jd.scan.ss = jd.scan.ah = jd.scan.al = 0;
    jd.scan.se = 63;
  } else if (!valid_band(jd)) {
    return false;
  }
  jd.marker->sawSos = 1;
  return true;
}

// One segment by its code; codes that are not listed are passed over, scanning goes on behind them.
bool read_segment(PELOJ_JDINFO& jd, Marker code) {
  switch (code) {
    case kSof0:
    case kSof2:
      return read_frame(jd, code);
    case kDht:
      return read_huffman_tables(jd);
    case kDqt:
      return read_quant_tables(jd);
    case kDri:
      return read_restart_interval(jd);
    case kSos:
      return read_scan(jd);
    case kDnl:
    case kCom:
      return read_application(jd, code);
    default:
      if (code >= kApp0 && code <= kApp15) return read_application(jd, code);
      if (jd.marker->foreign == Reason::kNone) {
        jd.marker->foreign = foreign_process(*jd.source, static_cast<uint8_t>(code));
      }
      return true;
  }
}

// From the component count, the application segments and the identifiers (JFIF; T.872 for APP14).
ColourSpace colour_space(const PELOJ_JDINFO& jd) {
  const MarkerRecord& marker = *jd.marker;
  if (jd.frame.componentCount == 1) return ColourSpace::kGrey;
  if (jd.frame.componentCount != 3) return ColourSpace::kNone;
  if (marker.sawApp0) return ColourSpace::kYcc;
  if (marker.sawApp14) {
    if (marker.transform > 1) return ColourSpace::kNone;
    return marker.transform == 0 ? ColourSpace::kRgb : ColourSpace::kYcc;
  }
  using Ids = std::array<uint8_t, kMaxComponents>;
  if (marker.componentIds == Ids{0, 1, 2} || marker.componentIds == Ids{1, 2, 3})
    return ColourSpace::kYcc;
  return marker.componentIds == Ids{'R', 'G', 'B'} ? ColourSpace::kRgb : ColourSpace::kNone;
}

bool parse_header(PELOJ_JDINFO& jd) {
  jd.marker = os_new<MarkerRecord>();
  if (!jd.marker) return refuse(Reason::kNoMemory, kStage);
  jd.marker->transform = 1;
  int status = PELOJ_FAIL;
  if (!find_soi(*jd.source)) return refuse(Reason::kUnknownFormat, kStage);
  if (parse_to_scan(&jd, &status) == static_cast<int>(kEoi) || status != PELOJ_OK) {
    return false;
  }
  jd.frame.colourSpace = colour_space(jd);
  if (jd.frame.colourSpace == ColourSpace::kNone)
    return refuse(Reason::kVariant, kStage, "its colour space");
  const MarkerRecord& marker = *jd.marker;
  return marker.sawDht && marker.sawDqt && marker.sawSos;
}

}  // namespace

int parse_to_scan(PELOJ_JDINFO* jdInfo, int* status) {
  *status = PELOJ_FAIL;
  uint8_t code = 0;
  while (next_marker(*jdInfo->source, code)) {
    // Behind a scan, EOI ends the picture; what follows is another file's.
    const auto marker = static_cast<Marker>(code);
    if (marker == kEoi && jdInfo->marker->sawSos) return code;
    if (!read_segment(*jdInfo, marker)) return code;
    if (marker == kSos) {
      *status = PELOJ_OK;
      return code;
    }
  }
  cut(*jdInfo);
  return code;
}

int parse_header(PELOJ_JDINFO* jdInfo) {
  if (parse_header(*jdInfo)) return PELOJ_OK;
  refuse(Reason::kDamaged, kStage);
  clear_decoder(jdInfo);
  return PELOJ_FAIL;
}

}  // namespace pelo::jpeg
