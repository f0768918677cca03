#include "tools/tavik-tune/message_diff.h"

#include <cmath>
#include <limits>

#include "gmock/gmock.h"
#include "google/protobuf/text_format.h"
#include "gtest/gtest.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/ltm_delta_y_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik::tune {
namespace {

using ::testing::ElementsAre;
using ::testing::IsEmpty;

template <typename T>
T Parse(const std::string& text) {
  T message;
  EXPECT_TRUE(google::protobuf::TextFormat::ParseFromString(text, &message)) << text;
  return message;
}

std::vector<std::string> Lines(const google::protobuf::Message& a,
                               const google::protobuf::Message& b,
                               MessageDiffOptions options = {}) {
  std::vector<std::string> lines;
  for (const FieldChange& change : DiffMessages(a, b, options)) lines.push_back(change.ToString());
  return lines;
}

using vosbrine::zelmondrake::LscDynamicParam;
using vosbrine::zelmondrake::WbDynamicParam;

TEST(MessageDiffTest, EqualMessagesHaveNoChange) {
  const auto lsc = Parse<LscDynamicParam>(
      "lsc_tables { width: 2 height: 1 lsc_grid_gain_r: [1.5, 1] } "
      "vorel_dynamic_param { gradient_threshold: 0.5 }");
  EXPECT_THAT(Lines(lsc, lsc), IsEmpty());
  EXPECT_THAT(Lines(LscDynamicParam(), LscDynamicParam()), IsEmpty());
}

TEST(MessageDiffTest, ChangedElementsOfAList) {
  EXPECT_THAT(Lines(Parse<WbDynamicParam>("wb_gains: [1.2, 1, 2.6]"),
                    Parse<WbDynamicParam>("wb_gains: [1.25, 1, 2.5]")),
              ElementsAre("wb_gains[0]: 1.2 -> 1.25", "wb_gains[2]: 2.6 -> 2.5"));
}

TEST(MessageDiffTest, ListOfAnotherLengthIsOneChange) {
  EXPECT_THAT(Lines(Parse<WbDynamicParam>("wb_gains: [1.2, 1, 2.6]"),
                    Parse<WbDynamicParam>("wb_gains: [1.2, 1]")),
              ElementsAre("wb_gains: 3 values -> 2 values"));
  EXPECT_THAT(Lines(Parse<WbDynamicParam>("wb_gains: [1]"), WbDynamicParam()),
              ElementsAre("wb_gains: 1 value -> 0 values"));
}

TEST(MessageDiffTest, ManyChangedElementsAreSummedUpUnlessAllAreAskedFor) {
  const auto flat = Parse<LscDynamicParam>(
      "lsc_tables { width: 3 height: 3 lsc_grid_gain_r: [1, 1, 1, 1, 1, 1, 1, 1, 1] }");
  const auto raised = Parse<LscDynamicParam>(
      "lsc_tables { width: 3 height: 3 lsc_grid_gain_r: [1.25, 1.25, 1.25, 1.25, 1.5, 1.25, "
      "1.25, 1.25, 1.25] }");
  EXPECT_THAT(Lines(flat, raised),
              ElementsAre("lsc_tables.lsc_grid_gain_r: 9 of 9 values changed, the largest by 0.5 "
                          "at [4]: 1 -> 1.5"));
  const std::vector<std::string> every = Lines(flat, raised, {.max_elements_per_list = 0});
  ASSERT_EQ(every.size(), 9u);
  EXPECT_EQ(every[0], "lsc_tables.lsc_grid_gain_r[0]: 1 -> 1.25");
  EXPECT_EQ(every[4], "lsc_tables.lsc_grid_gain_r[4]: 1 -> 1.5");
  // Eight changes are still told one by one.
  const auto eight = Parse<LscDynamicParam>(
      "lsc_tables { width: 3 height: 3 lsc_grid_gain_r: [1, 2, 2, 2, 2, 2, 2, 2, 2] }");
  EXPECT_EQ(Lines(flat, eight).size(), 8u);
}

TEST(MessageDiffTest, ScalarsOfEveryKind) {
  EXPECT_THAT(Lines(Parse<LscDynamicParam>("lsc_tables { width: 33 }"),
                    Parse<LscDynamicParam>("lsc_tables { width: 17 }")),
              ElementsAre("lsc_tables.width: 33 -> 17"));
  EXPECT_THAT(Lines(Parse<vosbrine::zelmondrake::LscStaticParam>("enable_vorel: false"),
                    Parse<vosbrine::zelmondrake::LscStaticParam>("enable_vorel: true")),
              ElementsAre("enable_vorel: false -> true"));
  EXPECT_THAT(
      Lines(vosbrine::zelmondrake::LtmDeltaYStaticParam(),
            Parse<vosbrine::zelmondrake::LtmDeltaYStaticParam>("post_ltm_curve: GAMMA22_CURVE")),
      ElementsAre("post_ltm_curve: POSTLTMCURVE_UNSPECIFIED -> GAMMA22_CURVE"));
}

TEST(MessageDiffTest, NumbersCompareByTheirBits) {
  WbDynamicParam zero, negative_zero, nan;
  zero.add_wb_gains(0.0f);
  negative_zero.add_wb_gains(-0.0f);
  nan.add_wb_gains(std::numeric_limits<float>::quiet_NaN());
  EXPECT_THAT(Lines(zero, negative_zero), ElementsAre("wb_gains[0]: 0 -> -0"));
  EXPECT_THAT(Lines(nan, nan), IsEmpty());
  EXPECT_THAT(Lines(zero, nan), ElementsAre("wb_gains[0]: 0 -> nan"));
}

TEST(MessageDiffTest, SubmessageSetOnOneSideOnly) {
  EXPECT_THAT(Lines(LscDynamicParam(), Parse<LscDynamicParam>("vorel_dynamic_param {}")),
              ElementsAre("vorel_dynamic_param: unset -> set"));
  EXPECT_THAT(Lines(LscDynamicParam(),
                    Parse<LscDynamicParam>("vorel_dynamic_param { tint_update_gain: 0.25 }")),
              ElementsAre("vorel_dynamic_param.tint_update_gain: 0 -> 0.25"));
}

TEST(MessageDiffTest, ListsOfMessages) {
  using vosbrine::zelmondrake::ClutStaticParam;
  EXPECT_THAT(
      Lines(Parse<ClutStaticParam>("input_lut { lut: [0, 0.5] } input_lut { lut: [0, 0.5] }"),
            Parse<ClutStaticParam>("input_lut { lut: [0, 0.75] }")),
      ElementsAre("input_lut[0].lut[1]: 0.5 -> 0.75", "input_lut: 2 entries -> 1 entry"));
}

TEST(MessageDiffTest, MessagesOfTwoTypes) {
  EXPECT_THAT(Lines(WbDynamicParam(), vosbrine::zelmondrake::CcmDynamicParam()),
              ElementsAre("type: vosbrine.zelmondrake.WbDynamicParam -> "
                          "vosbrine.zelmondrake.CcmDynamicParam"));
}

TEST(MessageDiffTest, FloatsPrintInTheirShortestExactForm) {
  EXPECT_EQ(FormatFloat(1.2f), "1.2");
  EXPECT_EQ(FormatFloat(0.1f), "0.1");
  EXPECT_EQ(FormatFloat(2.0f), "2");
  EXPECT_EQ(FormatFloat(1e-7f), "1e-07");
  EXPECT_EQ(FormatFloat(16777216.0f), "16777216");
}

}  // namespace
}  // namespace tavik::tune
