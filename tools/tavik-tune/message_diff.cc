#include "tools/tavik-tune/message_diff.h"

#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>

#include "absl/strings/escaping.h"
#include "tavik/base/strings.h"

namespace tavik::tune {
namespace {

using google::protobuf::Descriptor;
using google::protobuf::FieldDescriptor;
using google::protobuf::Message;
using google::protobuf::Reflection;

template <typename T>
std::string ShortestText(T value) {
  char text[64];
  const auto result = std::to_chars(text, text + sizeof(text), value);
  return std::string(text, result.ptr);
}

// A difference of two values is read for its size: six significant digits are plenty, and
// spare it the digits of the subtraction's rounding.
std::string SixDigits(double value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%.6g", value);
  return text;
}

template <typename T>
bool SameBits(T a, T b) {
  return std::memcmp(&a, &b, sizeof(T)) == 0;
}

// One element of a scalar field: its text, and its value as a number where it has one.
struct Scalar {
  std::string text;
  double number = 0;
  bool is_number = false;
};

// Reads element `index` of a repeated field, or the field itself when `index` is negative.
Scalar ReadScalar(const Message& message, const FieldDescriptor& field, int index) {
  const Reflection& r = *message.GetReflection();
  const bool repeated = index >= 0;
  switch (field.cpp_type()) {
    case FieldDescriptor::CPPTYPE_FLOAT: {
      const float v =
          repeated ? r.GetRepeatedFloat(message, &field, index) : r.GetFloat(message, &field);
      return {FormatFloat(v), v, true};
    }
    case FieldDescriptor::CPPTYPE_DOUBLE: {
      const double v =
          repeated ? r.GetRepeatedDouble(message, &field, index) : r.GetDouble(message, &field);
      return {ShortestText(v), v, true};
    }
    case FieldDescriptor::CPPTYPE_INT32: {
      const int32_t v =
          repeated ? r.GetRepeatedInt32(message, &field, index) : r.GetInt32(message, &field);
      return {StrCat(v), static_cast<double>(v), true};
    }
    case FieldDescriptor::CPPTYPE_INT64: {
      const int64_t v =
          repeated ? r.GetRepeatedInt64(message, &field, index) : r.GetInt64(message, &field);
      return {StrCat(v), static_cast<double>(v), true};
    }
    case FieldDescriptor::CPPTYPE_UINT32: {
      const uint32_t v =
          repeated ? r.GetRepeatedUInt32(message, &field, index) : r.GetUInt32(message, &field);
      return {StrCat(v), static_cast<double>(v), true};
    }
    case FieldDescriptor::CPPTYPE_UINT64: {
      const uint64_t v =
          repeated ? r.GetRepeatedUInt64(message, &field, index) : r.GetUInt64(message, &field);
      return {StrCat(v), static_cast<double>(v), true};
    }
    case FieldDescriptor::CPPTYPE_BOOL: {
      const bool v =
          repeated ? r.GetRepeatedBool(message, &field, index) : r.GetBool(message, &field);
      return {v ? "true" : "false"};
    }
    case FieldDescriptor::CPPTYPE_ENUM: {
      const auto* v =
          repeated ? r.GetRepeatedEnum(message, &field, index) : r.GetEnum(message, &field);
      const int number = repeated ? r.GetRepeatedEnumValue(message, &field, index)
                                  : r.GetEnumValue(message, &field);
      // An open enum may hold a number it has no name for.
      return {v != nullptr && v->number() == number ? v->name() : StrCat(number)};
    }
    case FieldDescriptor::CPPTYPE_STRING: {
      std::string scratch;
      const std::string& v = repeated
                                 ? r.GetRepeatedStringReference(message, &field, index, &scratch)
                                 : r.GetStringReference(message, &field, &scratch);
      return {StrCat("\"", absl::CHexEscape(v), "\"")};
    }
    default:
      return {};
  }
}

// Whether two elements hold the same bits (numbers) or the same text (everything else).
bool SameScalar(const Message& a, const Message& b, const FieldDescriptor& field, int index) {
  const Reflection& ra = *a.GetReflection();
  const Reflection& rb = *b.GetReflection();
  const bool repeated = index >= 0;
  switch (field.cpp_type()) {
    case FieldDescriptor::CPPTYPE_FLOAT:
      return repeated ? SameBits(ra.GetRepeatedFloat(a, &field, index),
                                 rb.GetRepeatedFloat(b, &field, index))
                      : SameBits(ra.GetFloat(a, &field), rb.GetFloat(b, &field));
    case FieldDescriptor::CPPTYPE_DOUBLE:
      return repeated ? SameBits(ra.GetRepeatedDouble(a, &field, index),
                                 rb.GetRepeatedDouble(b, &field, index))
                      : SameBits(ra.GetDouble(a, &field), rb.GetDouble(b, &field));
    default:
      return ReadScalar(a, field, index).text == ReadScalar(b, field, index).text;
  }
}

class Differ {
 public:
  Differ(const MessageDiffOptions& options, std::vector<FieldChange>* changes)
      : options_(options), changes_(changes) {}

