// The gamma translator's own steps, not exported: visible so that its tests can pin their values.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_GAMMA_CURVES_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_GAMMA_CURVES_H_

#include "tavik/base/status.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/translators/tonemap.h"

namespace tavik::gamma_internal {

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
void SetDefaultTuning(vosbrine::zelmondrake::GammaTuning& tuning);

}  // namespace tavik::gamma_internal

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_GAMMA_CURVES_H_
