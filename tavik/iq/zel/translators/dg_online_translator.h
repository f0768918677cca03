// Digital gain of the G3AA stage: the black-level stretch of each colour times the frame's digital
// gain, capped at kMaxDigitalGain, written to the gain register that TranslateBlc also fills.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_DG_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_DG_ONLINE_TRANSLATOR_H_

#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/translators/g3aa_blc_registers.h"

namespace tavik {

// Frame facts of the digital-gain stage.
struct DgInput {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  // Bits per sample of the sensor's output; the tuning's offsets are in its units.
  int32_t sensor_bit_depth = 0;
  float digital_gain = 0.0f;
};

// Gains from a BlcTuning block: the stretch of element 0 of each offset array times the digital
// gain. Fails on an empty tuning, a depth of 16 or more, an empty offset array, an offset above
// the 15-bit range and a digital gain below 1 (or NaN).
TAVIK_EXPORT Status TranslateDg(const TuningBlock& block, const DgInput& input,
                                tavik_registers::zel::g3aa::DgConfigValue& output);

// The gains of the default tuning (offsets of 64 at 10 bits, RGGB, digital gain 1).
TAVIK_EXPORT Status GetDefaultDg(tavik_registers::zel::g3aa::DgConfigValue& output);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kDg;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_DG_ONLINE_TRANSLATOR_H_
