// The directories of an EXIF segment: what the camera is (IFD0), how the picture was taken (Exif), and
// where (GPS).
#include <cstddef>

#include "codec/formats/jpeg/exif/exif_members.h"

namespace pelo::jpeg {

static_assert(sizeof(void*) != 4 ||
              (sizeof(TAVIRPELO_EXIFINFO) == 200 && offsetof(TAVIRPELO_EXIFINFO, make) == 20 &&
               offsetof(TAVIRPELO_EXIFINFO, exposureTime) == 64 &&
               offsetof(TAVIRPELO_EXIFINFO, isoSpeed) == 124 &&
               offsetof(TAVIRPELO_EXIFINFO, thumbnail) == 156 &&
               offsetof(TAVIRPELO_EXIFINFO, gps) == 196));
static_assert(sizeof(void*) != 4 || (offsetof(TAVIRPELO_GPSINFO, latitude) == 8 &&
                                     offsetof(TAVIRPELO_GPSINFO, altitude) == 64 &&
                                     offsetof(TAVIRPELO_GPSINFO, mapDatum) == 96 &&
                                     offsetof(TAVIRPELO_GPSINFO, dateStamp) == 104));

namespace {

using Exif = TAVIRPELO_EXIFINFO;
using Gps = TAVIRPELO_GPSINFO;

constexpr uint16_t kExifPointer = 34665;
constexpr uint16_t kGpsPointer = 34853;

constexpr Member<Exif> kImageMembers[] = {
    {258, kShort, 3, shorts<&Exif::bitsPerSample>},    {259, kShort, 1, number<&Exif::compression>},
    {271, kAscii, kAnyCount, copy<&Exif::make>},       {272, kAscii, kAnyCount, copy<&Exif::model>},
    {274, kShort, 1, number<&Exif::orientation>},      {282, kRational, 1, rational<&Exif::xResolution>},
    {283, kRational, 1, rational<&Exif::yResolution>}, {296, kShort, 1, number<&Exif::resolutionUnit>},
    {305, kAscii, kAnyCount, copy<&Exif::software>},   {531, kShort, 1, number<&Exif::ycbcrPositioning>},
    {33432, kAscii, kAnyCount, copy<&Exif::rights>},
};

constexpr Member<Exif> kExifMembers[] = {
    {33434, kRational, 1, rational<&Exif::exposureTime>},
    {33437, kRational, 1, rational<&Exif::fNumber>},
    {34855, kShort, kAnyCount, number<&Exif::isoSpeed>},
    {36864, kUndefined, 4, copy<&Exif::exifVersion>},
    {36867, kAscii, 20, copy<&Exif::captureTime>},
    {36868, kAscii, 20, copy<&Exif::digitizingTime>},
    {37377, kSignedRational, 1, rational<&Exif::shutterSpeed>},
    {37380, kSignedRational, 1, rational<&Exif::exposureBias>},
    {37385, kShort, 1, number<&Exif::flash>},
    {37386, kRational, 1, rational<&Exif::focalLength>},
    {40961, kShort, 1, number<&Exif::colourSpace>},
    {40962, kShortOrLong, 1, number<&Exif::pixelXDimension>},
    {40963, kShortOrLong, 1, number<&Exif::pixelYDimension>},
    {41986, kShort, 1, number<&Exif::exposureMode>},
    {41987, kShort, 1, number<&Exif::whiteBalance>},
    {41988, kRational, 1, rational<&Exif::digitalZoom>},
};

bool store_processing_method(Gps& gps, const Field& field, const tiff::Structure&) {
  if (!store_copy(gps.processingMethod, field)) return false;
  gps.processingMethodLength = field.length;
  return true;
}

bool store_date_stamp(Gps& gps, const Field& field, const tiff::Structure&) {
  std::memcpy(gps.dateStamp, field.value, sizeof gps.dateStamp);
  gps.dateStamp[sizeof gps.dateStamp - 1] = 0;
  return true;
}

constexpr Member<Gps> kGpsMembers[] = {
    {0, kBytes, 4, inplace<&Gps::version>},
    {1, kAscii, 2, inplace<&Gps::latitudeRef>},
    {2, kRational, 3, rationals<&Gps::latitude>},
    {3, kAscii, 2, inplace<&Gps::longitudeRef>},
    {4, kRational, 3, rationals<&Gps::longitude>},
    {5, kBytes, 1, inplace<&Gps::altitudeRef>},
    {6, kRational, 1, rational<&Gps::altitude>},
    {7, kRational, 3, rationals<&Gps::timeStamp>},
    {18, kAscii, kAnyCount, copy<&Gps::mapDatum>},
    {27, kUndefined, kAnyCount, store_processing_method},
    {29, kAscii, sizeof Gps::dateStamp, store_date_stamp},
};

// The directories that IFD0 points to. Each kind is walked once, so that a segment full of pointers
// costs no more than its entries.
class SubDirectories {
 public:
  SubDirectories(const tiff::Structure& tiff, Exif& info) : tiff_(tiff), info_(info) {}

  // False when no directory is to be trusted behind this one: memory ran out, or the directory names a
  // successor, which these never have.
  bool walk(const Field& field) {
    if (field.type != tiff::kLong || field.count != 1) return true;
    if (field.tag == kExifPointer) {
      return std::exchange(exifWalked_, true) || read_exif_ifd(&tiff_, field.number, &info_) == 0;
    }
    if (std::exchange(gpsWalked_, true)) return true;
    if (info_.gps == nullptr) info_.gps = os_new<Gps>().release();
    return info_.gps != nullptr && read_gps_ifd(&tiff_, field.number, info_.gps) == 0;
  }

 private:
  const tiff::Structure& tiff_;
  Exif& info_;
  bool exifWalked_ = false;
  bool gpsWalked_ = false;
};

template <class Record>
uint32_t fill(const tiff::Structure& tiff, uint32_t offset, std::span<const Member<Record>> table,
              Record& record) {
  return walk_directory(tiff, offset,
                        [&](const Field& field) { return store_field(table, record, field, tiff); });
}

}  // namespace

uint32_t read_ifd0(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info) {
  SubDirectories directories(*tiff, *info);
  return walk_directory(*tiff, offset, [&](const Field& field) {
    if (field.tag == kExifPointer || field.tag == kGpsPointer) return directories.walk(field);
    return store_field<Exif>(kImageMembers, *info, field, *tiff);
  });
}

uint32_t read_exif_ifd(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_EXIFINFO* info) {
  return fill<Exif>(*tiff, offset, kExifMembers, *info);
}

uint32_t read_gps_ifd(const tiff::Structure* tiff, uint32_t offset, TAVIRPELO_GPSINFO* gps) {
  return fill<Gps>(*tiff, offset, kGpsMembers, *gps);
}

}  // namespace pelo::jpeg
