// Register images of the G3AA black-level and digital-gain stages: two 64-bit words each, bit 0 of
// the first word being the stage's enable flag. Shared by the black-level and the digital-gain
// translators, which both write the gain register.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_G3AA_BLC_REGISTERS_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_G3AA_BLC_REGISTERS_H_

#include <cstdint>
#include <type_traits>

#include "tavik/iq/zel/translators/record_description.h"

namespace tavik_registers::zel::g3aa {

// Offsets per colour, unsigned, in the stage's 15-bit sample domain. `offset_b` straddles the two
// words: its low 13 bits end word 0, its high 3 bits start word 1.
struct BlcConfigValue {
  // Word 0.
  uint64_t enable : 1;
  uint64_t pixel_order : 2;
  uint64_t offset_r : 16;
  uint64_t offset_gr : 16;
  uint64_t offset_gb : 16;
  uint64_t offset_b_lo : 13;
  // Word 1.
  uint64_t offset_b_hi : 3;
  uint64_t : 61;

  TAVIK_SPLIT_FIELD_ACCESSORS(uint32_t, OffsetB, SetOffsetB, offset_b)
};
static_assert(sizeof(BlcConfigValue) == 16);
TAVIK_DESCRIBE_RECORD(BlcConfigValue, 64, TAVIK_FIELD(enable), TAVIK_FIELD(pixel_order),
                      TAVIK_FIELD(offset_r), TAVIK_FIELD(offset_gr), TAVIK_FIELD(offset_gb),
                      TAVIK_SPLIT_FIELD(offset_b));

// Gains per colour, unsigned Q8.16. `gain_gb` straddles the two words: its low 13 bits end word 0,
// its high 11 bits start word 1. Bits 35-63 of word 1 belong to other uses and are left as found.
struct DgConfigValue {
  // Word 0.
  uint64_t enable : 1;
  uint64_t pixel_order : 2;
  uint64_t gain_r : 24;
  uint64_t gain_gr : 24;
  uint64_t gain_gb_lo : 13;
  // Word 1.
  uint64_t gain_gb_hi : 11;
  uint64_t gain_b : 24;
  uint64_t : 29;

  TAVIK_SPLIT_FIELD_ACCESSORS(uint32_t, GainGb, SetGainGb, gain_gb)
};
static_assert(sizeof(DgConfigValue) == 16);
TAVIK_DESCRIBE_RECORD(DgConfigValue, 64, TAVIK_FIELD(enable), TAVIK_FIELD(pixel_order),
                      TAVIK_FIELD(gain_r), TAVIK_FIELD(gain_gr), TAVIK_SPLIT_FIELD(gain_gb),
                      TAVIK_FIELD(gain_b));

}  // namespace tavik_registers::zel::g3aa

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_G3AA_BLC_REGISTERS_H_
