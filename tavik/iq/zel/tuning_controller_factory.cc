#include "tavik/iq/zel/tuning_controller_factory.h"

#include "tavik/base/file_path.h"
#include "tavik/base/logging.h"
#include "tavik/iq/zel/zel_tuning_controller.h"

namespace tavik {
namespace {

constexpr char kRedirectTuningBinaryProperty[] = "vendor.camera.debug.redirect_tuning_binary";

const std::vector<std::string>& DefaultTuningBinaryPaths() {
  static const auto* const paths =
      new std::vector<std::string>{"/apex/com.qarmont.varro.camera.hal/etc/lib64/camera/"};
  return *paths;
}

const std::vector<std::string>& RedirectTuningBinaryPaths() {
  static const auto* const paths = new std::vector<std::string>{"/data/vendor/camera/etc/"};
  return *paths;
}

}  // namespace

const std::vector<std::string>& TuningBinaryPaths() {
  // No merge of the two lists, and no fallback from one to the other.
  if (GetBooleanSystemProperty(kRedirectTuningBinaryProperty, false)) {
    TAVIK_LOG(INFO) << "Redirect Tuning Binary Paths to " << RedirectTuningBinaryPaths().front();
    return RedirectTuningBinaryPaths();
  }
  return DefaultTuningBinaryPaths();
}

StatusOr<std::shared_ptr<TuningController>> CreateTuningController(
    std::string_view device_name,
    const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>& calibration) {
  std::vector<std::string> paths;
  for (const std::string& path : TuningBinaryPaths()) paths.push_back(DevicePath(path));
  return std::shared_ptr<TuningController>(
      std::make_shared<ZelTuningController>(device_name, paths, calibration));
}

}  // namespace tavik
