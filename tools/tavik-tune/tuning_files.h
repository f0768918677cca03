// The files of a tuning directory as the runtime sees them, and the blocks of a tree set.
#ifndef TOOLS_TAVIK_TUNE_TUNING_FILES_H_
#define TOOLS_TAVIK_TUNE_TUNING_FILES_H_

#include <string>
#include <vector>

#include "google/protobuf/descriptor.h"

namespace tavik::tune {

// `paths` with each directory replaced by the files in it, one level deep, in the order the
// directory gives them (the order in which the runtime reads them, which decides between
// duplicates). "." and ".." are left out.
std::vector<std::string> ExpandPaths(const std::vector<std::string>& paths);

// Whether the runtime reads `path` at all, and whether as golden calibration.
bool IsBinarypb(const std::string& path);
bool IsGoldenCalibrationPath(const std::string& path);

// One hardware block: its field in TuningTreeSet and its message, "blc" and BlcTuning.
struct BlockType {
  const google::protobuf::FieldDescriptor* tree_field;
  const google::protobuf::Descriptor* message;  // vosbrine.zelmondrake.<Block>Tuning
  const google::protobuf::Descriptor* static_param;
  const google::protobuf::Descriptor* dynamic_param;
};

// Every block, in the controller's position order.
const std::vector<BlockType>& AllBlockTypes();

// The block whose message name ("GammaTuning") or tree field ("gamma") is `name`; null if none.
const BlockType* FindBlockType(const std::string& name);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_TUNING_FILES_H_
