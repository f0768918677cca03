// Sharp: the local-contrast controls of the ITP sharpener (threshold, power and suppression),
// with the pixel order. The steppings A0 and B0 translate alike and differ in one fixed bit.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_SHARP_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_SHARP_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// The sharpener's values. lc_fixed_a and lc_fixed_b are settings of the stage that no tuning
// drives; the *_spare fields are cleared by the translation.
struct SharpItpOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable_low_power : 1;
  uint32_t : 31;
  // Word 2. The power (0..63) and threshold (0..1023) codes.
  uint32_t lc_power_spare_low : 1;
  uint32_t lc_power : 6;
  uint32_t lc_power_spare_high : 1;
  uint32_t lc_fixed_a : 13;
  uint32_t lc_threshold : 10;
  uint32_t : 1;
  // Word 3. The suppression code runs from 255 (none) down to -255, in 9-bit two's complement.
  uint32_t lc_fixed_b : 10;
  uint32_t lc_suppression : 9;
  uint32_t lc_suppression_spare : 11;
  uint32_t : 2;
  // Word 4.
  uint32_t pixel_order : 2;
  uint32_t : 30;
};
static_assert(sizeof(SharpItpOutput) == 20);
TAVIK_DESCRIBE_RECORD(SharpItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable_low_power),
                      TAVIK_FIELD(lc_power_spare_low), TAVIK_FIELD(lc_power),
                      TAVIK_FIELD(lc_power_spare_high), TAVIK_FIELD(lc_fixed_a),
                      TAVIK_FIELD(lc_threshold), TAVIK_FIELD(lc_fixed_b),
                      TAVIK_FIELD(lc_suppression), TAVIK_FIELD(lc_suppression_spare),
                      TAVIK_FIELD(pixel_order));

// Settings of the sharpener that no tuning drives, told by value word by word and written by the
// GetDefault forms alone. Bit 0 of word 6 is stepping A0's.
struct SharpItpFixedOutput {
  uint32_t words[10];
};
static_assert(sizeof(SharpItpFixedOutput) == 40);
TAVIK_DESCRIBE_RECORD(SharpItpFixedOutput, 32, TAVIK_TABLE(words, 32));

// Stepping A0. Fails on a block of another type and a tuning without dynamic or static part,
// writing nothing.
TAVIK_EXPORT Status TranslateSharp(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                                   SharpItpOutput& output);
// Stepping B0: the same translation.
TAVIK_EXPORT Status TranslateSharpB0(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                                     SharpItpOutput& output);

// The values of the default tuning on RGGB, and the fixed words of each stepping.
TAVIK_EXPORT Status GetDefaultSharp(SharpItpOutput& output, SharpItpFixedOutput& fixed);
TAVIK_EXPORT Status GetDefaultSharpB0(SharpItpOutput& output, SharpItpFixedOutput& fixed);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kSharp;
extern const TranslatorForm kSharpB0;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_SHARP_ONLINE_TRANSLATOR_H_
