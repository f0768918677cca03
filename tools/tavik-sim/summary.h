// The run's summary for a person: what was resolved, what the cache did, what failed and where
// the time went.
#ifndef TOOLS_TAVIK_SIM_SUMMARY_H_
#define TOOLS_TAVIK_SIM_SUMMARY_H_

#include <string>
#include <vector>

#include "tools/tavik-sim/session_runner.h"

namespace tavik::sim {

// Whether the run failed: a frame without a signalled fence, or any failure recorded.
bool RunFailed(const std::vector<FrameRecord>& records);

std::string FormatSummary(const std::vector<FrameRecord>& records);

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_SUMMARY_H_
