#include "tavik/iq/private/interpolator.h"

#include <algorithm>
#include <memory>

#include "google/protobuf/descriptor.pb.h"
#include "tavik/base/logging.h"
#include "tavik/base/status_macros.h"
#include "tavik/base/strings.h"

namespace tavik {
namespace {

using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;
using google::protobuf::Reflection;
using PathIterator = std::vector<MutableTraversalPathNode>::const_iterator;

// Below this, two regions touch and there is no gap to blend across.
constexpr float kMinimumRegionGap = 1e-6f;

// "foo[2].x" for the float x in element 2 of the repeated field foo.
std::string GetFieldPath(PathIterator begin, PathIterator end) {
  std::string path;
  for (PathIterator node = begin; node != end; ++node) {
    if (node->index.has_value()) StrAppend(&path, "[", *node->index, "]");
    if (!path.empty()) path += ".";
    path += node->field->name();
  }
  return path;
}

void AppendChildFieldName(size_t prefix_length, const FieldDescriptor* field, std::string* name) {
  name->resize(prefix_length);
  if (field->is_extension()) {
    StrAppend(name, "<", field->PrintableNameForExtension(), ">");
  } else {
    name->append(field->name());
  }
}

// Every field in declaration order, set or not, so that a proto3 zero is blended like any value;
// then the extensions that are set.
void CollectFieldDescriptors(const Message& message, std::vector<const FieldDescriptor*>* fields) {
  const Descriptor* descriptor = message.GetDescriptor();
  for (int i = 0; i < descriptor->field_count(); ++i) fields->push_back(descriptor->field(i));
  std::vector<const FieldDescriptor*> set_fields;
  message.GetReflection()->ListFields(message, &set_fields);
  for (const FieldDescriptor* field : set_fields) {
    if (field->is_extension()) fields->push_back(field);
  }
}

void TraverseMessageInternal(Message* message, std::string* field_path,
                             std::vector<MutableTraversalPathNode>* path,
                             const MutableTraversalVisitor& visitor, std::optional<int> index) {
  const size_t prefix_length = field_path->size();
  std::vector<const FieldDescriptor*> fields;
  CollectFieldDescriptors(*message, &fields);
  const Reflection* reflection = message->GetReflection();
  for (const FieldDescriptor* field : fields) {
    AppendChildFieldName(prefix_length, field, field_path);
    path->push_back(MutableTraversalPathNode{message, field, index});
    const bool go_deeper = visitor(field_path, path, field, message);
    if (go_deeper && (field->type() == FieldDescriptor::TYPE_MESSAGE ||
                      field->type() == FieldDescriptor::TYPE_GROUP)) {
      field_path->push_back('.');
      const size_t with_dot = field_path->size();
      if (field->is_repeated()) {
        const int size = reflection->FieldSize(*message, field);
        for (int i = 0; i < size; ++i) {
          TraverseMessageInternal(reflection->MutableRepeatedMessage(message, field, i), field_path,
                                  path, visitor, i);
          field_path->resize(with_dot);
        }
      } else if (reflection->HasField(*message, field)) {
        TraverseMessageInternal(reflection->MutableMessage(message, field), field_path, path,
                                visitor, std::nullopt);
      }
    }
    path->pop_back();
  }
  field_path->resize(prefix_length);
}

// The message of `root` that corresponds to the leaf's holder along `path`, or null (logged)
// when the path can't be followed. A repeated message field takes its element index from the
// node after it and skips that node, so a float nested below a message inside a repeated element
// is out of reach: such fields keep the first region's value.
const Message* FindMatchingMessage(const Message& root,
                                   const std::vector<MutableTraversalPathNode>& path) {
  const Message* current = &root;
  for (size_t k = 0; k < path.size();) {
    const FieldDescriptor* field = path[k].field;
    if (field->containing_type() != current->GetDescriptor()) {
      TAVIK_LOG(ERROR) << "field is not found: "
                       << GetFieldPath(path.begin(), path.begin() + k + 1);
      return nullptr;
    }
    if (field->cpp_type() != FieldDescriptor::CPPTYPE_MESSAGE) break;
    const Reflection* reflection = current->GetReflection();
    if (!field->is_repeated()) {
      current = &reflection->GetMessage(*current, field);
      k += 1;
      continue;
    }
    if (k + 1 >= path.size() || !path[k + 1].index.has_value()) {
      TAVIK_LOG(ERROR) << "Missing index for "
                       << GetFieldPath(path.begin(), path.begin() + std::min(k + 2, path.size()));
      return nullptr;
    }
    const int index = *path[k + 1].index;
    if (index >= reflection->FieldSize(*current, field)) {
      TAVIK_LOG(ERROR) << "field is not found: "
                       << GetFieldPath(path.begin(), path.begin() + k + 2);
      return nullptr;
    }
    current = &reflection->GetRepeatedMessage(*current, field, index);
    k += 2;
  }
  return current;
}

// The visitor of one blend: `out` is traversed, `msg2` followed along the same path.
class BlendingVisitor {
 public:
  BlendingVisitor(const Message& msg2, float t) : msg2_(msg2), t_(t) {}

