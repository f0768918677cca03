#include "tavik/iq/zel/translators/record_description.h"

#include <cstdint>
#include <cstring>
#include <string_view>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/g3aa_blc_registers.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"

namespace tavik {
namespace {

using ::tavik::test::PatternFilled;
using ::tavik_registers::zel::g3aa::BlcConfigValue;
using ::tavik_registers::zel::g3aa::DgConfigValue;

// A record of every shape a description knows: bit-fields, a field split over two words, a plain
// member, a table of narrower entries.
struct SampleRecord {
  uint32_t bypass : 1;
  uint32_t : 31;
  uint32_t gain_lo : 20;
  uint32_t : 12;
  uint32_t gain_hi : 4;
  uint32_t level : 12;
  uint32_t : 16;
  uint16_t plain;
  uint16_t lut[8];
  TAVIK_SPLIT_FIELD_ACCESSORS(uint32_t, Gain, SetGain, gain)
};
TAVIK_DESCRIBE_RECORD(SampleRecord, 32, TAVIK_FIELD(bypass), TAVIK_SPLIT_FIELD(gain),
                      TAVIK_FIELD(level), TAVIK_FIELD(plain), TAVIK_TABLE(lut, 12));

// A group of fields that a record repeats (the levels of a threshold), kept in a struct of its
// own and described with dotted names, and a table of signed entries.
struct Levels {
  uint32_t level_0 : 14;
  uint32_t : 2;
  uint32_t level_1 : 14;
  uint32_t : 2;
};
struct GroupedRecord {
  Levels thresholds;
  int16_t shifts[4];
};
TAVIK_DESCRIBE_RECORD(GroupedRecord, 32, TAVIK_FIELD(thresholds.level_0),
                      TAVIK_FIELD(thresholds.level_1), TAVIK_TABLE(shifts, 16));

// Widths come from the members, at compile time.
static_assert(TAVIK_BIT_WIDTH(SampleRecord, bypass) == 1);
static_assert(TAVIK_BIT_WIDTH(SampleRecord, gain_lo) == 20);
static_assert(TAVIK_BIT_WIDTH(SampleRecord, level) == 12);
static_assert(TAVIK_BIT_WIDTH(SampleRecord, plain) == 16);
static_assert(TAVIK_BIT_WIDTH(BlcConfigValue, offset_b_lo) == 13);
static_assert(DescribedRecord<SampleRecord>);
static_assert(!DescribedRecord<int>);

const FieldDescription& Field(const RecordDescription& record, std::string_view name) {
  for (const FieldDescription& field : record.fields) {
    if (field.name == name) return field;
  }
  ADD_FAILURE() << record.name << " has no field " << name;
  return record.fields.front();
}

TEST(RecordDescriptionTest, DescribesNameWordSizeSizeAndHeader) {
  const RecordDescription& record = RecordDescriptionOf<SampleRecord>();
  EXPECT_EQ(record.name, "SampleRecord");
  EXPECT_EQ(record.word_bits, 32);
  EXPECT_EQ(record.size, sizeof(SampleRecord));
  EXPECT_EQ(record.alignment, alignof(SampleRecord));
  // Three words of bit-fields and the plain member come before the table.
  EXPECT_EQ(record.header_size, offsetof(SampleRecord, lut));
  ASSERT_EQ(record.fields.size(), 5u);
}

TEST(RecordDescriptionTest, FieldsInRecordOrderWithTheirWidths) {
  const RecordDescription& record = RecordDescriptionOf<SampleRecord>();
  std::vector<std::string_view> names;
  std::vector<int> widths;
  for (const FieldDescription& field : record.fields) {
    names.push_back(field.name);
    widths.push_back(field.width);
  }
  EXPECT_THAT(names, ::testing::ElementsAre("bypass", "gain", "level", "plain", "lut"));
  EXPECT_THAT(widths, ::testing::ElementsAre(1, 24, 12, 16, 12));
  EXPECT_FALSE(Field(record, "gain").is_table);
  EXPECT_TRUE(Field(record, "lut").is_table);
  EXPECT_EQ(Field(record, "lut").count, 8);
  EXPECT_EQ(Field(record, "lut").offset, offsetof(SampleRecord, lut));
  EXPECT_EQ(Field(record, "bypass").offset, FieldDescription::kNoOffset);
}

TEST(RecordDescriptionTest, SetterMasksToTheFieldAndKeepsOtherBits) {
  const RecordDescription& record = RecordDescriptionOf<SampleRecord>();
  SampleRecord value = PatternFilled<SampleRecord>();
  Field(record, "level").set(&value, 0, 0xFFFF);
  Field(record, "bypass").set(&value, 0, 2);
  EXPECT_EQ(value.level, 0xFFFu);
  EXPECT_EQ(value.bypass, 0u);
  // The spare bits of the word around `level` are still the pattern's.
  uint32_t word = 0;
  std::memcpy(&word, reinterpret_cast<const char*>(&value) + 8, 4);
  EXPECT_EQ(word, 0xA5A5FFF5u);
  EXPECT_EQ(Field(record, "level").get(&value, 0), 0xFFFu);
}

TEST(RecordDescriptionTest, SplitFieldReadsAndWritesAsOneValue) {
  const RecordDescription& record = RecordDescriptionOf<SampleRecord>();
  SampleRecord value{};
  Field(record, "gain").set(&value, 0, 0xABCDEF);
  EXPECT_EQ(value.gain_lo, 0xBCDEFu);
  EXPECT_EQ(value.gain_hi, 0xAu);
  EXPECT_EQ(value.Gain(), 0xABCDEFu);
  EXPECT_EQ(Field(record, "gain").get(&value, 0), 0xABCDEFu);
  // Bits above the field's 24 are dropped.
  value.SetGain(0x1FFFFFFF);
  EXPECT_EQ(value.Gain(), 0xFFFFFFu);
}

TEST(RecordDescriptionTest, TableEntriesAreMaskedToTheirDeclaredWidth) {
  const RecordDescription& record = RecordDescriptionOf<SampleRecord>();
  SampleRecord value{};
  Field(record, "lut").set(&value, 3, 0xFFFF);
  EXPECT_EQ(value.lut[3], 0x0FFF);
  EXPECT_EQ(Field(record, "lut").get(&value, 3), 0x0FFFu);
  EXPECT_EQ(value.lut[2], 0);
}

TEST(RecordDescriptionTest, SetFieldMasksNegativeCodesToTheFieldsWidth) {
  SampleRecord value = PatternFilled<SampleRecord>();
  TAVIK_SET_FIELD(value, level, -1);
  EXPECT_EQ(value.level, 0xFFFu);
  TAVIK_SET_FIELD(value, level, int64_t{-16383});
  EXPECT_EQ(value.level, 1u);  // -16383 is ...1100000000000001 in two's complement.
  TAVIK_SET_FIELD(value, plain, 0x12345);
  EXPECT_EQ(value.plain, 0x2345);
}

TEST(RecordDescriptionTest, SplitHelpersJoinAndSplit) {
  EXPECT_EQ(JoinSplitField(0x1FFF, 0x7, 13), 0xFFFFu);
  EXPECT_EQ(SplitFieldLow(0xFFFF, 13), 0x1FFFu);
  EXPECT_EQ(SplitFieldHigh(0xFFFF, 13), 0x7u);
  EXPECT_EQ(FieldBits(~uint64_t{0}, 64), ~uint64_t{0});
  EXPECT_EQ(FieldBits(0xFF, 4), 0xFu);
}

TEST(RecordDescriptionTest, NestedGroupFieldsHaveDottedNamesAndTheirOwnWidths) {
  const RecordDescription& record = RecordDescriptionOf<GroupedRecord>();
  EXPECT_EQ(record.header_size, offsetof(GroupedRecord, shifts));
  const FieldDescription& level_1 = Field(record, "thresholds.level_1");
  EXPECT_EQ(level_1.width, 14);
  GroupedRecord value = PatternFilled<GroupedRecord>();
  level_1.set(&value, 0, 0xFFFFF);
  EXPECT_EQ(value.thresholds.level_1, 0x3FFFu);
  EXPECT_EQ(level_1.get(&value, 0), 0x3FFFu);
  uint32_t word = 0;
  std::memcpy(&word, &value, 4);
  EXPECT_EQ(word, 0xBFFFA5A5u);  // Bits 30-31 and the low half are the pattern's.
}

TEST(RecordDescriptionTest, SignedTableEntriesReadAsTheirRawBits) {
  const RecordDescription& record = RecordDescriptionOf<GroupedRecord>();
  const FieldDescription& shifts = Field(record, "shifts");
  GroupedRecord value{};
  value.shifts[1] = -1;
  value.shifts[2] = -24575;
  EXPECT_EQ(shifts.get(&value, 1), 0xFFFFu);
  EXPECT_EQ(shifts.get(&value, 2), 0xA001u);
  shifts.set(&value, 3, 0xFFFE);
  EXPECT_EQ(value.shifts[3], -2);
}

// The library's own records: register values are described in 64-bit words, split fields as one.
TEST(RecordDescriptionTest, G3aaBlackLevelRegistersAreSixtyFourBitWordsWithOneOffsetB) {
  const RecordDescription& offsets = RecordDescriptionOf<BlcConfigValue>();
  EXPECT_EQ(offsets.word_bits, 64);
  EXPECT_EQ(offsets.header_size, 16u);
  EXPECT_EQ(Field(offsets, "offset_b").width, 16);
  BlcConfigValue value{};
  value.SetOffsetB(0xFFFF);
  EXPECT_EQ(value.offset_b_lo, 0x1FFFu);
  EXPECT_EQ(value.offset_b_hi, 0x7u);
  EXPECT_EQ(Field(offsets, "offset_b").get(&value, 0), 0xFFFFu);

  const RecordDescription& gains = RecordDescriptionOf<DgConfigValue>();
  EXPECT_EQ(gains.word_bits, 64);
  EXPECT_EQ(Field(gains, "gain_gb").width, 24);
}

TEST(RecordDescriptionTest, BlackLevelIppHeaderIsThreeWordsBeforeItsTables) {
  const RecordDescription& record = RecordDescriptionOf<BlcIppOutput>();
  EXPECT_EQ(record.header_size, 12u);
  EXPECT_EQ(Field(record, "offsets").width, 15);
  EXPECT_EQ(Field(record, "offsets").count, 16);
  EXPECT_EQ(Field(record, "tile_mode").width, 4);
}

TEST(RecordDescriptionTest, GammaItpHeaderIsFourWordsBeforeItsTables) {
  const RecordDescription& record = RecordDescriptionOf<GammaItpOutput>();
  EXPECT_EQ(record.header_size, 16u);
  EXPECT_EQ(Field(record, "gamma_x").count, 64);
  EXPECT_EQ(Field(record, "gamma_b_last_step").width, 16);
}

}  // namespace
}  // namespace tavik
