// Sensor gamma: undoes a sensor's companding at the head of the pipeline, by a curve of 129
// points on an even axis. The IPP stage (the newest stepping's, hence the Pro form) takes 128
// codes of Q14 and the step to the last point; the G3AA stage takes all 129 points in Q15, once
// per colour channel.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_SENSOR_GAMMA_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_SENSOR_GAMMA_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/protos/sensor_gamma_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/tonemap.h"

namespace tavik_registers::zel::g3aa_generic {

// The G3AA linearization stage's configuration register.
struct LinearizationConfigValue {
  uint32_t enable : 1;
  uint32_t pixel_order : 2;  // The G3AA code of the Bayer pattern.
  uint32_t : 29;
};
static_assert(sizeof(LinearizationConfigValue) == 4);
TAVIK_DESCRIBE_RECORD(LinearizationConfigValue, 32, TAVIK_FIELD(enable), TAVIK_FIELD(pixel_order));

}  // namespace tavik_registers::zel::g3aa_generic

namespace tavik_registers::zel::g3aa {

// The G3AA linearization table: 129 entries of four Q15 codes (0..32768), one per colour channel,
// entry i at lut[4 i] to lut[4 i + 3]. The four codes of an entry are equal.
struct LinearizationLutValue {
  static constexpr int kEntries = 129;
  static constexpr int kChannels = 4;

  uint16_t lut[kEntries * kChannels];
};
static_assert(sizeof(LinearizationLutValue) == 129 * 4 * 2);
TAVIK_DESCRIBE_RECORD(LinearizationLutValue, 32, TAVIK_TABLE(lut, 16));

}  // namespace tavik_registers::zel::g3aa

namespace tavik {

// The IPP stage's curve: 128 points in Q14 (0..32767), then the step from point 127 to the last
// point, limited to 0..32767.
struct SensorGammaIppOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  uint16_t gamma_lut[128];
  uint16_t last_delta;
};
static_assert(sizeof(SensorGammaIppOutput) == 264);
static_assert(offsetof(SensorGammaIppOutput, gamma_lut) == 4);
static_assert(offsetof(SensorGammaIppOutput, last_delta) == 260);
TAVIK_DESCRIBE_RECORD(SensorGammaIppOutput, 32, TAVIK_FIELD(bypass), TAVIK_TABLE(gamma_lut, 15),
                      TAVIK_FIELD(last_delta));

// The IPP stage's settings that no tuning drives, written by GetDefaultSensorGammaPro alone: two
// 14-bit values (0x400 each), then the linear curve in the output's form.
struct SensorGammaIppFixedOutput {
  // Word 0.
  uint32_t value_0 : 14;
  uint32_t : 2;
  uint32_t value_1 : 14;
  uint32_t : 2;
  uint16_t gamma_lut[128];
  uint16_t last_delta;
};
static_assert(sizeof(SensorGammaIppFixedOutput) == 264);
static_assert(offsetof(SensorGammaIppFixedOutput, gamma_lut) == 4);
static_assert(offsetof(SensorGammaIppFixedOutput, last_delta) == 260);
TAVIK_DESCRIBE_RECORD(SensorGammaIppFixedOutput, 32, TAVIK_FIELD(value_0), TAVIK_FIELD(value_1),
                      TAVIK_TABLE(gamma_lut, 15), TAVIK_FIELD(last_delta));

// IPP, for the newest stepping. With the application's tone curve (`tonemap_mode` 0) the stage is
// bypassed and the block not read. A disabled block writes bypass alone. Without a dynamic part
// the curve is linear, with a warning; a curve of other than 129 points fails, before any code is
// written.
TAVIK_EXPORT Status TranslateSensorGammaPro(const TuningBlock& block, SensorGammaIppOutput& output,
                                            TonemapMode tonemap_mode);

// G3AA. The block is read first ("Invalid TuningBlock!" whatever the mode); with the
// application's tone curve the stage is switched off. Otherwise as the Pro form, in Q15 and with
// the last point a point.
TAVIK_EXPORT Status TranslateSensorGamma(
    const TuningBlock& block, vosbrine::BayerPattern bayer_pattern,
    tavik_registers::zel::g3aa_generic::LinearizationConfigValue& config,
    tavik_registers::zel::g3aa::LinearizationLutValue& lut, TonemapMode tonemap_mode);

// The linear curve, enabled, with the tuning ruling the tone curve (and an RGGB frame for the
// G3AA form); the Pro form also writes the whole fixed record, on success only.
TAVIK_EXPORT Status GetDefaultSensorGammaPro(SensorGammaIppOutput& output,
                                             SensorGammaIppFixedOutput& fixed);
TAVIK_EXPORT Status
GetDefaultSensorGamma(tavik_registers::zel::g3aa_generic::LinearizationConfigValue& config,
                      tavik_registers::zel::g3aa::LinearizationLutValue& lut);

// The unit's rows of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kSensorGammaProIpp;
extern const TranslatorForm kSensorGammaG3aa;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_SENSOR_GAMMA_ONLINE_TRANSLATOR_H_
