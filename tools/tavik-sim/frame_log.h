// The frame log: one JSON object per line and frame. Everything but the "timing" object is the
// same from run to run of one scenario.
#ifndef TOOLS_TAVIK_SIM_FRAME_LOG_H_
#define TOOLS_TAVIK_SIM_FRAME_LOG_H_

#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tools/tavik-sim/session_runner.h"

namespace tavik::sim {

// One line, without its newline. "timing" is the last member.
std::string FrameLogLine(const FrameRecord& record);
Status WriteFrameLog(const std::string& path, const std::vector<FrameRecord>& records);

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_FRAME_LOG_H_
