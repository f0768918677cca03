// Filling block messages from tree sets found beforehand, as the controller does frame after
// frame: the exact-key index, and messages refilled over a former fill, which must end as a new
// message would, failures included.
#include <memory>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/tuning_provider.h"

namespace vosbrine {
namespace {

using ::tavik::Status;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::MakeUsecase;
using ::tavik::test::MakeUsecaseData;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StateWith;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::test::WriteBinarypb;
using ::testing::NotNull;
using ::vosbrine::zelmondrake::BlcDynamicParam;
using ::vosbrine::zelmondrake::BlcStaticParam;
using ::vosbrine::zelmondrake::BlcTuning;
using ::vosbrine::zelmondrake::CcmTuning;

BlcDynamicParam Offsets(float value, int count) {
  BlcDynamicParam offsets;
  for (int i = 0; i < count; ++i) offsets.add_offsets_r(value);
  return offsets;
}

TuningUsecase Gn1Viewfinder() {
  return MakeUsecase(BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER);
}

// One file, for GN1 viewfinder: a black level that differs in every gain region (and in the
// length of its lists), and no colour-correction tree.
class TuningProviderFillTest : public ::testing::Test {
 protected:
  void SetUp() override {
    zelmondrake::TuningTreeSet tree_set;
    vosbrine::Node broken = LeafNode(30, 40, Offsets(9, 1));
    broken.mutable_dynamic_param()->set_value("\xff\xff");
    *tree_set.mutable_blc() = MakeTree(
        true, BlcStaticParam(),
        MakeLevel(Level::GAIN,
                  {LeafNode(1, 4, Offsets(64, 4)), LeafNode(8, 16, Offsets(65, 6)), broken}));
    WriteBinarypb(dir_, "gn1.binarypb", MakeUsecaseData(Gn1Viewfinder(), tree_set));
    auto provider = zelmondrake::TuningProvider::Create({dir_.path()}, nullptr);
    ASSERT_TRUE(provider.ok()) << provider.status();
    provider_ = std::move(*provider);
    tree_set_ = provider_->FindPreparedTreeSet(Gn1Viewfinder(), /*fallback=*/true);
    ASSERT_THAT(tree_set_, NotNull());
  }

  template <typename T>
  Status Fill(const CameraState& state, T* out, bool bypassed = false) {
    const SubBlockFields fields(T::descriptor(), tree_set_->tree_set().GetDescriptor());
    return provider_->FillSubBlockTuning(*tree_set_, fields, Gn1Viewfinder(), state, out, bypassed);
  }

