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
bool refuse_header(const MarkerRecord& seen, Reason reason) {
  if (!seen.sawSos) refuse(reason, kStage);
  return false;
}

// The bytes of the segments, and what the ones so far said.
struct Input {
  PELOJ_SOURCE& source;
  MarkerRecord& seen;

  bool cut() const { return refuse_header(seen, Reason::kTruncated); }

  // Consumes n bytes into `bytes`; false when the source ends first.
  bool read(void* bytes, uint32_t n) const {
    if (!source.need(n)) return cut(), false;
    std::memcpy(bytes, source.take(n), n);
    return true;
  }
  bool skip(uint32_t n) const { return source.skip(n) || cut(); }

  // The bytes of a segment behind its length.
  bool open_segment(uint32_t& left) const {
    return (source.need(2) || cut()) && segment_length(source, left);
  }
};

constexpr const char* kComponents = "neither one nor three components";

// SOF0, SOF2 (T.81 B.2.2).
bool read_frame(const Input& in, Frame& frame, Marker code) {
  MarkerRecord& marker = in.seen;
  uint8_t head[8];
  if (marker.frameType != FrameType::kNone || !in.read(head, 8)) return false;
  const FrameHead start = load_frame_head(head + 2);
  frame.height = start.height;
  frame.width = start.width;
  const int count = head[7];
  if (start.precision != 8 || start.height > kMaxSide || start.width > kMaxSide) {
    return refuse_frame(start, kStage);
  }
  if (count == 4) return refuse(Reason::kCmyk, kStage);
  if (count != 1 && count != 3) refuse(Reason::kVariant, kStage, kComponents);
  if (count > kMaxComponents || load_be16(head) != 8 + 3 * count) return false;

  frame.components = os_new<std::array<Component, kMaxComponents>>();
  if (!frame.components) return refuse_header(in.seen, Reason::kNoMemory);
  frame.componentCount = count;
  for (int i = 0; i < count; ++i) {
    uint8_t bytes[3];
    if (!in.read(bytes, 3)) return false;
    Component& component = (*frame.components)[static_cast<size_t>(i)];
    component.index = static_cast<uint8_t>(i);
    component.id = bytes[0];
    component.h = bytes[1] >> 4;
    component.v = bytes[1] & 15;
    component.quantTable = bytes[2];
    if (component.h < 1 || component.h > kMaxSampling || component.v < 1 || component.v > kMaxSampling) {
      return false;
    }
    marker.componentIds[static_cast<size_t>(i)] = component.id;
    frame.hMax = std::max<int>(frame.hMax, component.h);
    frame.vMax = std::max<int>(frame.vMax, component.v);
  }
  marker.frameType = code == kSof0 ? FrameType::kBaseline : FrameType::kProgressive;
  return true;
}

// DHT (T.81 B.2.4.2): every definition takes a slot of its own.
bool read_huffman_tables(const Input& in, Tables& tables) {
  uint32_t left;
  in.seen.sawDht = 1;
  if (!in.open_segment(left)) return false;
  while (left > 0) {
    uint8_t head[17];
    if (left < 17 || tables.rawCount >= kTablePoolSize || !in.read(head, 17)) return false;
    const bool isAc = (head[0] & 0x10) != 0;
    const uint8_t number = isAc ? head[0] - 0x10 : head[0];
    if (number > 3) return false;

    auto table = os_new<HuffmanSpec>();
    if (!table) return refuse_header(in.seen, Reason::kNoMemory);
    uint32_t total = 0;
    for (size_t i = 1; i <= 16; ++i) total += table->counts[i] = head[i];
    left -= 17;
    if (total > 256 || total > left || !in.read(table->symbols.data(), total)) return false;
    left -= total;
    (isAc ? tables.acRaw : tables.dcRaw)[number] = table.get();
    tables.rawPool[tables.rawCount++] = std::move(table);
  }
  return true;
}

// Puts a table in its place. The one before it stays while a component that is still to be shown has it.
void replace_quant_table(const Frame& frame, Tables& tables, OsPtr<QuantTable> table, size_t number) {
  OsPtr<QuantTable>& place = tables.quant[number];
  for (int c = 0; c < frame.componentCount; ++c) {
    if (place && (*frame.components)[static_cast<size_t>(c)].table == place.get())
      tables.replacedQuant[tables.replacedCount++] = std::move(place);
  }
  place = std::move(table);
}

// DQT (T.81 B.2.4.1), 8-bit tables.
bool read_quant_tables(const Input& in, const Frame& frame, Tables& tables) {
  uint32_t left;
  if (!in.open_segment(left)) return false;
  while (left > 0) {
    uint8_t bytes[65];
    if (left < 65 || !in.read(bytes, 65) || bytes[0] > 3) return false;
    auto table = os_new<QuantTable>();
    if (!table) return refuse_header(in.seen, Reason::kNoMemory);
    for (size_t i = 0; i < 64; ++i) table->value[PELOJ_NATURAL_ORDER[i]] = bytes[1 + i];
    replace_quant_table(frame, tables, std::move(table), bytes[0]);
    left -= 65;
  }
  in.seen.sawDqt = 1;
  return true;
}

