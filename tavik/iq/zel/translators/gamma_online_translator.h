// Gamma: the tone curve of a frame, from the tuning or from the application's contrast curve,
// turned into the lookup tables of two stages: the ITP gamma block (a knot table and three colour
// tables, Q14) and the G3AA gamma block (one table on 81 fixed knots, Q15).
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"

namespace tavik_registers::zel::g3aa_generic {

// The G3AA gamma stage's configuration register.
struct GammaConfigValue {
  uint32_t enable : 8;  // The whole first byte: 1 runs the stage, 0 passes pixels through.
  uint32_t : 24;
};
static_assert(sizeof(GammaConfigValue) == 4);

}  // namespace tavik_registers::zel::g3aa_generic

namespace tavik_registers::zel::g3aa {

// The G3AA gamma stage's table: the green curve at the stage's 81 fixed knots, Q15 (0..32767),
// then 15 unused slots that are kept at zero.
struct GammaLutValue {
  uint16_t gamma_lut_values[96];
};
static_assert(sizeof(GammaLutValue) == 192);
static_assert(offsetof(GammaLutValue, gamma_lut_values) == 0);

}  // namespace tavik_registers::zel::g3aa

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

// The ITP gamma block. Each table has 65 slots: 64 curve points, then the size of the step from
// point 63 to point 64 (a magnitude; the colour steps' signs stand in the *_last_negative bits).
struct GammaItpOutput {
  uint32_t bypass : 1;
  uint32_t : 31;
  uint32_t gamma_r_last_negative : 1;
  uint32_t : 31;
  uint32_t gamma_g_last_negative : 1;
  uint32_t : 31;
  uint32_t gamma_b_last_negative : 1;
  uint32_t : 31;
  uint16_t gamma_x[64];  // Knot positions, Q14, 0..16384.
  uint16_t gamma_x_last_step;
  uint16_t gamma_r[64];  // Curve values, Q14, 0..16384.
  uint16_t gamma_r_last_step;
  uint16_t gamma_g[64];
  uint16_t gamma_g_last_step;
  uint16_t gamma_b[64];
  uint16_t gamma_b_last_step;
};
static_assert(sizeof(GammaItpOutput) == 536);
static_assert(offsetof(GammaItpOutput, gamma_x) == 16);
static_assert(offsetof(GammaItpOutput, gamma_x_last_step) == 144);
static_assert(offsetof(GammaItpOutput, gamma_r) == 146);
static_assert(offsetof(GammaItpOutput, gamma_r_last_step) == 274);
static_assert(offsetof(GammaItpOutput, gamma_g) == 276);
static_assert(offsetof(GammaItpOutput, gamma_g_last_step) == 404);
static_assert(offsetof(GammaItpOutput, gamma_b) == 406);
static_assert(offsetof(GammaItpOutput, gamma_b_last_step) == 534);

// Settings of the ITP gamma block that no tuning drives: a flag, then two 15-bit values, each in
// a 16-bit slot whose top bit belongs to someone else. The defaults clear all three.
struct GammaItpFixedOutput {
  uint32_t flag : 1;
  uint32_t : 31;
  uint16_t value_0 : 15;
  uint16_t : 1;
  uint16_t value_1 : 15;
  uint16_t : 1;
};
static_assert(sizeof(GammaItpFixedOutput) == 8);

// The ITP form. With the tuning ruling, reads the block's GammaTuning (65 knots) and hands back in
// `curve` the tuning's curve resampled at 64 points; with the application's curve, builds the
// tables from `tonemap.curve` and hands that curve back. `curve` may be `tonemap.curve` itself.
TAVIK_EXPORT Status TranslateGamma(const TuningBlock& block, const Tonemap& tonemap,
                                   GammaItpOutput& output, TonemapCurve& curve);

// The G3AA form: the enable byte, and, when enabled, the green curve at the stage's knots.
TAVIK_EXPORT Status TranslateGamma(const TuningBlock& block, const Tonemap& tonemap,
                                   tavik_registers::zel::g3aa_generic::GammaConfigValue& config,
                                   tavik_registers::zel::g3aa::GammaLutValue& lut);

// The tables of the default tuning, a pure power curve of exponent 1/2.2; also clears the fixed
// record's fields.
TAVIK_EXPORT Status GetDefaultGamma(GammaItpOutput& output, GammaItpFixedOutput& fixed);

TAVIK_EXPORT Status GetDefaultGamma(tavik_registers::zel::g3aa_generic::GammaConfigValue& config,
                                    tavik_registers::zel::g3aa::GammaLutValue& lut);

// The unit's own steps, not exported; visible so that tests can pin their values.
namespace gamma_internal {

inline constexpr int kG3aaGammaKnotCount = 81;

// The G3AA stage's knot abscissae: steps of 1/256 to 0.125, 1/128 to 0.25, 1/64 to 0.5 and 1/32
// to 1.0, each as stored, rounded to six decimals (0.003906, not 1/256).
extern const float kG3aaGammaKnots[kG3aaGammaKnotCount];

// A whole tuning sampled from the application's curve: enabled, 65 knots at i/65.
StatusOr<vosbrine::zelmondrake::GammaTuning> GenerateTuningParams(const TonemapCurve& curve);

// The tuning's curve at `sample_count` points evenly spread over 0..1, the last at exactly 1.0.
StatusOr<TonemapCurve> ResampleTonemap(const vosbrine::zelmondrake::GammaTuning& tuning,
                                       int sample_count);

// Enabled; 65 knots at i/64; every channel (i/64)^(1/2.2) rounded to six decimals.
void SetDefaultTuning(vosbrine::zelmondrake::GammaTuning* tuning);

}  // namespace gamma_internal
}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_
