#include "tools/tavik-tune/forest.h"

#include "google/protobuf/message.h"
#include "tavik/base/strings.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/sensor_eeprom_data.h"
#include "tools/common/module_calibration_file.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {

StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> LoadForest(
    const ForestSource& source) {
  // Only read during the load: the provider keeps calibrated trees, not the device's tables.
  std::shared_ptr<vosbrine::SensorEepromDataMap> eeprom_data;
  if (!source.calibration_path.empty()) {
    StatusOr<tools::ModuleCalibrationMap> calibration =
        tools::ReadModuleCalibrationFile(source.calibration_path);
    if (!calibration.ok()) return calibration.status();
    eeprom_data = BuildTuningEepromData(source.device_name, *calibration, /*dump=*/false);
    if (eeprom_data == nullptr) {
      return InvalidArgumentError(
          StrCat(source.calibration_path, ": no module of a known sensor with a usable grid"));
    }
  }
  // Directories expanded here, in the runtime's order, so that "." and ".." don't show up as
  // rejected files.
  return vosbrine::zelmondrake::TuningProvider::Create(ExpandPaths(source.paths),
                                                       eeprom_data.get());
}

std::string ResolvedUsecaseKey(const vosbrine::zelmondrake::TuningProvider& provider,
                               const vosbrine::TuningUsecase& usecase) {
  const google::protobuf::Message* tree_set = provider.GetTuningTreeSet(usecase, /*fallback=*/true);
  for (const auto& [key, message] : provider.forest()) {
    if (message.get() == tree_set) return key;
  }
  return "";
}

std::unique_ptr<google::protobuf::Message> NewBlockMessage(
    const google::protobuf::Descriptor* type) {
  return std::unique_ptr<google::protobuf::Message>(
      google::protobuf::MessageFactory::generated_factory()->GetPrototype(type)->New());
}

Status FillBlock(const vosbrine::zelmondrake::TuningProvider& provider,
                 const vosbrine::TuningUsecase& usecase, const vosbrine::CameraState& state,
                 google::protobuf::Message& block) {
  block.Clear();
  return provider.FillSubBlockTuning(usecase, state, &block, /*fallback=*/true,
                                     /*bypassed=*/false);
}

}  // namespace tavik::tune
