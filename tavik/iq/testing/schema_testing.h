// Pins a message's schema by descriptor: tuning files are read through reflection by field name,
// and written by other tools by field number, so both, and the types, are contracts.
#ifndef TAVIK_IQ_TESTING_SCHEMA_TESTING_H_
#define TAVIK_IQ_TESTING_SCHEMA_TESTING_H_

#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "google/protobuf/descriptor.h"
#include "google/protobuf/descriptor.pb.h"
#include "gtest/gtest.h"

namespace tavik::test {

using FieldType = google::protobuf::FieldDescriptor::Type;
using FieldLabel = google::protobuf::FieldDescriptor::Label;

inline constexpr FieldType kBool = google::protobuf::FieldDescriptor::TYPE_BOOL;
inline constexpr FieldType kFloat = google::protobuf::FieldDescriptor::TYPE_FLOAT;
inline constexpr FieldType kDouble = google::protobuf::FieldDescriptor::TYPE_DOUBLE;
inline constexpr FieldType kInt32 = google::protobuf::FieldDescriptor::TYPE_INT32;
inline constexpr FieldType kInt64 = google::protobuf::FieldDescriptor::TYPE_INT64;
inline constexpr FieldType kUint32 = google::protobuf::FieldDescriptor::TYPE_UINT32;
inline constexpr FieldType kUint64 = google::protobuf::FieldDescriptor::TYPE_UINT64;
inline constexpr FieldType kString = google::protobuf::FieldDescriptor::TYPE_STRING;
inline constexpr FieldType kBytes = google::protobuf::FieldDescriptor::TYPE_BYTES;
inline constexpr FieldType kEnum = google::protobuf::FieldDescriptor::TYPE_ENUM;
inline constexpr FieldType kMessage = google::protobuf::FieldDescriptor::TYPE_MESSAGE;

inline constexpr FieldLabel kSingular = google::protobuf::FieldDescriptor::LABEL_OPTIONAL;
inline constexpr FieldLabel kRepeated = google::protobuf::FieldDescriptor::LABEL_REPEATED;

// One expected field. `type_name` is the full name of a message or enum field's type
// ("vosbrine.LscTables") and empty for scalars.
struct FieldSpec {
  std::string name;
  int number;
  FieldType type;
  FieldLabel label = kSingular;
  std::string type_name = {};
  bool deprecated = false;
};

// Expects `message` to declare exactly `fields`, in this declaration order.
inline void ExpectFields(const google::protobuf::Descriptor* message,
                         std::initializer_list<FieldSpec> fields) {
  ASSERT_NE(message, nullptr);
  SCOPED_TRACE(message->full_name());
  ASSERT_EQ(message->field_count(), static_cast<int>(fields.size()));
  int index = 0;
  for (const FieldSpec& expected : fields) {
    const google::protobuf::FieldDescriptor* field = message->field(index++);
    SCOPED_TRACE(expected.name);
    EXPECT_EQ(field->name(), expected.name);
    EXPECT_EQ(field->number(), expected.number);
    EXPECT_EQ(field->type(), expected.type);
    EXPECT_EQ(field->label(), expected.label);
    EXPECT_EQ(field->options().deprecated(), expected.deprecated);
    if (field->message_type() != nullptr) {
      EXPECT_EQ(field->message_type()->full_name(), expected.type_name);
    } else if (field->enum_type() != nullptr) {
      EXPECT_EQ(field->enum_type()->full_name(), expected.type_name);
    } else {
      EXPECT_EQ(expected.type_name, "");
    }
  }
}

// Expects `field_name` of `message` to track presence (`has_` accessors) or not.
inline void ExpectPresence(const google::protobuf::Descriptor* message,
                           const std::string& field_name, bool has_presence) {
  ASSERT_NE(message, nullptr);
  const google::protobuf::FieldDescriptor* field = message->FindFieldByName(field_name);
  ASSERT_NE(field, nullptr) << message->full_name() << "." << field_name;
  EXPECT_EQ(field->has_presence(), has_presence) << message->full_name() << "." << field_name;
}

// Expects `enum_type` to declare exactly `values` (number, name) in this order.
inline void ExpectEnumValues(const google::protobuf::EnumDescriptor* enum_type,
                             std::initializer_list<std::pair<int, std::string>> values) {
  ASSERT_NE(enum_type, nullptr);
  SCOPED_TRACE(enum_type->full_name());
  ASSERT_EQ(enum_type->value_count(), static_cast<int>(values.size()));
  int index = 0;
  for (const auto& [number, name] : values) {
    const google::protobuf::EnumValueDescriptor* value = enum_type->value(index++);
    EXPECT_EQ(value->number(), number) << name;
    EXPECT_EQ(value->name(), name);
  }
}

// Expects `message` to reserve exactly the field numbers `numbers` (each a single number).
inline void ExpectReservedNumbers(const google::protobuf::Descriptor* message,
                                  std::initializer_list<int> numbers) {
  ASSERT_NE(message, nullptr);
  SCOPED_TRACE(message->full_name());
  std::vector<int> reserved;
  for (int i = 0; i < message->reserved_range_count(); ++i) {
    const auto* range = message->reserved_range(i);
    for (int number = range->start; number < range->end; ++number) reserved.push_back(number);
  }
  EXPECT_EQ(reserved, std::vector<int>(numbers));
}

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_SCHEMA_TESTING_H_
