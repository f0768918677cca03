#include "tools/tavik-tune/lint.h"

#include <cstdio>
#include <map>
#include <memory>

#include "google/protobuf/any.pb.h"
#include "absl/strings/str_join.h"
#include "google/protobuf/dynamic_message.h"
#include "tavik/base/status.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {
namespace {

using google::protobuf::Any;
using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;

constexpr char kWholeFile[] = "-";
constexpr char kTopLevel[] = "";
constexpr char kStaticParam[] = "static_param";

std::string FormatFloat(float value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%g", value);
  return text;
}

std::string LevelTypeName(const vosbrine::Level& level) {
  return vosbrine::Level::Type_IsValid(level.type())
             ? vosbrine::Level::Type_Name(level.type())
             : StrCat("type ", static_cast<int>(level.type()));
}

// "CCT#1(3800..4500)": the node at `index` of a level.
std::string NodeStep(const vosbrine::Level& level, int index) {
  const vosbrine::Node& node = level.nodes(index);
  return StrCat(LevelTypeName(level), "#", index, "(", FormatFloat(node.lower()), "..",
                FormatFloat(node.upper()), ")");
}

// Paths read from the top level down: "CCT#1(3800..4500) > GAIN#0(1..2)".
std::string JoinStep(const std::string& path, const std::string& step) {
  return path == kTopLevel ? step : StrCat(path, " > ", step);
}

// The full type name that an Any's URL names: what follows its last '/'.
std::string PackedTypeName(const Any& any) {
  const std::string& url = any.type_url();
  const size_t slash = url.rfind('/');
  return slash == std::string::npos ? url : url.substr(slash + 1);
}

// What is wrong with `any` as a pack of `expected`, or empty. `what` names the field.
std::string CheckPackedType(const Any& any, const Descriptor* expected, const std::string& what) {
  if (any.type_url().empty()) return StrCat(what, " is not set");
  const std::string packed = PackedTypeName(any);
  if (packed == expected->full_name()) return "";
  if (any.type_url().find('/') == std::string::npos || packed == expected->name() ||
      (packed.find('.') == std::string::npos)) {
    return StrCat(what, " type URL '", any.type_url(), "' lacks the full name ",
                  expected->full_name());
  }
  return StrCat(what, " packs ", packed, ", expected ", expected->full_name());
}

// Lengths of every repeated float field of a message, by field path ("a.b[2].c").
void CollectRepeatedFloatLengths(const Message& message, const std::string& prefix,
                                 std::map<std::string, int>* lengths) {
  const auto* reflection = message.GetReflection();
  const Descriptor* descriptor = message.GetDescriptor();
  for (int i = 0; i < descriptor->field_count(); ++i) {
    const FieldDescriptor* field = descriptor->field(i);
    const std::string name = prefix.empty() ? field->name() : StrCat(prefix, ".", field->name());
    if (field->is_repeated() && field->cpp_type() == FieldDescriptor::CPPTYPE_FLOAT) {
      (*lengths)[name] = reflection->FieldSize(message, field);
    } else if (field->cpp_type() == FieldDescriptor::CPPTYPE_MESSAGE) {
      if (field->is_repeated()) {
        for (int j = 0; j < reflection->FieldSize(message, field); ++j) {
          CollectRepeatedFloatLengths(reflection->GetRepeatedMessage(message, field, j),
                                      StrCat(name, "[", j, "]"), lengths);
        }
      } else if (reflection->HasField(message, field)) {
        CollectRepeatedFloatLengths(reflection->GetMessage(message, field), name, lengths);
      }
    }
  }
}

// Lints one block's tree.
class TreeLinter {
 public:
  TreeLinter(const std::string& file, const BlockType& block,
             std::vector<LintFinding>* findings)
      : file_(file), block_(block), findings_(findings) {}

