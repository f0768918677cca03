// Hardware records described field by field, once, beside their structs, so that everything that
// reads or writes a record by name (the tools' printed values and JSON, debug dumps, offline
// replay, generic tests) goes through one description instead of its own hand list.
//
//   struct FooOutput {
//     uint32_t bypass : 1;
//     uint32_t : 31;
//     uint32_t gain_lo : 20;   // A field that straddles two words.
//     uint32_t : 12;
//     uint32_t gain_hi : 4;
//     uint32_t : 28;
//     uint16_t lut[8];         // 12-bit entries.
//     TAVIK_SPLIT_FIELD_ACCESSORS(uint32_t, Gain, SetGain, gain)
//   };
//   TAVIK_DESCRIBE_RECORD(FooOutput, 32, TAVIK_FIELD(bypass), TAVIK_SPLIT_FIELD(gain),
//                         TAVIK_TABLE(lut, 12));
//
// The description is a constant in the record's own namespace, found by argument-dependent lookup
// through DescribeRecord(const Record*): RecordDescriptionOf<Record>() gives it. Widths of
// bit-fields are computed at compile time from the members themselves, so a description cannot
// disagree with its struct about them. The same machinery gives translators a field writer that
// masks to the field's own width (TAVIK_SET_FIELD).
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_RECORD_DESCRIPTION_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_RECORD_DESCRIPTION_H_

#include <bit>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <span>
#include <string_view>
#include <type_traits>

namespace tavik {

// One named field of a record: a bit-field or a plain integer member (count 1), or a table of
// `count` entries. Values are the field's raw bits, zero-extended.
struct FieldDescription {
  static constexpr size_t kNoOffset = std::numeric_limits<size_t>::max();

  std::string_view name;
  int width = 0;  // Bits of the field, or of each entry of a table.
  int count = 1;  // 1, or the table's length.
  bool is_table = false;
  size_t offset = kNoOffset;  // Byte offset of a table; bit-fields have none.
  uint64_t (*get)(const void* record, int index) = nullptr;
  void (*set)(void* record, int index, uint64_t value) = nullptr;
};

struct RecordDescription {
  std::string_view name;  // The struct's name, such as "BlcIppOutput".
  int word_bits = 32;     // 32, or 64 for register values held in 64-bit words.
  size_t size = 0;        // sizeof the record.
  size_t alignment = 1;   // alignof the record.
  // Bytes of the run of bit-field words that opens the record, up to its first table.
  size_t header_size = 0;
  std::span<const FieldDescription> fields;
};

// The description of `Record`, declared beside it with TAVIK_DESCRIBE_RECORD.
template <typename Record>
constexpr const RecordDescription& RecordDescriptionOf() {
  return DescribeRecord(static_cast<const Record*>(nullptr));
}

template <typename Record>
concept DescribedRecord = requires(const Record* record) {
  { DescribeRecord(record) } -> std::same_as<const RecordDescription&>;
};

namespace record_description_internal {

// The number of bits of an all-ones value.
constexpr int WidthOfAllOnes(uint64_t all_ones) { return std::bit_width(all_ones); }

constexpr size_t HeaderSize(std::span<const FieldDescription> fields, size_t record_size) {
  size_t header = record_size;
  for (const FieldDescription& field : fields) {
    if (field.offset != FieldDescription::kNoOffset && field.offset < header) header = field.offset;
  }
  return header;
}

using FieldGetter = uint64_t (*)(const void* record, int index);
using FieldSetter = void (*)(void* record, int index, uint64_t value);

constexpr FieldDescription Field(std::string_view name, int width, FieldGetter get,
                                 FieldSetter set) {
  return FieldDescription{name, width, 1, false, FieldDescription::kNoOffset, get, set};
}

constexpr FieldDescription Table(std::string_view name, int width, int count, size_t offset,
                                 FieldGetter get, FieldSetter set) {
  return FieldDescription{name, width, count, true, offset, get, set};
}

// An integer's bits as a field value, two's complement for negative values. Floats are refused:
// a translator converts them with its rounding first.
template <typename Value>
constexpr uint64_t AsFieldBits(Value value) {
  static_assert(std::is_integral_v<Value> || std::is_enum_v<Value>,
                "a field is written from an integer code");
  return static_cast<uint64_t>(value);
}

}  // namespace record_description_internal

// The low `width` bits of `value` (width 1..64).
constexpr uint64_t FieldBits(uint64_t value, int width) {
  return width >= 64 ? value : value & ((uint64_t{1} << width) - 1);
}

// A field kept as a low part of `low_width` bits and a high part: the whole value, and its parts.
constexpr uint64_t JoinSplitField(uint64_t low, uint64_t high, int low_width) {
  return low | (high << low_width);
}
constexpr uint64_t SplitFieldLow(uint64_t value, int low_width) {
  return FieldBits(value, low_width);
}
constexpr uint64_t SplitFieldHigh(uint64_t value, int low_width) { return value >> low_width; }

}  // namespace tavik

// The width in bits of member `member` of `Record` (a bit-field's declared width, or the whole
// type's for a plain integer member), as a constant expression.
#define TAVIK_BIT_WIDTH(Record, member)                      \
  (::tavik::record_description_internal::WidthOfAllOnes([] { \
    Record tavik_probe_{};                                   \
    tavik_probe_.member = ~tavik_probe_.member;              \
    return static_cast<uint64_t>(tavik_probe_.member);       \
  }()))

