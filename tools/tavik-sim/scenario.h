// Scenarios of tavik-sim: reading one from protobuf text, checking it, and expanding it into the
// frames of a session.
#ifndef TOOLS_TAVIK_SIM_SCENARIO_H_
#define TOOLS_TAVIK_SIM_SCENARIO_H_

#include <string>
#include <string_view>
#include <vector>

#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tools/tavik-sim/scenario.pb.h"

namespace tavik::sim {

// The scenario that the tool runs without --scenario: 300 frames of the rear GN1 camera, from a
// tungsten-lit room at high gain out to daylight, the torch on and off, a snapshot, then video.
extern const char kDefaultScenarioText[];

// One frame of a session, as the camera service would describe it.
struct SimFrame {
  int index = 0;
  int segment = 0;
  std::string segment_name;
  UseCase use_case;
  TuningInfo tuning_info;
  TuningCoordinates coordinates;
};

// Parses and checks `text`; `source` names it in errors ("FILE:LINE:COLUMN: message",
// "FILE: segment N: message").
StatusOr<Scenario> ParseScenario(std::string_view text, std::string_view source);
// Reads and parses the file at `path`; NotFoundError "PATH: cannot open" when it can't be read.
StatusOr<Scenario> ReadScenarioFile(const std::string& path);
StatusOr<Scenario> DefaultScenario();

// The frames of `scenario`, at most `max_frames` of them when it is not negative.
std::vector<SimFrame> ExpandScenario(const Scenario& scenario, int max_frames = -1);

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_SCENARIO_H_
