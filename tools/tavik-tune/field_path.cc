#include "tools/tavik-tune/field_path.h"

#include <charconv>

#include "tavik/base/strings.h"

namespace tavik::tune {
namespace {

using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;
using google::protobuf::Reflection;

bool IsNumber(const FieldDescriptor& field) {
  return field.cpp_type() != FieldDescriptor::CPPTYPE_MESSAGE &&
         field.cpp_type() != FieldDescriptor::CPPTYPE_STRING;
}

double ReadNumber(const Message& message, const FieldDescriptor& field, int index) {
  const Reflection& reflection = *message.GetReflection();
  const bool repeated = field.is_repeated();
  switch (field.cpp_type()) {
    case FieldDescriptor::CPPTYPE_FLOAT:
      return repeated ? reflection.GetRepeatedFloat(message, &field, index)
                      : reflection.GetFloat(message, &field);
    case FieldDescriptor::CPPTYPE_DOUBLE:
      return repeated ? reflection.GetRepeatedDouble(message, &field, index)
                      : reflection.GetDouble(message, &field);
    case FieldDescriptor::CPPTYPE_INT32:
      return repeated ? reflection.GetRepeatedInt32(message, &field, index)
                      : reflection.GetInt32(message, &field);
    case FieldDescriptor::CPPTYPE_INT64:
      return static_cast<double>(repeated ? reflection.GetRepeatedInt64(message, &field, index)
                                          : reflection.GetInt64(message, &field));
    case FieldDescriptor::CPPTYPE_UINT32:
      return repeated ? reflection.GetRepeatedUInt32(message, &field, index)
                      : reflection.GetUInt32(message, &field);
    case FieldDescriptor::CPPTYPE_UINT64:
      return static_cast<double>(repeated ? reflection.GetRepeatedUInt64(message, &field, index)
                                          : reflection.GetUInt64(message, &field));
    case FieldDescriptor::CPPTYPE_BOOL:
      return (repeated ? reflection.GetRepeatedBool(message, &field, index)
                       : reflection.GetBool(message, &field))
                 ? 1.0
                 : 0.0;
    case FieldDescriptor::CPPTYPE_ENUM:
      return repeated ? reflection.GetRepeatedEnumValue(message, &field, index)
                      : reflection.GetEnumValue(message, &field);
    default:
      return 0.0;
  }
}

// "name" or "name[index]".
struct Part {
  std::string_view name;
  int index = -1;
};

StatusOr<Part> SplitPart(std::string_view part, std::string_view text) {
  const size_t bracket = part.find('[');
  if (bracket == std::string_view::npos) {
    if (part.empty()) return InvalidArgumentError(StrCat("empty name in field path '", text, "'"));
    return Part{part};
  }
  const std::string_view digits = part.substr(bracket + 1, part.size() - bracket - 2);
  int index = -1;
  const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), index);
  if (bracket == 0 || part.back() != ']' || digits.empty() || error != std::errc() ||
      end != digits.data() + digits.size() || index < 0) {
    return InvalidArgumentError(
        StrCat("bad element '", part, "' in field path '", text, "': write name[index]"));
  }
  return Part{part.substr(0, bracket), index};
}

}  // namespace

StatusOr<FieldPath> FieldPath::Parse(const Descriptor* block, std::string_view text) {
  std::vector<Step> steps;
  const Descriptor* type = block;
  std::vector<std::string_view> parts;
  for (size_t start = 0;;) {
    const size_t dot = text.find('.', start);
    parts.push_back(text.substr(start, dot == std::string_view::npos ? dot : dot - start));
    if (dot == std::string_view::npos) break;
    start = dot + 1;
  }
  for (size_t i = 0; i < parts.size(); ++i) {
    StatusOr<Part> part = SplitPart(parts[i], text);
    if (!part.ok()) return part.status();
    const FieldDescriptor* field = type->FindFieldByName(std::string(part->name));
    if (i == 0) {
      // Most fields worth a look are the dynamic ones: let them go without the prefix.
      const FieldDescriptor* dynamic_param = block->FindFieldByName("dynamic_param");
      if (dynamic_param != nullptr && dynamic_param->message_type() != nullptr) {
        if (const FieldDescriptor* dynamic =
                dynamic_param->message_type()->FindFieldByName(std::string(part->name));
            dynamic != nullptr) {
          steps.push_back({dynamic_param, kWhole});
          field = dynamic;
        }
      }
    }
    if (field == nullptr) {
      return InvalidArgumentError(
          StrCat("no field '", part->name, "' in ",
                 i == 0 ? StrCat(block->name(), " or its dynamic_param") : type->name()));
    }
    if (part->index != kWhole && !field->is_repeated()) {
      return InvalidArgumentError(StrCat("'", part->name, "' is not repeated: drop the index"));
    }
    steps.push_back({field, part->index});
    const bool last = i + 1 == parts.size();
    if (field->cpp_type() == FieldDescriptor::CPPTYPE_MESSAGE) {
      if (last) {
        return InvalidArgumentError(
            StrCat("'", part->name, "' is a message: name one of its fields"));
      }
      if (field->is_repeated() && part->index == kWhole) {
        return InvalidArgumentError(
            StrCat("'", part->name, "' is a list of messages: pick one, ", part->name, "[0]"));
      }
      type = field->message_type();
    } else if (!last) {
      return InvalidArgumentError(StrCat("'", part->name, "' has no fields"));
    } else if (!IsNumber(*field)) {
      return InvalidArgumentError(StrCat("'", part->name, "' is not a number"));
    }
  }
  return FieldPath(std::string(text), std::move(steps));
}

StatusOr<std::vector<double>> FieldPath::Read(const Message& block) const {
  const Message* message = &block;
  for (const Step& step : steps_) {
    const Reflection& reflection = *message->GetReflection();
    const int size = step.field->is_repeated() ? reflection.FieldSize(*message, step.field) : 1;
    if (step.index != kWhole && step.index >= size) {
      return OutOfRangeError(
          StrCat(step.field->name(), "[", step.index, "] is past the end of ", size, " values"));
    }
    if (step.field->cpp_type() != FieldDescriptor::CPPTYPE_MESSAGE) {
      if (step.index != kWhole || !step.field->is_repeated()) {
        return std::vector<double>{ReadNumber(*message, *step.field, step.index)};
      }
      std::vector<double> values;
      values.reserve(size);
      for (int i = 0; i < size; ++i) values.push_back(ReadNumber(*message, *step.field, i));
      return values;
    }
    message = step.index == kWhole
                  ? &reflection.GetMessage(*message, step.field)
                  : &reflection.GetRepeatedMessage(*message, step.field, step.index);
  }
  return std::vector<double>{};  // Parse never makes a path without a number at its end.
}

bool FieldPath::IsList() const {
  return !steps_.empty() && steps_.back().field->is_repeated() && steps_.back().index == kWhole;
}

std::string FieldPath::ElementLabel(size_t index) const {
  return IsList() ? StrCat(text_, "[", index, "]") : text_;
}

}  // namespace tavik::tune
