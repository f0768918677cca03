// Writes a one-block tuning file in memory, reads it back and prints its key: the smallest use of
// the installed headers, schemas and libraries.
#include <iostream>
#include <string>

#include "tavik/base/logging.h"
#include "tavik/base/status.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/version.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

namespace {

tavik::StatusOr<std::string> WriteTuningFile() {
  vosbrine::zelmondrake::BlcDynamicParam offsets;
  for (int i = 0; i < 4; ++i) offsets.add_offsets_r(64.0f);

  vosbrine::zelmondrake::TuningTreeSet tree_set;
  vosbrine::TuningTree* blc = tree_set.mutable_blc();
  blc->set_enable(true);
  blc->mutable_static_param()->PackFrom(vosbrine::zelmondrake::BlcStaticParam());
  vosbrine::Node* node = blc->mutable_dynamic_top_level()->add_nodes();
  node->set_lower(0.0f);
  node->set_upper(100.0f);
  node->mutable_dynamic_param()->PackFrom(offsets);

  vosbrine::TuningUsecaseData data;
  data.mutable_tuning_usecase()->set_camera_sensor(vosbrine::BRIMAL_SENSOR_BRINGUP);
  data.mutable_tuning_usecase()->set_sensor_mode(vosbrine::FULL_4_3_FULL_15_30FPS);
  data.mutable_tuning_usecase()->set_camera_usecase(vosbrine::VIEWFINDER);
  data.mutable_tuning_tree_set()->PackFrom(tree_set);

  std::string bytes;
  if (!data.SerializeToString(&bytes)) return tavik::InternalError("Serialisation failed");
  return bytes;
}

}  // namespace

int main() {
  tavik::StatusOr<std::string> bytes = WriteTuningFile();
  if (!bytes.ok()) {
    TAVIK_LOG(ERROR) << bytes.status().ToString();
    return 1;
  }
  vosbrine::TuningUsecaseData data;
  vosbrine::zelmondrake::TuningTreeSet tree_set;
  if (!data.ParseFromString(*bytes) || !data.tuning_tree_set().UnpackTo(&tree_set)) {
    TAVIK_LOG(ERROR) << "Could not read back the tuning file";
    return 1;
  }
  const vosbrine::TuningUsecase& key = data.tuning_usecase();
  std::cout << tavik::StrCat("tavik ", tavik::LibraryVersion(), ": ",
                             vosbrine::CameraSensor_Name(key.camera_sensor()), "_",
                             vosbrine::SensorMode_Name(key.sensor_mode()), "_",
                             vosbrine::CameraUsecase_Name(key.camera_usecase()), ", blc ",
                             tree_set.blc().enable() ? "enabled" : "disabled")
            << std::endl;
  return 0;
}
