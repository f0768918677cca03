#include "tavik/iq/zel/zel_tuning_controller_util.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "google/protobuf/generated_enum_reflection.h"
#include "tavik/base/logging.h"
#include "tavik/base/strings.h"

namespace tavik {
namespace {

// Warnings here can fire on every frame of a misconfigured session.
constexpr int kWarningPeriodSeconds = 5;

constexpr std::string_view kFennelmooreDevice = "fennelmoore";

template <typename Enum>
bool ParseEnumName(const google::protobuf::EnumDescriptor* type, const std::string& name,
                   Enum* value) {
  return google::protobuf::internal::ParseNamedEnum(type, name, value);
}

bool SameRange(const tavik_api::Range<float>& range, float min, float max) {
  return range.min == min && range.max == max;
}

// The candidate that fits in [lower, upper] with the least slack; (0, 0) when none fits.
tavik_api::Range<float> ClosestFrameRate(float lower, float upper) {
  tavik_api::Range<float> best{0.0f, 0.0f};
  float best_slack = 0.0f;
  bool found = false;
  for (const tavik_api::Range<float>& candidate : FrameRateCandidates()) {
    if (!(lower <= candidate.min && upper >= candidate.max)) continue;
    const float slack = (candidate.min - lower) + (upper - candidate.max);
    if (!found || slack < best_slack) {
      best = candidate;
      best_slack = slack;
      found = true;
    }
  }
  return best;
}

bool IsVideoSize(tavik_api::GenericSize<int> size) {
  const auto& sizes = VideoSizes();
  return std::find(sizes.begin(), sizes.end(), size) != sizes.end();
}

}  // namespace

const std::vector<tavik_api::Range<float>>& FrameRateCandidates() {
  static const auto* const candidates = new std::vector<tavik_api::Range<float>>{
      {15, 15}, {15, 30}, {30, 30}, {30, 60}, {60, 60}, {90, 90}, {120, 120}, {240, 240}};
  return *candidates;
}

const std::vector<tavik_api::GenericSize<int>>& VideoSizes() {
  // (640, 480) stands twice; the second row changes nothing.
  static const auto* const sizes = new std::vector<tavik_api::GenericSize<int>>{
      {1920, 1080}, {1920, 1088}, {3840, 2160}, {2048, 1080}, {720, 480},
      {640, 480},   {704, 480},   {4096, 2160}, {1280, 720},  {352, 288},
      {176, 144},   {2560, 1440}, {320, 240},   {640, 480}};
  return *sizes;
}

vosbrine::CameraSensor ConvertToCameraSensor(std::string_view device_name,
                                             std::string_view sensor_name,
                                             const tavik_api::SensorModuleSpec& module_spec) {
  if (module_spec.facing < 0 || module_spec.facing > 3) return vosbrine::INVALID_CAMERA_SENSOR;
  const char* facing = module_spec.facing == 0 ? "REAR" : "FRONT";

  const char* kind = nullptr;
  if (module_spec.sensor_kind == 1) {
    kind = "IR";
  } else {
    switch (module_spec.lens_type) {
      case 0: kind = "NORMAL"; break;
      case 1: kind = "WIDE"; break;
      case 2: kind = "TELE"; break;
      case 5: kind = "VIRTUAL"; break;
      default: return vosbrine::INVALID_CAMERA_SENSOR;
    }
  }

  const char* prefix = device_name == kFennelmooreDevice ? "FENNELMOORE_" : "BRIMAL_";
  const std::string name = StrCat(prefix, facing, "_", sensor_name, "_", kind);
  vosbrine::CameraSensor sensor = vosbrine::INVALID_CAMERA_SENSOR;
  if (!ParseEnumName(vosbrine::CameraSensor_descriptor(), name, &sensor)) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "INVALID_CAMERA_SENSOR: " << name;
    return vosbrine::INVALID_CAMERA_SENSOR;
  }
  return sensor;
}

