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
#include "tavik/iq/zel/translators/internal/black_level_gains.h"
#include "tavik/iq/zel/translators/translator_table.h"
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

using black_level_internal::SetDefaultTuning;

// The frame's facts as the black-level stages take them.
BlcInput BlcInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, facts.sensor_type, facts.sensor_bit_depth, facts.digital_gain};
}

// Constants of the configuration, written by word.
void WriteFixedOutput(BlcIppFixedOutput& fixed) {
  fixed = BlcIppFixedOutput{};
  fixed.range_high = 16383;
  TAVIK_SET_FIELD(fixed, range_low, -16383);
}

}  // namespace

Status TranslateBlc(const TuningBlock& block, const BlcInput& input, BlcIppOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
  TAVIK_ASSIGN_OR_RETURN(const zm::BlcTuning* tuning, RequireTuning<zm::BlcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
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
    return InvalidArgumentErrorBuilder()
           << black_level_internal::kDepthTooLargeText << sensor_bit_depth;
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
  TAVIK_RETURN_IF_ERROR(RequireOutput(output));
  TAVIK_ASSIGN_OR_RETURN(const zm::BlcTuning* tuning, RequireTuning<zm::BlcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning, "BlcTuning proto doesn't have static param!"));
  output->enable = tuning->enable() ? 1 : 0;
  output->pixel_order = GetG3aaPixelOrder(input.bayer_pattern);
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, black_level_internal::kNoDynamicParamText));

  std::array<double, 4> offsets;
  std::array<double, 4> stretch_gains;
  TAVIK_RETURN_IF_ERROR(
      CalculateG3AAOffsetGains(*tuning, input.sensor_bit_depth, offsets, stretch_gains));
  TAVIK_SET_FIELD(*output, offset_r, TruncateWrapping(offsets[kR]));
  TAVIK_SET_FIELD(*output, offset_gr, TruncateWrapping(offsets[kGr]));
  TAVIK_SET_FIELD(*output, offset_gb, TruncateWrapping(offsets[kGb]));
  output->SetOffsetB(static_cast<uint64_t>(TruncateWrapping(offsets[kB])));
  return OkStatus();
}

Status TranslateBlc(const TuningBlock& block, const BlcInput& input, DgConfigValue* output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
  TAVIK_RETURN_IF_ERROR(RequireOutput(output));
  TAVIK_ASSIGN_OR_RETURN(const zm::BlcTuning* tuning, RequireTuning<zm::BlcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, black_level_internal::kNoDynamicParamText));
  return black_level_internal::TranslateG3aaGains(*tuning, input.sensor_bit_depth,
                                                  input.digital_gain, input.bayer_pattern,
                                                  kCapTextPrefix, *output);
}

Status GetDefaultBlc(BlcIppOutput& output, BlcIppFixedOutput& fixed) {
  return GetDefault(
      "GetDefaultBlc", SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateBlc(block, kDefaultInput, output); },
      [&] { WriteFixedOutput(fixed); });
}

Status GetDefaultBlc(BlcConfigValue* output) {
  return GetDefault("GetDefaultBlc", SetDefaultTuning, [&](const TuningBlock& block) {
    return TranslateBlc(block, kDefaultInput, output);
  });
}

Status GetDefaultBlc(DgConfigValue* output) {
  return GetDefault("GetDefaultBlc", SetDefaultTuning, [&](const TuningBlock& block) {
    return TranslateBlc(block, kDefaultInput, output);
  });
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

namespace translator_forms {

constexpr TranslatorForm kBlcIpp = MakeTranslatorForm<zm::BlcTuning, BlcIppOutput>(
    "TranslateBlc (IPP)", [](const TranslatorFrame& frame, BlcIppOutput& output) {
      return TranslateBlc(frame.Block<zm::BlcTuning>(), BlcInputOf(frame.facts), output);
    });
constexpr TranslatorForm kBlcG3aaOffsets = MakeTranslatorForm<zm::BlcTuning, BlcConfigValue>(
    "TranslateBlc (G3AA offsets)", [](const TranslatorFrame& frame, BlcConfigValue& output) {
      return TranslateBlc(frame.Block<zm::BlcTuning>(), BlcInputOf(frame.facts), &output);
    });
constexpr TranslatorForm kBlcG3aaGains = MakeTranslatorForm<zm::BlcTuning, DgConfigValue>(
    "TranslateBlc (G3AA gains)", [](const TranslatorFrame& frame, DgConfigValue& output) {
      return TranslateBlc(frame.Block<zm::BlcTuning>(), BlcInputOf(frame.facts), &output);
    });

}  // namespace translator_forms
}  // namespace tavik
