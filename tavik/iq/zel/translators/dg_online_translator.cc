#include "tavik/iq/zel/translators/dg_online_translator.h"

#include <array>

#include "google/protobuf/repeated_field.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::g3aa::DgConfigValue;

// Unlike TranslateBlc's, this cap line has a blank after "under".
constexpr char kCapTextPrefix[] = "Max digital gain * stretch_gain should be under ";

}  // namespace

Status TranslateDg(const TuningBlock& block, const DgInput& input, DgConfigValue& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateDg");
  const zm::BlcTuning* tuning = GetTuningProto<zm::BlcTuning>(block);
  if (tuning == nullptr) return InvalidArgumentError(kInvalidTuningBlockText);
  if (!tuning->has_dynamic_param()) {
    return InvalidArgumentError(blc_internal::kNoDynamicParamText);
  }
  // Tested here as well as in CalculateG3AAOffsetGains, so that it comes before the size test.
  if (input.sensor_bit_depth >= 16) {
    return InvalidArgumentErrorBuilder()
           << blc_internal::kDepthTooLargeText << input.sensor_bit_depth;
  }
  const zm::BlcDynamicParam& dynamic = tuning->dynamic_param();
  if (dynamic.offsets_r().empty() || dynamic.offsets_gr().empty() || dynamic.offsets_gb().empty() ||
      dynamic.offsets_b().empty()) {
    return InvalidArgumentError("Offsets can't be empty in blc dynamic parameters.");
  }

  return blc_internal::TranslateG3aaGains(*tuning, input.sensor_bit_depth, input.digital_gain,
                                          input.bayer_pattern, kCapTextPrefix, output);
}

Status GetDefaultDg(DgConfigValue& output) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultDg");
  ZelTuningBlock<zm::BlcTuning> block;
  blc_internal::SetDefaultTuning(block.message);
  constexpr DgInput kDefaultInput = {vosbrine::RGGB, 10, 1.0f};
  return TranslateDg(block, kDefaultInput, output);
}

}  // namespace tavik
