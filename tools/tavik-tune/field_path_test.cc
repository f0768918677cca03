#include "tools/tavik-tune/field_path.h"

#include "gmock/gmock.h"
#include "google/protobuf/text_format.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::IsOkAndHolds;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

template <typename T>
T Parse(const std::string& text) {
  T message;
  EXPECT_TRUE(google::protobuf::TextFormat::ParseFromString(text, &message)) << text;
  return message;
}

StatusOr<std::vector<double>> Read(const google::protobuf::Message& block,
                                   const std::string& path) {
  StatusOr<FieldPath> parsed = FieldPath::Parse(block.GetDescriptor(), path);
  if (!parsed.ok()) return parsed.status();
  return parsed->Read(block);
}

TEST(FieldPathTest, ListOfTheDynamicParamGivesEveryElement) {
  const auto wb =
      Parse<vosbrine::zelmondrake::WbTuning>("dynamic_param { wb_gains: [1.5, 1, 2.25] }");
  EXPECT_THAT(Read(wb, "wb_gains"), IsOkAndHolds(ElementsAre(1.5, 1.0, 2.25)));
  StatusOr<FieldPath> path = FieldPath::Parse(wb.GetDescriptor(), "wb_gains");
  ASSERT_THAT(path, IsOk());
  EXPECT_TRUE(path->IsList());
  EXPECT_EQ(path->ElementLabel(2), "wb_gains[2]");
}

TEST(FieldPathTest, IndexPicksOneElement) {
  const auto wb =
      Parse<vosbrine::zelmondrake::WbTuning>("dynamic_param { wb_gains: [1.5, 1, 2.25] }");
  EXPECT_THAT(Read(wb, "wb_gains[2]"), IsOkAndHolds(ElementsAre(2.25)));
  StatusOr<FieldPath> path = FieldPath::Parse(wb.GetDescriptor(), "wb_gains[2]");
  ASSERT_THAT(path, IsOk());
  EXPECT_FALSE(path->IsList());
  EXPECT_EQ(path->ElementLabel(0), "wb_gains[2]");
}

TEST(FieldPathTest, EmptyListGivesNoValue) {
  EXPECT_THAT(Read(vosbrine::zelmondrake::WbTuning(), "wb_gains"), IsOkAndHolds(IsEmpty()));
}

TEST(FieldPathTest, FieldsOfTheBlockItselfAndNestedFields) {
  const auto gamma = Parse<vosbrine::zelmondrake::GammaTuning>(
      "enable: true static_param { gamma_x: [0, 0.25, 0.5, 1] }");
  EXPECT_THAT(Read(gamma, "static_param.gamma_x[1]"), IsOkAndHolds(ElementsAre(0.25)));
  EXPECT_THAT(Read(gamma, "enable"), IsOkAndHolds(ElementsAre(1.0)));

  const auto lsc = Parse<vosbrine::zelmondrake::LscTuning>(
      "dynamic_param { lsc_tables { width: 2 height: 1 lsc_grid_gain_r: [1.75, 1.5] } }");
  EXPECT_THAT(Read(lsc, "lsc_tables.lsc_grid_gain_r[1]"), IsOkAndHolds(ElementsAre(1.5)));
  EXPECT_THAT(Read(lsc, "lsc_tables.width"), IsOkAndHolds(ElementsAre(2.0)));
  EXPECT_THAT(Read(lsc, "dynamic_param.lsc_tables.height"), IsOkAndHolds(ElementsAre(1.0)));
}

TEST(FieldPathTest, ElementOfAListOfMessages) {
  const auto clut = Parse<vosbrine::zelmondrake::ClutTuning>(
      "static_param { input_lut { lut: [0, 0.5] } input_lut { channel_index: 1 lut: [0, 0.75] } }");
  EXPECT_THAT(Read(clut, "static_param.input_lut[1].lut[1]"), IsOkAndHolds(ElementsAre(0.75)));
  EXPECT_THAT(Read(clut, "static_param.input_lut[1].channel_index"),
              IsOkAndHolds(ElementsAre(1.0)));
}

TEST(FieldPathTest, BadPathsAreExplained) {
  const auto* wb = vosbrine::zelmondrake::WbTuning::descriptor();
  const auto* lsc = vosbrine::zelmondrake::LscTuning::descriptor();
  const auto* clut = vosbrine::zelmondrake::ClutTuning::descriptor();
  EXPECT_THAT(
      FieldPath::Parse(wb, "gains"),
      StatusIs(StatusCode::kInvalidArgument, "no field 'gains' in WbTuning or its dynamic_param"));
  EXPECT_THAT(FieldPath::Parse(lsc, "lsc_tables.gain"),
              StatusIs(StatusCode::kInvalidArgument, "no field 'gain' in LscTables"));
  EXPECT_THAT(FieldPath::Parse(wb, "enable[0]"),
              StatusIs(StatusCode::kInvalidArgument, "'enable' is not repeated: drop the index"));
  EXPECT_THAT(FieldPath::Parse(wb, "enable.x"),
              StatusIs(StatusCode::kInvalidArgument, "'enable' has no fields"));
  EXPECT_THAT(
      FieldPath::Parse(lsc, "lsc_tables"),
      StatusIs(StatusCode::kInvalidArgument, "'lsc_tables' is a message: name one of its fields"));
  EXPECT_THAT(FieldPath::Parse(clut, "static_param.input_lut.lut"),
              StatusIs(StatusCode::kInvalidArgument,
                       "'input_lut' is a list of messages: pick one, input_lut[0]"));
  EXPECT_THAT(FieldPath::Parse(wb, "wb_gains[x]"),
              StatusIs(StatusCode::kInvalidArgument,
                       "bad element 'wb_gains[x]' in field path 'wb_gains[x]': write name[index]"));
  EXPECT_THAT(FieldPath::Parse(wb, "wb_gains[-1]"),
              StatusIs(StatusCode::kInvalidArgument,
                       "bad element 'wb_gains[-1]' in field path 'wb_gains[-1]': write "
                       "name[index]"));
  EXPECT_THAT(
      FieldPath::Parse(wb, "static_param..enable"),
      StatusIs(StatusCode::kInvalidArgument, "empty name in field path 'static_param..enable'"));
  EXPECT_THAT(FieldPath::Parse(wb, ""),
              StatusIs(StatusCode::kInvalidArgument, "empty name in field path ''"));
}

TEST(FieldPathTest, IndexPastTheEndFailsOnRead) {
  const auto wb = Parse<vosbrine::zelmondrake::WbTuning>("dynamic_param { wb_gains: [1, 1, 2] }");
  EXPECT_THAT(Read(wb, "wb_gains[3]"),
              StatusIs(StatusCode::kOutOfRange, "wb_gains[3] is past the end of 3 values"));
  const auto clut = Parse<vosbrine::zelmondrake::ClutTuning>("static_param { input_lut {} }");
  EXPECT_THAT(Read(clut, "static_param.input_lut[1].lut[0]"),
              StatusIs(StatusCode::kOutOfRange, "input_lut[1] is past the end of 1 values"));
}

}  // namespace
}  // namespace tavik::tune
