// The forest of loaded tunings: every tuning file of a device, keyed by its use case, with the
// device's factory calibration applied. Loaded once; immutable afterwards, so lookups take no
// lock. The base holds the logic for any processor generation; a generation's provider supplies
// the tree-set type and the calibration.
#ifndef TAVIK_IQ_TUNING_PROVIDER_BASE_H_
#define TAVIK_IQ_TUNING_PROVIDER_BASE_H_

#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "google/protobuf/any.pb.h"
#include "google/protobuf/message.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"

namespace vosbrine {

// A device's own calibration of one sensor; a generation derives its record from this.
class TAVIK_EXPORT SensorEepromData {
 public:
  virtual ~SensorEepromData() = default;
};

// Keyed by the numeric value of CameraSensor.
using SensorEepromDataMap = tavik::FlatHashMap<long, std::unique_ptr<const SensorEepromData>>;

// Ordered by plain byte comparison of the key text; the nearest-key fallback relies on it.
using TuningForestMap = std::map<std::string, std::shared_ptr<google::protobuf::Message>>;

// The TuningTreeSet field of a block: its message's short name in snake case, less "_tuning".
// "vosbrine.zelmondrake.GtnrSharpenerTuning" gives "gtnr_sharpener".
TAVIK_EXPORT std::string FieldNameFromMessageName(std::string_view name);

// The forest's key of a use case: "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER".
// Sensor first, then mode, so that the nearest key in sort order stays on the same sensor and mode
// where it can. An unknown enum number gives an empty name.
TAVIK_EXPORT std::string EncodeUsecaseKey(const TuningUsecase& usecase);

class TAVIK_EXPORT TuningProviderBase {
 public:
  virtual ~TuningProviderBase() = default;

  // Forwards to tavik::ReadBinaryProto; a derived provider may read from elsewhere.
  virtual tavik::Status ReadBinaryProto(const std::string& path,
                                        google::protobuf::Message& message) const;

  // Applies a device's calibration to one tree set. The base has none to apply.
  virtual tavik::Status ApplySensorEepromCalibration(
      const std::unique_ptr<const SensorEepromData>& eeprom_data,
      const GoldenSensorFactoryCalibrationData& golden,
      google::protobuf::Message* tuning_tree_set) const;

  // Loads every .binarypb of `paths` (files, or directories searched one level deep). Fails only
  // when no path is given, no tuning file is found, or none of them loads: one good file among
  // bad ones is enough.
  tavik::Status Load(const std::vector<std::string>& paths,
                     const google::protobuf::Descriptor* tree_set_descriptor,
                     const SensorEepromDataMap* eeprom_data);

  // The tree set of `usecase`; with `fallback`, the nearest key by common prefix when there is no
  // exact one. Null (logged) when nothing is found.
  const google::protobuf::Message* GetTuningTreeSet(const TuningUsecase& usecase,
                                                    bool fallback) const;

  bool HasTuningUsecase(const TuningUsecase& usecase) const;

  // The tuner's switch of `sub_block` (a block message name such as "GtnrTuning").
  bool IsSubBlockEnabled(const TuningUsecase& usecase, const std::string& sub_block,
                         bool fallback) const;

  // Fills a block message (<Block>Tuning) for `usecase` at `camera_state`: `enable` is the tree's
  // switch and not `bypassed`; the static part is unpacked; the dynamic part is interpolated when
  // enabled, else the first leaf.
  tavik::Status FillSubBlockTuning(const TuningUsecase& usecase,
                                   const CameraState& camera_state,
                                   google::protobuf::Message* sub_block_tuning, bool fallback,
                                   bool bypassed) const;

  // Every leaf of `level`, depth first in node order, for rewriting in place.
  static tavik::Status FindMutableDynamicParams(Level* level,
                                                std::vector<google::protobuf::Any*>* dynamic_params);

  const TuningForestMap& forest() const { return forest_; }

 private:
  TuningForestMap forest_;
};

}  // namespace vosbrine

#endif  // TAVIK_IQ_TUNING_PROVIDER_BASE_H_
