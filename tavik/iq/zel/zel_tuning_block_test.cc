#include "tavik/iq/zel/zel_tuning_block.h"

#include <memory>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/time.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/protos/lsc_tables.pb.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/disparity_param.pb.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/protos/dpc_param.pb.h"
#include "tavik/iq/zel/protos/edgedet_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_sharpener_param.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/lsc_stats_param.pb.h"
#include "tavik/iq/zel/protos/ltm_delta_y_param.pb.h"
#include "tavik/iq/zel/protos/ltm_param.pb.h"
#include "tavik/iq/zel/protos/nfltr_param.pb.h"
#include "tavik/iq/zel/protos/nsmix_param.pb.h"
#include "tavik/iq/zel/protos/prc_param.pb.h"
#include "tavik/iq/zel/protos/rgb_yuv_conversion_param.pb.h"
#include "tavik/iq/zel/protos/sensor_gamma_param.pb.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"
#include "tavik/iq/zel/protos/snadd_param.pb.h"
#include "tavik/iq/zel/protos/stk_param.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::IsEmpty;

namespace zm = ::vosbrine::zelmondrake;

// A block that is not one of the typed blocks, with a name of the test's choosing.
class ForeignBlock : public TuningBlock {
 public:
  explicit ForeignBlock(std::string name) : name_(std::move(name)) {}
  std::string GetName() const override { return name_; }

 private:
  std::string name_;
};

template <typename T>
std::shared_ptr<const ZelTuningBlock<T>> MakeBlock(bool enable = false) {
  T message;
  message.set_enable(enable);
  return std::make_shared<const ZelTuningBlock<T>>(std::move(message));
}

template <typename T>
std::string NameOf() {
  return ZelTuningBlock<T>().GetName();
}

TEST(ZelTuningBlockTest, GetNameIsTheShortMessageNameOfEveryBlock) {
  EXPECT_EQ(NameOf<zm::BlcTuning>(), "BlcTuning");
  EXPECT_EQ(NameOf<zm::CcmTuning>(), "CcmTuning");
  EXPECT_EQ(NameOf<zm::ClutTuning>(), "ClutTuning");
  EXPECT_EQ(NameOf<zm::DisparityTuning>(), "DisparityTuning");
  EXPECT_EQ(NameOf<zm::DmscTuning>(), "DmscTuning");
  EXPECT_EQ(NameOf<zm::DpcTuning>(), "DpcTuning");
  EXPECT_EQ(NameOf<zm::EdgedetTuning>(), "EdgedetTuning");
  EXPECT_EQ(NameOf<zm::GammaTuning>(), "GammaTuning");
  EXPECT_EQ(NameOf<zm::GtnrSharpenerTuning>(), "GtnrSharpenerTuning");
  EXPECT_EQ(NameOf<zm::GtnrTuning>(), "GtnrTuning");
  EXPECT_EQ(NameOf<zm::HqdnsTuning>(), "HqdnsTuning");
  EXPECT_EQ(NameOf<zm::LscStatsTuning>(), "LscStatsTuning");
  EXPECT_EQ(NameOf<zm::LscTuning>(), "LscTuning");
  EXPECT_EQ(NameOf<zm::LtmTuning>(), "LtmTuning");
  EXPECT_EQ(NameOf<zm::LtmDeltaYTuning>(), "LtmDeltaYTuning");
  EXPECT_EQ(NameOf<zm::NfltrTuning>(), "NfltrTuning");
  EXPECT_EQ(NameOf<zm::NsmixTuning>(), "NsmixTuning");
  EXPECT_EQ(NameOf<zm::PrcTuning>(), "PrcTuning");
  EXPECT_EQ(NameOf<zm::RgbYuvConversionTuning>(), "RgbYuvConversionTuning");
  EXPECT_EQ(NameOf<zm::SensorGammaTuning>(), "SensorGammaTuning");
  EXPECT_EQ(NameOf<zm::SharpTuning>(), "SharpTuning");
  EXPECT_EQ(NameOf<zm::SkindTuning>(), "SkindTuning");
  EXPECT_EQ(NameOf<zm::SnaddTuning>(), "SnaddTuning");
  EXPECT_EQ(NameOf<zm::StkTuning>(), "StkTuning");
  EXPECT_EQ(NameOf<zm::WbTuning>(), "WbTuning");
}

