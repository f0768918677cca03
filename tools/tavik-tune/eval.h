// Evaluation of blocks as the controller does it: the forest of a directory, the nearest key when
// the use case has no file of its own, each block filled at a camera state.
#ifndef TOOLS_TAVIK_TUNE_EVAL_H_
#define TOOLS_TAVIK_TUNE_EVAL_H_

#include <ostream>
#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {

struct EvalRequest {
  std::vector<std::string> paths;
  vosbrine::TuningUsecase usecase;
  vosbrine::CameraState state;
  std::vector<const BlockType*> blocks;  // Every block when none is named.
  // A device's module calibration (tavik.tools.ModuleCalibrationSet in text), applied to the
  // shading tuning at load as on the device; none when empty.
  std::string calibration_path;
  std::string device_name;  // Names the sensors of the calibration: "fennelmoore" or other.
  // Also run every translator of each block, on these frame facts, and print the values.
  bool translate = false;
  FrameFacts frame_facts;
};

// Parses "DIR --sensor S --mode M --usecase U [--cct X ...] [--block NAME ...]". Coordinates are
// named after the camera state's fields, with dashes: --cct, --gain (real_gain), --led
// (led_influence), --bv, --exp-ratio, --mired-cct, --scaler-ratio, --pre-scaler-ratio,
// --frame-count, --exposure-time-msecs; --calibration FILE and --device NAME; --translate with
// --bayer-pattern, --sensor-type, --bit-depth and --digital-gain.
StatusOr<EvalRequest> ParseEvalArgs(const std::vector<std::string>& args);

// Loads the forest and prints the key used, then each block in text form.
Status RunEval(const EvalRequest& request, std::ostream& out);

// The option text of --help.
extern const char kEvalHelp[];

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_EVAL_H_
