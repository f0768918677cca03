#include "tavik/iq/private/blend_plan.h"

#include <mutex>
#include <utility>

#include "google/protobuf/descriptor.pb.h"
#include "tavik/base/containers.h"
#include "tavik/base/logging.h"
#include "tavik/base/strings.h"

namespace tavik {

using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;
using google::protobuf::Reflection;

// One field of a message that a blend touches, in declaration order.
struct BlendPlan::Step {
  enum class Kind { kFloat, kRepeatedFloat, kMessage, kRepeatedMessage };

  Kind kind;
  const FieldDescriptor* field;
  // The dotted name that the error lines print ("a.b.c"); element indices are not part of it.
  std::string path;
  // kMessage: the submessage's steps; kRepeatedMessage: those of each element.
  std::unique_ptr<Node> child;
};

struct BlendPlan::Node {
  std::vector<Step> steps;

  void Blend(Message* out, const Message& source, float t) const;
  // The lines of an element of `out` that `source` lacks: each float of it is "not found".
  void LogMissingElement(const std::string& repeated_path, int index) const;
};

namespace {

bool IsMessage(const FieldDescriptor* field) {
  return field->cpp_type() == FieldDescriptor::CPPTYPE_MESSAGE;
}

// Whether `type` holds a message field that the walk would enter.
bool HasMessageFields(const Descriptor* type) {
  for (int i = 0; i < type->field_count(); ++i) {
    const FieldDescriptor* field = type->field(i);
    if (IsMessage(field) && !field->options().deprecated()) return true;
  }
  return false;
}

}  // namespace

BlendPlan::BlendPlan(const Descriptor* type) : type_(type) {}

BlendPlan::~BlendPlan() = default;

std::unique_ptr<BlendPlan> BlendPlan::Compile(const Descriptor* type) {
  if (type == nullptr) return nullptr;
  std::vector<const Descriptor*> open;
  std::unique_ptr<Node> root = CompileNode(type, "", &open);
  if (root == nullptr) return nullptr;
  std::unique_ptr<BlendPlan> plan(new BlendPlan(type));
  plan->root_ = std::move(root);
  return plan;
}

const BlendPlan* BlendPlan::ForGeneratedType(const Descriptor* type) {
  if (type == nullptr ||
      type->file()->pool() != google::protobuf::DescriptorPool::generated_pool()) {
    return nullptr;
  }
  static std::mutex* const mutex = new std::mutex;
  static auto* const plans = new FlatHashMap<const Descriptor*, std::unique_ptr<BlendPlan>>;
  std::lock_guard<std::mutex> lock(*mutex);
  auto [entry, inserted] = plans->try_emplace(type);
  if (inserted) entry->second = Compile(type);
  return entry->second.get();
}

void BlendPlan::Blend(Message* out, const Message& source, float t) const {
  root_->Blend(out, source, t);
}

std::unique_ptr<BlendPlan::Node> BlendPlan::CompileNode(const Descriptor* type,
                                                        const std::string& prefix,
                                                        std::vector<const Descriptor*>* open) {
  using Kind = BlendPlan::Step::Kind;
  // The walk visits set extensions and every member of a oneof (setting the member it blends).
  if (type->extension_range_count() > 0 || type->real_oneof_decl_count() > 0) return nullptr;
  for (const Descriptor* ancestor : *open) {
    if (ancestor == type) return nullptr;
  }
  open->push_back(type);
  auto node = std::make_unique<BlendPlan::Node>();
  bool plannable = true;
  for (int i = 0; i < type->field_count() && plannable; ++i) {
    const FieldDescriptor* field = type->field(i);
    // A deprecated field is neither blended nor entered.
    if (field->options().deprecated()) continue;
    std::string path = prefix.empty() ? field->name() : StrCat(prefix, ".", field->name());
    if (field->cpp_type() == FieldDescriptor::CPPTYPE_FLOAT) {
      node->steps.push_back({field->is_repeated() ? Kind::kRepeatedFloat : Kind::kFloat, field,
                             std::move(path), nullptr});
      continue;
    }
    if (!IsMessage(field)) continue;
    if (field->is_map()) {
      plannable = false;
      break;
    }
    // The walk finds an element's counterpart by index and then skips a level of the path, so a
    // message inside a repeated element is matched in ways a list of steps does not follow.
    if (field->is_repeated() && HasMessageFields(field->message_type())) {
      plannable = false;
      break;
    }
    std::unique_ptr<Node> child = CompileNode(field->message_type(), path, open);
    if (child == nullptr) {
      plannable = false;
      break;
    }
    // A submessage without floats is entered by the walk to no effect.
    if (child->steps.empty()) continue;
    node->steps.push_back({field->is_repeated() ? Kind::kRepeatedMessage : Kind::kMessage, field,
                           std::move(path), std::move(child)});
  }
  open->pop_back();
  if (!plannable) return nullptr;
  return node;
}

void BlendPlan::Node::Blend(Message* out, const Message& source, float t) const {
  using Kind = Step::Kind;
  const Reflection* out_reflection = out->GetReflection();
  const Reflection* source_reflection = source.GetReflection();
  for (const Step& step : steps) {
    const FieldDescriptor* field = step.field;
    switch (step.kind) {
      case Kind::kFloat:
        out_reflection->SetFloat(out, field,
                                 BlendFloat(out_reflection->GetFloat(*out, field),
                                            source_reflection->GetFloat(source, field), t));
        break;
      case Kind::kRepeatedFloat: {
        // The raw arrays let the inner loop vectorise; the field-ref API would cost a virtual
        // call per element.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
        google::protobuf::RepeatedField<float>* out_values =
            out_reflection->MutableRepeatedField<float>(out, field);
        const google::protobuf::RepeatedField<float>& source_values =
            source_reflection->GetRepeatedField<float>(source, field);
#pragma GCC diagnostic pop
        if (out_values->size() != source_values.size()) {
          TAVIK_LOG(ERROR) << "Mismatched sizes found at the repeated field " << step.path;
          break;
        }
        BlendFloats(out_values->mutable_data(), source_values.data(), out_values->size(), t);
        break;
      }
      case Kind::kMessage:
        // An unset submessage of `out` is not entered, nor created.
        if (out_reflection->HasField(*out, field)) {
          step.child->Blend(out_reflection->MutableMessage(out, field),
                            source_reflection->GetMessage(source, field), t);
        }
        break;
      case Kind::kRepeatedMessage: {
        const int size = out_reflection->FieldSize(*out, field);
        const int source_size = source_reflection->FieldSize(source, field);
        for (int i = 0; i < size; ++i) {
          Message* element = out_reflection->MutableRepeatedMessage(out, field, i);
          if (i < source_size) {
            step.child->Blend(element, source_reflection->GetRepeatedMessage(source, field, i), t);
          } else {
            step.child->LogMissingElement(step.path, i);
          }
        }
        break;
      }
    }
  }
}

void BlendPlan::Node::LogMissingElement(const std::string& repeated_path, int index) const {
  for (const Step& step : steps) {
    TAVIK_LOG(ERROR) << "field is not found: " << repeated_path << "[" << index << "]."
                     << step.field->name();
  }
}

}  // namespace tavik