// Writes `value` (any integer, two's complement for negative values) to `record.member`, masked to
// the member's own width: the one way translators store a computed code into a field.
#define TAVIK_SET_FIELD(record, member, value)                                      \
  ((record).member =                                                                \
       ::tavik::FieldBits(::tavik::record_description_internal::AsFieldBits(value), \
                          TAVIK_BIT_WIDTH(std::remove_cvref_t<decltype(record)>, member)))

// Inside a struct: the accessor pair of a field kept as `member_lo` and `member_hi`.
#define TAVIK_SPLIT_FIELD_ACCESSORS(Type, Getter, Setter, member)                                \
  constexpr Type Getter() const {                                                                \
    using TavikSelf_ = std::remove_cvref_t<decltype(*this)>;                                     \
    return static_cast<Type>(::tavik::JoinSplitField(member##_lo, member##_hi,                   \
                                                     TAVIK_BIT_WIDTH(TavikSelf_, member##_lo))); \
  }                                                                                              \
  constexpr void Setter(uint64_t value) {                                                        \
    using TavikSelf_ = std::remove_cvref_t<decltype(*this)>;                                     \
    constexpr int kLowWidth = TAVIK_BIT_WIDTH(TavikSelf_, member##_lo);                          \
    TAVIK_SET_FIELD(*this, member##_lo, ::tavik::SplitFieldLow(value, kLowWidth));               \
    TAVIK_SET_FIELD(*this, member##_hi, ::tavik::SplitFieldHigh(value, kLowWidth));              \
  }

// Field descriptions, used inside TAVIK_DESCRIBE_RECORD, where TavikRecord_ names the record.
// A bit-field or plain integer member, of its own width.
#define TAVIK_FIELD(member)                                                             \
  ::tavik::record_description_internal::Field(                                          \
      #member, TAVIK_BIT_WIDTH(TavikRecord_, member),                                   \
      [](const void* record, int) -> uint64_t {                                         \
        return static_cast<uint64_t>(static_cast<const TavikRecord_*>(record)->member); \
      },                                                                                \
      [](void* record, int, uint64_t value) {                                           \
        TAVIK_SET_FIELD(*static_cast<TavikRecord_*>(record), member, value);            \
      })

// A field kept as `member_lo` and `member_hi`, shown as one.
#define TAVIK_SPLIT_FIELD(member)                                                              \
  ::tavik::record_description_internal::Field(                                                 \
      #member,                                                                                 \
      TAVIK_BIT_WIDTH(TavikRecord_, member##_lo) + TAVIK_BIT_WIDTH(TavikRecord_, member##_hi), \
      [](const void* record, int) -> uint64_t {                                                \
        const auto& r = *static_cast<const TavikRecord_*>(record);                             \
        return ::tavik::JoinSplitField(r.member##_lo, r.member##_hi,                           \
                                       TAVIK_BIT_WIDTH(TavikRecord_, member##_lo));            \
      },                                                                                       \
      [](void* record, int, uint64_t value) {                                                  \
        auto& r = *static_cast<TavikRecord_*>(record);                                         \
        constexpr int kLowWidth = TAVIK_BIT_WIDTH(TavikRecord_, member##_lo);                  \
        TAVIK_SET_FIELD(r, member##_lo, ::tavik::SplitFieldLow(value, kLowWidth));             \
        TAVIK_SET_FIELD(r, member##_hi, ::tavik::SplitFieldHigh(value, kLowWidth));            \
      })

// An array member whose entries hold `width` bits each (at most the entry type's). Entries of a
// signed type read as their raw bits too: -1 in a 16-bit table reads 0xFFFF.
#define TAVIK_TABLE(member, width)                                                          \
  ::tavik::record_description_internal::Table(                                              \
      #member, (width), static_cast<int>(std::extent_v<decltype(TavikRecord_::member)>),    \
      offsetof(TavikRecord_, member),                                                       \
      [](const void* record, int index) -> uint64_t {                                       \
        return ::tavik::FieldBits(                                                          \
            static_cast<uint64_t>(static_cast<const TavikRecord_*>(record)->member[index]), \
            (width));                                                                       \
      },                                                                                    \
      [](void* record, int index, uint64_t value) {                                         \
        static_cast<TavikRecord_*>(record)->member[index] =                                 \
            static_cast<std::remove_extent_t<decltype(TavikRecord_::member)>>(              \
                ::tavik::FieldBits(value, (width)));                                        \
      })

// Declares the description of `Record`, in the record's own namespace, with the fields in record
// order. `word_bits` is the size of the record's words (32, or 64 for 64-bit register values).
#define TAVIK_DESCRIBE_RECORD(Record, word_bits, ...)                                      \
  namespace tavik_record_description_##Record {                                            \
    using TavikRecord_ = Record;                                                           \
    inline constexpr ::tavik::FieldDescription kFields[] = {__VA_ARGS__};                  \
    inline constexpr ::tavik::RecordDescription kDescription = {                           \
        #Record,                                                                           \
        (word_bits),                                                                       \
        sizeof(Record),                                                                    \
        alignof(Record),                                                                   \
        ::tavik::record_description_internal::HeaderSize(kFields, sizeof(Record)),         \
        kFields};                                                                          \
  }                                                                                        \
  constexpr const ::tavik::RecordDescription& DescribeRecord(const Record*) {              \
    return tavik_record_description_##Record::kDescription;                                \
  }                                                                                        \
  static_assert(std::is_standard_layout_v<Record> && std::is_trivially_copyable_v<Record>, \
                #Record " must be a plain record")

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_RECORD_DESCRIPTION_H_