  void Lint(const vosbrine::TuningTree& tree) {
    if (const std::string problem =
            CheckPackedType(tree.static_param(), block_.static_param, "static_param");
        !problem.empty()) {
      Report(kStaticParam, problem);
    } else if (!tree.static_param().UnpackTo(
                   std::unique_ptr<Message>(NewMessage(block_.static_param)).get())) {
      Report(kStaticParam, StrCat("static_param does not parse as ",
                                block_.static_param->full_name()));
    }
    if (!tree.has_dynamic_top_level()) {
      Report(kWholeFile, "no dynamic_top_level: the block can't be evaluated");
      return;
    }
    LintLevel(tree.dynamic_top_level(), kTopLevel);
  }

 private:
  static Message* NewMessage(const Descriptor* type) {
    return google::protobuf::MessageFactory::generated_factory()->GetPrototype(type)->New();
  }

  void Report(const std::string& path, const std::string& problem) {
    findings_->push_back(LintFinding{file_, block_.message->name(), path, problem});
  }

  void LintLevel(const vosbrine::Level& level, const std::string& path) {
    const std::string level_path = JoinStep(path, StrCat(LevelTypeName(level), " level"));
    if (level.type() == vosbrine::Level::UNKNOWN) {
      Report(level_path, "level type UNKNOWN: evaluation fails");
    } else if (!vosbrine::Level::Type_IsValid(level.type())) {
      Report(level_path, StrCat("level type ", static_cast<int>(level.type()),
                                " is out of range: evaluation fails"));
    }
    if (level.nodes().empty()) {
      Report(level_path, "empty level: evaluation fails");
      return;
    }
    for (int i = 0; i < level.nodes_size(); ++i) {
      const vosbrine::Node& node = level.nodes(i);
      const std::string node_path = JoinStep(path, NodeStep(level, i));
      if (node.lower() > node.upper()) {
        Report(node_path, StrCat("lower ", FormatFloat(node.lower()), " > upper ",
                                 FormatFloat(node.upper())));
      }
      if (i > 0) {
        const vosbrine::Node& previous = level.nodes(i - 1);
        if (node.upper() < previous.upper()) {
          Report(node_path, StrCat("not ascending by upper: ", FormatFloat(node.upper()),
                                   " after ", FormatFloat(previous.upper()),
                                   "; region lookup picks wrong regions"));
        } else if (node.lower() < previous.upper()) {
          Report(node_path, StrCat("overlaps the region before it, which ends at ",
                                   FormatFloat(previous.upper())));
        }
      }
      if (node.has_child_level()) {
        LintLevel(node.child_level(), node_path);
      } else if (node.has_dynamic_param()) {
        LintLeaf(node.dynamic_param(), node_path);
      } else {
        Report(node_path, "node has neither child_level nor dynamic_param: evaluation fails");
      }
    }
  }

  void LintLeaf(const Any& leaf, const std::string& path) {
    if (const std::string problem = CheckPackedType(leaf, block_.dynamic_param, "dynamic_param");
        !problem.empty()) {
      Report(path, problem);
      return;
    }
    std::unique_ptr<Message> values(NewMessage(block_.dynamic_param));
    if (!leaf.UnpackTo(values.get())) {
      Report(path, StrCat("dynamic_param does not parse as ", block_.dynamic_param->full_name()));
      return;
    }
    std::map<std::string, int> lengths;
    CollectRepeatedFloatLengths(*values, "", &lengths);
    if (first_leaf_path_.empty()) {
      first_leaf_path_ = path;
      first_leaf_lengths_ = std::move(lengths);
      return;
    }
    for (const auto& [field, length] : lengths) {
      const auto first = first_leaf_lengths_.find(field);
      const int first_length = first == first_leaf_lengths_.end() ? 0 : first->second;
      if (length != first_length) {
        Report(path, StrCat(field, " has ", length, " values, ", first_length, " in the leaf at ",
                            first_leaf_path_, ": the blend keeps the lower region's list"));
      }
    }
  }

