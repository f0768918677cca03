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
#include <tuple>
#include <vector>

#include "google/protobuf/any.pb.h"
#include "google/protobuf/message.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/private/prepared_tree.h"
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

// The fields that filling a block message uses, found by name once per block type: the block's
// tree in the tree set (by FieldNameFromMessageName), and its "enable", "static_param" and
// "dynamic_param". A null field is one the message or the tree set lacks; the fill reports it when
// it needs it, as it would have on looking it up.
struct SubBlockFields {
  SubBlockFields(const google::protobuf::Descriptor* block_type,
                 const google::protobuf::Descriptor* tree_set_type);

  const google::protobuf::Descriptor* block_type;
  const google::protobuf::Descriptor* tree_set_type;
  std::string tree_name;
  const google::protobuf::FieldDescriptor* tree;    // A singular message field of the tree set.
  const google::protobuf::FieldDescriptor* enable;  // A singular bool.
  const google::protobuf::FieldDescriptor* static_param;  // Singular messages.
  const google::protobuf::FieldDescriptor* dynamic_param;
};

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

  // The tree set that GetTuningTreeSet finds, with the trees prepared for evaluation (unpacked
  // once, on first use). Null, logged, when nothing is found. For callers that fill several blocks
  // of one use case: the search is done once.
  const tavik::PreparedTreeSet* FindPreparedTreeSet(const TuningUsecase& usecase,
                                                    bool fallback) const;

  // FillSubBlockTuning on a tree set found beforehand, with the fields of the block's type found
  // beforehand; `usecase` is the one the tree set was found for, named in failures. Same results,
  // statuses and lines. `sub_block_tuning` may hold a former fill of its type, whose storage is
  // reused: it ends as a new message would.
  tavik::Status FillSubBlockTuning(const tavik::PreparedTreeSet& tree_set,
                                   const SubBlockFields& fields, const TuningUsecase& usecase,
                                   const CameraState& camera_state,
                                   google::protobuf::Message* sub_block_tuning,
                                   bool bypassed) const;

  // Every leaf of `level`, depth first in node order, for rewriting in place.
  static tavik::Status FindMutableDynamicParams(Level* level,
                                                std::vector<google::protobuf::Any*>* dynamic_params);

  const TuningForestMap& forest() const { return forest_; }

 private:
  // Rebuilds what lookups use beside the forest: the exact-key index and the prepared tree sets.
  void BuildLookupIndex();
  // The tree set whose key is exactly that of `usecase`, in time independent of the forest's
  // size; null when there is none.
  const google::protobuf::Message* FindExactTreeSet(const TuningUsecase& usecase) const;

  TuningForestMap forest_;
  // The forest's keys as enum numbers, unknown numbers made one (they share the empty name).
  tavik::FlatHashMap<std::tuple<int, int, int>, const google::protobuf::Message*> exact_index_;
  tavik::FlatHashMap<const google::protobuf::Message*, std::unique_ptr<tavik::PreparedTreeSet>>
      prepared_;
};

}  // namespace vosbrine

#endif  // TAVIK_IQ_TUNING_PROVIDER_BASE_H_
