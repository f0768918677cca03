// Prc: a colour corrector of twenty regions in hue, saturation and value. Each region has outer
// bounds, inner distances (told to the stage as shift counts) and a shift vector.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_PRC_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_PRC_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/prc_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/tonemap.h"

namespace tavik_registers::zel::itp {

// The ITP Prc stage's configuration register: settings that no tuning drives, written by
// GetDefaultPrc alone (zero); their meaning is the stage's own.
struct PrcConfigurationValue {
  uint32_t settings;
};
static_assert(sizeof(PrcConfigurationValue) == 4);
TAVIK_DESCRIBE_RECORD(PrcConfigurationValue, 32, TAVIK_FIELD(settings));

}  // namespace tavik_registers::zel::itp

namespace tavik {

inline constexpr int kPrcRegions = 20;

// The stage's values: the bypass word, then fifteen tables of one code per region, in the order
// of the tuning's lists. Hues are in 49151ths of a turn (high bounds offset by 2, so that a
// region's upper bound stays above its lower one), saturations and values in 16381ths (likewise),
// inner distances as shift counts 0..15, shift vectors as signed codes.
struct PrcOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  uint16_t outer_hue_low[kPrcRegions];   // 0..49151.
  uint16_t outer_hue_high[kPrcRegions];  // 2..49153.
  uint16_t outer_sat_low[kPrcRegions];   // 0..16381.
  uint16_t outer_sat_high[kPrcRegions];  // 2..16383.
  uint16_t outer_val_low[kPrcRegions];
  uint16_t outer_val_high[kPrcRegions];
  uint16_t inner_distance_hue_low[kPrcRegions];  // 0..15.
  uint16_t inner_distance_hue_high[kPrcRegions];
  uint16_t inner_distance_sat_low[kPrcRegions];
  uint16_t inner_distance_sat_high[kPrcRegions];
  uint16_t inner_distance_val_low[kPrcRegions];
  uint16_t inner_distance_val_high[kPrcRegions];
  int16_t shift_vector_hue[kPrcRegions];  // -24575..24575.
  int16_t shift_vector_sat[kPrcRegions];  // -8191..8191.
  int16_t shift_vector_val[kPrcRegions];
};
static_assert(sizeof(PrcOutput) == 4 + 15 * 40);
static_assert(offsetof(PrcOutput, outer_hue_low) == 2 * 2);
static_assert(offsetof(PrcOutput, inner_distance_hue_low) == 4 + 6 * 40);
static_assert(offsetof(PrcOutput, shift_vector_hue) == 4 + 12 * 40);
static_assert(offsetof(PrcOutput, shift_vector_val) == 4 + 14 * 40);
TAVIK_DESCRIBE_RECORD(PrcOutput, 32, TAVIK_FIELD(bypass), TAVIK_TABLE(outer_hue_low, 16),
                      TAVIK_TABLE(outer_hue_high, 16), TAVIK_TABLE(outer_sat_low, 14),
                      TAVIK_TABLE(outer_sat_high, 14), TAVIK_TABLE(outer_val_low, 14),
                      TAVIK_TABLE(outer_val_high, 14), TAVIK_TABLE(inner_distance_hue_low, 4),
                      TAVIK_TABLE(inner_distance_hue_high, 4),
                      TAVIK_TABLE(inner_distance_sat_low, 4),
                      TAVIK_TABLE(inner_distance_sat_high, 4),
                      TAVIK_TABLE(inner_distance_val_low, 4),
                      TAVIK_TABLE(inner_distance_val_high, 4), TAVIK_TABLE(shift_vector_hue, 16),
                      TAVIK_TABLE(shift_vector_sat, 16), TAVIK_TABLE(shift_vector_val, 16));

// With the application's tone curve (`tonemap_mode` 0) the stage is bypassed and the block not
// read. Otherwise fails on an empty tuning ("Invalid TuningBlock!", then region info, then static
// info) and on a list of fewer than 20 values ("<list> size is wrong: <count>"), before anything
// is written; of a longer list the first 20 values are read.
TAVIK_EXPORT Status TranslatePrc(const TuningBlock& block, PrcOutput& output,
                                 TonemapMode tonemap_mode);

// A disabled tuning of all-zero regions, translated with the tuning ruling the tone curve, and the
// configuration register's constant settings. Refuses a null register first.
TAVIK_EXPORT Status GetDefaultPrc(PrcOutput& output,
                                  tavik_registers::zel::itp::PrcConfigurationValue* config);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kPrc;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_PRC_ONLINE_TRANSLATOR_H_
