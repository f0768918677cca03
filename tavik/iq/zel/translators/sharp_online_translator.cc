#include "tavik/iq/zel/translators/sharp_online_translator.h"

#include <cstdint>
#include <string_view>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;

// Word 2's bits 8-20 and word 3's bits 0-9.
constexpr uint32_t kLcFixedA = 0x3E1;
constexpr uint32_t kLcFixedB = 128;

// Both steppings' translation. Opens no trace: its callers do.
Status TranslateSharpCommon(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                            SharpItpOutput& output) {
  TAVIK_ASSIGN_OR_RETURN(const zm::SharpTuning* tuning, RequireTuning<zm::SharpTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  output.bypass = tuning->enable() ? 0 : 1;
  output.enable_low_power = tuning->static_param().enable_low_power() ? 1 : 0;

  const zm::SharpDynamicParam& dynamic = tuning->dynamic_param();
  TAVIK_SET_FIELD(output, lc_threshold, ToScaledCode(dynamic.lc_threshold(), 1023.0f, 0, 1023));
  // The word's low 21 bits are the power code shifted by one, or-ed with the fixed part.
  output.lc_power_spare_low = 0;
  TAVIK_SET_FIELD(output, lc_power, ToScaledCode(dynamic.lc_power(), 63.0f, 0, 63));
  output.lc_power_spare_high = 0;
  output.lc_fixed_a = kLcFixedA;

  // From 255 (no suppression) down to -255, in single precision in this order; masked to 9 bits,
  // not limited.
  const float s = dynamic.lc_suppression();
  output.lc_fixed_b = kLcFixedB;
  TAVIK_SET_FIELD(output, lc_suppression, RoundWrapping((1.0f - s) * 255.0f - s * 255.0f));
  output.lc_suppression_spare = 0;

  output.pixel_order = vosbrine::GetMainIspPixelOrder(bayer_pattern);
  return OkStatus();
}

void SetDefaultTuning(zm::SharpTuning& tuning) {
  tuning.Clear();
  tuning.set_enable(true);
  tuning.mutable_static_param()->set_enable_low_power(false);
  zm::SharpDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  dynamic.set_lc_threshold(0.00293f);
  dynamic.set_lc_suppression(0.453f);
  dynamic.set_lc_power(0.0f);
}

// The fixed words both steppings share.
void WriteCommonFixedOutput(SharpItpFixedOutput& fixed) {
  uint32_t* words = fixed.words;
  WriteFixedBits(words[0], 0, 0x04081000);
  WriteFixedBits(words[1], ~uint32_t{0x7}, 3);
  WriteFixedBits(words[2], ~uint32_t{0xFF}, 0x40);
  WriteFixedBits(words[3], ~uint32_t{0xFFF}, 0xF);
  WriteFixedBits(words[4], ~uint32_t{0x7F}, 8);
  WriteFixedBits(words[5], ~uint32_t{0}, 1);
  WriteFixedBits(words[7], ~uint32_t{0xFFFF}, 0x418);
  WriteFixedBits(words[8], ~uint32_t{0xFFF}, 0x100);
  WriteFixedBits(words[9], ~uint32_t{0x1FFFFFF}, 0x800004);
}

enum class Stepping { kA0, kB0 };

Status GetDefaultSharpCommon(std::string_view trace_name, Stepping stepping, SharpItpOutput& output,
                             SharpItpFixedOutput& fixed) {
  return GetDefault(
      trace_name, SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateSharpCommon(block, vosbrine::RGGB, output); },
      [&] {
        WriteCommonFixedOutput(fixed);
        // The one difference between the steppings.
        if (stepping == Stepping::kA0) WriteFixedBits(fixed.words[6], ~uint32_t{0}, 1);
      });
}

}  // namespace

Status TranslateSharp(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                      SharpItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSharp");
  return TranslateSharpCommon(block, bayer_pattern, output);
}

Status TranslateSharpB0(const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
                        SharpItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSharpB0");
  return TranslateSharpCommon(block, bayer_pattern, output);
}

Status GetDefaultSharp(SharpItpOutput& output, SharpItpFixedOutput& fixed) {
  return GetDefaultSharpCommon("GetDefaultSharp", Stepping::kA0, output, fixed);
}

Status GetDefaultSharpB0(SharpItpOutput& output, SharpItpFixedOutput& fixed) {
  return GetDefaultSharpCommon("GetDefaultSharpB0", Stepping::kB0, output, fixed);
}

namespace translator_forms {

constexpr TranslatorForm kSharp = MakeTranslatorForm<zm::SharpTuning, SharpItpOutput>(
    "TranslateSharp (ITP)", [](const TranslatorFrame& frame, SharpItpOutput& output) {
      return TranslateSharp(frame.Block<zm::SharpTuning>(), frame.facts.bayer_pattern, output);
    });
constexpr TranslatorForm kSharpB0 = MakeTranslatorForm<zm::SharpTuning, SharpItpOutput>(
    "TranslateSharpB0 (ITP)", [](const TranslatorFrame& frame, SharpItpOutput& output) {
      return TranslateSharpB0(frame.Block<zm::SharpTuning>(), frame.facts.bayer_pattern, output);
    });

}  // namespace translator_forms
}  // namespace tavik