  const std::string& file_;
  const BlockType& block_;
  std::vector<LintFinding>* findings_;
  std::string first_leaf_path_;
  std::map<std::string, int> first_leaf_lengths_;
};

void LintGoldenFile(const std::string& file, std::vector<LintFinding>* findings) {
  vosbrine::GoldenSensorFactoryCalibrationData golden;
  if (Status status = ReadBinaryProto(file, golden); !status.ok()) {
    findings->push_back({file, kWholeFile, kWholeFile, std::string(status.message())});
    return;
  }
  const Descriptor* expected =
      vosbrine::zelmondrake::ZelSensorFactoryCalibrationData::descriptor();
  if (const std::string problem =
          CheckPackedType(golden.calibration_data(), expected, "calibration_data");
      !problem.empty()) {
    findings->push_back({file, kWholeFile, kWholeFile, problem});
    return;
  }
  vosbrine::zelmondrake::ZelSensorFactoryCalibrationData data;
  if (!golden.calibration_data().UnpackTo(&data)) {
    findings->push_back({file, kWholeFile, kWholeFile,
                         StrCat("calibration_data does not parse as ", expected->full_name())});
    return;
  }
  const vosbrine::LscTables& lsc = data.lsc();
  const int cells = lsc.width() * lsc.height();
  for (const auto& [name, size] :
       {std::pair<const char*, int>{"lsc_grid_gain_r", lsc.lsc_grid_gain_r_size()},
        {"lsc_grid_gain_gr", lsc.lsc_grid_gain_gr_size()},
        {"lsc_grid_gain_gb", lsc.lsc_grid_gain_gb_size()},
        {"lsc_grid_gain_b", lsc.lsc_grid_gain_b_size()}}) {
    if (size != cells) {
      findings->push_back({file, kWholeFile, kWholeFile,
                           StrCat("lsc.", name, " has ", size, " gains, width * height is ",
                                  cells)});
    }
  }
}

}  // namespace

std::string LintFinding::ToString() const { return StrCat(file, ": ", block, ": ", path, ": ",
                                                          problem); }

std::vector<LintFinding> LintPaths(const std::vector<std::string>& paths) {
  std::vector<LintFinding> findings;
  std::map<std::string, std::string> file_of_key;
  for (const std::string& file : ExpandPaths(paths)) {
    if (!IsBinarypb(file)) {
      findings.push_back({file, kWholeFile, kWholeFile, "not a .binarypb file: the runtime skips it"});
      continue;
    }
    if (IsGoldenCalibrationPath(file)) {
      LintGoldenFile(file, &findings);
      continue;
    }
    vosbrine::TuningUsecaseData data;
    if (Status status = ReadBinaryProto(file, data); !status.ok()) {
      findings.push_back({file, kWholeFile, kWholeFile, std::string(status.message())});
      continue;
    }
    const std::string key = vosbrine::EncodeUsecaseKey(data.tuning_usecase());
    if (const auto [it, inserted] = file_of_key.emplace(key, file); !inserted) {
      findings.push_back({file, kWholeFile, kWholeFile,
                          StrCat("duplicate use case key '", key, "', also in ", it->second,
                                 ": the runtime keeps the file it reads first")});
    }
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    const Descriptor* tree_set_type = vosbrine::zelmondrake::TuningTreeSet::descriptor();
    if (const std::string problem =
            CheckPackedType(data.tuning_tree_set(), tree_set_type, "tuning_tree_set");
        !problem.empty()) {
      findings.push_back({file, kWholeFile, kWholeFile, problem});
      continue;
    }
    if (!data.tuning_tree_set().UnpackTo(&tree_set)) {
      findings.push_back({file, kWholeFile, kWholeFile,
                          StrCat("tuning_tree_set does not parse as ", tree_set_type->full_name())});
      continue;
    }
    std::vector<std::string> missing;
    const auto* reflection = tree_set.GetReflection();
    for (const BlockType& block : AllBlockTypes()) {
      if (!reflection->HasField(tree_set, block.tree_field)) {
        missing.push_back(block.message->name());
        continue;
      }
      const auto& tree =
          static_cast<const vosbrine::TuningTree&>(reflection->GetMessage(tree_set, block.tree_field));
      TreeLinter(file, block, &findings).Lint(tree);
    }
    if (!missing.empty()) {
      findings.push_back({file, kWholeFile, kWholeFile,
                          StrCat("no tree for ", missing.size(), " blocks (",
                                 absl::StrJoin(missing, ", "),
                                 "): a request for any of them fails")});
    }
  }
  return findings;
}

}  // namespace tavik::tune
