// Disparity: the green-imbalance stage, which corrects the small difference between the two green
// samples of a Bayer quad. The IPP stage takes thresholds and slopes; the G3AA stage turns the
// low slope limit and the low threshold into a 65-entry table that rises linearly.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_DISPARITY_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_DISPARITY_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/disparity_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik_registers::zel::g3aa_generic {

// The G3AA green-imbalance stage's configuration register.
struct GreenImbalanceConfigValue {
  // Word 0.
  uint32_t enable : 1;
  uint32_t pixel_order : 2;  // The G3AA code of the Bayer pattern.
  uint32_t : 29;
  // Word 1. Half the frame's size, per side.
  uint32_t half_height : 16;
  uint32_t half_width : 16;
};
static_assert(sizeof(GreenImbalanceConfigValue) == 8);
TAVIK_DESCRIBE_RECORD(GreenImbalanceConfigValue, 32, TAVIK_FIELD(enable), TAVIK_FIELD(pixel_order),
                      TAVIK_FIELD(half_height), TAVIK_FIELD(half_width));

}  // namespace tavik_registers::zel::g3aa_generic

namespace tavik_registers::zel::g3aa {

// The G3AA green-imbalance table as the stage's memory holds it: 33 groups of eight 32-bit slots,
// group t holding entries 2t and 2t + 1 of the 65. In a group, slot 0 holds the slope of the even
// entry and slot 1 that of the odd one, slot 2 the threshold of the even entry and slot 3 that of
// the odd one; slots 4 to 7 are not the table's. The last group holds entry 64 alone.
struct GreenImbalanceLutValue {
  static constexpr int kEntries = 65;
  static constexpr int kSlotsPerGroup = 8;

  // The slots of entry k's two values.
  static constexpr int SlopeSlot(int k) { return k / 2 * kSlotsPerGroup + k % 2; }
  static constexpr int ThresholdSlot(int k) { return k / 2 * kSlotsPerGroup + 2 + k % 2; }

  uint32_t lut[33 * kSlotsPerGroup];
};
static_assert(sizeof(GreenImbalanceLutValue) == 33 * 32);
static_assert(GreenImbalanceLutValue::SlopeSlot(64) * 4 == 32 * 32);
static_assert(GreenImbalanceLutValue::ThresholdSlot(63) * 4 == 31 * 32 + 12);
TAVIK_DESCRIBE_RECORD(GreenImbalanceLutValue, 32, TAVIK_TABLE(lut, 32));

}  // namespace tavik_registers::zel::g3aa

namespace tavik {

// Frame facts of the green-imbalance stages.
struct DisparityInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  int32_t sensor_bit_depth = 0;
  float digital_gain = 0.0f;
  int32_t bayer_width = 0;
  int32_t bayer_height = 0;
};

// The IPP stage's values, thirteen words. Thresholds and slopes are 12-bit codes of full scale
// 4095, the radial terms 8-bit codes of full scale 255.
struct DisparityIppOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable : 1;
  uint32_t control : 15;     // Always 0x1D0.
  uint32_t sensor_mode : 2;  // 3 for a mono sensor, else 2.
  uint32_t : 14;
  // Word 2: the pixel order, with the fixed bits of its word.
  uint32_t pixel_order : 2;
  uint32_t : 2;
  uint32_t order_bit4 : 1;  // Set.
  uint32_t : 3;
  uint32_t order_bit8 : 1;  // Cleared.
  uint32_t : 3;
  uint32_t order_bit12 : 1;  // Cleared.
  uint32_t : 19;
  // Word 3.
  uint32_t enable_correction : 1;
  uint32_t enable_5x7 : 1;
  uint32_t enable_slope_estimation : 1;
  uint32_t correction_mode : 2;  // Always 3.
  uint32_t : 27;
  // Words 4 to 9.
  uint32_t disparity_threshold_low : 12;
  uint32_t : 20;
  uint32_t disparity_threshold_high : 12;
  uint32_t : 20;
  uint32_t max_slope_allowed_low : 12;
  uint32_t : 20;
  uint32_t max_slope_allowed_high : 12;
  uint32_t : 20;
  uint32_t slope_threshold_low : 12;
  uint32_t : 20;
  uint32_t slope_threshold_high : 12;
  uint32_t : 20;
  // Word 10.
  uint32_t radial_power : 8;
  uint32_t radial_limit : 8;
  uint32_t : 16;
  // Words 11 and 12.
  uint32_t bayer_width : 15;
  uint32_t : 17;
  uint32_t bayer_height : 15;
  uint32_t : 17;
};
static_assert(sizeof(DisparityIppOutput) == 13 * 4);
TAVIK_DESCRIBE_RECORD(DisparityIppOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable),
                      TAVIK_FIELD(control), TAVIK_FIELD(sensor_mode), TAVIK_FIELD(pixel_order),
                      TAVIK_FIELD(order_bit4), TAVIK_FIELD(order_bit8), TAVIK_FIELD(order_bit12),
                      TAVIK_FIELD(enable_correction), TAVIK_FIELD(enable_5x7),
                      TAVIK_FIELD(enable_slope_estimation), TAVIK_FIELD(correction_mode),
                      TAVIK_FIELD(disparity_threshold_low), TAVIK_FIELD(disparity_threshold_high),
                      TAVIK_FIELD(max_slope_allowed_low), TAVIK_FIELD(max_slope_allowed_high),
                      TAVIK_FIELD(slope_threshold_low), TAVIK_FIELD(slope_threshold_high),
                      TAVIK_FIELD(radial_power), TAVIK_FIELD(radial_limit),
                      TAVIK_FIELD(bayer_width), TAVIK_FIELD(bayer_height));

// The IPP stage's settings that no tuning drives, written by GetDefaultDisparity alone: further
// words of the stage, zero in every configuration; their meaning is the stage's own.
struct DisparityIppFixedOutput {
  uint32_t reserved[4];
};
static_assert(sizeof(DisparityIppFixedOutput) == 16);
TAVIK_DESCRIBE_RECORD(DisparityIppFixedOutput, 32, TAVIK_TABLE(reserved, 32));

// IPP. Fails on an empty tuning ("Invalid TuningBlock!", then region info, then static info),
// before anything is written.
TAVIK_EXPORT Status TranslateDisparity(const TuningBlock& block, const DisparityInput& input,
                                       DisparityIppOutput& output);

// G3AA. A disabled block needs no dynamic part, and writes nothing but the enable bit. Fails on a
// missing static part, a missing dynamic part of an enabled block, and a frame with neither side
// positive, before anything is written.
TAVIK_EXPORT Status
TranslateDisparity(const TuningBlock& block, const DisparityInput& input,
                   tavik_registers::zel::g3aa_generic::GreenImbalanceConfigValue& config,
                   tavik_registers::zel::g3aa::GreenImbalanceLutValue& lut);

// The values of the default tuning for an RGGB 10-bit Bayer frame of 4032 by 3024; the IPP form
// also writes the whole fixed record, on success only.
TAVIK_EXPORT Status GetDefaultDisparity(DisparityIppOutput& output, DisparityIppFixedOutput& fixed);
TAVIK_EXPORT Status
GetDefaultDisparity(tavik_registers::zel::g3aa_generic::GreenImbalanceConfigValue& config,
                    tavik_registers::zel::g3aa::GreenImbalanceLutValue& lut);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kDisparityIpp;
extern const TranslatorForm kDisparityG3aa;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_DISPARITY_ONLINE_TRANSLATOR_H_
