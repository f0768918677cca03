// The forest of a tuning directory loaded as the controller loads it, with a device's module
// calibration applied when one is given, for the verbs that evaluate blocks.
#ifndef TOOLS_TAVIK_TUNE_FOREST_H_
#define TOOLS_TAVIK_TUNE_FOREST_H_

#include <memory>
#include <string>
#include <vector>

#include "google/protobuf/message.h"
#include "tavik/base/status.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/tuning_provider.h"

namespace tavik::tune {

struct ForestSource {
  std::vector<std::string> paths;  // Files and directories, as the controller takes them.
  // A device's module calibration (tavik.tools.ModuleCalibrationSet in text), applied to the
  // shading tuning at load as on the device; none when empty.
  std::string calibration_path;
  std::string device_name;  // Names the sensors of the calibration.
};

// Loads the forest. Fails with the provider's status, or when the calibration can't be read or
// yields no module of a known sensor.
StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> LoadForest(
    const ForestSource& source);

// The key of the tree set that a lookup of `usecase` with fallback takes, as production does;
// empty when the forest has none.
std::string ResolvedUsecaseKey(const vosbrine::zelmondrake::TuningProvider& provider,
                               const vosbrine::TuningUsecase& usecase);

// A new, empty message of `type`, from the generated factory.
std::unique_ptr<google::protobuf::Message> NewBlockMessage(
    const google::protobuf::Descriptor* type);

// Fills `block` (a <Block>Tuning) for `usecase` at `state` as the controller does: the nearest
// key, the tree interpolated when enabled, its first leaf when not.
Status FillBlock(const vosbrine::zelmondrake::TuningProvider& provider,
                 const vosbrine::TuningUsecase& usecase, const vosbrine::CameraState& state,
                 google::protobuf::Message& block);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_FOREST_H_