vosbrine::SensorMode ConvertToSensorMode(const TuningSensorModeInfo& info,
                                         tavik_api::GenericSize<int> image_size,
                                         const UseCase& use_case) {
  if (image_size.height == 0 || info.mode_height == 0) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "Image height cannot be 0.";
    return vosbrine::INVALID_SENSOR_MODE;
  }

  const char* binning = nullptr;
  if (info.binning_x == 2 && info.binning_y == 2) {
    binning = "BINNING2X2";
  } else if (info.binning_x == 1 && info.binning_y == 1) {
    binning = "FULL";
  } else {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "Unsupported binning_factor.";
    return vosbrine::INVALID_SENSOR_MODE;
  }

  const tavik_api::Range<float>& target = info.target_fps_range;
  const float upper = target.max;
  const float lower = info.sensor_fps_range.min > target.min ? target.max : target.min;
  const tavik_api::Range<float> rate = ClosestFrameRate(lower, upper);

  std::string aspect, resolution, frame_rate;
  if (use_case.type >= 2 && IsVideoSize(image_size)) {
    aspect = "16_9";
    if (SameRange(rate, 30, 60)) {
      resolution = "1080P";
      frame_rate = "30_60FPS";
    } else if (SameRange(rate, 90, 90) || SameRange(rate, 120, 120) ||
               SameRange(rate, 240, 240)) {
      resolution = "1080P";
      frame_rate = StrCat(rate.max, "FPS");
    } else {
      resolution = image_size.height <= 720 ? "720P" : image_size.height <= 1088 ? "1080P" : "2160P";
      frame_rate = StrCat(rate.max, "FPS");
    }
  } else {
    resolution = "FULL";
    const float ratio =
        static_cast<float>(image_size.height) / static_cast<float>(image_size.width);
    if (std::fabs(ratio - 0.5625f) < std::fabs(ratio - 0.75f)) {
      aspect = "16_9";
      if (SameRange(rate, 15, 15) || SameRange(rate, 30, 30) || SameRange(rate, 60, 60)) {
        frame_rate = StrCat(rate.max, "FPS");
      } else {
        frame_rate = rate.max == 30.0f ? "15_30FPS" : "30_60FPS";
      }
    } else {
      aspect = "4_3";
      frame_rate = "15_30FPS";
    }
  }

  const std::string name = StrCat(binning, "_", aspect, "_", resolution, "_", frame_rate);
  vosbrine::SensorMode mode = vosbrine::INVALID_SENSOR_MODE;
  if (!ParseEnumName(vosbrine::SensorMode_descriptor(), name, &mode)) {
    TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "INVALID_SENSOR_MODE: " << name;
    return vosbrine::INVALID_SENSOR_MODE;
  }
  return mode;
}

vosbrine::CameraUsecase ConvertToCameraUseCase(const UseCase& use_case) {
  using vosbrine::CameraUsecase;
  struct Row {
    CameraUsecase first_party, first_party_torch, third_party, third_party_torch;
  };
  Row row;
  switch (use_case.type) {
    case 0:
    case 5:
      // A night viewfinder is one use case, torch or not.
      if (use_case.night) {
        return use_case.first_party ? vosbrine::VIEWFINDER_NOCTARELLE
                                    : vosbrine::VIEWFINDER_NOCTARELLE_3P;
      }
      row = {vosbrine::VIEWFINDER, vosbrine::VIEWFINDER_TORCH, vosbrine::VIEWFINDER_3P,
             vosbrine::VIEWFINDER_TORCH_3P};
      break;
    case 1:
      row = {vosbrine::SNAPSHOT, vosbrine::SNAPSHOT_TORCH, vosbrine::SNAPSHOT_3P,
             vosbrine::SNAPSHOT_TORCH_3P};
      break;
    case 2:
      row = {vosbrine::VIDEO_VIEWFINDER, vosbrine::VIDEO_VIEWFINDER_TORCH,
             vosbrine::VIDEO_VIEWFINDER_3P, vosbrine::VIDEO_VIEWFINDER_TORCH_3P};
      break;
    case 3:
      row = {vosbrine::VIDEO_RECORDING, vosbrine::VIDEO_RECORDING_TORCH,
             vosbrine::VIDEO_RECORDING_3P, vosbrine::VIDEO_RECORDING_TORCH_3P};
      break;
    case 4:
      row = {vosbrine::VIDEO_LIVESHOT, vosbrine::VIDEO_LIVESHOT_TORCH, vosbrine::VIDEO_LIVESHOT_3P,
             vosbrine::VIDEO_LIVESHOT_TORCH_3P};
      break;
    default:
      TAVIK_LOG_EVERY_N_SEC(WARNING, kWarningPeriodSeconds) << "INVALID_CAMERA_USECASE.";
      return vosbrine::INVALID_CAMERA_USECASE;
  }
  if (use_case.first_party) return use_case.torch ? row.first_party_torch : row.first_party;
  return use_case.torch ? row.third_party_torch : row.third_party;
}

vosbrine::CameraState ConvertToCameraState(const ZelTuningPoint& point) {
  const TuningCoordinates& from = point.tuning_coordinates;
  vosbrine::CameraState state;
  vosbrine::LevelCoordinates* to = state.mutable_level_coordinates();
  to->set_led_influence(from.led_influence);
  to->set_cct(from.cct);
  to->set_bv(from.bv);
  to->set_real_gain(from.real_gain);
  to->set_exp_ratio(from.exp_ratio);
  to->set_mired_cct(from.mired_cct);
  to->set_scaler_ratio(from.scaler_ratio);
  to->set_pre_scaler_ratio(from.pre_scaler_ratio);
  to->set_frame_count(static_cast<float>(from.frame_count));
  to->set_exposure_time_msecs(from.exposure_time_msecs);
  return state;
}

StatusOr<vosbrine::BayerPattern> ConvertToBayerPattern(ColorFilterArrangement arrangement) {
  switch (arrangement) {
    case ColorFilterArrangement::kBggr:
      return vosbrine::BGGR;
    case ColorFilterArrangement::kGbrg:
      return vosbrine::GBRG;
    case ColorFilterArrangement::kGrbg:
      return vosbrine::GRBG;
    case ColorFilterArrangement::kRggb:
      return vosbrine::RGGB;
    default:
      return InvalidArgumentError(StrCat("Color filter arrangement (",
                                         ColorFilterArrangementToString(arrangement),
                                         ") not convertible to Bayer pattern"));
  }
}

}  // namespace tavik
