// Reads a device's module calibration (protobuf text of tavik.tools.ModuleCalibrationSet) into
// the map that the camera service hands the tuning controller.
#ifndef TOOLS_COMMON_MODULE_CALIBRATION_FILE_H_
#define TOOLS_COMMON_MODULE_CALIBRATION_FILE_H_

#include <string>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"

namespace tavik::tools {

using ModuleCalibrationMap = FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>;

// Fails with the file's name and the parser's line and column on bad text, and when two modules
// have one key.
StatusOr<ModuleCalibrationMap> ReadModuleCalibrationFile(const std::string& path);

}  // namespace tavik::tools

#endif  // TOOLS_COMMON_MODULE_CALIBRATION_FILE_H_
