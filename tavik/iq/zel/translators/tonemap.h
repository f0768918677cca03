// The camera service's tone-curve request of a frame, as the tone translators read it: who rules
// the curve (the application or the tuning) and the application's curve.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_TONEMAP_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_TONEMAP_H_

#include <cstdint>
#include <utility>
#include <vector>

#include "tavik/base/camera_types.h"

namespace tavik {

// Who rules the frame's tone curve, in the camera service's numbering. Only the application's
// curve (0) is told apart here: any other value lets the tuning rule.
enum class TonemapMode : int32_t {
  kContrastCurve = 0,
  kHighQuality = 2,
};

// A tone curve per colour channel, as points (x, y) in 0..1.
struct TonemapCurve {
  using Points = std::vector<tavik_api::GenericPoint<float>>;

  TonemapCurve() = default;
  TonemapCurve(const TonemapCurve&) = default;
  TonemapCurve& operator=(const TonemapCurve&) = default;
  // A moved-from curve is empty, not merely valid: the service reuses it as a fresh curve.
  TonemapCurve(TonemapCurve&& other) noexcept
      : red(std::exchange(other.red, {})),
        green(std::exchange(other.green, {})),
        blue(std::exchange(other.blue, {})) {}
  // Releases this curve's points and takes the other's, which is left empty.
  TonemapCurve& operator=(TonemapCurve&& other) noexcept {
    if (this != &other) {
      red = std::exchange(other.red, {});
      green = std::exchange(other.green, {});
      blue = std::exchange(other.blue, {});
    }
    return *this;
  }
  ~TonemapCurve() = default;

  Points red;
  Points green;
  Points blue;
};

// The frame's tone-curve request. `curve` is read only when `mode` is kContrastCurve.
struct Tonemap {
  TonemapMode mode = TonemapMode::kContrastCurve;
  TonemapCurve curve;
};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_TONEMAP_H_
