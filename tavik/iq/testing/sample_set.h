// The sample tuning set, read for tests that check a mechanism on every real tree: its tree sets
// and, for each tree, its leaves unpacked. Needs TAVIK_SAMPLE_TUNING_DIR, the directory of the
// compiled set.
#ifndef TAVIK_IQ_TESTING_SAMPLE_SET_H_
#define TAVIK_IQ_TESTING_SAMPLE_SET_H_

#include <dirent.h>

#include <memory>
#include <set>
#include <string>
#include <vector>

#include "google/protobuf/any.pb.h"
#include "google/protobuf/message.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

namespace tavik::test {

// Every tree of every tuning file of the set, each distinct tree once.
inline std::vector<vosbrine::TuningTree> SampleTrees() {
  std::vector<vosbrine::TuningTree> trees;
  std::set<std::string> seen;
  DIR* directory = opendir(TAVIK_SAMPLE_TUNING_DIR);
  if (directory == nullptr) return trees;
  std::vector<std::string> names;
  while (const dirent* entry = readdir(directory)) names.push_back(entry->d_name);
  closedir(directory);
  for (const std::string& name : names) {
    if (name.size() < 9 || name.substr(name.size() - 9) != ".binarypb" ||
        name.find("golden_sensor_factory_calibration_data") != std::string::npos) {
      continue;
    }
    vosbrine::TuningUsecaseData data;
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    if (!ReadBinaryProto(std::string(TAVIK_SAMPLE_TUNING_DIR) + "/" + name, data).ok() ||
        !data.tuning_tree_set().UnpackTo(&tree_set)) {
      continue;
    }
    const google::protobuf::Descriptor* type = tree_set.GetDescriptor();
    for (int i = 0; i < type->field_count(); ++i) {
      const auto& tree = static_cast<const vosbrine::TuningTree&>(
          tree_set.GetReflection()->GetMessage(tree_set, type->field(i)));
      if (seen.insert(tree.SerializeAsString()).second) trees.push_back(tree);
    }
  }
  return trees;
}

// A packed message unpacked into a message of the type its URL names; null when it can't be.
inline std::unique_ptr<google::protobuf::Message> UnpackAny(const google::protobuf::Any& packed) {
  const std::string& url = packed.type_url();
  const google::protobuf::Descriptor* type =
      google::protobuf::DescriptorPool::generated_pool()->FindMessageTypeByName(
          url.substr(url.rfind('/') + 1));
  if (type == nullptr) return nullptr;
  std::unique_ptr<google::protobuf::Message> message(
      google::protobuf::MessageFactory::generated_factory()->GetPrototype(type)->New());
  if (!packed.UnpackTo(message.get())) return nullptr;
  return message;
}

// The leaves of `level` and its children, depth first.
inline void AppendLeaves(const vosbrine::Level& level,
                         std::vector<std::unique_ptr<google::protobuf::Message>>* leaves) {
  for (const vosbrine::Node& node : level.nodes()) {
    if (node.has_child_level()) AppendLeaves(node.child_level(), leaves);
    if (node.has_dynamic_param()) {
      if (auto leaf = UnpackAny(node.dynamic_param())) leaves->push_back(std::move(leaf));
    }
  }
}

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_SAMPLE_SET_H_
