#include <algorithm>
#include <utility>

#include "codec/formats/jpeg/transform/transform.h"

namespace pelo::jpeg {
namespace {

constexpr int kFailed = 0, kDone = 1, kMore = 4;
constexpr int kStep = 16;  // output pixels after which a call in steps returns

// The source's rows go from the last to the first when the operation turns the picture upside down; each
// becomes a row of the output, or with exchanged directions its next column.
class Rotation {
 public:
  bool start(void* source, int size, Size picture, ELO_DESTINATION* destination,
             const Operation& operation);
  int run(bool inSteps);
  // Completes the output with what there is.
  bool end();

 private:
  void take_parameters(int size);
  bool start_encoder(Size picture, ELO_DESTINATION* destination);
  bool one_row();
  int position() const { return operation_->transposes ? columns_.column : encoder_->row; }

  const Operation* operation_ = nullptr;
  CoefficientSource source_;
  RowSnapshots snapshots_;
  TransformParameters parameters_;
  ELO_ENCODER* encoder_ = nullptr;
  ColumnEncoder columns_;
  OsBuffer<CoefficientBlock> row_, turned_;
  int rowsTaken_ = 0;
};

bool Rotation::start(void* source, int size, Size picture, ELO_DESTINATION* destination,
                     const Operation& operation) {
  operation_ = &operation;
  if (!source_.open(TAVIRPELO_IO_MEMORY, source, size, picture.width / 8, picture.height / 8))
    return false;
  const PELOJ_JDINFO& jd = source_.decoder();
  if (source_.progressive() || jd.frame.width != picture.width || jd.frame.height != picture.height)
    return false;
  const size_t blocks = source_.grid().row_blocks();
  if (!row_.allocate(blocks) || !turned_.allocate(blocks)) return false;
  take_parameters(size);
  if (!start_encoder(picture, destination)) return false;
  return !operation.mirrorsRows || make_row_record(&source_, &snapshots_);
}

void Rotation::take_parameters(int size) {
  parameters_of_source(&source_, &parameters_);
  parameters_.sourceSize = size;
  if (!operation_->transposes) return;
  parameters_.coding.restartPerRow = true;
  transpose_parameters(&parameters_);
}

bool Rotation::start_encoder(Size picture, ELO_DESTINATION* destination) {
  if (operation_->transposes) std::swap(picture.width, picture.height);
  TAVIRPELO_RAWINFO image{};
  image.width = static_cast<uint32_t>(picture.width);
  image.height = static_cast<uint32_t>(picture.height);
  image.format = TAVIRPELO_YUV420;
  const TAVIRPELO_ENCOPTION options{100, nullptr, 0};
  encoder_ = begin_bands(&image, destination, &options, &parameters_.coding);
  if (encoder_ == nullptr) return false;
  const McuGrid& grid = source_.grid();
  const Size mcus = operation_->transposes ? Size{grid.down, grid.across} : Size{grid.across, grid.down};
  if (encoder_->mcusAcross != mcus.width || encoder_->mcusDown != mcus.height) return false;
  return !operation_->transposes || begin_column(&columns_, encoder_, parameters_.sourceSize);
}

// The source's next row, in the order of the operation, transformed and coded.
bool Rotation::one_row() {
  const McuGrid& grid = source_.grid();
  if (operation_->mirrorsRows) {
    const auto row = static_cast<size_t>(grid.down - 1 - rowsTaken_);
    if (!load_partial(&source_.decoder(), &snapshots_[row])) return false;
  }
  if (!source_.read_row(row_.data())) return false;
  for (int mcu = 0; mcu < grid.across; ++mcu) {
    const int target = operation_->mirrorsColumns ? grid.across - 1 - mcu : mcu;
    transform_mcu(*operation_, grid, row_.data() + mcu * grid.blocks,
                  turned_.data() + target * grid.blocks);
  }
  ++rowsTaken_;
  return operation_->transposes ? code_column(&columns_, turned_.data())
                                : code_stream(encoder_, turned_.data());
}

int Rotation::run(bool inSteps) {
  while (rowsTaken_ < source_.grid().down) {
    if (!one_row()) return kFailed;
    if (inSteps && position() % kStep == 0 && rowsTaken_ < source_.grid().down) return kMore;
  }
  return end() ? kDone : kFailed;
}

bool Rotation::end() {
  if (encoder_ == nullptr) return true;
  const bool joined = finish_column(&columns_);
  const bool finished = finish_bands(std::exchange(encoder_, nullptr), nullptr, nullptr);
  columns_.encoder = nullptr;
  return joined && finished;
}

using OwnedRotation = OsPtr<Rotation>;

OwnedRotation begin(void* source, int size, Size picture, ELO_DESTINATION* destination,
                    const Operation& operation) {
  OwnedRotation rotation = os_new<Rotation>();
  if (rotation == nullptr || rotation->start(source, size, picture, destination, operation))
    return rotation;
  rotation->end();
  return nullptr;
}

int fail(ELO_DESTINATION& destination) {
  if (destination.kind == ELO_TO_MEMORY) discard(destination);
  return kFailed;
}

// The turn that a state holds, which is then idle. What stands in an idle one is not looked at.
OwnedRotation take(ELO_TRANSFORMSTATE& state) {
  void* context = state.started != 0 ? state.context : nullptr;
  state = {};
  return OwnedRotation(static_cast<Rotation*>(context));
}

// Runs a new or a kept turn; the state keeps it when there is more to do.
int proceed(OwnedRotation rotation, ELO_DESTINATION& destination, ELO_TRANSFORMSTATE* state) {
  const int result = rotation->run(state != nullptr);
  if (result == kMore) {
    *state = {1, 1, rotation.release()};
    return result;
  }
  if (result == kFailed) {
    rotation->end();
    return fail(destination);
  }
  return result;
}

}  // namespace
int rotate_jpeg(void* source, int size, int width, int height, ELO_DESTINATION* destination, int angle,
                int flip, ELO_TRANSFORMSTATE* state) {
  if (angle == 0 && flip == 0) return kDone;
  const Operation* operation = find_operation(angle, flip != 0);
  if (destination == nullptr) return kFailed;
  if (operation == nullptr || source == nullptr) return fail(*destination);
  OwnedRotation rotation = state != nullptr ? take(*state) : nullptr;
  if (rotation == nullptr) rotation = begin(source, size, {width, height}, destination, *operation);
  if (rotation == nullptr) return fail(*destination);
  return proceed(std::move(rotation), *destination, state);
}

void abort_turn(void* context) {
  const OwnedRotation rotation(static_cast<Rotation*>(context));
  if (rotation != nullptr) rotation->end();
}

int abort_rotation(ELO_TRANSFORMSTATE* state) {
  if (state != nullptr) abort_turn(take(*state).release());
  return 1;
}

}  // namespace pelo::jpeg