TEST(ZelTuningBlockTest, GetNameDoesNotDependOnTheContent) {
  EXPECT_EQ(MakeBlock<zm::GtnrTuning>(/*enable=*/true)->GetName(), "GtnrTuning");
  EXPECT_EQ(MakeBlock<zm::GtnrTuning>(/*enable=*/false)->GetName(), "GtnrTuning");
}

TEST(ZelTuningBlockTest, HoldsTheMessageItWasMadeWith) {
  zm::BlcTuning message;
  message.set_enable(true);
  const ZelTuningBlock<zm::BlcTuning> block(message);
  EXPECT_TRUE(block.message.enable());
}

TEST(ZelTuningBlockTest, LscBlockIsAnLscTuningBlock) {
  EXPECT_TRUE((std::is_base_of_v<LscTuningBlock, ZelTuningBlock<zm::LscTuning>>));
  const std::shared_ptr<const TuningBlock> block = MakeBlock<zm::LscTuning>();
  EXPECT_NE(dynamic_cast<const LscTuningBlock*>(block.get()), nullptr);
}

TEST(ZelTuningBlockTest, OtherBlocksAreNotLscTuningBlocks) {
  EXPECT_FALSE((std::is_base_of_v<LscTuningBlock, ZelTuningBlock<zm::BlcTuning>>));
  EXPECT_FALSE((std::is_base_of_v<LscTuningBlock, ZelTuningBlock<zm::LscStatsTuning>>));
  EXPECT_FALSE((std::is_base_of_v<LscTuningBlock, ZelTuningBlock<zm::GtnrTuning>>));
  EXPECT_TRUE((std::is_base_of_v<TuningBlock, ZelTuningBlock<zm::BlcTuning>>));
  const std::shared_ptr<const TuningBlock> stats = MakeBlock<zm::LscStatsTuning>();
  EXPECT_EQ(dynamic_cast<const LscTuningBlock*>(stats.get()), nullptr);
  const std::shared_ptr<const TuningBlock> blc = MakeBlock<zm::BlcTuning>();
  EXPECT_EQ(dynamic_cast<const LscTuningBlock*>(blc.get()), nullptr);
}

TEST(ZelTuningBlockTest, GetLscTablesReturnsTheDynamicTables) {
  zm::LscTuning message;
  vosbrine::LscTables* tables = message.mutable_dynamic_param()->mutable_lsc_tables();
  tables->set_width(2);
  tables->set_height(1);
  tables->add_lsc_grid_gain_r(1.5f);
  tables->add_lsc_grid_gain_r(1.25f);
  tables->add_lsc_grid_gain_gr(1.0f);
  tables->add_lsc_grid_gain_gr(1.125f);
  tables->add_lsc_grid_gain_gb(1.0f);
  tables->add_lsc_grid_gain_gb(1.0625f);
  tables->add_lsc_grid_gain_b(2.0f);
  tables->add_lsc_grid_gain_b(1.75f);
  message.mutable_dynamic_param()->mutable_vorel_dynamic_param()->set_gradient_threshold(0.5f);
  const ZelTuningBlock<zm::LscTuning> block(message);

  const LscTuningBlock& as_lsc = block;
  const vosbrine::LscTables& result = as_lsc.GetLscTables();
  EXPECT_EQ(&result, &block.message.dynamic_param().lsc_tables());
  EXPECT_EQ(result.width(), 2);
  EXPECT_EQ(result.height(), 1);
  EXPECT_THAT(result.lsc_grid_gain_r(), ElementsAre(1.5f, 1.25f));
  EXPECT_THAT(result.lsc_grid_gain_gr(), ElementsAre(1.0f, 1.125f));
  EXPECT_THAT(result.lsc_grid_gain_gb(), ElementsAre(1.0f, 1.0625f));
  EXPECT_THAT(result.lsc_grid_gain_b(), ElementsAre(2.0f, 1.75f));
}

