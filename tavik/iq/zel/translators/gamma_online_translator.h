// Gamma: the tone curve of a frame, from the tuning or from the application's contrast curve,
// turned into the lookup tables of two stages: the ITP gamma block (a knot table and three colour
// tables, Q14) and the G3AA gamma block (one table on 81 fixed knots, Q15).
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/translators/g3aa_gamma_registers.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/tonemap.h"

namespace tavik {

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
TAVIK_DESCRIBE_RECORD(GammaItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(gamma_r_last_negative),
                      TAVIK_FIELD(gamma_g_last_negative), TAVIK_FIELD(gamma_b_last_negative),
                      TAVIK_TABLE(gamma_x, 16), TAVIK_FIELD(gamma_x_last_step),
                      TAVIK_TABLE(gamma_r, 16), TAVIK_FIELD(gamma_r_last_step),
                      TAVIK_TABLE(gamma_g, 16), TAVIK_FIELD(gamma_g_last_step),
                      TAVIK_TABLE(gamma_b, 16), TAVIK_FIELD(gamma_b_last_step));

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
TAVIK_DESCRIBE_RECORD(GammaItpFixedOutput, 32, TAVIK_FIELD(flag), TAVIK_FIELD(value_0),
                      TAVIK_FIELD(value_1));

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

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kGammaItp;
extern const TranslatorForm kGammaG3aa;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_GAMMA_ONLINE_TRANSLATOR_H_
