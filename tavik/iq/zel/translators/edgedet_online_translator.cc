#include "tavik/iq/zel/translators/edgedet_online_translator.h"

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;
using ::tavik_registers::zel::itp::EdgedetMagnitudeControlValue;

}  // namespace

Status TranslateEdgedet(const TuningBlock& block, EdgedetItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateEdgedet");
  TAVIK_ASSIGN_OR_RETURN(const zm::EdgedetTuning* tuning, RequireTuning<zm::EdgedetTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  output.bypass = tuning->enable() ? 0 : 1;
  output.enable_low_power = tuning->static_param().enable_low_power() ? 1 : 0;
  return OkStatus();
}

// Written from constants: the stage has no tuned values for a default tuning to give.
Status GetDefaultEdgedet(EdgedetItpOutput& output, EdgedetMagnitudeControlValue* control) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultEdgedet");
  TAVIK_RETURN_IF_ERROR(RequireOutput(control));
  output.bypass = 0;
  output.enable_low_power = 0;
  control->enable = 1;
  control->magnitude_mode = 2;
  return OkStatus();
}

namespace translator_forms {

constexpr TranslatorForm kEdgedet = MakeTranslatorForm<zm::EdgedetTuning, EdgedetItpOutput>(
    "TranslateEdgedet (ITP)", [](const TranslatorFrame& frame, EdgedetItpOutput& output) {
      return TranslateEdgedet(frame.Block<zm::EdgedetTuning>(), output);
    });

}  // namespace translator_forms
}  // namespace tavik
