// Compares two tunings, files or directories, block by block: use cases and trees added or
// removed, a tree's switch, its static parameters, its levels and regions, and the values of its
// leaves; and the golden calibration of each sensor.
#ifndef TOOLS_TAVIK_TUNE_DIFF_H_
#define TOOLS_TAVIK_TUNE_DIFF_H_

#include <string>
#include <vector>

#include "tavik/base/status.h"

namespace tavik::tune {

struct DiffFinding {
  // The use-case key, "golden SENSOR" for a golden calibration, or "-" for the inputs as a whole.
  std::string where;
  std::string block;  // Block message name ("GammaTuning"), or "-".
  std::string path;   // Place in the tree ("CCT#1(3800..4500) > GAIN#0(1..2)"), "static_param"
                      // or "-".
  std::string change;

  // "WHERE: BLOCK: PATH: CHANGE"
  std::string ToString() const;
};

struct DiffRequest {
  std::string old_path;
  std::string new_path;
  bool all_elements = false;  // Every changed element of a list, not a summary past eight.
};

// Parses "A B [--all]".
StatusOr<DiffRequest> ParseDiffArgs(const std::vector<std::string>& args);

// The differences from the old tuning to the new one; none when they are equal. Two files are
// compared with each other whatever their keys; when either side is a directory, its files are
// read as the runtime reads them (.binarypb only, the first file of a key wins) and use cases
// are matched by key, golden calibrations by sensor. Fails when a file can't be read or parsed.
StatusOr<std::vector<DiffFinding>> DiffTunings(const DiffRequest& request);

// The text of --help.
extern const char kDiffHelp[];

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_DIFF_H_
