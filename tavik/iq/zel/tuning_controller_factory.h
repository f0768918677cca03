// The camera service's entry point: one tuning controller per device, on the device's tuning
// files.
#ifndef TAVIK_IQ_ZEL_TUNING_CONTROLLER_FACTORY_H_
#define TAVIK_IQ_ZEL_TUNING_CONTROLLER_FACTORY_H_

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"
#include "tavik/base/tuning_controller.h"
#include "tavik/iq/export.h"

namespace tavik {

// Where the device keeps its tuning files: "/apex/com.qarmont.varro.camera.hal/etc/lib64/camera/",
// or "/data/vendor/camera/etc/" when "vendor.camera.debug.redirect_tuning_binary" is true. Never
// fails: a controller whose tuning did not load is handed out, and answers "Invalid provider".
TAVIK_EXPORT StatusOr<std::shared_ptr<TuningController>> CreateTuningController(
    std::string_view device_name,
    const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>& calibration);

// The tuning directories the factory would use now, as device paths (before the device-root
// mapping of the platform).
TAVIK_EXPORT const std::vector<std::string>& TuningBinaryPaths();

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TUNING_CONTROLLER_FACTORY_H_
