// Places in a tuning tree as tavik-tune's verbs name them: "CCT level" for a level,
// "CCT#1(3800..4500)" for the region at index 1 of a CCT level, joined from the top level down
// with " > ".
#ifndef TOOLS_TAVIK_TUNE_TREE_PATH_H_
#define TOOLS_TAVIK_TUNE_TREE_PATH_H_

#include <string>

#include "tavik/iq/protos/tuning_tree.pb.h"

namespace tavik::tune {

// "CCT", or "type 42" for a number the enum doesn't name.
std::string LevelTypeName(const vosbrine::Level& level);

// "CCT#1(3800..4500)": the node at `index` of `level`.
std::string NodeStep(const vosbrine::Level& level, int index);

// "3800..4500": a region's bounds, as the steps print them.
std::string RegionBounds(const vosbrine::Node& node);

// `step` below `path`; the top level's path is empty.
std::string JoinStep(const std::string& path, const std::string& step);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_TREE_PATH_H_
