#include "tools/common/module_calibration_file.h"

#include "tavik/base/strings.h"
#include "tools/common/module_calibration.pb.h"
#include "tools/common/text_proto.h"

namespace tavik::tools {

StatusOr<ModuleCalibrationMap> ReadModuleCalibrationFile(const std::string& path) {
  ModuleCalibrationSet set;
  if (Status status = ParseTextProtoFile(path, set); !status.ok()) return status;

  ModuleCalibrationMap map;
  for (const ModuleCalibration& module : set.modules()) {
    TuningSensorKey key{module.sensor_name(),
                        {module.facing(), module.lens_type(), module.sensor_kind()}};
    tavik_api::LensShadingCalibrationData data;
    data.width = module.width();
    data.height = module.height();
    data.grid_gain_r.assign(module.grid_gain_r().begin(), module.grid_gain_r().end());
    data.grid_gain_gr.assign(module.grid_gain_gr().begin(), module.grid_gain_gr().end());
    data.grid_gain_gb.assign(module.grid_gain_gb().begin(), module.grid_gain_gb().end());
    data.grid_gain_b.assign(module.grid_gain_b().begin(), module.grid_gain_b().end());
    data.full_width = module.full_width();
    data.full_height = module.full_height();
    data.crop_width = module.crop_width();
    data.crop_height = module.crop_height();
    data.crop_left = module.crop_left();
    data.crop_top = module.crop_top();
    if (!map.try_emplace(std::move(key), std::move(data)).second) {
      return InvalidArgumentError(StrCat(path, ": two modules of sensor ", module.sensor_name(),
                                         " facing ", module.facing(), " lens_type ",
                                         module.lens_type()));
    }
  }
  return map;
}

}  // namespace tavik::tools