  bool operator()(const std::string* field_path, std::vector<MutableTraversalPathNode>* path,
                  const FieldDescriptor* field, Message* message) const {
    if (field_path == nullptr || path == nullptr || field == nullptr || message == nullptr) {
      TAVIK_LOG(ERROR) << "Unexpected nullptr from TraverseMutableMessageWithPath().";
      return false;
    }
    if (field->options().deprecated()) {
      TAVIK_LOG(VERBOSE) << *field_path << " is deprecated.";
      return false;
    }
    if (field->cpp_type() != FieldDescriptor::CPPTYPE_FLOAT) {
      TAVIK_LOG(VERBOSE) << *field_path << " not float field, going deeper.";
      return true;
    }
    const Message* source = FindMatchingMessage(msg2_, *path);
    if (source == nullptr) return false;
    const Reflection* reflection = message->GetReflection();
    if (!field->is_repeated()) {
      reflection->SetFloat(message, field,
                           BlendFloat(reflection->GetFloat(*message, field),
                                      source->GetReflection()->GetFloat(*source, field), t_));
    } else {
      // The raw arrays let the inner loop vectorise; the field-ref API would cost a virtual call
      // per element.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
      google::protobuf::RepeatedField<float>* out_values =
          reflection->MutableRepeatedField<float>(message, field);
      const google::protobuf::RepeatedField<float>& source_values =
          source->GetReflection()->GetRepeatedField<float>(*source, field);
#pragma GCC diagnostic pop
      if (out_values->size() != source_values.size()) {
        TAVIK_LOG(ERROR) << "Mismatched sizes found at the repeated field " << *field_path;
        return false;
      }
      BlendFloats(out_values->mutable_data(), source_values.data(), out_values->size(), t_);
    }
    TAVIK_LOG(VERBOSE) << *field_path << " is interpolated.";
    return false;
  }

