// The controller's frame path as frames follow one another: blocks refilled over the storage of
// blocks that no bundle holds any more, bundles handed out again, and the use case of the last
// frame reused. Whatever is reused, every frame's blocks are those a new controller would make.
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_controller.h"

namespace tavik {
namespace {

using ::testing::NotNull;

using BlockNames = FlatHashSet<std::string_view>;

std::unique_ptr<ZelTuningController> SampleController() {
  return std::make_unique<ZelTuningController>(
      "", std::vector<std::string>{TAVIK_SAMPLE_TUNING_DIR},
      FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>());
}

TuningInfo Gn1Info() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "GN1";
  info.sensor_mode_info.mode_width = 4080;
  info.sensor_mode_info.mode_height = 3072;
  info.sensor_mode_info.sensor_fps_range = {15.0f, 30.0f};
  info.sensor_mode_info.target_fps_range = {15.0f, 30.0f};
  info.image_size = {4080, 3072};
  return info;
}

TuningInfo Imx663Info() {
  TuningInfo info = Gn1Info();
  info.sensor_mode_info.sensor_name = "IMX663";
  info.module_spec.facing = 1;
  return info;
}

// Camera states inside regions and in the gaps between them.
TuningCoordinates At(float cct, float gain, float bv) {
  TuningCoordinates coordinates;
  coordinates.cct = cct;
  coordinates.real_gain = gain;
  coordinates.bv = bv;
  coordinates.exp_ratio = 1.0f;
  coordinates.scaler_ratio = 1.0f;
  return coordinates;
}

const BlockNames& AllNames() {
  static const BlockNames* const names =
      new BlockNames(kZelBlockNames.begin(), kZelBlockNames.end());
  return *names;
}

std::shared_ptr<TuningBundle> Bundle(const ZelTuningController& controller, const TuningInfo& info,
                                     const TuningCoordinates& at) {
  StatusOr<std::shared_ptr<TuningBundle>> bundle =
      controller.Interpolate(controller.CreateTuningPoint(UseCase(), info, at), AllNames());
  EXPECT_TRUE(bundle.ok()) << bundle.status();
  return bundle.ok() ? *bundle : nullptr;
}

// Every block of `actual`, byte for byte that of `expected`, presence of submessages included.
void ExpectSameBlocks(const TuningBundle& expected, const TuningBundle& actual) {
  int compared = 0;
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    const std::string_view name = kZelBlockNames[Position];
    const TuningBlock* want = expected.GetBlock(name);
    const TuningBlock* got = actual.GetBlock(name);
    ASSERT_EQ(want == nullptr, got == nullptr) << name;
    if (want == nullptr) return;
    const T* want_message = GetTuningProto<T>(*want);
    const T* got_message = GetTuningProto<T>(*got);
    ASSERT_THAT(got_message, NotNull()) << name;
    EXPECT_EQ(want_message->SerializeAsString(), got_message->SerializeAsString()) << name;
    EXPECT_EQ(want_message->has_static_param(), got_message->has_static_param()) << name;
    EXPECT_EQ(want_message->has_dynamic_param(), got_message->has_dynamic_param()) << name;
    ++compared;
  });
  EXPECT_EQ(compared, 24);
}

const TuningCoordinates kStates[] = {At(6000, 1.2f, 8), At(4750, 2.5f, 4.5f), At(2800, 12, 1),
                                     At(5200, 6, 3), At(6000, 1.2f, 8)};

TEST(ZelTuningControllerFrameTest, BlocksRefilledOverReleasedOnesAreThoseOfANewController) {
  std::unique_ptr<ZelTuningController> reused = SampleController();
  for (const TuningCoordinates& at : kStates) {
    // Each frame's bundle goes before the next frame, so its blocks are refilled.
    std::shared_ptr<TuningBundle> bundle = Bundle(*reused, Gn1Info(), at);
    std::shared_ptr<TuningBundle> fresh = Bundle(*SampleController(), Gn1Info(), at);
    ASSERT_THAT(bundle, NotNull());
    ASSERT_THAT(fresh, NotNull());
    ExpectSameBlocks(*fresh, *bundle);
  }
}

TEST(ZelTuningControllerFrameTest, HeldBundlesKeepTheirBlocksWhileLaterFramesAreMade) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::vector<std::shared_ptr<TuningBundle>> held;
  for (const TuningCoordinates& at : kStates) held.push_back(Bundle(*controller, Gn1Info(), at));
  for (size_t i = 0; i < held.size(); ++i) {
    std::shared_ptr<TuningBundle> fresh = Bundle(*SampleController(), Gn1Info(), kStates[i]);
    ExpectSameBlocks(*fresh, *held[i]);
  }
}

TEST(ZelTuningControllerFrameTest, AChangedModuleBetweenFramesTakesItsOwnTuning) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  for (const TuningInfo& info : {Gn1Info(), Imx663Info(), Gn1Info()}) {
    std::shared_ptr<TuningBundle> bundle = Bundle(*controller, info, kStates[0]);
    std::shared_ptr<TuningBundle> fresh = Bundle(*SampleController(), info, kStates[0]);
    ExpectSameBlocks(*fresh, *bundle);
  }
  // The two modules' tunings differ, so the comparison above could tell them apart.
  std::shared_ptr<TuningBundle> gn1 = Bundle(*SampleController(), Gn1Info(), kStates[0]);
  std::shared_ptr<TuningBundle> imx663 = Bundle(*SampleController(), Imx663Info(), kStates[0]);
  bool differ = false;
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    const TuningBlock* a = gn1->GetBlock(kZelBlockNames[Position]);
    const TuningBlock* b = imx663->GetBlock(kZelBlockNames[Position]);
    if (a != nullptr && b != nullptr) {
      differ = differ || GetTuningProto<T>(*a)->SerializeAsString() !=
                             GetTuningProto<T>(*b)->SerializeAsString();
    }
  });
  EXPECT_TRUE(differ);
}

// A point of a class derived from the controller's.
class DerivedPoint : public ZelTuningPoint {
 public:
  using ZelTuningPoint::ZelTuningPoint;
};

TEST(ZelTuningControllerFrameTest, PointsOfDerivedClassesAreComparedAsPoints) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  const DerivedPoint a(UseCase(), Gn1Info(), kStates[0], false);
  const DerivedPoint b(UseCase(), Gn1Info(), kStates[1], false);
  EXPECT_THAT(controller->IsTuningPointUpdated(a, a), test::IsOkAndHolds(false));
  EXPECT_THAT(controller->IsTuningPointUpdated(a, b), test::IsOkAndHolds(true));
  const ZelTuningPoint plain(UseCase(), Gn1Info(), kStates[0], false);
  EXPECT_THAT(controller->IsTuningPointUpdated(plain, a), test::IsOkAndHolds(false));
}

}  // namespace
}  // namespace tavik