  TempDir dir_;
  std::unique_ptr<zelmondrake::TuningProvider> provider_;
  const tavik::PreparedTreeSet* tree_set_ = nullptr;
};

TEST_F(TuningProviderFillTest, FoundTreeSetIsTheOneTheLookupFinds) {
  EXPECT_EQ(&tree_set_->tree_set(), provider_->GetTuningTreeSet(Gn1Viewfinder(), false));
}

TEST_F(TuningProviderFillTest, RefilledMessageEndsAsANewOne) {
  // In turn: two regions, a gap between them, the bypassed first leaf, a leaf that can't be
  // unpacked, and the first region again.
  const std::vector<std::pair<CameraState, bool>> requests = {
      {StateWith("real_gain", 2), false},  {StateWith("real_gain", 12), false},
      {StateWith("real_gain", 6), false},  {StateWith("real_gain", 12), true},
      {StateWith("real_gain", 35), false}, {StateWith("real_gain", 2), false}};
  BlcTuning reused;
  for (const auto& [state, bypassed] : requests) {
    BlcTuning fresh;
    const Status fresh_status = Fill(state, &fresh, bypassed);
    const Status reused_status = Fill(state, &reused, bypassed);
    EXPECT_EQ(reused_status, fresh_status);
    EXPECT_EQ(reused.SerializeAsString(), fresh.SerializeAsString()) << fresh.DebugString();
    EXPECT_EQ(reused.has_static_param(), fresh.has_static_param());
    EXPECT_EQ(reused.has_dynamic_param(), fresh.has_dynamic_param());
  }
}

TEST_F(TuningProviderFillTest, LeafThatCantBeUnpackedFailsTheRequestThatReachesIt) {
  BlcTuning out;
  EXPECT_THAT(Fill(StateWith("real_gain", 35), &out),
              StatusIs(absl::StatusCode::kInvalidArgument,
                       "Failed to Unpack first_region. vosbrine.zelmondrake.BlcDynamicParam"));
  TAVIK_EXPECT_OK(Fill(StateWith("real_gain", 2), &out));
}

TEST_F(TuningProviderFillTest, RefilledMessageLosesWhatAFailedFillWouldNotMake) {
  // A block without a tree fails at its static parameters: a new message then has them, empty,
  // and no dynamic parameters.
  CcmTuning fresh;
  const Status fresh_status = Fill(StateWith("real_gain", 2), &fresh);
  EXPECT_THAT(fresh_status,
              StatusIs(absl::StatusCode::kInternal,
                       "Failed to unpack static_param. " + Gn1Viewfinder().DebugString()));
  EXPECT_TRUE(fresh.has_static_param());
  EXPECT_FALSE(fresh.has_dynamic_param());

  CcmTuning reused;
  reused.set_enable(true);
  reused.mutable_static_param();
  reused.mutable_dynamic_param()->add_ccm_gains(1.0f);
  EXPECT_EQ(Fill(StateWith("real_gain", 2), &reused), fresh_status);
  EXPECT_EQ(reused.SerializeAsString(), fresh.SerializeAsString());
  EXPECT_TRUE(reused.has_static_param());
  EXPECT_FALSE(reused.has_dynamic_param());
  EXPECT_FALSE(reused.enable());
}

TEST_F(TuningProviderFillTest, FieldsOfAnotherTypeAreFoundAgainForTheMessageAtHand) {
  const SubBlockFields ccm_fields(CcmTuning::descriptor(), tree_set_->tree_set().GetDescriptor());
  BlcTuning out;
  TAVIK_EXPECT_OK(provider_->FillSubBlockTuning(*tree_set_, ccm_fields, Gn1Viewfinder(),
                                                StateWith("real_gain", 2), &out, false));
  EXPECT_EQ(out.dynamic_param().offsets_r_size(), 4);
}

TEST(TuningProviderExactIndexTest, UnknownEnumNumbersShareTheirEmptyName) {
  TempDir dir;
  zelmondrake::TuningTreeSet tree_set;
  *tree_set.mutable_blc() =
      MakeTree(true, BlcStaticParam(), MakeLevel(Level::GAIN, {LeafNode(1, 4, Offsets(64, 4))}));
  const TuningUsecase unknown =
      MakeUsecase(static_cast<CameraSensor>(999), FULL_4_3_FULL_15_30FPS, VIEWFINDER);
  WriteBinarypb(dir, "unknown.binarypb", MakeUsecaseData(unknown, tree_set));
  auto provider = zelmondrake::TuningProvider::Create({dir.path()}, nullptr);
  ASSERT_TRUE(provider.ok());
  // Another unknown number has the same key text, and so the same tuning.
  const TuningUsecase other =
      MakeUsecase(static_cast<CameraSensor>(998), FULL_4_3_FULL_15_30FPS, VIEWFINDER);
  ScopedLogCapture log;
  EXPECT_TRUE((*provider)->HasTuningUsecase(other));
  EXPECT_NE((*provider)->GetTuningTreeSet(other, /*fallback=*/false), nullptr);
  EXPECT_TRUE(log.messages().empty());
  EXPECT_FALSE((*provider)->HasTuningUsecase(Gn1Viewfinder()));
  EXPECT_EQ(log.Count("Tuning_usecase not found: BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, "
                      "VIEWFINDER"),
            1);
}

}  // namespace
}  // namespace vosbrine