 private:
  const Message& msg2_;
  float t_;
};

// The coordinate that a level of `type` reads, or nullopt for a type outside the known ones.
// Matched by name: LevelCoordinates numbers its fields in another order than Level.Type.
std::optional<float> CoordinateForLevel(vosbrine::Level::Type type,
                                        const vosbrine::LevelCoordinates& coordinates) {
  switch (type) {
    case vosbrine::Level::LED:
      return coordinates.led_influence();
    case vosbrine::Level::CCT:
      return coordinates.cct();
    case vosbrine::Level::BV:
      return coordinates.bv();
    case vosbrine::Level::GAIN:
      return coordinates.real_gain();
    case vosbrine::Level::EXP_RATIO:
      return coordinates.exp_ratio();
    case vosbrine::Level::SCALER_RATIO:
      return coordinates.scaler_ratio();
    case vosbrine::Level::MIRED_CCT:
      return coordinates.mired_cct();
    case vosbrine::Level::PRE_SCALER_RATIO:
      return coordinates.pre_scaler_ratio();
    case vosbrine::Level::FRAME_COUNT:
      return coordinates.frame_count();
    case vosbrine::Level::EXPOSURE_TIME_MSECS:
      return coordinates.exposure_time_msecs();
    default:
      return std::nullopt;
  }
}

// What stays the same over one tree's evaluation: every message it fills is of one type.
struct TreeEvaluation {
  const vosbrine::CameraState& state;
  const PreparedTree* prepared;  // Null for a tree evaluated as it is packed.
  const Descriptor* type;
  const BlendPlan* plan;  // Null where the reflection walk blends.
};

Status LinearInterpolateLevel(const vosbrine::Level& level, const TreeEvaluation& evaluation,
                              Message* out);

// Fills `out` from one region: its leaf, or the evaluation of its child level.
Status FillRegion(const vosbrine::Node& node, const TreeEvaluation& evaluation,
                  std::string_view unpack_failure, Message* out) {
  if (node.has_dynamic_param()) {
    if (!UnpackFromPrepared(node.dynamic_param(), evaluation.prepared, evaluation.type, out)) {
      return InvalidArgumentError(StrCat(unpack_failure, out->GetTypeName()));
    }
    return OkStatus();
  }
  // An unset oneof reads as an empty child level, which fails as such.
  return LinearInterpolateLevel(node.child_level(), evaluation, out);
}

bool SameType(const Message& a, const Message& b) {
  return a.GetDescriptor()->full_name() == b.GetDescriptor()->full_name();
}

// The blend of LinearInterpolateMessage once its arguments are known good and `out` holds msg1:
// by `plan` when there is one and verbose logging, whose lines only the walk writes, is off.
void BlendIntoFirst(const Message& msg2, float x1, float x2, float x, const BlendPlan* plan,
                    Message* out) {
  const float delta = x2 - x1;
  if (!(delta > kMinimumRegionGap)) {
    TAVIK_LOG(VERBOSE) << "x2 <= x1, no interpolation was done.";
    return;
  }
  const float t = std::min(std::max((x - x1) / delta, 0.0f), 1.0f);
  if (!(t > 0.0f)) {
    TAVIK_LOG(VERBOSE) << "t <= 0.0, no interpolation was done. out = msg1.";
    return;
  }
  if (!(t < 1.0f)) {
    out->CopyFrom(msg2);
    TAVIK_LOG(VERBOSE) << "t >= 1.0f, no interpolation was done. out = msg2.";
    return;
  }
  if (plan != nullptr && !android::base::ShouldLog(android::base::VERBOSE, nullptr)) {
    plan->Blend(out, msg2, t);
  } else {
    BlendMessagesByReflection(msg2, t, out);
  }
}

Status LinearInterpolateLevel(const vosbrine::Level& level, const TreeEvaluation& evaluation,
                              Message* out) {
  const auto& nodes = level.nodes();
  if (nodes.empty()) return InvalidArgumentError(StrCat("Empty level. ", out->GetTypeName()));
  const std::optional<float> coordinate =
      CoordinateForLevel(level.type(), evaluation.state.level_coordinates());
  if (!coordinate.has_value()) return InvalidArgumentError("Unexpected node type.");
  const float x = *coordinate;

  // First region whose upper bound reaches x; past all regions, the last one. A NaN reaches none
  // of the comparisons and so ends at the first region.
  auto reaching = std::lower_bound(
      nodes.begin(), nodes.end(), x,
      [](const vosbrine::Node& node, float value) { return node.upper() < value; });
  if (reaching == nodes.end()) --reaching;
  const int i = static_cast<int>(reaching - nodes.begin());

  const bool single_region = nodes[i].lower() <= x || i == 0;
  const vosbrine::Node& first = single_region ? nodes[i] : nodes[i - 1];
  TAVIK_RETURN_IF_ERROR(FillRegion(first, evaluation, "Failed to Unpack first_region. ", out));
  if (single_region) return OkStatus();

  // A prepared leaf is blended from where it lies; anything else is made in a message of its own.
  // Either is of the type of `out`, and `out` holds the first region: LinearInterpolateMessage's
  // checks would pass and its copy do nothing, so it could not fail with "Interpolation failed.
  // Using first_region only. ", and its blend is all there is to do.
  const vosbrine::Node& second = nodes[i];
  const Message* second_message = nullptr;
  std::unique_ptr<Message> made;
  if (evaluation.prepared != nullptr && second.has_dynamic_param()) {
    second_message = evaluation.prepared->Unpacked(second.dynamic_param(), evaluation.type);
  }
  if (second_message == nullptr) {
    made.reset(out->New());
    TAVIK_RETURN_IF_ERROR(
        FillRegion(second, evaluation, "Failed to Unpack second_region. ", made.get()));
    second_message = made.get();
  }
  BlendIntoFirst(*second_message, first.upper(), second.lower(), x, evaluation.plan, out);
  return OkStatus();
}

Status InterpolateTreeInternal(const vosbrine::TuningTree& tree, const vosbrine::CameraState& state,
                               const PreparedTree* prepared, Message* out_dynamic_msg) {
  if (out_dynamic_msg == nullptr) return InvalidArgumentError("out_dynamic_msg is nullptr.");
  if (&tree == &vosbrine::TuningTree::default_instance() || !tree.has_dynamic_top_level()) {
    return InvalidArgumentError("Tree does not have dynamic_top_level.");
  }
  const Descriptor* type = out_dynamic_msg->GetDescriptor();
  const TreeEvaluation evaluation{state, prepared, type,
                                  prepared == nullptr ? nullptr : prepared->PlanFor(type)};
  return LinearInterpolateLevel(tree.dynamic_top_level(), evaluation, out_dynamic_msg);
}

}  // namespace

Status InterpolateTree(const vosbrine::TuningTree& tree, const vosbrine::CameraState& state,
                       Message* out_dynamic_msg) {
  return InterpolateTreeInternal(tree, state, nullptr, out_dynamic_msg);
}

Status InterpolateTree(const PreparedTree& tree, const vosbrine::CameraState& state,
                       Message* out_dynamic_msg) {
  return InterpolateTreeInternal(tree.tree(), state, &tree, out_dynamic_msg);
}

bool LinearInterpolateMessage(const Message& msg1, const Message& msg2, float x1, float x2, float x,
                              Message* out) {
  if (out == nullptr) {
    TAVIK_LOG(ERROR) << "Output messages pointer is nullptr.";
    return false;
  }
  if (!SameType(msg1, msg2) || !SameType(msg1, *out)) {
    TAVIK_LOG(ERROR) << "Input and output messages are not the same type.";
    return false;
  }
  out->CopyFrom(msg1);
  BlendIntoFirst(msg2, x1, x2, x, nullptr, out);
  return true;
}

void BlendMessagesByReflection(const Message& msg2, float t, Message* out) {
  TraverseMutableMessageWithPath(out, BlendingVisitor(msg2, t));
}

void TraverseMutableMessageWithPath(Message* message, const MutableTraversalVisitor& visitor) {
  std::string field_path;
  std::vector<MutableTraversalPathNode> path;
  TraverseMessageInternal(message, &field_path, &path, visitor, std::nullopt);
}

}  // namespace tavik
