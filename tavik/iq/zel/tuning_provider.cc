#include "tavik/iq/zel/tuning_provider.h"

#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

namespace vosbrine::zelmondrake {

tavik::StatusOr<std::unique_ptr<TuningProvider>> TuningProvider::Create(
    const std::vector<std::string>& paths, const SensorEepromDataMap* eeprom_data) {
  std::unique_ptr<TuningProvider> provider(new TuningProvider());
  const tavik::Status status = provider->Load(paths, TuningTreeSet::descriptor(), eeprom_data);
  if (!status.ok()) return status;
  return provider;
}

}  // namespace vosbrine::zelmondrake