TEST(ZelTuningBlockTest, GetLscTablesOfAnUnsetDynamicParamIsTheDefaultInstance) {
  const ZelTuningBlock<zm::LscTuning> block;
  const vosbrine::LscTables& result = block.GetLscTables();
  EXPECT_EQ(&result, &vosbrine::LscTables::default_instance());
  EXPECT_EQ(result.width(), 0);
  EXPECT_EQ(result.height(), 0);
  EXPECT_THAT(result.lsc_grid_gain_r(), IsEmpty());
}

TEST(ZelTuningBlockTest, GetLscTablesOfUnsetTablesIsTheDefaultInstance) {
  zm::LscTuning message;
  message.mutable_dynamic_param()->mutable_vorel_dynamic_param()->set_gradient_threshold(0.5f);
  const ZelTuningBlock<zm::LscTuning> block(message);
  EXPECT_EQ(&block.GetLscTables(), &vosbrine::LscTables::default_instance());
}

TEST(GetTuningProtoFromBlockTest, ReturnsTheHeldMessageOfTheRightType) {
  const auto block = MakeBlock<zm::BlcTuning>(/*enable=*/true);
  ScopedLogCapture capture;
  const zm::BlcTuning* proto = GetTuningProto<zm::BlcTuning>(*block);
  ASSERT_NE(proto, nullptr);
  EXPECT_EQ(proto, &block->message);
  EXPECT_TRUE(proto->enable());
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(GetTuningProtoFromBlockTest, ReturnsTheLscMessageOfTheLscBlock) {
  const auto block = MakeBlock<zm::LscTuning>(/*enable=*/true);
  const zm::LscTuning* proto = GetTuningProto<zm::LscTuning>(*block);
  ASSERT_NE(proto, nullptr);
  EXPECT_EQ(proto, &block->message);
}

TEST(GetTuningProtoFromBlockTest, BlockOfAnotherTypeGivesNullAndLogsBothNames) {
  const auto block = MakeBlock<zm::LscTuning>();
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProto<zm::BlcTuning>(*block), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: LscTuning, expected: BlcTuning"));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(GetTuningProtoFromBlockTest, LscStatsBlockIsNotAnLscBlock) {
  const auto block = MakeBlock<zm::LscStatsTuning>();
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProto<zm::LscTuning>(*block), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: LscStatsTuning, expected: LscTuning"));
}

TEST(GetTuningProtoFromBlockTest, TypeIsTakenFromTheBlockNotFromItsName) {
  // A foreign block that calls itself "BlcTuning" is still not a BlcTuning block.
  const ForeignBlock block("BlcTuning");
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProto<zm::BlcTuning>(block), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: BlcTuning, expected: BlcTuning"));
}

TEST(GetTuningProtoFromBlockTest, ForeignBlockGivesNullAndLogsItsName) {
  const ForeignBlock block("VendorBlock");
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProto<zm::GtnrTuning>(block), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: VendorBlock, expected: GtnrTuning"));
}

TEST(GetTuningProtoFromBlockTest, EveryMismatchIsLogged) {
  // Not rate-limited: each refusal is a line.
  const auto block = MakeBlock<zm::DpcTuning>();
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProto<zm::BlcTuning>(*block), nullptr);
  EXPECT_EQ(GetTuningProto<zm::BlcTuning>(*block), nullptr);
  EXPECT_EQ(capture.Count("Incorrect tuning block type: DpcTuning, expected: BlcTuning"), 2);
}

TEST(ZelTuningBundleTest, GetBlockOfAnEmptyBundleIsNull) {
  const ZelTuningBundle bundle;
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), nullptr);
  EXPECT_EQ(bundle.GetBlock(""), nullptr);
}

TEST(ZelTuningBundleTest, AddedBlockIsFoundByItsName) {
  ZelTuningBundle bundle;
  const auto blc = MakeBlock<zm::BlcTuning>();
  const auto gtnr = MakeBlock<zm::GtnrTuning>();
  EXPECT_THAT(bundle.AddBlock(blc), IsOk());
  EXPECT_THAT(bundle.AddBlock(gtnr), IsOk());
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), blc.get());
  EXPECT_EQ(bundle.GetBlock("GtnrTuning"), gtnr.get());
}