bool read_restart_interval(const Input& in, ScanHeader& scan) {
  uint8_t bytes[4];
  if (!in.read(bytes, 4) || load_be16(bytes) != 4) return false;
  scan.restartInterval = load_be16(bytes + 2);
  return true;
}

// APPn, COM, DNL: skipped, but for what an APP14 ends with.
bool read_application(const Input& in, Marker code) {
  uint32_t left;
  if (!in.open_segment(left)) return false;
  if (code == kApp0) in.seen.sawApp0 = 1;
  if (code != kApp14) return in.skip(left);
  in.seen.sawApp14 = 1;
  if (left == 0) return true;
  return in.skip(left - 1) && in.read(&in.seen.transform, 1);
}

Component* find_component(const Frame& frame, uint8_t id) {
  for (int i = 0; i < frame.componentCount; ++i) {
    Component& component = (*frame.components)[static_cast<size_t>(i)];
    if (component.id == id) return &component;
  }
  return nullptr;
}

// A progressive scan's band must stay inside a block (T.81 G.1.1.1.1).
bool valid_band(const ScanHeader& scan) {
  if (scan.ss > scan.se || scan.se > 63 || scan.ah > 13 || scan.al > 13) return false;
  return scan.ss == 0 ? scan.se == 0 : scan.componentCount == 1;
}

// SOS (T.81 B.2.3).
bool read_scan(const Input& in, const Frame& frame, ScanHeader& scan) {
  uint8_t head[3];
  if (in.seen.frameType == FrameType::kNone) {
    const bool foreign = in.seen.foreign != Reason::kNone;
    return foreign && refuse(in.seen.foreign, kStage);
  }
  if (!in.read(head, 3)) return false;
  const int count = head[2];
  if (count < 1 || count > kMaxComponents || load_be16(head) != 6 + 2 * count) return false;
  scan.componentCount = count;
  for (int i = 0; i < count; ++i) {
    uint8_t bytes[2];
    if (!in.read(bytes, 2)) return false;
    Component* component = find_component(frame, bytes[0]);
    const auto begin = scan.components.begin();
    // A component twice in a scan would be decoded twice and leave another undecoded.
    if (component == nullptr || std::find(begin, begin + i, component) != begin + i) return false;
    component->dcTable = bytes[1] >> 4;
    component->acTable = bytes[1] & 15;
    scan.components[static_cast<size_t>(i)] = component;
    scan.lastComponent = component->index;
  }
  uint8_t band[3];
  if (!in.read(band, 3)) return false;
  scan.ss = band[0];
  scan.se = band[1];
  scan.ah = band[2] >> 4;
  scan.al = band[2] & 15;
  if (in.seen.frameType == FrameType::kBaseline) {
    scan.ss = scan.ah = scan.al = 0;
    scan.se = 63;
  } else if (!valid_band(scan)) {
    return false;
  }
  in.seen.sawSos = 1;
  return true;
}

// One segment by its code; codes that are not listed are passed over, scanning goes on behind them.
bool read_segment(PELOJ_JDINFO& jd, Marker code) {
  const Input in{*jd.source, *jd.marker};
  switch (code) {
    case kSof0:
    case kSof2:
      return read_frame(in, jd.frame, code);
    case kDht:
      return read_huffman_tables(in, jd.tables);
    case kDqt:
      return read_quant_tables(in, jd.frame, jd.tables);
    case kDri:
      return read_restart_interval(in, jd.scan);
    case kSos:
      return read_scan(in, jd.frame, jd.scan);
    case kDnl:
    case kCom:
      return read_application(in, code);
    default:
      if (code >= kApp0 && code <= kApp15) return read_application(in, code);
      if (jd.marker->foreign == Reason::kNone) {
        jd.marker->foreign = foreign_process(*jd.source, static_cast<uint8_t>(code));
      }
      return true;
  }
}

// From the component count, the application segments and the identifiers (JFIF; T.872 for APP14).
ColourSpace colour_space(const MarkerRecord& marker, int componentCount) {
  if (componentCount == 1) return ColourSpace::kGrey;
  if (componentCount != 3) return ColourSpace::kNone;
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
  jd.frame.colourSpace = colour_space(*jd.marker, jd.frame.componentCount);
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
  refuse_header(*jdInfo->marker, Reason::kTruncated);
  return code;
}

int parse_header(PELOJ_JDINFO* jdInfo) {
  if (parse_header(*jdInfo)) return PELOJ_OK;
  refuse(Reason::kDamaged, kStage);
  clear_decoder(jdInfo);
  return PELOJ_FAIL;
}

}  // namespace pelo::jpeg
