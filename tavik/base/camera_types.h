// The camera service's description of a frame and of its sensor modules, as the tuning library
// reads them. Plain values; the service fills them.
#ifndef TAVIK_BASE_CAMERA_TYPES_H_
#define TAVIK_BASE_CAMERA_TYPES_H_

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "absl/hash/hash.h"

namespace tavik_api {

template <typename T>
struct GenericSize {
  T width = 0;
  T height = 0;

  friend bool operator==(const GenericSize&, const GenericSize&) = default;
};

// A point of a curve, as the service passes the application's tone curves.
template <typename T>
struct GenericPoint {
  T x = 0;
  T y = 0;

  friend bool operator==(const GenericPoint&, const GenericPoint&) = default;
};

template <typename T>
struct Range {
  T min = 0;
  T max = 0;

  friend bool operator==(const Range&, const Range&) = default;
};

// How a sensor module sits in the device.
struct SensorModuleSpec {
  int32_t facing = 0;       // 0 rear; 1, 2, 3 front
  int32_t lens_type = 0;    // 0 normal, 1 wide, 2 tele, 5 virtual
  int32_t sensor_kind = 0;  // 1 infrared

  friend bool operator==(const SensorModuleSpec&, const SensorModuleSpec&) = default;
  template <typename H>
  friend H AbslHashValue(H state, const SensorModuleSpec& module) {
    return H::combine(std::move(state), module.facing, module.lens_type, module.sensor_kind);
  }
};

// A module's factory lens-shading measurement, as read from its EEPROM.
struct LensShadingCalibrationData {
  int32_t width = 0;  // Size of the calibration grid.
  int32_t height = 0;
  std::vector<float> grid_gain_r;
  std::vector<float> grid_gain_gr;
  std::vector<float> grid_gain_gb;
  std::vector<float> grid_gain_b;
  int32_t full_width = 0;  // The full sensor area.
  int32_t full_height = 0;
  int32_t crop_width = 0;  // The area that the grid covers, and where it lies.
  int32_t crop_height = 0;
  int32_t crop_left = 0;
  int32_t crop_top = 0;
};

}  // namespace tavik_api

namespace tavik {

// What the frame is for. Polymorphic because the service extends it; the tuning library reads
// these fields only.
class UseCase {
 public:
  virtual ~UseCase() = default;

  int32_t type = 0;  // 0 and 5 viewfinder, 1 snapshot, 2 video viewfinder, 3 video recording,
                     // 4 video live shot
  bool torch = false;
  bool hdr = false;  // Not read by the use-case mapping, but a change refreshes tuning blocks.
  bool night = false;
  bool first_party = true;  // False for applications from outside the device maker.

  friend bool operator==(const UseCase& a, const UseCase& b) {
    return a.type == b.type && a.torch == b.torch && a.hdr == b.hdr && a.night == b.night &&
           a.first_party == b.first_party;
  }
};

struct TuningSensorModeInfo {
  std::string sensor_name;  // "IMX363"
  int32_t mode_width = 0;
  int32_t mode_height = 0;
  tavik_api::Range<float> sensor_fps_range;  // Range of the sensor mode.
  tavik_api::Range<float> target_fps_range;  // Range asked for.
  int32_t binning_x = 1;
  int32_t binning_y = 1;
};

// The crop of the frame in the sensor mode, in fractions of the mode's size.
struct NormalizedCrop {
  float left = 0.0f;
  float top = 0.0f;
  float width = 1.0f;
  float height = 1.0f;

  friend bool operator==(const NormalizedCrop&, const NormalizedCrop&) = default;
};

struct TuningInfo {
  TuningSensorModeInfo sensor_mode_info;
  NormalizedCrop normalized_crop;
  tavik_api::GenericSize<int> image_size;
  tavik_api::SensorModuleSpec module_spec;
  uint32_t bypass_bitmask = 0;  // One bit per block whose hardware the frame bypasses.
};

// The camera state of a frame: one value per kind of tuning level.
struct TuningCoordinates {
  float led_influence = 0.0f;
  float cct = 0.0f;
  float bv = 0.0f;
  float real_gain = 0.0f;
  float exp_ratio = 0.0f;
  float mired_cct = 0.0f;
  float scaler_ratio = 0.0f;
  float pre_scaler_ratio = 0.0f;
  int32_t frame_count = 0;
  float exposure_time_msecs = 0.0f;
};

// Colour filter of a sensor, in the service's numbering.
enum class ColorFilterArrangement : int32_t {
  kBggr = 0,
  kGbrg = 1,
  kGrbg = 2,
  kRggb = 3,
  kMono = 4,
  kNir = 5,
};

// "BGGR", "GBRG", "GRBG", "RGGB", "MONO", "NIR"; "UNKNOWN(<number>)" for any other value.
std::string ColorFilterArrangementToString(ColorFilterArrangement arrangement);

// A sensor module: its sensor's name and how it sits. Key of the service's calibration map.
struct TuningSensorKey {
  std::string sensor_name;
  tavik_api::SensorModuleSpec module_spec;

  friend bool operator==(const TuningSensorKey&, const TuningSensorKey&) = default;
  template <typename H>
  friend H AbslHashValue(H state, const TuningSensorKey& key) {
    return H::combine(std::move(state), key.sensor_name, key.module_spec);
  }
};

}  // namespace tavik

#endif  // TAVIK_BASE_CAMERA_TYPES_H_