TEST(ZelTuningBundleTest, BlockThatWasNotAddedIsNull) {
  ZelTuningBundle bundle;
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::BlcTuning>()), IsOk());
  EXPECT_EQ(bundle.GetBlock("DpcTuning"), nullptr);
  // Names are exact: no case folding, no prefix match.
  EXPECT_EQ(bundle.GetBlock("blctuning"), nullptr);
  EXPECT_EQ(bundle.GetBlock("Blc"), nullptr);
  EXPECT_EQ(bundle.GetBlock("BlcTuningX"), nullptr);
}

TEST(ZelTuningBundleTest, GetBlockTakesAViewIntoALongerText) {
  ZelTuningBundle bundle;
  const auto lsc = MakeBlock<zm::LscTuning>();
  ASSERT_THAT(bundle.AddBlock(lsc), IsOk());
  const std::string text = "LscTuningBlock";
  EXPECT_EQ(bundle.GetBlock(std::string_view(text).substr(0, 9)), lsc.get());
  EXPECT_EQ(bundle.GetBlock(text), nullptr);
}

TEST(ZelTuningBundleTest, SecondBlockOfOneNameIsDroppedAndTheFirstKept) {
  ZelTuningBundle bundle;
  const auto first = MakeBlock<zm::BlcTuning>(/*enable=*/true);
  const auto second = MakeBlock<zm::BlcTuning>(/*enable=*/false);
  ScopedLogCapture capture;
  EXPECT_THAT(bundle.AddBlock(first), IsOk());
  EXPECT_THAT(bundle.AddBlock(second), IsOk());
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), first.get());
  const zm::BlcTuning* proto = GetTuningProtoFromBundle<zm::BlcTuning>(bundle, "BlcTuning");
  ASSERT_NE(proto, nullptr);
  EXPECT_TRUE(proto->enable());
  // Dropped silently.
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(ZelTuningBundleTest, SecondBlockOfOneNameIsDroppedEvenWhenOfAnotherType) {
  ZelTuningBundle bundle;
  const auto foreign = std::make_shared<const ForeignBlock>("BlcTuning");
  const auto blc = MakeBlock<zm::BlcTuning>();
  EXPECT_THAT(bundle.AddBlock(foreign), IsOk());
  EXPECT_THAT(bundle.AddBlock(blc), IsOk());
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), foreign.get());
}

TEST(ZelTuningBundleTest, DroppedBlockIsNotKeptAlive) {
  ZelTuningBundle bundle;
  const auto first = MakeBlock<zm::DpcTuning>();
  auto second = MakeBlock<zm::DpcTuning>();
  const std::weak_ptr<const ZelTuningBlock<zm::DpcTuning>> weak_second = second;
  ASSERT_THAT(bundle.AddBlock(first), IsOk());
  ASSERT_THAT(bundle.AddBlock(std::move(second)), IsOk());
  EXPECT_TRUE(weak_second.expired());
}

TEST(ZelTuningBundleTest, NullBlockIsRefused) {
  ZelTuningBundle bundle;
  EXPECT_THAT(bundle.AddBlock(nullptr),
              StatusIs(StatusCode::kInvalidArgument, "Null tuning block"));
  EXPECT_EQ(bundle.GetBlock(""), nullptr);
}

TEST(ZelTuningBundleTest, KeysBlocksByTheirOwnName) {
  ZelTuningBundle bundle;
  const auto foreign = std::make_shared<const ForeignBlock>("VendorBlock");
  ASSERT_THAT(bundle.AddBlock(foreign), IsOk());
  EXPECT_EQ(bundle.GetBlock("VendorBlock"), foreign.get());
}