  void Compare(const Message& a, const Message& b, const std::string& prefix) {
    const Descriptor* type = a.GetDescriptor();
    for (int i = 0; i < type->field_count(); ++i) {
      const FieldDescriptor& field = *type->field(i);
      const std::string path = prefix.empty() ? field.name() : StrCat(prefix, ".", field.name());
      if (field.is_repeated()) {
        CompareRepeated(a, b, field, path);
      } else if (field.cpp_type() == FieldDescriptor::CPPTYPE_MESSAGE) {
        CompareSubmessage(a, b, field, path);
      } else if (!SameScalar(a, b, field, -1)) {
        changes_->push_back(
            {path, ReadScalar(a, field, -1).text, ReadScalar(b, field, -1).text, ""});
      }
    }
  }

 private:
  void CompareSubmessage(const Message& a, const Message& b, const FieldDescriptor& field,
                         const std::string& path) {
    const bool in_a = a.GetReflection()->HasField(a, &field);
    const bool in_b = b.GetReflection()->HasField(b, &field);
    if (!in_a && !in_b) return;
    const size_t before = changes_->size();
    Compare(a.GetReflection()->GetMessage(a, &field), b.GetReflection()->GetMessage(b, &field),
            path);
    // A message of defaults on one side only still differs: it is set there.
    if (changes_->size() == before && in_a != in_b) {
      changes_->push_back({path, in_a ? "set" : "unset", in_b ? "set" : "unset", ""});
    }
  }

  void CompareRepeated(const Message& a, const Message& b, const FieldDescriptor& field,
                       const std::string& path) {
    const int size_a = a.GetReflection()->FieldSize(a, &field);
    const int size_b = b.GetReflection()->FieldSize(b, &field);
    if (field.cpp_type() == FieldDescriptor::CPPTYPE_MESSAGE) {
      const int common = std::min(size_a, size_b);
      for (int i = 0; i < common; ++i) {
        Compare(a.GetReflection()->GetRepeatedMessage(a, &field, i),
                b.GetReflection()->GetRepeatedMessage(b, &field, i), StrCat(path, "[", i, "]"));
      }
      if (size_a != size_b) {
        changes_->push_back(
            {path, Count(size_a, "entry", "entries"), Count(size_b, "entry", "entries"), ""});
      }
      return;
    }
    if (size_a != size_b) {
      changes_->push_back(
          {path, Count(size_a, "value", "values"), Count(size_b, "value", "values"), ""});
      return;
    }
    std::vector<FieldChange> elements;
    int largest_at = -1;
    double largest = -1;
    for (int i = 0; i < size_a; ++i) {
      if (SameScalar(a, b, field, i)) continue;
      const Scalar old_value = ReadScalar(a, field, i);
      const Scalar new_value = ReadScalar(b, field, i);
      elements.push_back({StrCat(path, "[", i, "]"), old_value.text, new_value.text, ""});
      if (old_value.is_number) {
        const double change = std::abs(new_value.number - old_value.number);
        // A NaN on either side counts as the largest change.
        if (largest_at < 0 || !(change <= largest)) {
          largest = change;
          largest_at = i;
        }
      }
    }
    if (options_.max_elements_per_list <= 0 ||
        static_cast<int>(elements.size()) <= options_.max_elements_per_list) {
      changes_->insert(changes_->end(), elements.begin(), elements.end());
      return;
    }
    std::string summary = StrCat(elements.size(), " of ", size_a, " values changed");
    if (largest_at >= 0) {
      StrAppend(&summary, ", the largest by ", SixDigits(largest), " at [", largest_at,
                "]: ", ReadScalar(a, field, largest_at).text, " -> ",
                ReadScalar(b, field, largest_at).text);
    }
    changes_->push_back({path, "", "", std::move(summary)});
  }

  static std::string Count(int count, const char* one, const char* many) {
    return StrCat(count, " ", count == 1 ? one : many);
  }

  const MessageDiffOptions& options_;
  std::vector<FieldChange>* changes_;
};

}  // namespace

std::string FieldChange::ToString() const {
  if (!summary.empty()) return StrCat(path, ": ", summary);
  return StrCat(path, ": ", old_value, " -> ", new_value);
}

std::string FormatFloat(float value) { return ShortestText(value); }

std::vector<FieldChange> DiffMessages(const google::protobuf::Message& old_message,
                                      const google::protobuf::Message& new_message,
                                      const MessageDiffOptions& options) {
  std::vector<FieldChange> changes;
  if (old_message.GetDescriptor() != new_message.GetDescriptor()) {
    changes.push_back({"type", old_message.GetTypeName(), new_message.GetTypeName(), ""});
    return changes;
  }
  Differ(options, &changes).Compare(old_message, new_message, "");
  return changes;
}

}  // namespace tavik::tune
