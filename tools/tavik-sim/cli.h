// The command line of tavik-sim, as a function so that tests can run it.
#ifndef TOOLS_TAVIK_SIM_CLI_H_
#define TOOLS_TAVIK_SIM_CLI_H_

#include <ostream>
#include <string>
#include <vector>

namespace tavik::sim {

inline constexpr int kExitOk = 0;
inline constexpr int kExitFailure = 1;
inline constexpr int kExitUsage = 2;

// Runs the tool on `args` (without the program name); the summary goes to `out`, errors and the
// progress bar to `err`. Returns the exit status.
int RunSimCommand(const std::vector<std::string>& args, std::ostream& out, std::ostream& err);

}  // namespace tavik::sim

#endif  // TOOLS_TAVIK_SIM_CLI_H_
