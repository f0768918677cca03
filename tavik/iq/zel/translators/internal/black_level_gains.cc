#include "tavik/iq/zel/translators/internal/black_level_gains.h"

#include <array>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/logging.h"
#include "tavik/base/status_macros.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/translator_util.h"

namespace tavik::black_level_internal {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::DgConfigValue;

// Channels in the order of CalculateG3AAOffsetGains's arrays and of the G3AA registers.
enum Channel { kR = 0, kGr = 1, kGb = 2, kB = 3 };

}  // namespace

Status TranslateG3aaGains(const zm::BlcTuning& tuning, int32_t sensor_bit_depth, float digital_gain,
                          vosbrine::BayerPattern bayer_pattern, const char* cap_text_prefix,
                          DgConfigValue& output) {
  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  TAVIK_RETURN_IF_ERROR(CalculateG3AAOffsetGains(tuning, sensor_bit_depth, offsets, stretch_gains));
  // Also refuses a NaN gain.
  if (!(digital_gain >= 1.0f)) return InvalidArgumentError(kDigitalGainBelowOneText);
  std::array<uint32_t, 4> values;
  for (int channel = kR; channel <= kB; ++channel) {
    const double stretch_gain = stretch_gains[channel];
    float gain = digital_gain;
    if (stretch_gain * gain > kMaxDigitalGain) {
      gain = static_cast<float>(kMaxDigitalGain / stretch_gain);
      TAVIK_LOG(ERROR) << cap_text_prefix << kMaxDigitalGain
                       << ". If not, it is capped to kMaxDigitalGain: " << digital_gain << " "
                       << stretch_gain;
    }
    uint32_t value = TruncateToUint32(stretch_gain * gain * 65536.0);
    // Never a zero gain, and nothing beyond the Q8.16 range's top.
    if (value == 0) value = 1;
    if (value > 0x1000000u) value = 0x1000000u;
    values[channel] = value;
  }
  TAVIK_SET_FIELD(output, gain_r, values[kR]);
  TAVIK_SET_FIELD(output, gain_gr, values[kGr]);
  output.SetGainGb(values[kGb]);
  TAVIK_SET_FIELD(output, gain_b, values[kB]);
  output.enable = 1;
  output.pixel_order = GetG3aaPixelOrder(bayer_pattern);
  return OkStatus();
}

void SetDefaultTuning(zm::BlcTuning& tuning) {
  tuning.set_enable(true);
  tuning.mutable_static_param();
  zm::BlcDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  for (google::protobuf::RepeatedField<float>* offsets :
       {dynamic.mutable_offsets_r(), dynamic.mutable_offsets_gr(), dynamic.mutable_offsets_gb(),
        dynamic.mutable_offsets_b()}) {
    offsets->Reserve(4);
    for (int k = 0; k < 4; ++k) offsets->Add(64.0f);
  }
}

}  // namespace tavik::black_level_internal
