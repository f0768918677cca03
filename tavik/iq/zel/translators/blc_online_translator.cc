#include "tavik/iq/zel/translators/blc_online_translator.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/logging.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::BlcConfigValue;
using ::tavik_registers::zel::g3aa::DgConfigValue;

// Log texts are contracts: the cap line of TranslateBlc has no blank after "under", that of
// TranslateDg has one.
constexpr char kCapTextPrefix[] = "Max digital gain * stretch_gain should be under";

// Channels in the order of BlcDynamicParam and of the G3AA registers.
enum Channel { kR = 0, kGr = 1, kGb = 2, kB = 3 };

const google::protobuf::RepeatedField<float>& Offsets(const zm::BlcDynamicParam& dynamic,
                                                      int channel) {
  switch (channel) {
    case kR:
      return dynamic.offsets_r();
    case kGr:
      return dynamic.offsets_gr();
    case kGb:
      return dynamic.offsets_gb();
    default:
      return dynamic.offsets_b();
  }
}

// The G3AA stage reads element 0 alone and tests no size; an empty array is no pedestal.
float FirstOffset(const google::protobuf::RepeatedField<float>& offsets) {
  return offsets.empty() ? 0.0f : offsets.Get(0);
}

// The channel in each cell of the Bayer quad (top left, top right, bottom left, bottom right),
// indexed by the G3AA code of the pattern: RGGB 0, GRBG 1, GBRG 2, BGGR 3. Going through that code
// reads an unknown pattern, logged, as RGGB, as the G3AA registers do.
constexpr std::array<std::array<int, 4>, 4> kQuadChannelsByG3aaCode = {{
    {kR, kGr, kGb, kB},  // RGGB
    {kGr, kR, kB, kGb},  // GRBG
    {kGb, kB, kR, kGr},  // GBRG
    {kB, kGb, kGr, kR},  // BGGR
}};

const std::array<int, 4>& QuadChannels(vosbrine::BayerPattern pattern) {
  return kQuadChannelsByG3aaCode[GetG3aaPixelOrder(pattern) & 3];
}

// 2 to the power (`full_bits` - `sensor_bit_depth`), as a 32-bit shift whose count is taken modulo
// 32: a depth above `full_bits` wraps to a large power of two instead of a fraction (IPP depths 15
// and 16 give 2^31 and 2^30). The count is reduced before shifting, so no shift is out of range.
float DepthScale(int32_t full_bits, int32_t sensor_bit_depth) {
  const uint32_t count =
      (static_cast<uint32_t>(full_bits) - static_cast<uint32_t>(sensor_bit_depth)) & 31u;
  return static_cast<float>(uint32_t{1} << count);
}

constexpr BlcInput kDefaultInput = {vosbrine::RGGB, vosbrine::SENSOR_TYPE_BAYER, 10, 1.0f};

}  // namespace

