// The tuning provider of this processor generation: tree sets of type
// vosbrine.zelmondrake.TuningTreeSet.
#ifndef TAVIK_IQ_ZEL_TUNING_PROVIDER_H_
#define TAVIK_IQ_ZEL_TUNING_PROVIDER_H_

#include <memory>
#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/tuning_provider_base.h"

namespace vosbrine::zelmondrake {

class TAVIK_EXPORT TuningProvider : public TuningProviderBase {
 public:
  // Loads `paths` (see TuningProviderBase::Load). `eeprom_data` may be null.
  static tavik::StatusOr<std::unique_ptr<TuningProvider>> Create(
      const std::vector<std::string>& paths, const SensorEepromDataMap* eeprom_data);

  ~TuningProvider() override = default;

  // Rewrites every leaf of the set's shading tree with the tables calibrated by the device's
  // measurement (a ZelSensorEepromData) against the golden one. Leaves done before a failure stay
  // calibrated.
  tavik::Status ApplySensorEepromCalibration(
      const std::unique_ptr<const SensorEepromData>& eeprom_data,
      const GoldenSensorFactoryCalibrationData& golden,
      google::protobuf::Message* tuning_tree_set) const override;

 private:
  TuningProvider() = default;
};

}  // namespace vosbrine::zelmondrake

#endif  // TAVIK_IQ_ZEL_TUNING_PROVIDER_H_
