#include "tools/pelo/exif_text.h"

#include <fmt/format.h>

#include <cmath>
#include <string_view>
#include <vector>

#include "tools/common/text.h"

namespace pelo_tool {
namespace {

// Not finite for a denominator of 0.
double value_of(TAVIRPELO_RATIONAL r) {
  return static_cast<double>(r.numerator) / r.denominator;
}

struct Row {
  const char* name;
  std::string text;
  std::string json;
};

// Collects the fields that are there: 0 and null stand for absent ones.
class Rows {
 public:
  void number(const char* name, uint32_t value) {
    if (value != 0) add(name, std::to_string(value), std::to_string(value));
  }
  void text(const char* name, std::string_view value) {
    add(name, tool::printable(value), tool::json_text(value));
  }
  void string(const char* name, const char* value) {
    if (value != nullptr) text(name, value);
  }
  template <class Rational>
  void rational(const char* name, Rational value) {
    if (value.numerator == 0 && value.denominator == 0) return;
    add(name, fmt::format("{}/{}", value.numerator, value.denominator),
        fmt::format("[{}, {}]", value.numerator, value.denominator));
  }
  // Numbers that are nothing, of denominators 0, are left out.
  void decimal(const char* name, double value) {
    if (std::isfinite(value)) add(name, fmt::format("{:.9g}", value), fmt::format("{:.9g}", value));
  }
  // Hours, minutes and seconds; the latter may have a fraction.
  void time(const char* name, const TAVIRPELO_RATIONAL (&parts)[3]) {
    double hours = value_of(parts[0]);
    double minutes = value_of(parts[1]);
    double seconds = value_of(parts[2]);
    if (!std::isfinite(hours + minutes + seconds)) return;
    bool whole = seconds == std::floor(seconds);
    text(name, fmt::format("{:02.0f}:{:02.0f}:{:0{}.{}f}", hours, minutes, seconds, whole ? 2 : 6,
                           whole ? 0 : 3));
  }
  void object(const char* name, Rows rows) {
    add(name, "", rows.json());
    rows_.back().children = std::move(rows.rows_);
  }

  std::string lines(const std::string& indent) const { return lines(rows_, indent); }
  std::string json() const {
    std::string result = "{";
    for (const Entry& entry : rows_) {
      result +=
          fmt::format("{}\"{}\": {}", result.size() == 1 ? "" : ", ", entry.row.name, entry.row.json);
    }
    return result + "}";
  }

 private:
  struct Entry {
    Row row;
    std::vector<Entry> children;
  };

  void add(const char* name, std::string text, std::string json) {
    rows_.push_back({{name, std::move(text), std::move(json)}, {}});
  }
  static std::string lines(const std::vector<Entry>& entries, const std::string& indent) {
    std::string result;
    for (const Entry& entry : entries) {
      if (entry.children.empty()) {
        result += fmt::format("{}{:<17} {}\n", indent, entry.row.name, entry.row.text);
      } else {
        result += fmt::format("{}{}\n", indent, entry.row.name) + lines(entry.children, indent + "  ");
      }
    }
    return result;
  }

  std::vector<Entry> rows_;
};

// Degrees, minutes and seconds, negative in the south and west; not a number when any is none.
double degrees(const TAVIRPELO_RATIONAL (&parts)[3], char reference) {
  double magnitude = value_of(parts[0]) + value_of(parts[1]) / 60 + value_of(parts[2]) / 3600;
  return reference == 'S' || reference == 'W' ? -magnitude : magnitude;
}

Rows gps_rows(const TAVIRPELO_GPSINFO& gps) {
  Rows rows;
  if (gps.version[0] != 0) {
    rows.text("version", fmt::format("{}.{}.{}.{}", gps.version[0], gps.version[1], gps.version[2],
                                     gps.version[3]));
  }
  rows.decimal("latitude", degrees(gps.latitude, gps.latitudeRef[0]));
  rows.decimal("longitude", degrees(gps.longitude, gps.longitudeRef[0]));
  rows.decimal("altitude", value_of(gps.altitude) * (gps.altitudeRef == 1 ? -1 : 1));
  if (gps.dateStamp[0] != 0) rows.string("date", gps.dateStamp);
  rows.time("time", gps.timeStamp);
  rows.string("datum", gps.mapDatum);
  if (gps.processingMethodLength > 8) {  // behind the name of a character code
    rows.text("method",
              {reinterpret_cast<const char*>(gps.processingMethod) + 8, gps.processingMethodLength - 8});
  }
  return rows;
}

Rows thumbnail_rows(const TAVIRPELO_EXIFTHUMBNAIL& thumbnail) {
  Rows rows;
  rows.number("width", thumbnail.width);
  rows.number("height", thumbnail.height);
  rows.number("compression", thumbnail.compression);
  rows.number("offset", thumbnail.offset);
  rows.number("bytes", thumbnail.length);
  return rows;
}

Rows exif_rows(const TAVIRPELO_EXIFINFO& info) {
  Rows rows;
  rows.string("make", info.make);
  rows.string("model", info.model);
  rows.number("orientation", info.orientation);
  rows.string("software", info.software);
  rows.string("rights", info.rights);
  rows.string("captureTime", info.captureTime);
  rows.string("digitizingTime", info.digitizingTime);
  rows.rational("exposureTime", info.exposureTime);
  rows.rational("fNumber", info.fNumber);
  rows.number("isoSpeed", info.isoSpeed);
  rows.rational("exposureBias", info.exposureBias);
  rows.rational("shutterSpeed", info.shutterSpeed);
  rows.rational("focalLength", info.focalLength);
  rows.rational("digitalZoom", info.digitalZoom);
  rows.number("flash", info.flash);
  rows.number("exposureMode", info.exposureMode);
  rows.number("whiteBalance", info.whiteBalance);
  rows.number("colourSpace", info.colourSpace);
  rows.number("pixelXDimension", info.pixelXDimension);
  rows.number("pixelYDimension", info.pixelYDimension);
  rows.rational("xResolution", info.xResolution);
  rows.rational("yResolution", info.yResolution);
  rows.number("resolutionUnit", info.resolutionUnit);
  rows.number("ycbcrPositioning", info.ycbcrPositioning);
  rows.number("compression", info.compression);
  if (info.exifVersion != nullptr)
    rows.text("exifVersion", {reinterpret_cast<const char*>(info.exifVersion), 4});
  if (info.thumbnail.present) rows.object("thumbnail", thumbnail_rows(info.thumbnail));
  if (info.gps != nullptr) rows.object("gps", gps_rows(*info.gps));
  return rows;
}

}  // namespace

std::string exif_lines(const TAVIRPELO_EXIFINFO& info, const std::string& indent) {
  return exif_rows(info).lines(indent);
}

std::string exif_json(const TAVIRPELO_EXIFINFO& info) {
  return exif_rows(info).json();
}

}  // namespace pelo_tool