Status TranslateBlc(const TuningBlock& block, const BlcInput& input, BlcIppOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
  const zm::BlcTuning* tuning = GetTuningProto<zm::BlcTuning>(block);
  TAVIK_RETURN_IF_ERROR(CheckTuning(tuning));
  if (input.sensor_bit_depth < 1 || input.sensor_bit_depth > 16) {
    return InvalidArgumentErrorBuilder()
           << "Sensor bit depth doesn't match with hardware pipeline " << input.sensor_bit_depth;
  }

  output.bypass = tuning->enable() ? 0 : 1;
  output.tile_mode = (input.sensor_type == vosbrine::SENSOR_TYPE_MONO ? 1u : 0u) | 6u;

  const zm::BlcDynamicParam& dynamic = tuning->dynamic_param();
  for (int channel = kR; channel <= kB; ++channel) {
    if (Offsets(dynamic, channel).size() != 4) {
      return InvalidArgumentErrorBuilder() << "Offsets size is wrong: " << dynamic.DebugString();
    }
  }

  // Offsets: negated pedestals moved to the stage's 14-bit domain, wrapped to 15 bits.
  std::memset(output.offsets, 0, sizeof(output.offsets));
  const float scale = DepthScale(14, input.sensor_bit_depth);
  const bool quad_bayer = input.sensor_type == vosbrine::SENSOR_TYPE_QUAD_BAYER;
  const std::array<int, 4>& quad_channels = QuadChannels(input.bayer_pattern);
  for (int cell = 0; cell < 4; ++cell) {
    const int cell_row = cell / 2;
    const int cell_column = cell % 2;
    const google::protobuf::RepeatedField<float>& offsets = Offsets(dynamic, quad_channels[cell]);
    for (int k = 0; k < 4; ++k) {
      // A Bayer tile holds four quads, element k in the k-th; a quad-Bayer tile holds one 2x2
      // block per colour, element k at the k-th position of its block.
      const int row = quad_bayer ? 2 * cell_row + k / 2 : 2 * (k / 2) + cell_row;
      const int column = quad_bayer ? 2 * cell_column + k % 2 : 2 * (k % 2) + cell_column;
      const float code = RoundHalfAwayFromZero(scale * -offsets.Get(k));
      output.offsets[4 * row + column] = static_cast<uint16_t>(LowBits(TruncateWrapping(code), 15));
    }
  }

  if (input.digital_gain < 1.0f) {
    return InvalidArgumentErrorBuilder()
           << "digital_gain should be higher than 1.0f " << input.digital_gain;
  }

  // The largest stretch comes from the least raw entry. A zero offset (raw 0) reads as -32768 and
  // makes the stretch negative, which selects the 4-bit format whatever the gain: that is the
  // field's defined behaviour, not an accident to guard against.
  const uint16_t least = *std::min_element(std::begin(output.offsets), std::end(output.offsets));
  const int32_t smallest = static_cast<int32_t>(least) - 32768;
  const float max_stretch = 16383.0f / static_cast<float>(smallest + 16383);

  float digital_gain = input.digital_gain;
  const float product = digital_gain * max_stretch;
  if (product < 16.0f) {
    output.gain_integer_bits = 4;
  } else if (product < kMaxDigitalGain) {
    output.gain_integer_bits = 5;
  } else {
    // gain_integer_bits keeps what the caller (GetDefaultBlc) left there.
    digital_gain = kMaxDigitalGain / max_stretch;
    TAVIK_LOG(ERROR) << kCapTextPrefix << kMaxDigitalGain
                     << ". If not, it is capped to kMaxDigitalGain: " << input.digital_gain << " "
                     << max_stretch;
  }

  const float format_scale = static_cast<float>(uint32_t{1} << (14 - output.gain_integer_bits));
  for (int i = 0; i < 16; ++i) {
    const int32_t raw = output.offsets[i];
    const int32_t offset = raw > 16383 ? raw - 32768 : raw;
    const float gain = 16383.0f / static_cast<float>(offset + 16383) * digital_gain * format_scale;
    output.gains[i] = static_cast<uint16_t>(LowBits(TruncateToUint32(gain), 15));
  }
  return OkStatus();
}

Status CalculateG3AAOffsetGains(const zm::BlcTuning& tuning, int32_t sensor_bit_depth,
                                std::array<double, 4>& offsets,
                                std::array<double, 4>& stretch_gains) {
  if (sensor_bit_depth >= 16) {
    return InvalidArgumentErrorBuilder() << blc_internal::kDepthTooLargeText << sensor_bit_depth;
  }
  const float scale = DepthScale(15, sensor_bit_depth);
  const zm::BlcDynamicParam& dynamic = tuning.dynamic_param();
  for (int channel = kR; channel <= kB; ++channel) {
    const float offset = FirstOffset(Offsets(dynamic, channel)) * scale;
    offsets[channel] = offset;
  }
  for (int channel = kR; channel <= kB; ++channel) {
    if (offsets[channel] > 32768.0) {
      return InvalidArgumentErrorBuilder()
             << "Offset is too large to calculate stretch gain! " << offsets[channel];
    }
    stretch_gains[channel] = 32768.0 / (32768.0 - offsets[channel]);
  }
  return OkStatus();
}

