#include "tools/tavik-tune/diff.h"

#include <sys/stat.h>

#include <map>
#include <memory>
#include <optional>

#include "google/protobuf/any.pb.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/forest.h"
#include "tools/tavik-tune/message_diff.h"
#include "tools/tavik-tune/tree_path.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {
namespace {

using google::protobuf::Any;
using google::protobuf::Descriptor;
using google::protobuf::Message;
using vosbrine::Level;
using vosbrine::Node;
using vosbrine::TuningTree;
using vosbrine::zelmondrake::TuningTreeSet;

constexpr char kNone[] = "-";

struct TuningFile {
  std::string path;
  vosbrine::TuningUsecaseData data;
  TuningTreeSet tree_set;
};

struct GoldenFile {
  std::string path;
  vosbrine::GoldenSensorFactoryCalibrationData data;
};

// One side of the comparison: its tunings by key and its golden calibrations by sensor, each the
// first file read, as the runtime keeps them.
struct Side {
  bool is_directory = false;
  std::map<std::string, TuningFile> tunings;
  std::map<std::string, GoldenFile> goldens;
};

bool IsDirectory(const std::string& path) {
  struct stat info;
  return stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

std::string SensorName(vosbrine::CameraSensor sensor) {
  const std::string name = vosbrine::CameraSensor_Name(sensor);
  return name.empty() ? StrCat(static_cast<int>(sensor)) : name;
}

Status ReadFile(const std::string& file, Side& side) {
  if (IsGoldenCalibrationPath(file)) {
    GoldenFile golden{file, {}};
    if (Status status = ReadBinaryProto(file, golden.data); !status.ok()) return status;
    side.goldens.emplace(SensorName(golden.data.camera_sensor()), std::move(golden));
    return OkStatus();
  }
  TuningFile tuning{file, {}, {}};
  if (Status status = ReadBinaryProto(file, tuning.data); !status.ok()) return status;
  if (!tuning.data.tuning_tree_set().UnpackTo(&tuning.tree_set)) {
    return InvalidArgumentError(StrCat(file, ": tuning_tree_set does not unpack as ",
                                       TuningTreeSet::descriptor()->full_name()));
  }
  side.tunings.emplace(vosbrine::EncodeUsecaseKey(tuning.data.tuning_usecase()), std::move(tuning));
  return OkStatus();
}

StatusOr<Side> ReadSide(const std::string& path) {
  Side side;
  side.is_directory = IsDirectory(path);
  if (!side.is_directory) {
    struct stat info;
    if (stat(path.c_str(), &info) != 0) return NotFoundError(StrCat(path, ": cannot open"));
    if (Status status = ReadFile(path, side); !status.ok()) return status;
    return side;
  }
  for (const std::string& file : ExpandPaths({path})) {
    if (!IsBinarypb(file)) continue;  // The runtime skips them too.
    if (Status status = ReadFile(file, side); !status.ok()) return status;
  }
  return side;
}

// "leaf", "CCT level" or "nothing": what a node holds.
std::string NodeContent(const Node& node) {
  if (node.has_dynamic_param()) return "leaf";
  if (node.has_child_level()) return StrCat(LevelTypeName(node.child_level()), " level");
  return "nothing";
}

// Compares the trees of one block.
class TreeDiffer {
 public:
  TreeDiffer(const std::string& where, const BlockType& block, const MessageDiffOptions& options,
             std::vector<DiffFinding>* findings)
      : where_(where), block_(block), options_(options), findings_(findings) {}

  void Compare(const TuningTree& a, const TuningTree& b) {
    if (a.enable() != b.enable()) {
      Report(kNone, StrCat("enable: ", a.enable() ? "true" : "false", " -> ",
                           b.enable() ? "true" : "false"));
    }
    ComparePacked(a.static_param(), b.static_param(), block_.static_param, "static_param");
    if (a.has_dynamic_top_level() != b.has_dynamic_top_level()) {
      Report(kNone,
             a.has_dynamic_top_level() ? "dynamic_top_level removed" : "dynamic_top_level added");
      return;
    }
    CompareLevels(a.dynamic_top_level(), b.dynamic_top_level(), "");
  }

 private:
  void Report(const std::string& path, std::string change) {
    findings_->push_back({where_, block_.message->name(), path, std::move(change)});
  }

  // Two Any fields that should pack `type`: their fields compared when both unpack, their bytes
  // otherwise.
  void ComparePacked(const Any& a, const Any& b, const Descriptor* type, const std::string& path) {
    if (a.type_url() != b.type_url()) {
      Report(path, StrCat("packs '", a.type_url(), "' -> '", b.type_url(), "'"));
      return;
    }
    std::unique_ptr<Message> old_values = NewBlockMessage(type);
    std::unique_ptr<Message> new_values = NewBlockMessage(type);
    if (!a.UnpackTo(old_values.get()) || !b.UnpackTo(new_values.get())) {
      if (a.value() != b.value()) {
        Report(path, StrCat("bytes differ, and do not parse as ", type->full_name()));
      }
      return;
    }
    for (const FieldChange& change : DiffMessages(*old_values, *new_values, options_)) {
      Report(path, change.ToString());
    }
  }

  void CompareLevels(const Level& a, const Level& b, const std::string& path) {
    const std::string level_path = JoinStep(path, StrCat(LevelTypeName(b), " level"));
    if (a.type() != b.type()) {
      Report(JoinStep(path, StrCat(LevelTypeName(a), " level")),
             StrCat("level type ", LevelTypeName(a), " -> ", LevelTypeName(b),
                    ": the subtree is replaced"));
      return;
    }
    // Regions pair up by their bounds first; the rest in order, as regions moved; what is left
    // over was added or removed.
    const int count_a = a.nodes_size(), count_b = b.nodes_size();
    std::vector<int> partner_of_b(count_b, -1);
    std::vector<bool> a_taken(count_a, false);
    for (int j = 0; j < count_b; ++j) {
      for (int i = 0; i < count_a; ++i) {
        if (!a_taken[i] && a.nodes(i).lower() == b.nodes(j).lower() &&
            a.nodes(i).upper() == b.nodes(j).upper()) {
          partner_of_b[j] = i;
          a_taken[i] = true;
          break;
        }
      }
    }
    int next_a = 0;
    for (int j = 0; j < count_b; ++j) {
      if (partner_of_b[j] >= 0) continue;
      while (next_a < count_a && a_taken[next_a]) ++next_a;
      if (next_a == count_a) break;
      partner_of_b[j] = next_a;
      a_taken[next_a] = true;
    }
    for (int i = 0; i < count_a; ++i) {
      if (!a_taken[i]) Report(level_path, StrCat("region ", RegionBounds(a.nodes(i)), " removed"));
    }
    for (int j = 0; j < count_b; ++j) {
      const std::string node_path = JoinStep(path, NodeStep(b, j));
      if (partner_of_b[j] < 0) {
        Report(level_path, StrCat("region ", RegionBounds(b.nodes(j)), " added"));
        continue;
      }
      const Node& old_node = a.nodes(partner_of_b[j]);
      const Node& new_node = b.nodes(j);
      if (old_node.lower() != new_node.lower() || old_node.upper() != new_node.upper()) {
        Report(level_path,
               StrCat("region ", RegionBounds(old_node), " -> ", RegionBounds(new_node)));
      }
      CompareNodes(old_node, new_node, node_path);
    }
  }

  void CompareNodes(const Node& a, const Node& b, const std::string& path) {
    if (a.has_dynamic_param() && b.has_dynamic_param()) {
      ComparePacked(a.dynamic_param(), b.dynamic_param(), block_.dynamic_param, path);
    } else if (a.has_child_level() && b.has_child_level()) {
      CompareLevels(a.child_level(), b.child_level(), path);
    } else if (NodeContent(a) != NodeContent(b)) {
      Report(path, StrCat(NodeContent(a), " -> ", NodeContent(b)));
    }
  }

  const std::string& where_;
  const BlockType& block_;
  const MessageDiffOptions& options_;
  std::vector<DiffFinding>* findings_;
};

void CompareTunings(const std::string& where, const TuningFile& a, const TuningFile& b,
                    const MessageDiffOptions& options, std::vector<DiffFinding>* findings) {
  if (a.data.version() != b.data.version()) {
    findings->push_back(
        {where, kNone, kNone,
         StrCat("version: \"", a.data.version(), "\" -> \"", b.data.version(), "\"")});
  }
  const auto* reflection = a.tree_set.GetReflection();
  for (const BlockType& block : AllBlockTypes()) {
    const bool in_a = reflection->HasField(a.tree_set, block.tree_field);
    const bool in_b = reflection->HasField(b.tree_set, block.tree_field);
    if (!in_a && !in_b) continue;
    if (in_a != in_b) {
      findings->push_back(
          {where, block.message->name(), kNone, in_a ? "tree removed" : "tree added"});
      continue;
    }
    TreeDiffer(where, block, options, findings)
        .Compare(
            static_cast<const TuningTree&>(reflection->GetMessage(a.tree_set, block.tree_field)),
            static_cast<const TuningTree&>(reflection->GetMessage(b.tree_set, block.tree_field)));
  }
}

void CompareGoldens(const std::string& where, const GoldenFile& a, const GoldenFile& b,
                    const MessageDiffOptions& options, std::vector<DiffFinding>* findings) {
  if (a.data.camera_sensor() != b.data.camera_sensor()) {
    findings->push_back({where, kNone, kNone,
                         StrCat("camera_sensor: ", SensorName(a.data.camera_sensor()), " -> ",
                                SensorName(b.data.camera_sensor()))});
  }
  vosbrine::zelmondrake::ZelSensorFactoryCalibrationData old_data, new_data;
  const Any& old_any = a.data.calibration_data();
  const Any& new_any = b.data.calibration_data();
  if (old_any.type_url() != new_any.type_url()) {
    findings->push_back({where, kNone, "calibration_data",
                         StrCat("packs '", old_any.type_url(), "' -> '", new_any.type_url(), "'")});
    return;
  }
  if (!old_any.UnpackTo(&old_data) || !new_any.UnpackTo(&new_data)) {
    if (old_any.value() != new_any.value()) {
      findings->push_back(
          {where, kNone, "calibration_data",
           StrCat("bytes differ, and do not parse as ", old_data.GetDescriptor()->full_name())});
    }
    return;
  }
  for (const FieldChange& change : DiffMessages(old_data, new_data, options)) {
    findings->push_back({where, kNone, "calibration_data", change.ToString()});
  }
}

// Entries of two maps by key: compared where both have one, reported where one side has none.
template <typename File, typename CompareFn>
void CompareByKey(const std::map<std::string, File>& a, const std::map<std::string, File>& b,
                  const std::string& prefix, CompareFn compare,
                  std::vector<DiffFinding>* findings) {
  auto it_a = a.begin();
  auto it_b = b.begin();
  while (it_a != a.end() || it_b != b.end()) {
    if (it_b == b.end() || (it_a != a.end() && it_a->first < it_b->first)) {
      findings->push_back(
          {prefix + it_a->first, kNone, kNone, StrCat("removed (was ", it_a->second.path, ")")});
      ++it_a;
    } else if (it_a == a.end() || it_b->first < it_a->first) {
      findings->push_back(
          {prefix + it_b->first, kNone, kNone, StrCat("added (in ", it_b->second.path, ")")});
      ++it_b;
    } else {
      compare(prefix + it_a->first, it_a->second, it_b->second);
      ++it_a;
      ++it_b;
    }
  }
}

}  // namespace

const char kDiffHelp[] =
    "Compares tuning OLD with tuning NEW, block by block, and prints one line per difference:\n"
    "WHERE: BLOCK: PATH: CHANGE, WHERE being the use-case key (or 'golden SENSOR'), PATH the\n"
    "place in the tree (CCT#1(3800..4500) > GAIN#0(1..2)) or static_param, '-' for none.\n"
    "Told: use cases, golden calibrations and trees added or removed; a tree's enable; static\n"
    "parameters; levels whose type changed; regions added, removed or moved; leaves whose\n"
    "content changed (leaf, level or nothing); changed values as FIELD: OLD -> NEW, a list\n"
    "of another length as N values -> M values; the version text.\n"
    "Two files are compared with each other whatever their keys. A directory is read as the\n"
    "runtime reads it: its .binarypb files, one level deep, the first file of a key winning;\n"
    "use cases are matched by key, golden calibrations by sensor.\n"
    "\n"
    "  --all   every changed element of a list; past eight, a list is told in one line with the\n"
    "          count and the largest change\n"
    "\n"
    "Exit status, as diff's: 0 when equal, 1 when they differ, 2 on a usage error or a file\n"
    "that can't be read.\n";

std::string DiffFinding::ToString() const {
  return StrCat(where, ": ", block, ": ", path, ": ", change);
}

StatusOr<DiffRequest> ParseDiffArgs(const std::vector<std::string>& args) {
  DiffRequest request;
  std::vector<std::string> paths;
  for (const std::string& arg : args) {
    if (arg == "--all") {
      request.all_elements = true;
    } else if (arg.size() > 1 && arg[0] == '-') {
      return InvalidArgumentError(StrCat("unknown option ", arg));
    } else {
      paths.push_back(arg);
    }
  }
  if (paths.size() != 2) return InvalidArgumentError("give two tunings, OLD and NEW");
  request.old_path = paths[0];
  request.new_path = paths[1];
  return request;
}

StatusOr<std::vector<DiffFinding>> DiffTunings(const DiffRequest& request) {
  StatusOr<Side> old_side = ReadSide(request.old_path);
  if (!old_side.ok()) return old_side.status();
  StatusOr<Side> new_side = ReadSide(request.new_path);
  if (!new_side.ok()) return new_side.status();
  MessageDiffOptions options;
  if (request.all_elements) options.max_elements_per_list = 0;

  std::vector<DiffFinding> findings;
  auto compare_tunings = [&](const std::string& where, const TuningFile& a, const TuningFile& b) {
    CompareTunings(where, a, b, options, &findings);
  };
  auto compare_goldens = [&](const std::string& where, const GoldenFile& a, const GoldenFile& b) {
    CompareGoldens(where, a, b, options, &findings);
  };
  // Two files: whatever they hold, compared with each other.
  if (!old_side->is_directory && !new_side->is_directory &&
      old_side->tunings.size() == new_side->tunings.size() &&
      old_side->goldens.size() == new_side->goldens.size()) {
    if (old_side->tunings.size() == 1) {
      const auto& [old_key, old_file] = *old_side->tunings.begin();
      const auto& [new_key, new_file] = *new_side->tunings.begin();
      if (old_key != new_key) {
        findings.push_back({kNone, kNone, kNone, StrCat("use case: ", old_key, " -> ", new_key)});
      }
      compare_tunings(new_key, old_file, new_file);
    } else {
      const auto& [old_sensor, old_file] = *old_side->goldens.begin();
      const auto& [new_sensor, new_file] = *new_side->goldens.begin();
      compare_goldens("golden " + new_sensor, old_file, new_file);
    }
    return findings;
  }
  CompareByKey(old_side->tunings, new_side->tunings, "", compare_tunings, &findings);
  CompareByKey(old_side->goldens, new_side->goldens, "golden ", compare_goldens, &findings);
  return findings;
}

}  // namespace tavik::tune
