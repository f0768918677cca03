// A device's own lens-shading calibration, brought to the grid of the tuning's shading tables
// so that the provider can apply it to every shading leaf at load.
#ifndef TAVIK_IQ_ZEL_SENSOR_EEPROM_DATA_H_
#define TAVIK_IQ_ZEL_SENSOR_EEPROM_DATA_H_

#include <memory>
#include <string_view>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/lsc_tables.pb.h"
#include "tavik/iq/tuning_provider_base.h"

namespace vosbrine::zelmondrake {

class TAVIK_EXPORT ZelSensorEepromData : public SensorEepromData {
 public:
  explicit ZelSensorEepromData(LscTables lsc_tables) : lsc_tables(std::move(lsc_tables)) {}

  // On the tuning's grid: 33 by 25.
  LscTables lsc_tables;
};

}  // namespace vosbrine::zelmondrake

namespace tavik {

// Device tables by sensor, from the calibration that the service read from each module: each
// module's grid is cropped to the area it covers in the full sensor and resized to the tuning's
// 33 by 25 grid. Modules that no sensor enum row names, or whose grid can't be resized, are
// skipped (logged); of two modules of one sensor, the first in map order counts. With `dump`, both
// tables of each module are written to "/data/vendor/camera/<SENSOR>_lsc_eeprom.txt". Null when
// no module yields data.
TAVIK_EXPORT std::shared_ptr<vosbrine::SensorEepromDataMap> BuildTuningEepromData(
    std::string_view device_name,
    const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>& calibration,
    bool dump);

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_SENSOR_EEPROM_DATA_H_
