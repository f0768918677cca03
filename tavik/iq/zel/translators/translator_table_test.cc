// What holds for every form of the translator table, tested once over all rows: the table's
// order, the records' descriptions, the trace of each translator, its refusal of a block of
// another type, and the translation of every leaf of the sample tuning set.
#include "tavik/iq/zel/translators/translator_table.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/testing/translator_testing.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::ForeignBlock;
using ::tavik::test::IsOk;
using ::tavik::test::RecordingTraceSink;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;

bool WrittenBeforeTuning(const TranslatorForm& form, std::string_view field);

// Storage for a form's records filled with a pattern, as a caller's records may hold anything.
class PatternRecords {
 public:
  explicit PatternRecords(const TranslatorForm& form) {
    for (const RecordDescription* record : form.records) {
      auto& bytes = storage_.emplace_back(record->size + 16);
      std::memset(bytes.data(), 0xA5, bytes.size());
      pointers_.push_back(Aligned(bytes.data(), record->alignment));
    }
  }
  void* const* pointers() const { return pointers_.data(); }
  // Every byte still holds the pattern, but for the fields the form writes before it reads the
  // tuning, which may hold anything.
  bool UnchangedButFieldsBeforeTuning(const TranslatorForm& form) const {
    for (size_t i = 0; i < pointers_.size(); ++i) {
      const RecordDescription& record = *form.records[i];
      std::vector<unsigned char> expected(record.size + 16, 0xA5);
      void* expected_record = Aligned(expected.data(), record.alignment);
      for (const FieldDescription& field : record.fields) {
        if (!WrittenBeforeTuning(form, field.name)) continue;
        for (int index = 0; index < field.count; ++index) {
          field.set(expected_record, index, field.get(pointers_[i], index));
        }
      }
      if (std::memcmp(expected_record, pointers_[i], record.size) != 0) return false;
    }
    return true;
  }

 private:
  static void* Aligned(unsigned char* bytes, size_t alignment) {
    const auto address = reinterpret_cast<uintptr_t>(bytes);
    return bytes + (alignment - address % alignment) % alignment;
  }
  std::vector<std::vector<unsigned char>> storage_;
  std::vector<void*> pointers_;
};

// The blocks of one sample file: every leaf of every block type, by position.
struct SampleFile {
  std::string name;
  std::array<std::vector<std::shared_ptr<const TuningBlock>>, kZelBlockCount> leaves;

  // A frame of the file's first leaf of each block.
  TranslatorFrame FirstLeaves() const {
    TranslatorFrame frame;
    for (size_t position = 0; position < kZelBlockCount; ++position) {
      if (!leaves[position].empty()) frame.blocks[position] = leaves[position].front().get();
    }
    return frame;
  }
};

bool WrittenBeforeTuning(const TranslatorForm& form, std::string_view field) {
  return std::find(form.fields_before_tuning.begin(), form.fields_before_tuning.end(), field) !=
         form.fields_before_tuning.end();
}

std::vector<SampleFile> SampleFiles() {
  std::vector<SampleFile> files;
  for (const auto& [name, tree_set] : test::SampleTreeSets()) {
    SampleFile& file = files.emplace_back();
    file.name = name;
    ForEachZelBlockType([&]<size_t Position, typename T>() {
      const vosbrine::TuningTree* tree = test::TreeOf<T>(tree_set);
      if (tree == nullptr) return;
      for (ZelTuningBlock<T>& block : test::LeafBlocks<T>(*tree)) {
        file.leaves[Position].push_back(
            std::make_shared<const ZelTuningBlock<T>>(std::move(block)));
      }
    });
  }
  return files;
}

const std::vector<SampleFile>& SampleFilesOnce() {
  static const auto* const files = new std::vector<SampleFile>(SampleFiles());
  return *files;
}

std::string NameOf(const ::testing::TestParamInfo<const TranslatorForm*>& info) {
  std::string name;
  for (char c : info.param->name) {
    if (std::isalnum(static_cast<unsigned char>(c))) name += c;
  }
  return name;
}

TEST(TranslatorTableTest, RowsFollowTheBlocksPositionOrderWithUniqueNames) {
  std::set<std::string_view> names;
  size_t previous_block = 0;
  for (const TranslatorForm* form : TranslatorTable()) {
    EXPECT_GE(form->block, previous_block) << form->name;
    EXPECT_LT(form->block, kZelBlockCount) << form->name;
    previous_block = form->block;
    EXPECT_TRUE(names.insert(form->name).second) << "twice: " << form->name;
    EXPECT_THAT(std::string(form->function_name()), ::testing::StartsWith("Translate"));
    EXPECT_FALSE(form->records.empty()) << form->name;
    EXPECT_NE(form->translate, nullptr) << form->name;
  }
  EXPECT_FALSE(names.empty());
}

TEST(TranslatorTableTest, FunctionNameIsTheDisplayNameBeforeItsStage) {
  TranslatorForm form;
  form.name = "TranslateBlc (G3AA offsets)";
  EXPECT_EQ(form.function_name(), "TranslateBlc");
  form.name = "TranslateSkind";
  EXPECT_EQ(form.function_name(), "TranslateSkind");
}

TEST(TranslatorTableTest, WritingBeforeTuningTellsTheFieldsAndKeepsTheRestOfTheForm) {
  static constexpr std::string_view kFields[] = {"image_width", "image_height"};
  TranslatorForm form;
  form.name = "TranslateFoo (IPP)";
  form.block = 3;
  EXPECT_TRUE(form.fields_before_tuning.empty());
  const TranslatorForm writing = form.WritingBeforeTuning(kFields);
  EXPECT_EQ(writing.name, "TranslateFoo (IPP)");
  EXPECT_EQ(writing.block, 3u);
  EXPECT_THAT(writing.fields_before_tuning, ::testing::ElementsAre("image_width", "image_height"));
}

