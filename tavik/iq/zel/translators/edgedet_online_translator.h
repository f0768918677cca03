// Edgedet: the edge detector of the ITP stage. It has no tunable values, only its switches.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_EDGEDET_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_EDGEDET_ONLINE_TRANSLATOR_H_

#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/edgedet_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik_registers::zel::itp {

// The ITP edge detector's magnitude control register, set once by GetDefaultEdgedet.
struct EdgedetMagnitudeControlValue {
  uint32_t enable : 1;
  uint32_t : 7;
  uint32_t magnitude_mode : 2;
  uint32_t : 22;
};
static_assert(sizeof(EdgedetMagnitudeControlValue) == 4);
TAVIK_DESCRIBE_RECORD(EdgedetMagnitudeControlValue, 32, TAVIK_FIELD(enable),
                      TAVIK_FIELD(magnitude_mode));

}  // namespace tavik_registers::zel::itp

namespace tavik {

// The stage's switches, two words.
struct EdgedetItpOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable_low_power : 1;
  uint32_t : 31;
};
static_assert(sizeof(EdgedetItpOutput) == 8);
TAVIK_DESCRIBE_RECORD(EdgedetItpOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable_low_power));

// Fails on an empty tuning ("Invalid TuningBlock!", then region info, then static info): the
// dynamic part must be there though it holds nothing.
TAVIK_EXPORT Status TranslateEdgedet(const TuningBlock& block, EdgedetItpOutput& output);

// The stage on at full power, and its magnitude control (enabled, mode 2). Refuses a null register
// first.
TAVIK_EXPORT Status GetDefaultEdgedet(
    EdgedetItpOutput& output, tavik_registers::zel::itp::EdgedetMagnitudeControlValue* control);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kEdgedet;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_EDGEDET_ONLINE_TRANSLATOR_H_
