// Register images of the G3AA gamma stage: its configuration register and its table.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_G3AA_GAMMA_REGISTERS_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_G3AA_GAMMA_REGISTERS_H_

#include <cstddef>
#include <cstdint>

#include "tavik/iq/zel/translators/record_description.h"

namespace tavik_registers::zel::g3aa_generic {

// The G3AA gamma stage's configuration register.
struct GammaConfigValue {
  uint32_t enable : 8;  // The whole first byte: 1 runs the stage, 0 passes pixels through.
  uint32_t : 24;
};
static_assert(sizeof(GammaConfigValue) == 4);
TAVIK_DESCRIBE_RECORD(GammaConfigValue, 32, TAVIK_FIELD(enable));

}  // namespace tavik_registers::zel::g3aa_generic

namespace tavik_registers::zel::g3aa {

// The G3AA gamma stage's table: the green curve at the stage's 81 fixed knots, Q15 (0..32767),
// then 15 unused slots that are kept at zero.
struct GammaLutValue {
  uint16_t gamma_lut_values[96];
};
static_assert(sizeof(GammaLutValue) == 192);
static_assert(offsetof(GammaLutValue, gamma_lut_values) == 0);
TAVIK_DESCRIBE_RECORD(GammaLutValue, 32, TAVIK_TABLE(gamma_lut_values, 16));

}  // namespace tavik_registers::zel::g3aa

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_G3AA_GAMMA_REGISTERS_H_
