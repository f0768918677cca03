#include "tavik/iq/zel/sensor_eeprom_data.h"

#include <cstdio>
#include <string>

#include "google/protobuf/text_format.h"
#include "tavik/base/file_path.h"
#include "tavik/base/logging.h"
#include "tavik/base/strings.h"
#include "tavik/iq/lsc_table_operations.h"
#include "tavik/iq/zel/zel_tuning_controller_util.h"

namespace tavik {
namespace {

// The tuning's shading grid.
constexpr int kTuningGridHeight = 25;
constexpr int kTuningGridWidth = 33;
constexpr char kDumpDirectory[] = "/data/vendor/camera";
constexpr int kWarningPeriodSeconds = 5;

vosbrine::LscTables ToLscTables(const tavik_api::LensShadingCalibrationData& data) {
  vosbrine::LscTables tables;
  tables.set_width(data.width);
  tables.set_height(data.height);
  tables.mutable_lsc_grid_gain_r()->Add(data.grid_gain_r.begin(), data.grid_gain_r.end());
  tables.mutable_lsc_grid_gain_gr()->Add(data.grid_gain_gr.begin(), data.grid_gain_gr.end());
  tables.mutable_lsc_grid_gain_gb()->Add(data.grid_gain_gb.begin(), data.grid_gain_gb.end());
  tables.mutable_lsc_grid_gain_b()->Add(data.grid_gain_b.begin(), data.grid_gain_b.end());
  return tables;
}

// Margins measured in integers, then carried as floats.
vosbrine::LscCropInfo ToCropInfo(const tavik_api::LensShadingCalibrationData& data) {
  vosbrine::LscCropInfo crop;
  crop.set_width(static_cast<float>(data.full_width));
  crop.set_height(static_cast<float>(data.full_height));
  crop.set_margin_left(static_cast<float>(data.crop_left));
  crop.set_margin_right(static_cast<float>(data.full_width - data.crop_left - data.crop_width));
  crop.set_margin_top(static_cast<float>(data.crop_top));
  crop.set_margin_bottom(static_cast<float>(data.full_height - data.crop_top - data.crop_height));
  return crop;
}

// Best effort: a dump that can't be written changes nothing else.
void DumpTables(vosbrine::CameraSensor sensor, const vosbrine::LscTables& calibration_lsc_tables,
                const vosbrine::LscTables& resized) {
  const std::string path =
      JoinPath(kDumpDirectory, StrCat(vosbrine::CameraSensor_Name(sensor), "_lsc_eeprom.txt"));
  TAVIK_LOG(INFO) << "Trying to dump " << path;
  FILE* file = std::fopen(DevicePath(path).c_str(), "w");
  if (file == nullptr) return;
  google::protobuf::TextFormat::Printer printer;
  printer.SetUseShortRepeatedPrimitives(true);
  std::string calibration_text;
  std::string resized_text;
  printer.PrintToString(calibration_lsc_tables, &calibration_text);
  printer.PrintToString(resized, &resized_text);
  std::fputs("# calibration_lsc_tables.\n", file);
  std::fputs(calibration_text.c_str(), file);
  std::fputs("\n", file);
  std::fputs("# resized_lsc_tables.\n", file);
  std::fputs(resized_text.c_str(), file);
  std::fputs("\n", file);
  std::fflush(file);
  std::fclose(file);
  TAVIK_LOG(INFO) << "Finished dumping: " << path;
}

}  // namespace

std::shared_ptr<vosbrine::SensorEepromDataMap> BuildTuningEepromData(
    std::string_view device_name,
    const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>& calibration,
    bool dump) {
  auto eeprom_data = std::make_shared<vosbrine::SensorEepromDataMap>();
  for (const auto& [key, data] : calibration) {
    const vosbrine::CameraSensor sensor =
        ConvertToCameraSensor(device_name, key.sensor_name, key.module_spec);
    if (sensor == vosbrine::INVALID_CAMERA_SENSOR) {
      TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds)
          << key.sensor_name << " is not supported.";
      continue;
    }
    const vosbrine::LscTables calibration_lsc_tables = ToLscTables(data);
    vosbrine::LscTables resized;
    if (!LscCropAndResize(ToCropInfo(data), kTuningGridHeight, kTuningGridWidth,
                          calibration_lsc_tables, &resized)
             .ok()) {
      TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds)
          << key.sensor_name << " lsc calibration data resize failed.";
      continue;
    }
    if (dump) DumpTables(sensor, calibration_lsc_tables, resized);
    eeprom_data->try_emplace(
        sensor, std::make_unique<vosbrine::zelmondrake::ZelSensorEepromData>(std::move(resized)));
  }
  if (eeprom_data->empty()) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds)
        << "BuildTuningEepromData: No eeprom data available";
    return nullptr;
  }
  return eeprom_data;
}

}  // namespace tavik