TEST(TranslatorTableTest, AbsentBlockIsRefusedLikeAForeignOne) {
  const TranslatorFrame frame;
  EXPECT_EQ(frame.Block<vosbrine::zelmondrake::BlcTuning>().GetName(), "absent block");
  EXPECT_EQ(&frame.Block<vosbrine::zelmondrake::GammaTuning>(), &TranslatorFrame::AbsentBlock());
}

class TranslatorFormTest : public ::testing::TestWithParam<const TranslatorForm*> {
 protected:
  const TranslatorForm& form() const { return *GetParam(); }
};

TEST_P(TranslatorFormTest, RecordsAreDescribedFieldByField) {
  for (const RecordDescription* record : form().records) {
    SCOPED_TRACE(record->name);
    EXPECT_FALSE(record->name.empty());
    EXPECT_TRUE(record->word_bits == 32 || record->word_bits == 64);
    EXPECT_LE(record->header_size, record->size);
    EXPECT_FALSE(record->fields.empty());
    for (const FieldDescription& field : record->fields) {
      EXPECT_GE(field.width, 1) << field.name;
      EXPECT_LE(field.width, 64) << field.name;
      EXPECT_GE(field.count, 1) << field.name;
      if (field.is_table) {
        EXPECT_LT(field.offset, record->size) << field.name;
      }
    }
  }
}

TEST_P(TranslatorFormTest, BlockOfAnotherTypeGivesTheStockTextAndLeavesTheRecordsAsTheyWere) {
  if (SampleFilesOnce().empty()) GTEST_SKIP() << "The sample tuning set is not built";
  TranslatorFrame frame = SampleFilesOnce().front().FirstLeaves();
  const ForeignBlock foreign;
  frame.blocks[form().block] = &foreign;
  PatternRecords records(form());
  ScopedLogCapture log;
  EXPECT_THAT(form().translate(frame, records.pointers()),
              StatusIs(absl::StatusCode::kInvalidArgument, "Invalid TuningBlock!"));
  EXPECT_TRUE(log.Contains("Incorrect tuning block type: Foreign"));
  EXPECT_TRUE(records.UnchangedButFieldsBeforeTuning(form()));
}

TEST_P(TranslatorFormTest, FieldsWrittenBeforeTheTuningAreFieldsOfItsRecords) {
  for (std::string_view name : form().fields_before_tuning) {
    bool found = false;
    for (const RecordDescription* record : form().records) {
      for (const FieldDescription& field : record->fields) found = found || field.name == name;
    }
    EXPECT_TRUE(found) << name;
  }
}

TEST_P(TranslatorFormTest, TracedUnderTheTranslatorCategoryWithItsOwnName) {
  if (SampleFilesOnce().empty()) GTEST_SKIP() << "The sample tuning set is not built";
  const TranslatorFrame frame = SampleFilesOnce().front().FirstLeaves();
  TranslatorRecords records(form());
  RecordingTraceSink sink;
  TAVIK_EXPECT_OK(records.Translate(frame));
  ASSERT_FALSE(sink.spans().empty());
  // The translator's own span encloses any other, so it ends last.
  EXPECT_EQ(sink.spans().back(),
            RecordingTraceSink::Span(kTranslatorTraceCategory, form().function_name()));
}

TEST_P(TranslatorFormTest, EveryLeafOfTheSampleSetTranslates) {
  if (SampleFilesOnce().empty()) GTEST_SKIP() << "The sample tuning set is not built";
  TranslatorRecords records(form());
  int leaves = 0;
  for (const SampleFile& file : SampleFilesOnce()) {
    TranslatorFrame frame = file.FirstLeaves();
    for (const std::shared_ptr<const TuningBlock>& leaf : file.leaves[form().block]) {
      frame.blocks[form().block] = leaf.get();
      EXPECT_THAT(records.Translate(frame), IsOk()) << file.name << ", leaf " << leaves;
      ++leaves;
    }
  }
  EXPECT_GT(leaves, 0);
}

INSTANTIATE_TEST_SUITE_P(EveryForm, TranslatorFormTest,
                         ::testing::ValuesIn(TranslatorTable().begin(), TranslatorTable().end()),
                         NameOf);

TEST(TranslatorRecordsTest, TranslateZeroFillsTheRecordsFirst) {
  if (SampleFilesOnce().empty()) GTEST_SKIP() << "The sample tuning set is not built";
  const TranslatorForm& form = *TranslatorTable().front();
  TranslatorRecords records(form);
  ASSERT_EQ(records.size(), form.records.size());
  std::memset(records.pointers()[0], 0xFF, form.records[0]->size);
  const TranslatorFrame frame = SampleFilesOnce().front().FirstLeaves();
  TAVIK_ASSERT_OK(records.Translate(frame));
  // The spare bits of the first word are zero again.
  uint32_t word = 0;
  std::memcpy(&word, records.record(0), 4);
  EXPECT_EQ(word & ~1u, 0u);
}

TEST(TranslatorRecordsTest, RecordsKeepTheirAlignment) {
  for (const TranslatorForm* form : TranslatorTable()) {
    TranslatorRecords records(*form);
    for (size_t i = 0; i < records.size(); ++i) {
      EXPECT_EQ(reinterpret_cast<uintptr_t>(records.record(i)) % records.description(i).alignment,
                0u)
          << form->name;
    }
  }
}

}  // namespace
}  // namespace tavik