TEST(ZelTuningBundleTest, BundleKeepsItsBlocksAlive) {
  ZelTuningBundle bundle;
  auto block = MakeBlock<zm::SharpTuning>(/*enable=*/true);
  const std::weak_ptr<const ZelTuningBlock<zm::SharpTuning>> weak = block;
  ASSERT_THAT(bundle.AddBlock(std::move(block)), IsOk());
  EXPECT_FALSE(weak.expired());
  const zm::SharpTuning* proto = GetTuningProtoFromBundle<zm::SharpTuning>(bundle, "SharpTuning");
  ASSERT_NE(proto, nullptr);
  EXPECT_TRUE(proto->enable());
}

TEST(ZelTuningBundleTest, OneBlockIsSharedBetweenBundles) {
  ZelTuningBundle first;
  ZelTuningBundle second;
  const auto block = MakeBlock<zm::GammaTuning>();
  ASSERT_THAT(first.AddBlock(block), IsOk());
  ASSERT_THAT(second.AddBlock(block), IsOk());
  EXPECT_EQ(first.GetBlock("GammaTuning"), second.GetBlock("GammaTuning"));
  EXPECT_EQ(block.use_count(), 3);
}

TEST(ZelTuningBundleTest, NamedBlockIsAddedUnderTheNameGiven) {
  ZelTuningBundle bundle;
  const auto first = MakeBlock<zm::BlcTuning>(/*enable=*/true);
  const auto second = MakeBlock<zm::BlcTuning>(/*enable=*/false);
  bundle.AddNamedBlock("BlcTuning", first);
  bundle.AddNamedBlock("BlcTuning", second);
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), first.get());
  // And the name rule of AddBlock holds across both.
  EXPECT_THAT(bundle.AddBlock(second), IsOk());
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), first.get());
}

TEST(ZelTuningBundleTest, ReleasedBundleIsEmptyAndLetsItsBlocksGo) {
  ZelTuningBundle bundle;
  auto blc = MakeBlock<zm::BlcTuning>();
  const std::weak_ptr<const ZelTuningBlock<zm::BlcTuning>> watch = blc;
  ASSERT_THAT(bundle.AddBlock(std::move(blc)), IsOk());
  bundle.ReleaseBlocks();
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), nullptr);
  EXPECT_TRUE(watch.expired());

  // Filled again, it holds the new blocks; the old name's slot takes a block as if it were new.
  const auto again = MakeBlock<zm::BlcTuning>(/*enable=*/false);
  const auto dpc = MakeBlock<zm::DpcTuning>();
  EXPECT_THAT(bundle.AddBlock(again), IsOk());
  bundle.AddNamedBlock("DpcTuning", dpc);
  EXPECT_EQ(bundle.GetBlock("BlcTuning"), again.get());
  EXPECT_EQ(bundle.GetBlock("DpcTuning"), dpc.get());
}

TEST(ZelTuningBundleTest, HoldsAllTwentyFiveBlocks) {
  ZelTuningBundle bundle;
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::BlcTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::CcmTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::ClutTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::DisparityTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::DmscTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::DpcTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::EdgedetTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::GammaTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::GtnrSharpenerTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::GtnrTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::HqdnsTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::LscStatsTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::LscTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::LtmTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::LtmDeltaYTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::NfltrTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::NsmixTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::PrcTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::RgbYuvConversionTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::SensorGammaTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::SharpTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::SkindTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::SnaddTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::StkTuning>()), IsOk());
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::WbTuning>()), IsOk());

  const char* const kNames[] = {"BlcTuning",
                                "CcmTuning",
                                "ClutTuning",
                                "DisparityTuning",
                                "DmscTuning",
                                "DpcTuning",
                                "EdgedetTuning",
                                "GammaTuning",
                                "GtnrSharpenerTuning",
                                "GtnrTuning",
                                "HqdnsTuning",
                                "LscStatsTuning",
                                "LscTuning",
                                "LtmTuning",
                                "LtmDeltaYTuning",
                                "NfltrTuning",
                                "NsmixTuning",
                                "PrcTuning",
                                "RgbYuvConversionTuning",
                                "SensorGammaTuning",
                                "SharpTuning",
                                "SkindTuning",
                                "SnaddTuning",
                                "StkTuning",
                                "WbTuning"};
  std::vector<std::string> found_names;
  for (const char* name : kNames) {
    const TuningBlock* block = bundle.GetBlock(name);
    ASSERT_NE(block, nullptr) << name;
    found_names.push_back(block->GetName());
  }
  EXPECT_THAT(found_names, ElementsAreArray(kNames));
  EXPECT_NE(GetTuningProtoFromBundle<zm::SensorGammaTuning>(bundle, "SensorGammaTuning"), nullptr);
  EXPECT_NE(GetTuningProtoFromBundle<zm::LtmDeltaYTuning>(bundle, "LtmDeltaYTuning"), nullptr);
}

