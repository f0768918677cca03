#include "tavik/iq/zel/translators/dg_online_translator.h"

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/internal/black_level_gains.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::DgConfigValue;

// Unlike TranslateBlc's, this cap line has a blank after "under".
constexpr char kCapTextPrefix[] = "Max digital gain * stretch_gain should be under ";

constexpr DgInput kDefaultInput = {vosbrine::RGGB, 10, 1.0f};

// The frame's facts as the digital-gain stage takes them.
DgInput DgInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, facts.sensor_bit_depth, facts.digital_gain};
}

}  // namespace

Status TranslateDg(const TuningBlock& block, const DgInput& input, DgConfigValue& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDg");
  TAVIK_ASSIGN_OR_RETURN(const zm::BlcTuning* tuning, RequireTuning<zm::BlcTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning, black_level_internal::kNoDynamicParamText));
  // Tested here as well as in CalculateG3AAOffsetGains, so that it comes before the size test.
  if (input.sensor_bit_depth >= 16) {
    return InvalidArgumentErrorBuilder()
           << black_level_internal::kDepthTooLargeText << input.sensor_bit_depth;
  }
  const zm::BlcDynamicParam& dynamic = tuning->dynamic_param();
  if (dynamic.offsets_r().empty() || dynamic.offsets_gr().empty() || dynamic.offsets_gb().empty() ||
      dynamic.offsets_b().empty()) {
    return InvalidArgumentError("Offsets can't be empty in blc dynamic parameters.");
  }

  return black_level_internal::TranslateG3aaGains(*tuning, input.sensor_bit_depth,
                                                  input.digital_gain, input.bayer_pattern,
                                                  kCapTextPrefix, output);
}

Status GetDefaultDg(DgConfigValue& output) {
  return GetDefault(
      "GetDefaultDg", black_level_internal::SetDefaultTuning,
      [&](const TuningBlock& block) { return TranslateDg(block, kDefaultInput, output); });
}

namespace translator_forms {

constexpr TranslatorForm kDg = MakeTranslatorForm<zm::BlcTuning, DgConfigValue>(
    "TranslateDg (G3AA gains)", [](const TranslatorFrame& frame, DgConfigValue& output) {
      return TranslateDg(frame.Block<zm::BlcTuning>(), DgInputOf(frame.facts), output);
    });

}  // namespace translator_forms
}  // namespace tavik