Status TranslateBlc(const TuningBlock& block, const BlcInput& input, BlcConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
  if (output == nullptr) return InvalidArgumentError(kOutputIsNullText);
  const zm::BlcTuning* tuning = GetTuningProto<zm::BlcTuning>(block);
  if (tuning == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
  if (!tuning->has_static_param()) {
    return InvalidArgumentError("BlcTuning proto doesn't have static param!");
  }
  output->enable = tuning->enable() ? 1 : 0;
  output->pixel_order = GetG3aaPixelOrder(input.bayer_pattern);
  if (!tuning->has_dynamic_param()) {
    return InvalidArgumentError(blc_internal::kNoDynamicParamText);
  }

  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  TAVIK_RETURN_IF_ERROR(
      CalculateG3AAOffsetGains(*tuning, input.sensor_bit_depth, offsets, stretch_gains));
  output->offset_r = LowBits(TruncateWrapping(offsets[kR]), 16);
  output->offset_gr = LowBits(TruncateWrapping(offsets[kGr]), 16);
  output->offset_gb = LowBits(TruncateWrapping(offsets[kGb]), 16);
  output->SetOffsetB(static_cast<uint32_t>(LowBits(TruncateWrapping(offsets[kB]), 16)));
  return OkStatus();
}

Status TranslateBlc(const TuningBlock& block, const BlcInput& input, DgConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
  if (output == nullptr) return InvalidArgumentError(kOutputIsNullText);
  const zm::BlcTuning* tuning = GetTuningProto<zm::BlcTuning>(block);
  if (tuning == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
  if (!tuning->has_dynamic_param()) {
    return InvalidArgumentError(blc_internal::kNoDynamicParamText);
  }

  return blc_internal::TranslateG3aaGains(*tuning, input.sensor_bit_depth, input.digital_gain,
                                          input.bayer_pattern, kCapTextPrefix, *output);
}

Status GetDefaultBlc(BlcIppOutput& output, BlcIppFixedOutput& fixed) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultBlc");
  ZelTuningBlock<zm::BlcTuning> block;
  blc_internal::SetDefaultTuning(block.message);
  TAVIK_RETURN_IF_ERROR(TranslateBlc(block, kDefaultInput, output));
  // Constants of the configuration, written by word.
  fixed = BlcIppFixedOutput{};
  fixed.range_high = 16383;
  fixed.range_low = LowBits(-16383, 15);
  return OkStatus();
}

Status GetDefaultBlc(BlcConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultBlc");
  ZelTuningBlock<zm::BlcTuning> block;
  blc_internal::SetDefaultTuning(block.message);
  return TranslateBlc(block, kDefaultInput, output);
}

Status GetDefaultBlc(DgConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultBlc");
  ZelTuningBlock<zm::BlcTuning> block;
  blc_internal::SetDefaultTuning(block.message);
  return TranslateBlc(block, kDefaultInput, output);
}

std::array<float, 4> GetDynamicBlc(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern) {
  const zm::BlcTuning* tuning = GetTuningProto<zm::BlcTuning>(block);
  if (tuning == nullptr || !tuning->has_dynamic_param()) {
    TAVIK_LOG(ERROR) << "Blc tuning block is empty. Return default 64 value for offsets.";
    return {64.0f, 64.0f, 64.0f, 64.0f};
  }
  const zm::BlcDynamicParam& dynamic = tuning->dynamic_param();
  const std::array<int, 4>& quad_channels = QuadChannels(bayer_pattern);
  return {FirstOffset(Offsets(dynamic, quad_channels[0])),
          FirstOffset(Offsets(dynamic, quad_channels[1])),
          FirstOffset(Offsets(dynamic, quad_channels[2])),
          FirstOffset(Offsets(dynamic, quad_channels[3]))};
}

namespace blc_internal {

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
    values[channel] = static_cast<uint32_t>(LowBits(value, 24));
  }
  output.gain_r = values[kR];
  output.gain_gr = values[kGr];
  output.SetGainGb(values[kGb]);
  output.gain_b = values[kB];
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

}  // namespace blc_internal
}  // namespace tavik