TEST(GetTuningProtoFromBundleTest, ReturnsTheMessageOfThePresentBlock) {
  ZelTuningBundle bundle;
  const auto block = MakeBlock<zm::HqdnsTuning>(/*enable=*/true);
  ASSERT_THAT(bundle.AddBlock(block), IsOk());
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProtoFromBundle<zm::HqdnsTuning>(bundle, "HqdnsTuning"), &block->message);
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(GetTuningProtoFromBundleTest, AbsentBlockGivesNullAndLogs) {
  ZelTuningBundle bundle;
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::LscTuning>()), IsOk());
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProtoFromBundle<zm::BlcTuning>(bundle, "BlcTuning"), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Proto BlcTuning not found in tuning bundle"));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(GetTuningProtoFromBundleTest, AbsentBlockLogsTheTypeNotTheNameAskedFor) {
  const ZelTuningBundle bundle;
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProtoFromBundle<zm::BlcTuning>(bundle, "SomethingElse"), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Proto BlcTuning not found in tuning bundle"));
}

TEST(GetTuningProtoFromBundleTest, PresentBlockOfAnotherTypeGivesNullAndLogsBothNames) {
  ZelTuningBundle bundle;
  ASSERT_THAT(bundle.AddBlock(MakeBlock<zm::SensorGammaTuning>()), IsOk());
  ScopedLogCapture capture;
  EXPECT_EQ(GetTuningProtoFromBundle<zm::GammaTuning>(bundle, "SensorGammaTuning"), nullptr);
  EXPECT_THAT(capture.messages(android::base::ERROR),
              ElementsAre("Incorrect tuning block type: SensorGammaTuning, expected: GammaTuning"));
}

TEST(GetTuningProtoFromBundleTest, WorksThroughTheAbstractBundle) {
  auto bundle = std::make_shared<ZelTuningBundle>();
  const auto block = MakeBlock<zm::StkTuning>(/*enable=*/true);
  ASSERT_THAT(bundle->AddBlock(block), IsOk());
  const std::shared_ptr<TuningBundle> shared = bundle;
  const TuningBundle& abstract = *shared;
  EXPECT_EQ(abstract.GetBlock("StkTuning"), block.get());
  EXPECT_EQ(GetTuningProtoFromBundle<zm::StkTuning>(abstract, "StkTuning"), &block->message);
}

UseCase VideoRecordingWithTorch() {
  UseCase use_case;
  use_case.type = 3;
  use_case.torch = true;
  use_case.first_party = false;
  return use_case;
}

TuningInfo ImxInfo() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "IMX363";
  info.sensor_mode_info.mode_width = 4032;
  info.sensor_mode_info.mode_height = 3024;
  info.sensor_mode_info.target_fps_range = {30, 30};
  info.image_size = {1920, 1080};
  info.module_spec = {1, 2, 0};
  info.bypass_bitmask = 0x5u;
  return info;
}

TuningCoordinates SomeCoordinates() {
  TuningCoordinates coordinates;
  coordinates.cct = 5000.0f;
  coordinates.frame_count = 12;
  return coordinates;
}

