// Black-level correction: subtracts the sensor's pedestal from each raw sample and stretches the
// remainder back to full scale, with the digital gain applied in the same stage. Translated for
// the IPP stage (a 4x4 tile of offsets and gains in one record) and for the two G3AA registers
// (offsets in BlcConfigValue, gains in DgConfigValue).
//
// Removing an offset lowers the white point, so every gain carries a stretch of full scale over
// (full scale minus offset); the product of stretch and digital gain is capped at
// kMaxDigitalGain, with an error line, rather than refused.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_BLC_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_BLC_ONLINE_TRANSLATOR_H_

#include <array>
#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/translators/g3aa_blc_registers.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// The largest product of stretch gain and digital gain that the stages take.
inline constexpr float kMaxDigitalGain = 32.0f;

// Frame facts of the black-level stages.
struct BlcInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::INVALID_SENSOR_TYPE;
  // Bits per sample of the sensor's output; the tuning's offsets are in its units.
  int32_t sensor_bit_depth = 0;
  float digital_gain = 0.0f;
};

// The IPP stage's values. The tile is indexed 4 x row + column; offsets are negative numbers in
// 15-bit two's complement of a 14-bit sample domain, gains unsigned with 14 - gain_integer_bits
// fractional bits.
struct BlcIppOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1. Bit 0 is set for a mono sensor, bits 1 and 2 always.
  uint32_t tile_mode : 4;
  uint32_t : 28;
  // Word 2. 4 or 5.
  uint32_t gain_integer_bits : 3;
  uint32_t : 29;
  // 15-bit values in 16-bit entries.
  uint16_t offsets[16];
  uint16_t gains[16];
};
static_assert(sizeof(BlcIppOutput) == 76);
static_assert(offsetof(BlcIppOutput, offsets) == 12);
static_assert(offsetof(BlcIppOutput, gains) == 44);
TAVIK_DESCRIBE_RECORD(BlcIppOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(tile_mode),
                      TAVIK_FIELD(gain_integer_bits), TAVIK_TABLE(offsets, 15),
                      TAVIK_TABLE(gains, 15));

// The IPP stage's values that no tuning drives, written by GetDefaultBlc alone.
struct BlcIppFixedOutput {
  // Word 0.
  uint32_t range_high : 15;
  uint32_t : 17;
  // Word 1. 15-bit two's complement.
  uint32_t range_low : 15;
  uint32_t : 17;
  // Further fields of the stage, zero by default; their meaning is the stage's own.
  uint32_t reserved[8];
};
static_assert(sizeof(BlcIppFixedOutput) == 40);
static_assert(offsetof(BlcIppFixedOutput, reserved) == 8);
TAVIK_DESCRIBE_RECORD(BlcIppFixedOutput, 32, TAVIK_FIELD(range_high), TAVIK_FIELD(range_low),
                      TAVIK_TABLE(reserved, 32));

// IPP. Fails on an empty tuning, a sensor depth outside 1..16, offset arrays other than 4 values
// each (after bypass and tile_mode are written) and a digital gain below 1 (after the offsets
// are written).
TAVIK_EXPORT Status TranslateBlc(const TuningBlock& block, const BlcInput& input,
                                 BlcIppOutput& output);
// G3AA offsets, from element 0 of each array.
TAVIK_EXPORT Status TranslateBlc(const TuningBlock& block, const BlcInput& input,
                                 tavik_registers::zel::g3aa::BlcConfigValue* output);
// G3AA gains: the stretch of element 0 of each array times the digital gain.
TAVIK_EXPORT Status TranslateBlc(const TuningBlock& block, const BlcInput& input,
                                 tavik_registers::zel::g3aa::DgConfigValue* output);

// The values of the default tuning (offsets of 64 at 10 bits, RGGB Bayer sensor, digital gain 1);
// the IPP form also writes the whole fixed record, on success only.
TAVIK_EXPORT Status GetDefaultBlc(BlcIppOutput& output, BlcIppFixedOutput& fixed);
TAVIK_EXPORT Status GetDefaultBlc(tavik_registers::zel::g3aa::BlcConfigValue* output);
TAVIK_EXPORT Status GetDefaultBlc(tavik_registers::zel::g3aa::DgConfigValue* output);

// Element 0 of each offset array in the raster order of the Bayer quad (top left, top right,
// bottom left, bottom right), for those who need the pedestal itself; an empty array gives 0.
// Without a BlcTuning block carrying dynamic_param: 64 four times, with an error line.
TAVIK_EXPORT std::array<float, 4> GetDynamicBlc(const TuningBlock& block,
                                                vosbrine::BayerPattern bayer_pattern);

// The G3AA offsets and stretch gains, in the order r, gr, gb, b whatever the pattern: element 0
// of each array scaled from `sensor_bit_depth` to 15 bits (an empty array counts as 0), and
// 32768 / (32768 - offset). Fails on a depth of 16 or more, and on an offset above 32768.
TAVIK_EXPORT Status CalculateG3AAOffsetGains(const vosbrine::zelmondrake::BlcTuning& tuning,
                                             int32_t sensor_bit_depth,
                                             std::array<double, 4>& offsets,
                                             std::array<double, 4>& stretch_gains);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kBlcIpp;
extern const TranslatorForm kBlcG3aaOffsets;
extern const TranslatorForm kBlcG3aaGains;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_BLC_ONLINE_TRANSLATOR_H_
