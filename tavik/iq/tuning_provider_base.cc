#include "tavik/iq/tuning_provider_base.h"

#include <dirent.h>
#include <sys/stat.h>

#include <algorithm>
#include <climits>
#include <utility>

#include "google/protobuf/dynamic_message.h"
#include "tavik/base/file_path.h"
#include "tavik/base/logging.h"
#include "tavik/base/strings.h"
#include "tavik/iq/private/interpolator.h"
#include "tavik/iq/read_binary_proto.h"

namespace vosbrine {
namespace {

using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;
using tavik::Status;
using tavik::StrCat;

constexpr char kBinarypbExtension[] = "binarypb";
// Any path containing this, a directory included, is a golden calibration file.
constexpr char kGoldenFileMarker[] = "golden_sensor_factory_calibration_data";

// Sorts `path` into the tuning or the golden list; false (logged) when it is no .binarypb.
bool AppendBinarypbPaths(const std::string& path, std::vector<std::string>* tuning_paths,
                         std::vector<std::string>* golden_paths) {
  if (tavik::Extension(path) != kBinarypbExtension) {
    TAVIK_LOG(ERROR) << path << " is not a binarypb.";
    return false;
  }
  if (path.find(kGoldenFileMarker) != std::string::npos) {
    golden_paths->push_back(path);
  } else {
    tuning_paths->push_back(path);
  }
  return true;
}

std::string EnumName(const google::protobuf::EnumDescriptor* type, int number) {
  const google::protobuf::EnumValueDescriptor* value = type->FindValueByNumber(number);
  return value == nullptr ? std::string() : value->name();
}

// A singular message field of `type` named `name`, or null.
const FieldDescriptor* FindSingularMessageField(const Descriptor* type, const std::string& name) {
  const FieldDescriptor* field = type->FindFieldByName(name);
  if (field == nullptr || field->cpp_type() != FieldDescriptor::CPPTYPE_MESSAGE ||
      field->is_repeated()) {
    return nullptr;
  }
  return field;
}

// Takes one field name, not a path. Null (logged) when the field is absent or is no message.
const FieldDescriptor* FindMessageField(const Message& message, const std::string& name) {
  const FieldDescriptor* field = FindSingularMessageField(message.GetDescriptor(), name);
  if (field == nullptr) TAVIK_LOG(ERROR) << "Field is not found: " << name;
  return field;
}

const Message* GetSubmessageByFieldPath(const Message& message, const std::string& name) {
  const FieldDescriptor* field = FindMessageField(message, name);
  if (field == nullptr) return nullptr;
  return &message.GetReflection()->GetMessage(message, field);
}

size_t CommonPrefixLength(const std::string& key, const std::string& wanted) {
  const size_t limit = std::min(key.size(), wanted.size());
  size_t length = 0;
  while (length < limit && key[length] == wanted[length]) ++length;
  return length;
}

// Unpacks the first leaf that a depth-first walk finds and that unpacks into `out`.
Status UnpackFirstLeaf(const Level& top_level, const tavik::PreparedTree& prepared, Message* out) {
  const Descriptor* type = out->GetDescriptor();
  const auto* nodes = &top_level.nodes();
  for (int i = 0; i < nodes->size();) {
    const Node& node = (*nodes)[i];
    if (node.has_dynamic_param()) {
      if (tavik::UnpackFromPrepared(node.dynamic_param(), &prepared, type, out)) {
        return tavik::OkStatus();
      }
      ++i;
    } else if (node.has_child_level()) {
      nodes = &node.child_level().nodes();
      i = 0;
    } else {
      ++i;
    }
  }
  return tavik::InternalError("First dynamic_param not found.");
}

// Makes a block message that may hold a former fill hold what a new message holds, but for the
// static and dynamic parameters, which the fill clears or drops itself.
void ResetForFill(const SubBlockFields& fields, const google::protobuf::Reflection* reflection,
                  Message* out) {
  if (!reflection->GetUnknownFields(*out).empty()) {
    reflection->MutableUnknownFields(out)->Clear();
  }
  const Descriptor* type = fields.block_type;
  for (int i = 0; i < type->field_count(); ++i) {
    const FieldDescriptor* field = type->field(i);
    if (field != fields.static_param && field != fields.dynamic_param) {
      reflection->ClearField(out, field);
    }
  }
}

// An enum number as the key text sees it: every unknown number has the same, empty, name.
int KeyNumber(const google::protobuf::EnumDescriptor* type, int number) {
  return type->FindValueByNumber(number) == nullptr ? INT_MIN : number;
}

int KeyNumber(const google::protobuf::EnumDescriptor* type, std::string_view name) {
  const google::protobuf::EnumValueDescriptor* value =
      name.empty() ? nullptr : type->FindValueByName(std::string(name));
  return value == nullptr ? INT_MIN : value->number();
}

// The key numbers of a key text that EncodeUsecaseKey made.
std::tuple<int, int, int> KeyOfText(std::string_view key) {
  constexpr std::string_view kSeparator = ", ";
  std::string_view names[3];
  for (int i = 0; i < 2; ++i) {
    const size_t end = key.find(kSeparator);
    if (end == std::string_view::npos) return {INT_MIN, INT_MIN, INT_MIN};
    names[i] = key.substr(0, end);
    key.remove_prefix(end + kSeparator.size());
  }
  names[2] = key;
  return {KeyNumber(CameraSensor_descriptor(), names[0]),
          KeyNumber(SensorMode_descriptor(), names[1]),
          KeyNumber(CameraUsecase_descriptor(), names[2])};
}

std::tuple<int, int, int> ExactKey(const TuningUsecase& usecase) {
  return {KeyNumber(CameraSensor_descriptor(), usecase.camera_sensor()),
          KeyNumber(SensorMode_descriptor(), usecase.sensor_mode()),
          KeyNumber(CameraUsecase_descriptor(), usecase.camera_usecase())};
}

}  // namespace

SubBlockFields::SubBlockFields(const Descriptor* block, const Descriptor* tree_set)
    : block_type(block),
      tree_set_type(tree_set),
      tree_name(FieldNameFromMessageName(block->full_name())),
      tree(FindSingularMessageField(tree_set, tree_name)),
      enable(block->FindFieldByName("enable")),
      static_param(FindSingularMessageField(block, "static_param")),
      dynamic_param(FindSingularMessageField(block, "dynamic_param")) {
  if (enable != nullptr &&
      (enable->cpp_type() != FieldDescriptor::CPPTYPE_BOOL || enable->is_repeated())) {
    enable = nullptr;
  }
}

std::string EncodeUsecaseKey(const TuningUsecase& usecase) {
  return StrCat(EnumName(CameraSensor_descriptor(), usecase.camera_sensor()), ", ",
                EnumName(SensorMode_descriptor(), usecase.sensor_mode()), ", ",
                EnumName(CameraUsecase_descriptor(), usecase.camera_usecase()));
}

std::string FieldNameFromMessageName(std::string_view name) {
  const size_t dot = name.rfind('.');
  if (dot != std::string_view::npos) name.remove_prefix(dot + 1);
  std::string field;
  for (size_t i = 0; i < name.size(); ++i) {
    const char c = name[i];
    const bool capital = c >= 'A' && c <= 'Z';
    if (capital && i > 0) field.push_back('_');
    field.push_back(capital ? static_cast<char>(c - 'A' + 'a') : c);
  }
  constexpr std::string_view kSuffix = "_tuning";
  if (field.size() >= kSuffix.size() &&
      std::string_view(field).substr(field.size() - kSuffix.size()) == kSuffix) {
    field.resize(field.size() - kSuffix.size());
  }
  return field;
}

Status TuningProviderBase::ReadBinaryProto(const std::string& path, Message& message) const {
  return tavik::ReadBinaryProto(path, message);
}

Status TuningProviderBase::ApplySensorEepromCalibration(
    const std::unique_ptr<const SensorEepromData>& /*eeprom_data*/,
    const GoldenSensorFactoryCalibrationData& /*golden*/, Message* /*tuning_tree_set*/) const {
  return tavik::UnimplementedError("ApplySensorEepromCalibration not implemented");
}

Status TuningProviderBase::Load(const std::vector<std::string>& paths,
                                const Descriptor* tree_set_descriptor,
                                const SensorEepromDataMap* eeprom_data) {
  if (paths.empty()) return tavik::InvalidArgumentError("Empty input paths.");

  std::vector<std::string> tuning_paths;
  std::vector<std::string> golden_paths;
  for (const std::string& entry : paths) {
    TAVIK_LOG(VERBOSE) << "Input entry: " << entry;
    struct stat info;
    if (stat(entry.c_str(), &info) == 0 && S_ISDIR(info.st_mode)) {
      TAVIK_LOG(VERBOSE) << "Input entry is directory. Searching for binarypbs.";
      int accepted = 0;
      if (DIR* directory = opendir(entry.c_str())) {
        // In the order the directory gives, one level deep. "." and ".." are not skipped: they
        // are rejected like any other name that is no .binarypb.
        while (const dirent* item = readdir(directory)) {
          if (item->d_name[0] == '\0') continue;
          if (AppendBinarypbPaths(tavik::JoinPath(entry, item->d_name), &tuning_paths,
                                  &golden_paths)) {
            ++accepted;
          }
        }
        closedir(directory);
      }
      if (accepted == 0) TAVIK_LOG(VERBOSE) << "No binarypb was found in the directory.";
    } else if (AppendBinarypbPaths(entry, &tuning_paths, &golden_paths)) {
      TAVIK_LOG(VERBOSE) << "Input entry is binarypb.";
    } else {
      TAVIK_LOG(VERBOSE) << "Input entry is not directory and not binarypb.";
    }
  }
  if (tuning_paths.empty()) return tavik::InvalidArgumentError("No valid tuning binarypb path.");

  std::vector<GoldenSensorFactoryCalibrationData> goldens;
  for (const std::string& path : golden_paths) {
    GoldenSensorFactoryCalibrationData golden;
    const Status status = ReadBinaryProto(path, golden);
    if (status.ok()) goldens.push_back(std::move(golden));
    TAVIK_LOG(VERBOSE) << "Golden data parsing status: " << status;
  }

  const size_t eeprom_count = eeprom_data == nullptr ? 0 : eeprom_data->size();
  TAVIK_LOG(VERBOSE) << "Available sensor EEPROM data: " << eeprom_count;

  int calibrated = 0;
  for (const std::string& path : tuning_paths) {
    TAVIK_LOG(VERBOSE) << "Trying to parse: " << path;
    TuningUsecaseData usecase_data;
    if (!ReadBinaryProto(path, usecase_data).ok()) {
      TAVIK_LOG(ERROR) << "Failed to parse binarypb. Name: " << path;
      continue;
    }
    std::shared_ptr<Message> tree_set;
    {
      google::protobuf::DynamicMessageFactory factory;
      factory.SetDelegateToGeneratedFactory(true);
      tree_set.reset(factory.GetPrototype(tree_set_descriptor)->New());
    }
    if (!usecase_data.tuning_tree_set().UnpackTo(tree_set.get())) {
      TAVIK_LOG(ERROR) << "Failed to unpack tuning_tree_set. Name: " << path;
      continue;
    }
    if (eeprom_count >= 1) {
      const auto entry = eeprom_data->find(usecase_data.tuning_usecase().camera_sensor());
      const auto golden = std::find_if(
          goldens.begin(), goldens.end(), [&](const GoldenSensorFactoryCalibrationData& g) {
            return g.camera_sensor() == usecase_data.tuning_usecase().camera_sensor();
          });
      if (entry != eeprom_data->end() && golden != goldens.end()) {
        const GoldenSensorFactoryCalibrationData golden_copy = *golden;
        const Status status =
            ApplySensorEepromCalibration(entry->second, golden_copy, tree_set.get());
        if (status.ok()) {
          ++calibrated;
        } else {
          TAVIK_LOG(ERROR) << status.message();
        }
      }
    }
    std::string key = EncodeUsecaseKey(usecase_data.tuning_usecase());
    if (forest_.count(key) != 0) {
      TAVIK_LOG(WARNING) << "Duplicated tuning_usecase: " << key;
      continue;
    }
    forest_.emplace(std::move(key), std::move(tree_set));
  }

  if (forest_.empty()) return tavik::InvalidArgumentError("No valid tuning binarypb.");
  BuildLookupIndex();
  TAVIK_LOG(INFO) << "Tuning binarypb found: " << tuning_paths.size()
                  << " Tuning binarypb parsed: " << forest_.size()
                  << " Golden data binarypb found: " << golden_paths.size()
                  << " Golden data binarypb parsed: " << goldens.size()
                  << " Calibration applied: " << calibrated;
  return tavik::OkStatus();
}

const Message* TuningProviderBase::GetTuningTreeSet(const TuningUsecase& usecase,
                                                    bool fallback) const {
  if (forest_.empty()) {
    TAVIK_LOG(ERROR) << "TuningForestMap is empty.";
    return nullptr;
  }
  if (const Message* exact = FindExactTreeSet(usecase)) return exact;
  const std::string key = EncodeUsecaseKey(usecase);
  const auto lower = forest_.lower_bound(key);
  if (lower != forest_.end() && lower->first == key) return lower->second.get();
  if (!fallback) {
    TAVIK_LOG(ERROR) << "Tuning_usecase not found: " << key;
    return nullptr;
  }
  if (lower == forest_.begin()) return lower->second.get();
  if (lower == forest_.end()) return std::prev(lower)->second.get();
  const auto before = std::prev(lower);
  // A tie goes to the smaller key.
  if (CommonPrefixLength(before->first, key) >= CommonPrefixLength(lower->first, key)) {
    return before->second.get();
  }
  return lower->second.get();
}

bool TuningProviderBase::HasTuningUsecase(const TuningUsecase& usecase) const {
  if (FindExactTreeSet(usecase) != nullptr) return true;
  TAVIK_LOG(WARNING) << "Tuning_usecase not found: " << EncodeUsecaseKey(usecase);
  return false;
}

bool TuningProviderBase::IsSubBlockEnabled(const TuningUsecase& usecase,
                                           const std::string& sub_block, bool fallback) const {
  const Message* tree_set = GetTuningTreeSet(usecase, fallback);
  if (tree_set == nullptr) {
    TAVIK_LOG(ERROR) << "Invalid tuning_usecase " << usecase.DebugString();
    return false;
  }
  const std::string field = FieldNameFromMessageName(sub_block);
  const auto* tree = dynamic_cast<const TuningTree*>(GetSubmessageByFieldPath(*tree_set, field));
  if (tree == nullptr) {
    TAVIK_LOG(ERROR) << "Invalid sub_block_str " << sub_block;
    return false;
  }
  return tree->enable();
}

Status TuningProviderBase::FillSubBlockTuning(const TuningUsecase& usecase,
                                              const CameraState& camera_state,
                                              Message* sub_block_tuning, bool fallback,
                                              bool bypassed) const {
  if (sub_block_tuning == nullptr) {
    return tavik::InvalidArgumentError("sub_block_tuning is nullptr.");
  }
  const tavik::PreparedTreeSet* tree_set = FindPreparedTreeSet(usecase, fallback);
  if (tree_set == nullptr) return tavik::NotFoundError("");
  const SubBlockFields fields(sub_block_tuning->GetDescriptor(), tree_set->type());
  return FillSubBlockTuning(*tree_set, fields, usecase, camera_state, sub_block_tuning, bypassed);
}

const tavik::PreparedTreeSet* TuningProviderBase::FindPreparedTreeSet(const TuningUsecase& usecase,
                                                                      bool fallback) const {
  const Message* tree_set = GetTuningTreeSet(usecase, fallback);
  if (tree_set == nullptr) return nullptr;
  const auto prepared = prepared_.find(tree_set);
  return prepared == prepared_.end() ? nullptr : prepared->second.get();
}

Status TuningProviderBase::FillSubBlockTuning(const tavik::PreparedTreeSet& tree_set,
                                              const SubBlockFields& fields,
                                              const TuningUsecase& usecase,
                                              const CameraState& camera_state,
                                              Message* sub_block_tuning, bool bypassed) const {
  if (sub_block_tuning == nullptr) {
    return tavik::InvalidArgumentError("sub_block_tuning is nullptr.");
  }
  if (fields.block_type != sub_block_tuning->GetDescriptor() ||
      fields.tree_set_type != tree_set.type()) {
    const SubBlockFields own_fields(sub_block_tuning->GetDescriptor(), tree_set.type());
    return FillSubBlockTuning(tree_set, own_fields, usecase, camera_state, sub_block_tuning,
                              bypassed);
  }
  Message& out = *sub_block_tuning;
  const google::protobuf::Reflection* reflection = out.GetReflection();
  // A former fill's submessages are kept for their storage; at every return below, the message
  // holds what a new one would, the submessages that a new one would not have made cleared away.
  ResetForFill(fields, reflection, &out);
  auto drop_submessages_from = [&](const FieldDescriptor* first) {
    for (const FieldDescriptor* field : {fields.static_param, fields.dynamic_param}) {
      if (field == first) first = nullptr;
      if (first == nullptr && field != nullptr) reflection->ClearField(&out, field);
    }
  };

  const TuningTree* tree = nullptr;
  if (fields.tree == nullptr) {
    // The line of FindMessageField, which found nothing when the fields were resolved.
    TAVIK_LOG(ERROR) << "Field is not found: " << fields.tree_name;
  } else {
    tree = dynamic_cast<const TuningTree*>(
        &tree_set.reflection()->GetMessage(tree_set.tree_set(), fields.tree));
  }
  if (tree == nullptr) {
    drop_submessages_from(fields.static_param);
    return tavik::NotFoundError(
        StrCat("TuningUsecaseData does not contain the requested sub block tuning tree for ",
               fields.tree_name));
  }
  const tavik::PreparedTree& prepared = tree_set.Get(fields.tree, *tree);

  const bool enabled = !bypassed && tree->enable();
  if (fields.enable != nullptr) reflection->SetBool(&out, fields.enable, enabled);

  if (fields.static_param == nullptr) {
    TAVIK_LOG(ERROR) << "Field is not found: static_param";
    drop_submessages_from(fields.dynamic_param);
    return tavik::InvalidArgumentError(
        "Can't get mutable static_param message from output message.");
  }
  Message* static_param = reflection->MutableMessage(&out, fields.static_param);
  static_param->Clear();
  if (!tavik::UnpackFromPrepared(tree->static_param(), &prepared,
                                 fields.static_param->message_type(), static_param)) {
    drop_submessages_from(fields.dynamic_param);
    return tavik::InternalError(StrCat("Failed to unpack static_param. ", usecase.DebugString()));
  }
  if (fields.dynamic_param == nullptr) {
    TAVIK_LOG(ERROR) << "Field is not found: dynamic_param";
    return tavik::InvalidArgumentError(
        "Can't get mutable dynamic_param message from output message.");
  }
  Message* dynamic_param = reflection->MutableMessage(&out, fields.dynamic_param);
  dynamic_param->Clear();
  if (enabled) return tavik::InterpolateTree(prepared, camera_state, dynamic_param);
  return UnpackFirstLeaf(tree->dynamic_top_level(), prepared, dynamic_param);
}

void TuningProviderBase::BuildLookupIndex() {
  exact_index_.clear();
  prepared_.clear();
  for (const auto& [key, tree_set] : forest_) {
    exact_index_.try_emplace(KeyOfText(key), tree_set.get());
    prepared_.try_emplace(tree_set.get(), std::make_unique<tavik::PreparedTreeSet>(*tree_set));
  }
}

const Message* TuningProviderBase::FindExactTreeSet(const TuningUsecase& usecase) const {
  const auto found = exact_index_.find(ExactKey(usecase));
  return found == exact_index_.end() ? nullptr : found->second;
}

Status TuningProviderBase::FindMutableDynamicParams(Level* level,
                                                    std::vector<google::protobuf::Any*>* dynamic_params) {
  if (level == nullptr) return tavik::InvalidArgumentError("level is nullptr");
  if (dynamic_params == nullptr) return tavik::InvalidArgumentError("dynamic_params is nullptr");
  for (Node& node : *level->mutable_nodes()) {
    if (node.has_child_level()) {
      const Status status = FindMutableDynamicParams(node.mutable_child_level(), dynamic_params);
      if (!status.ok()) return status;
    } else if (node.has_dynamic_param()) {
      dynamic_params->push_back(node.mutable_dynamic_param());
    }
  }
  return tavik::OkStatus();
}

}  // namespace vosbrine
