// Nfltr: the noise filter of the ITP block, ahead of the noise mix. Its tuning carries no values;
// the stage needs only the inverse of the frame's white-balance gains, to weigh each colour's
// noise as it was before the gains, and the pixel order.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_NFLTR_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_NFLTR_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/nfltr_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/white_balance_config.h"

namespace tavik {

// Frame facts of the noise filter.
struct NfltrInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  const tavik_api::WhiteBalanceConfig* wb = nullptr;
};

// The noise filter's values. The inverse gains are Q5, masked to 6 bits.
struct NfltrItpOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Words 1 to 3.
  uint32_t inverse_wb_r : 6;
  uint32_t : 26;
  uint32_t inverse_wb_g : 6;
  uint32_t : 26;
  uint32_t inverse_wb_b : 6;
  uint32_t : 26;
  // Word 4.
  uint32_t pixel_order : 2;
  uint32_t : 30;
};
static_assert(sizeof(NfltrItpOutput) == 20);
TAVIK_DESCRIBE_RECORD(NfltrItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(inverse_wb_r),
                      TAVIK_FIELD(inverse_wb_g), TAVIK_FIELD(inverse_wb_b),
                      TAVIK_FIELD(pixel_order));

// Settings of the noise filter that no tuning drives, told by value word by word and written by
// GetDefaultNfltr alone.
struct NfltrItpFixedOutput {
  uint32_t words[8];
};
static_assert(sizeof(NfltrItpFixedOutput) == 32);
TAVIK_DESCRIBE_RECORD(NfltrItpFixedOutput, 32, TAVIK_TABLE(words, 32));

// Fails on a block of another type, a tuning without dynamic or static part, and a missing white
// balance, writing nothing. A gain of 0 is the caller's error: its inverse is written as 0.
TAVIK_EXPORT Status TranslateNfltr(const TuningBlock& block, const NfltrInput& input,
                                   NfltrItpOutput& output);

// Safe values written from constants (inverse gains 30, 32 and 18 on RGGB, not bypassed) and the
// fixed words.
TAVIK_EXPORT Status GetDefaultNfltr(NfltrItpOutput& output, NfltrItpFixedOutput& fixed);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kNfltr;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_NFLTR_ONLINE_TRANSLATOR_H_
