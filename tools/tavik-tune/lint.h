// Finds in tuning files what the runtime would get silently wrong or fail on: regions it would
// search wrongly, levels and nodes it can't evaluate, leaves it can't unpack or blend, keys it
// would drop, files it would skip.
#ifndef TOOLS_TAVIK_TUNE_LINT_H_
#define TOOLS_TAVIK_TUNE_LINT_H_

#include <string>
#include <vector>

namespace tavik::tune {

struct LintFinding {
  std::string file;
  std::string block;  // Block message name ("GammaTuning"), or "-" for the file as a whole.
  std::string path;   // Place in the tree ("CCT#1(3800..4500) > GAIN#0(1..2)"), or "-".
  std::string problem;

  // "FILE: BLOCK: PATH: PROBLEM"
  std::string ToString() const;
};

// Lints files and directories (one level deep), in the order given.
std::vector<LintFinding> LintPaths(const std::vector<std::string>& paths);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_LINT_H_
