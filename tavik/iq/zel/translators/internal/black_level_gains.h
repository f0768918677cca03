// What the black-level and digital-gain translators share, and nothing else uses: the G3AA gain
// step that both of their gain forms run, its texts, and the default tuning of the block.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_BLACK_LEVEL_GAINS_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_BLACK_LEVEL_GAINS_H_

#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/translators/g3aa_blc_registers.h"

namespace tavik::black_level_internal {

inline constexpr char kNoDynamicParamText[] = "BlcTuning proto doesn't have dynamic param!";
inline constexpr char kDepthTooLargeText[] = "Sensor bit depth is larger than g3aa pipeline!";
inline constexpr char kDigitalGainBelowOneText[] = "Digital gain is lower than 1!";

// The gain step of both G3AA gain forms: the offsets' stretch gains, the digital gain test, then
// the four gains, each stretch gain times `digital_gain` capped at kMaxDigitalGain with one error
// line per capped channel that begins with `cap_text_prefix`; enable (always 1) and the pixel
// order of `bayer_pattern`.
Status TranslateG3aaGains(const vosbrine::zelmondrake::BlcTuning& tuning, int32_t sensor_bit_depth,
                          float digital_gain, vosbrine::BayerPattern bayer_pattern,
                          const char* cap_text_prefix,
                          tavik_registers::zel::g3aa::DgConfigValue& output);

// The default tuning of the block, shared by the defaults of both units: enabled, an empty static
// part, and offsets of 64.0 in each of the four lists of four.
void SetDefaultTuning(vosbrine::zelmondrake::BlcTuning& tuning);

}  // namespace tavik::black_level_internal

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_INTERNAL_BLACK_LEVEL_GAINS_H_