TEST(ZelTuningPointTest, KeepsItsFields) {
  const ZelTuningPoint point(VideoRecordingWithTorch(), ImxInfo(), SomeCoordinates(),
                             /*use_bringup_tuning=*/true);
  EXPECT_TRUE(point.use_case == VideoRecordingWithTorch());
  EXPECT_EQ(point.tuning_info.sensor_mode_info.sensor_name, "IMX363");
  EXPECT_EQ(point.tuning_info.sensor_mode_info.mode_width, 4032);
  EXPECT_EQ(point.tuning_info.sensor_mode_info.mode_height, 3024);
  EXPECT_EQ(point.tuning_info.sensor_mode_info.target_fps_range, (tavik_api::Range<float>{30, 30}));
  EXPECT_EQ(point.tuning_info.image_size, (tavik_api::GenericSize<int>{1920, 1080}));
  EXPECT_EQ(point.tuning_info.module_spec, (tavik_api::SensorModuleSpec{1, 2, 0}));
  EXPECT_EQ(point.tuning_info.bypass_bitmask, 0x5u);
  EXPECT_EQ(point.tuning_coordinates.cct, 5000.0f);
  EXPECT_EQ(point.tuning_coordinates.frame_count, 12);
  EXPECT_TRUE(point.use_bringup_tuning);
}

TEST(ZelTuningPointTest, ConstructorMakesAFreshUnsignalledFence) {
  const ZelTuningPoint first(UseCase(), TuningInfo(), TuningCoordinates(), false);
  const ZelTuningPoint second(UseCase(), TuningInfo(), TuningCoordinates(), false);
  ASSERT_NE(first.GetFence(), nullptr);
  ASSERT_NE(second.GetFence(), nullptr);
  EXPECT_NE(first.GetFence(), second.GetFence());
  EXPECT_FALSE(first.GetFence()->IsSignalled());
  EXPECT_THAT(first.WaitForDone(Milliseconds(10)),
              StatusIs(StatusCode::kDeadlineExceeded, "Fence not signalled within 10ms"));
}

TEST(ZelTuningPointTest, WaitForDoneReturnsTheSignalledStatus) {
  const ZelTuningPoint point(UseCase(), TuningInfo(), TuningCoordinates(), false);
  point.GetFence()->Signal(InternalError("Frame dropped"));
  EXPECT_EQ(point.WaitForDone(Milliseconds(10)), InternalError("Frame dropped"));
}

TEST(ZelTuningPointTest, CopySharesTheFenceAndCopiesTheFields) {
  const ZelTuningPoint point(VideoRecordingWithTorch(), ImxInfo(), SomeCoordinates(),
                             /*use_bringup_tuning=*/false);
  const ZelTuningPoint copy(point);
  EXPECT_EQ(copy.GetFence(), point.GetFence());
  EXPECT_TRUE(copy.use_case == point.use_case);
  EXPECT_EQ(copy.tuning_info.sensor_mode_info.sensor_name, "IMX363");
  EXPECT_EQ(copy.tuning_info.bypass_bitmask, 0x5u);
  EXPECT_EQ(copy.tuning_coordinates.frame_count, 12);
  EXPECT_FALSE(copy.use_bringup_tuning);

  copy.GetFence()->Signal(OkStatus());
  EXPECT_THAT(point.WaitForDone(Milliseconds(10)), IsOk());
}

TEST(ZelTuningPointTest, SignalOfTheOriginalReachesACopyThatOutlivesIt) {
  auto point =
      std::make_unique<ZelTuningPoint>(UseCase(), TuningInfo(), TuningCoordinates(), false);
  const ZelTuningPoint copy(*point);
  point->GetFence()->Signal(AbortedError("Session closed"));
  point.reset();
  EXPECT_EQ(copy.WaitForDone(Milliseconds(10)), AbortedError("Session closed"));
}

TEST(ZelTuningPointTest, IsATuningPoint) {
  const std::shared_ptr<const TuningPoint> point =
      std::make_shared<const ZelTuningPoint>(UseCase(), TuningInfo(), TuningCoordinates(), false);
  EXPECT_NE(dynamic_cast<const ZelTuningPoint*>(point.get()), nullptr);
  point->GetFence()->Signal(OkStatus());
  EXPECT_THAT(point->WaitForDone(InfiniteDuration()), IsOk());
}

}  // namespace
}  // namespace tavik
