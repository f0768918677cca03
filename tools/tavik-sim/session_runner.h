// Runs a session's frames through a tuning controller the way the camera service does, and keeps
// what each frame did.
#ifndef TOOLS_TAVIK_SIM_SESSION_RUNNER_H_
#define TOOLS_TAVIK_SIM_SESSION_RUNNER_H_

#include <array>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/base/time.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_controller.h"
#include "tools/tavik-sim/scenario.h"

namespace tavik::sim {

// The stages of a frame, in the order they run.
enum Stage { kCreate = 0, kEnabledChecks, kInterpolate, kTranslate, kSignalWait, kStageCount };
inline constexpr std::array<const char*, kStageCount> kStageNames = {
    "create", "enabled checks", "interpolate", "translate", "signal+wait"};

struct FrameRecord {
  SimFrame frame;
  std::string key;           // The point's use-case key.
  std::string resolved_key;  // The forest key that answered it; empty when none did.
  std::array<bool, kZelBlockCount> enabled{};
  std::array<bool, kZelBlockCount> in_bundle{};
  std::vector<std::string> refreshed_blocks;  // Position order.
  struct Translation {
    std::string translator;
    std::string block;
    std::string hardware_json;
  };
  std::vector<Translation> translations;
  struct Failure {
    std::string block;
    std::string message;
  };
  // Failures of the frame's calls other than the fence: the key, enabled checks, interpolation,
  // translators ("block" names the translator's block, or the call), signalling.
  std::vector<Failure> failures;
  bool fence_signalled = false;
  bool fence_timed_out = false;
  bool earlier_fences_signalled = false;  // The previous frame's fence fired before this one's.
  std::array<int64_t, kStageCount> stage_nanoseconds{};
};

struct RunOptions {
  Duration fence_timeout = Seconds(5);
  // Called after every frame with the number done and the total.
  std::function<void(int done, int total)> on_frame;
};

// Opens a capture session on `controller`, runs `frames` in order and closes the session.
std::vector<FrameRecord> RunSession(ZelTuningController& controller,
                                    const std::vector<SimFrame>& frames,
                                    const RunOptions& options = {});

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_SESSION_RUNNER_H_
