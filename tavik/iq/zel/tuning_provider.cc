#include "tavik/iq/zel/tuning_provider.h"

#include <vector>

#include "google/protobuf/any.pb.h"
#include "tavik/iq/lsc_table_operations.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/sensor_eeprom_data.h"

namespace vosbrine::zelmondrake {

tavik::StatusOr<std::unique_ptr<TuningProvider>> TuningProvider::Create(
    const std::vector<std::string>& paths, const SensorEepromDataMap* eeprom_data) {
  std::unique_ptr<TuningProvider> provider(new TuningProvider());
  const tavik::Status status = provider->Load(paths, TuningTreeSet::descriptor(), eeprom_data);
  if (!status.ok()) return status;
  return provider;
}

tavik::Status TuningProvider::ApplySensorEepromCalibration(
    const std::unique_ptr<const SensorEepromData>& eeprom_data,
    const GoldenSensorFactoryCalibrationData& golden,
    google::protobuf::Message* tuning_tree_set) const {
  if (tuning_tree_set == nullptr) return tavik::InvalidArgumentError("tuning_tree_set is nullptr.");
  const auto* device = dynamic_cast<const ZelSensorEepromData*>(eeprom_data.get());
  if (device == nullptr) return tavik::InvalidArgumentError("Invalid eeprom_data type.");
  if (!device->lsc_tables.IsInitialized()) {
    return tavik::InvalidArgumentError("lsc_tables_device_eeprom_data not initialized.");
  }
  auto* tree_set = dynamic_cast<TuningTreeSet*>(tuning_tree_set);
  if (tree_set == nullptr || !tree_set->has_lsc()) {
    return tavik::InvalidArgumentError("zel_tuning_tree_set does not have lsc tuning tree.");
  }
  std::vector<google::protobuf::Any*> leaves;
  const tavik::Status found =
      FindMutableDynamicParams(tree_set->mutable_lsc()->mutable_dynamic_top_level(), &leaves);
  if (!found.ok()) return found;
  ZelSensorFactoryCalibrationData golden_data;
  if (!golden.calibration_data().UnpackTo(&golden_data)) {
    return tavik::InternalError("Failed to unpack golden factory calibration data.");
  }
  for (google::protobuf::Any* leaf : leaves) {
    LscDynamicParam param;
    if (!leaf->UnpackTo(&param)) {
      return tavik::InvalidArgumentError("Cannot unpack to lsc_dynamic_param.");
    }
    const tavik::Status calibrated = tavik::CalibrateLscTables(
        device->lsc_tables, golden_data.lsc(), param.mutable_lsc_tables());
    if (!calibrated.ok()) return calibrated;
    leaf->PackFrom(param);
  }
  return tavik::OkStatus();
}

}  // namespace vosbrine::zelmondrake
