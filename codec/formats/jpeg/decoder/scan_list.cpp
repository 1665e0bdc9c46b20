#include "codec/base/errors.h"
#include "codec/formats/jpeg/decoder/headers.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/rows.h"
#include "codec/formats/jpeg/decoder/scans.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

int fail(int error, const char* text) {
  record_error(ErrorWord::kDecoding, error);
  log_error(text);
  return PELOJ_FAIL;
}

// The components of which the scans so far hold all that will be shown.
class Coverage {
 public:
  // Sequential scans hold their components whole. Later progressive scans cannot change what a reduced
  // transform reads of a component whose band reached far enough.
  void add_scan(const PELOJ_JDINFO& jd) {
    if (!is_progressive(jd)) {
      for (int i = 0; i < jd.scan.componentCount; ++i) complete(i, jd.scan) = true;
      return;
    }
    const bool enough =
        (jd.sizes.scale == kHalf && jd.scan.se > 18) || (jd.sizes.scale == kQuarter && jd.scan.se >= 5);
    if (enough) complete_[static_cast<size_t>(jd.scan.lastComponent)] = true;
  }
  // False for a sequential scan of components that are there already: the standard allows each once.
  bool gains(const PELOJ_JDINFO& jd) {
    if (is_progressive(jd)) return true;
    for (int i = 0; i < jd.scan.componentCount; ++i) {
      if (!complete(i, jd.scan)) return true;
    }
    return false;
  }
  bool all(int components) const {
    for (int c = 0; c < components; ++c) {
      if (!complete_[static_cast<size_t>(c)]) return false;
    }
    return true;
  }

 private:
  bool& complete(int scanIndex, const ScanHeader& scan) {
    return complete_[scan.components[static_cast<size_t>(scanIndex)]->index];
  }
  std::array<bool, kMaxComponents> complete_{};
};

// Reads up to the header of the next scan worth listing; false when there is none. The search for a
// marker passes over the entropy-coded data of the scans before it.
bool find_scan(PELOJ_JDINFO& jd, Coverage& coverage) {
  int status;
  do {
    parse_to_scan(&jd, &status);
  } while (status == PELOJ_OK && !coverage.gains(jd));
  return status == PELOJ_OK;
}

// Prepares the scan whose header has just been read.
int prepare_scan(PELOJ_JDINFO& jd) {
  if (prepare_upsampling(jd.frame, jd.sizes.scale, jd.progress) != PELOJ_OK) {
    return fail(TAVIRPELO_ERROR_DECODE, "PELOJ_DecodeImage : PELOJ_InitUpsampler fail");
  }
  if (prepare_before_scan(&jd) != PELOJ_OK) {
    return fail(TAVIRPELO_ERROR_DECODE, "PELOJ_DecodeImage : PELOJ_InitDecBeforeScan fail");
  }
  return PELOJ_OK;
}

}  // namespace

int list_scans(PELOJ_JDINFO& jd) {
  if (stores_coefficients(jd) && !allocate_store(jd.frame, jd.scans)) {
    return fail(TAVIRPELO_ERROR_MEMORY, "PELOJ_DecodeImage : malloc fail");
  }
  Coverage coverage;
  while (jd.scans.count < kMaxScans) {
    if (make_scan_record(&jd, &jd.scans.records[jd.scans.count]) != PELOJ_OK) {
      return fail(TAVIRPELO_ERROR_MEMORY, "PELOJ_DecodeImage : malloc fail");
    }
    ++jd.scans.count;
    coverage.add_scan(jd);
    if (coverage.all(jd.frame.componentCount) || !find_scan(jd, coverage)) break;
    if (prepare_scan(jd) != PELOJ_OK) return PELOJ_FAIL;
  }
  // What the state says of a sequential picture's scan stays that of the first one.
  if (is_progressive(jd) || load_scan(&jd, jd.scans.records[0].get())) return PELOJ_OK;
  return fail(TAVIRPELO_ERROR_DECODE, "PELOJ_DecodeImage : PELOJ_InitDecBeforeScan fail");
}

int make_scan_record(PELOJ_JDINFO* jdInfo, OsPtr<ScanRecord>* slot) {
  *slot = os_new<ScanRecord>();
  if (!*slot) return PELOJ_FAIL;
  ScanRecord& record = **slot;
  record.header = jdInfo->scan;
  jdInfo->entropy.eobRun = 0;
  save_scan(jdInfo, &record);
  return PELOJ_OK;
}

void save_scan(PELOJ_JDINFO* jdInfo, ScanRecord* record) {
  record->entropy = *jdInfo->entropy.state;
  record->sourcePosition = jdInfo->source->tell();
  record->eobRun = jdInfo->entropy.eobRun;
  record->nextRestart = jdInfo->marker->nextRestart;
  record->unreadMarker = jdInfo->entropy.unreadMarker;
}

int load_scan(PELOJ_JDINFO* jdInfo, const ScanRecord* record) {
  if (!jdInfo->source->move_to(record->sourcePosition)) return 0;
  static_cast<ScanHeader&>(jdInfo->scan) = record->header;
  *jdInfo->entropy.state = record->entropy;
  jdInfo->entropy.eobRun = record->eobRun;
  jdInfo->marker->nextRestart = record->nextRestart;
  jdInfo->entropy.unreadMarker = record->unreadMarker;
  if (!set_scan_geometry(jdInfo->frame, jdInfo->scan)) return 0;
  begin_imcu_row(jdInfo->scan, jdInfo->progress.imcuRow);
  return 1;
}

}  // namespace pelo::jpeg
