#include "tavik/iq/zel/zel_tuning_controller.h"

#include <linux/capability.h>
#include <sys/resource.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/fence.h"
#include "tavik/base/strings.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/property_scope.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/base/time.h"
#include "tavik/iq/testing/fresh_process.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/stk_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::CheckLogCount;
using ::tavik::test::ExpectInFreshProcess;
using ::tavik::test::IsOk;
using ::tavik::test::IsOkAndHolds;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::MakeUsecase;
using ::tavik::test::MakeUsecaseData;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::ScopedProperty;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::test::WriteBinarypb;
using ::testing::_;
using ::testing::Contains;
using ::testing::ElementsAre;
using ::testing::IsEmpty;
using ::testing::Not;
using ::testing::NotNull;
using ::vosbrine::zelmondrake::BlcDynamicParam;
using ::vosbrine::zelmondrake::BlcStaticParam;
using ::vosbrine::zelmondrake::BlcTuning;
using ::vosbrine::zelmondrake::ClutStaticParam;
using ::vosbrine::zelmondrake::StkTuning;

using Calibration = FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>;
using BlockNames = FlatHashSet<std::string_view>;

constexpr absl::StatusCode kFailedPrecondition = absl::StatusCode::kFailedPrecondition;
constexpr absl::StatusCode kInvalidArgument = absl::StatusCode::kInvalidArgument;
constexpr absl::StatusCode kDeadlineExceeded = absl::StatusCode::kDeadlineExceeded;
constexpr absl::StatusCode kInternal = absl::StatusCode::kInternal;

constexpr char kBringupProperty[] = "vendor.camera.debug.enable_sensor_bringup_tuning";
// Any device but "fennelmoore" names its sensors with the "BRIMAL_" prefix.
constexpr char kDevice[] = "brimal";

constexpr char kGn1ViewfinderKey[] = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";
constexpr char kDefaultKey[] = "BRIMAL_SENSOR_BRINGUP, FULL_4_3_FULL_15_30FPS, VIEWFINDER";
constexpr char kUsecaseUpdatedGn1Viewfinder[] =
    "Tuning usecase is updated: BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";

// A fence that must never fire is waited for briefly; one that must fire, generously.
Duration NeverSignalled() { return Milliseconds(50); }
Duration MustBeSignalled() { return Seconds(10); }

const Calibration& NoCalibration() {
  static const auto* const calibration = new Calibration();
  return *calibration;
}

std::unique_ptr<ZelTuningController> SampleController(std::string_view device = kDevice) {
  return std::make_unique<ZelTuningController>(
      device, std::vector<std::string>{TAVIK_SAMPLE_TUNING_DIR}, NoCalibration());
}

// Sessions, points and their comparison need no tuning.
std::unique_ptr<ZelTuningController> ControllerWithoutTuning() {
  return std::make_unique<ZelTuningController>(kDevice, std::vector<std::string>{},
                                               NoCalibration());
}

UseCase MakeUseCase(int32_t type) {
  UseCase use_case;
  use_case.type = type;
  use_case.first_party = true;
  return use_case;
}

UseCase Viewfinder() { return MakeUseCase(0); }

// The rear GN1 module, full 4:3 readout at 15 to 30 fps: FULL_4_3_FULL_15_30FPS.
TuningInfo Gn1Info() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "GN1";
  info.sensor_mode_info.mode_width = 4080;
  info.sensor_mode_info.mode_height = 3072;
  info.sensor_mode_info.sensor_fps_range = {15.0f, 30.0f};
  info.sensor_mode_info.target_fps_range = {15.0f, 30.0f};
  info.sensor_mode_info.binning_x = 1;
  info.sensor_mode_info.binning_y = 1;
  info.image_size = {4080, 3072};
  info.module_spec = {.facing = 0, .lens_type = 0, .sensor_kind = 0};
  return info;
}

// The rear GN1 module recording 1080p at 30 to 60 fps: FULL_16_9_1080P_30_60FPS with a video use
// case.
TuningInfo Gn1VideoInfo() {
  TuningInfo info = Gn1Info();
  info.sensor_mode_info.sensor_fps_range = {30.0f, 60.0f};
  info.sensor_mode_info.target_fps_range = {30.0f, 60.0f};
  info.image_size = {1920, 1080};
  return info;
}

// The front IMX663 module, binned 2x2: BINNING2X2_4_3_FULL_15_30FPS.
TuningInfo Imx663BinnedInfo() {
  TuningInfo info = Gn1Info();
  info.sensor_mode_info.sensor_name = "IMX663";
  info.sensor_mode_info.mode_width = 1632;
  info.sensor_mode_info.mode_height = 1224;
  info.sensor_mode_info.binning_x = 2;
  info.sensor_mode_info.binning_y = 2;
  info.image_size = {1632, 1224};
  info.module_spec = {.facing = 1, .lens_type = 0, .sensor_kind = 0};
  return info;
}

// A camera state at `gain`; the black level of the sample tunings follows gain alone.
TuningCoordinates AtGain(float gain) {
  TuningCoordinates coordinates;
  coordinates.led_influence = 0.0f;
  coordinates.cct = 5000.0f;
  coordinates.bv = 6.0f;
  coordinates.real_gain = gain;
  coordinates.exp_ratio = 1.0f;
  coordinates.mired_cct = 200.0f;
  coordinates.scaler_ratio = 1.0f;
  coordinates.pre_scaler_ratio = 1.0f;
  coordinates.frame_count = 10;
  coordinates.exposure_time_msecs = 16.0f;
  return coordinates;
}

std::shared_ptr<ZelTuningPoint> MakePoint(const ZelTuningController& controller,
                                          const UseCase& use_case, const TuningInfo& info,
                                          const TuningCoordinates& coordinates) {
  return std::dynamic_pointer_cast<ZelTuningPoint>(
      controller.CreateTuningPoint(use_case, info, coordinates));
}

std::shared_ptr<ZelTuningPoint> Gn1ViewfinderPoint(const ZelTuningController& controller,
                                                   float gain = 2.0f) {
  return MakePoint(controller, Viewfinder(), Gn1Info(), AtGain(gain));
}

std::string KeyText(const vosbrine::TuningUsecase& usecase) {
  return StrCat(vosbrine::CameraSensor_Name(usecase.camera_sensor()), ", ",
                vosbrine::SensorMode_Name(usecase.sensor_mode()), ", ",
                vosbrine::CameraUsecase_Name(usecase.camera_usecase()));
}

// The key that the controller makes of `point`, as text; the status text on failure.
std::string GeneratedKey(const ZelTuningController& controller, const ZelTuningPoint& point,
                         std::string_view device_name = kDevice) {
  StatusOr<std::shared_ptr<vosbrine::TuningUsecase>> usecase =
      controller.GenerateTuningUseCase(point, device_name);
  if (!usecase.ok()) return usecase.status().ToString();
  if (*usecase == nullptr) return "null";
  return KeyText(**usecase);
}

template <typename T>
const T* Message(const TuningBundle& bundle, std::string_view name) {
  return GetTuningProtoFromBundle<T>(bundle, name);
}

std::vector<std::string_view> AllBlockNames() {
  return std::vector<std::string_view>(kZelBlockNames.begin(), kZelBlockNames.end());
}

// A point of a class other than the controller's.
class ForeignPoint : public TuningPoint {
 public:
  ForeignPoint() : TuningPoint(std::make_shared<SoftwareFence>()) {}
};

// ---------------------------------------------------------------------------------------------
// Construction

TEST(ZelTuningControllerTest, InstanceNameIsZelTuningController) {
  EXPECT_EQ(ControllerWithoutTuning()->GetInstanceName(), "zel-tuning-controller");
  EXPECT_EQ(SampleController()->GetInstanceName(), "zel-tuning-controller");
}

TEST(ZelTuningControllerTest, LoadsTheTuningOfItsPaths) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  ASSERT_THAT(controller->provider(), NotNull());
  EXPECT_TRUE(controller->provider()->HasTuningUsecase(MakeUsecase(
      vosbrine::BRIMAL_REAR_GN1_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS, vosbrine::VIEWFINDER)));
}

TEST(ZelTuningControllerTest, PathsWithoutAValidFileGiveAControllerWithoutProvider) {
  TempDir empty_dir;
  TempDir bad_dir;
  bad_dir.WriteFile("broken.binarypb", "this is not a protocol buffer");
  for (const std::vector<std::string>& paths :
       {std::vector<std::string>{}, std::vector<std::string>{empty_dir.path()},
        std::vector<std::string>{bad_dir.path()}}) {
    ZelTuningController controller(kDevice, paths, NoCalibration());
    EXPECT_EQ(controller.provider(), nullptr);
    EXPECT_EQ(controller.GetInstanceName(), "zel-tuning-controller");
  }
}

// Paths that hold no valid tuning file: an empty directory and one with a broken file.
class ZelTuningControllerWithoutTuningTest : public ::testing::Test {
 protected:
  ZelTuningControllerWithoutTuningTest() {
    bad_dir_.WriteFile("broken.binarypb", "this is not a protocol buffer");
  }

  std::unique_ptr<ZelTuningController> MakeController() const {
    return std::make_unique<ZelTuningController>(
        kDevice, std::vector<std::string>{empty_dir_.path(), bad_dir_.path()}, NoCalibration());
  }

  TempDir empty_dir_;
  TempDir bad_dir_;
};

TEST_F(ZelTuningControllerWithoutTuningTest, InterpolateFailsWithInvalidProvider) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  ASSERT_EQ(controller->provider(), nullptr);
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  EXPECT_THAT(controller->Interpolate(point, BlockNames{"BlcTuning"}),
              StatusIs(kFailedPrecondition, "Invalid provider"));
  EXPECT_THAT(controller->Interpolate(point, BlockNames{}),
              StatusIs(kFailedPrecondition, "Invalid provider"));
  // The provider is looked at first.
  EXPECT_THAT(controller->Interpolate(nullptr, BlockNames{"BlcTuning"}),
              StatusIs(kFailedPrecondition, "Invalid provider"));
}

TEST_F(ZelTuningControllerWithoutTuningTest, IsBlockEnabledFailsWithInvalidProvider) {
  std::unique_ptr<ZelTuningController> controller = MakeController();
  ASSERT_EQ(controller->provider(), nullptr);
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  EXPECT_THAT(controller->IsBlockEnabled(*point, "BlcTuning"),
              StatusIs(kFailedPrecondition, "Invalid provider"));
  // The provider is looked at before the name.
  EXPECT_THAT(controller->IsBlockEnabled(*point, "NoSuchTuning"),
              StatusIs(kFailedPrecondition, "Invalid provider"));
}

TEST(ZelTuningControllerTest, ControllerWithoutProviderStillMakesPointsAndSignalsThem) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  ASSERT_THAT(point, NotNull());
  controller->NotifyCaptureSessionOpen();
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));
  controller->NotifyCaptureSessionClose();
}

// ---------------------------------------------------------------------------------------------
// Boolean properties

TEST(ZelTuningControllerPropertyTest, UnsetPropertyGivesTheDefault) {
  constexpr char kName[] = "vendor.camera.debug.tavik_controller_test_flag";
  ScopedProperty property(kName, "");
  EXPECT_FALSE(GetBooleanSystemProperty(kName, false));
  EXPECT_TRUE(GetBooleanSystemProperty(kName, true));
}

TEST(ZelTuningControllerPropertyTest, BooleanTextsAreRead) {
  constexpr char kName[] = "vendor.camera.debug.tavik_controller_test_flag";
  for (const char* text : {"true", "1", "y", "yes", "on"}) {
    ScopedProperty property(kName, text);
    EXPECT_TRUE(GetBooleanSystemProperty(kName, false)) << text;
  }
  for (const char* text : {"false", "0", "n", "no", "off"}) {
    ScopedProperty property(kName, text);
    EXPECT_FALSE(GetBooleanSystemProperty(kName, true)) << text;
  }
}

TEST(ZelTuningControllerPropertyTest, UnreadableValueGivesTheDefault) {
  constexpr char kName[] = "vendor.camera.debug.tavik_controller_test_flag";
  ScopedProperty property(kName, "sometimes");
  EXPECT_FALSE(GetBooleanSystemProperty(kName, false));
  EXPECT_TRUE(GetBooleanSystemProperty(kName, true));
}

// ---------------------------------------------------------------------------------------------
// Bring-up switch

TEST(ZelTuningControllerBringupTest, PointsCarryTheSwitchReadAtConstruction) {
  std::unique_ptr<ZelTuningController> with_bringup;
  {
    ScopedProperty property(kBringupProperty, "true");
    with_bringup = ControllerWithoutTuning();
  }
  std::unique_ptr<ZelTuningController> without_bringup = ControllerWithoutTuning();

  // Clearing the property later doesn't change a controller made while it was set...
  EXPECT_TRUE(Gn1ViewfinderPoint(*with_bringup)->use_bringup_tuning);
  // ...and setting it later doesn't change one made while it was clear.
  ScopedProperty property(kBringupProperty, "true");
  EXPECT_FALSE(Gn1ViewfinderPoint(*without_bringup)->use_bringup_tuning);
}

TEST(ZelTuningControllerBringupTest, FalsePropertyLeavesBringupOff) {
  ScopedProperty property(kBringupProperty, "false");
  EXPECT_FALSE(Gn1ViewfinderPoint(*ControllerWithoutTuning())->use_bringup_tuning);
}

TEST(ZelTuningControllerBringupTest, BringupGivesTheDefaultUseCaseWithNoLog) {
  ScopedProperty property(kBringupProperty, "true");
  std::unique_ptr<ZelTuningController> controller = SampleController();
  // Even a module that couldn't be named gives the default, silently.
  TuningInfo unnamed = Gn1Info();
  unnamed.sensor_mode_info.sensor_name = "NOSUCHSENSOR";
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, Viewfinder(), unnamed, AtGain(2));

  ScopedLogCapture log;
  EXPECT_EQ(GeneratedKey(*controller, *point), kDefaultKey);
  EXPECT_EQ(GeneratedKey(*controller, *Gn1ViewfinderPoint(*controller)), kDefaultKey);
  EXPECT_THAT(log.messages(), IsEmpty());
}

TEST(ZelTuningControllerBringupTest, BringupTuningIsWhatBlocksAreMadeAndAnsweredFrom) {
  ScopedProperty property(kBringupProperty, "true");
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);

  // Stk is off in the bring-up tuning, on in the GN1 viewfinder tuning.
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(false));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(point, BlockNames{"StkTuning"}));
  const StkTuning* stk = Message<StkTuning>(*bundle, "StkTuning");
  ASSERT_THAT(stk, NotNull());
  EXPECT_FALSE(stk->enable());
}

TEST(ZelTuningControllerBringupTest, TheSwitchOfThePointDecidesNotThatOfTheController) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  const ZelTuningPoint bringup_point(Viewfinder(), Gn1Info(), AtGain(2),
                                     /*use_bringup_tuning=*/true);
  EXPECT_EQ(GeneratedKey(*controller, bringup_point), kDefaultKey);
}

// ---------------------------------------------------------------------------------------------
// GenerateTuningUseCase

TEST(ZelTuningControllerUseCaseTest, ViewfinderOfTheRearModule) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  EXPECT_EQ(GeneratedKey(*controller, *Gn1ViewfinderPoint(*controller)), kGn1ViewfinderKey);
}

TEST(ZelTuningControllerUseCaseTest, VideoRecordingOfTheRearModule) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  std::shared_ptr<ZelTuningPoint> point =
      MakePoint(*controller, MakeUseCase(3), Gn1VideoInfo(), AtGain(2));
  EXPECT_EQ(GeneratedKey(*controller, *point),
            "BRIMAL_REAR_GN1_NORMAL, FULL_16_9_1080P_30_60FPS, VIDEO_RECORDING");
}

TEST(ZelTuningControllerUseCaseTest, BinnedSnapshotOfTheFrontModuleWithTorch) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  UseCase snapshot = MakeUseCase(1);
  snapshot.torch = true;
  std::shared_ptr<ZelTuningPoint> point =
      MakePoint(*controller, snapshot, Imx663BinnedInfo(), AtGain(2));
  EXPECT_EQ(GeneratedKey(*controller, *point),
            "BRIMAL_FRONT_IMX663_NORMAL, BINNING2X2_4_3_FULL_15_30FPS, SNAPSHOT_TORCH");
}

TEST(ZelTuningControllerUseCaseTest, ThirdPartyViewfinder) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  UseCase use_case = Viewfinder();
  use_case.first_party = false;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, use_case, Gn1Info(), AtGain(2));
  EXPECT_EQ(GeneratedKey(*controller, *point),
            "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER_3P");
}

TEST(ZelTuningControllerUseCaseTest, TheDeviceNameOfTheCallNamesTheSensor) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  // There is no FENNELMOORE_REAR_GN1_NORMAL: the sensor can't be mapped on that device.
  EXPECT_EQ(GeneratedKey(*controller, *point, "fennelmoore"), kDefaultKey);
  EXPECT_EQ(GeneratedKey(*controller, *point, "fennelmoore2"), kGn1ViewfinderKey);
}

TEST(ZelTuningControllerUseCaseTest, OneUnmappablePartDiscardsTheOthers) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();

  TuningInfo unnamed = Gn1Info();
  unnamed.sensor_mode_info.sensor_name = "NOSUCHSENSOR";
  EXPECT_EQ(GeneratedKey(*controller, *MakePoint(*controller, MakeUseCase(1), unnamed, AtGain(2))),
            kDefaultKey);

  TuningInfo no_height = Gn1Info();
  no_height.image_size.height = 0;
  EXPECT_EQ(
      GeneratedKey(*controller, *MakePoint(*controller, MakeUseCase(1), no_height, AtGain(2))),
      kDefaultKey);

  std::shared_ptr<ZelTuningPoint> unknown_type =
      MakePoint(*controller, MakeUseCase(6), Imx663BinnedInfo(), AtGain(2));
  EXPECT_EQ(GeneratedKey(*controller, *unknown_type), kDefaultKey);
}

// The three warnings below are rate-limited per call site; a new log capture restarts the sites,
// so each test sees its site's first line.

TEST(ZelTuningControllerUseCaseTest, UnmappableSensorWarnsAndGivesTheDefault) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  TuningInfo info = Gn1Info();
  info.sensor_mode_info.sensor_name = "NOSUCHSENSOR";
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, Viewfinder(), info, AtGain(2));
  ScopedLogCapture log;
  EXPECT_EQ(GeneratedKey(*controller, *point), kDefaultKey);
  EXPECT_EQ(log.Count("INVALID_CAMERA_SENSOR. Using default"), 1);
}

TEST(ZelTuningControllerUseCaseTest, UnmappableSensorModeWarnsAndGivesTheDefault) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  TuningInfo info = Gn1Info();
  info.sensor_mode_info.binning_x = 3;
  info.sensor_mode_info.binning_y = 3;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, Viewfinder(), info, AtGain(2));
  ScopedLogCapture log;
  EXPECT_EQ(GeneratedKey(*controller, *point), kDefaultKey);
  EXPECT_EQ(log.Count("INVALID_SENSOR_MODE. Using default"), 1);
}

TEST(ZelTuningControllerUseCaseTest, UnmappableUseCaseWarnsAndGivesTheDefault) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  std::shared_ptr<ZelTuningPoint> point =
      MakePoint(*controller, MakeUseCase(6), Gn1Info(), AtGain(2));
  ScopedLogCapture log;
  EXPECT_EQ(GeneratedKey(*controller, *point), kDefaultKey);
  EXPECT_EQ(log.Count("INVALID_CAMERA_USECASE. Using default"), 1);
}

// ---------------------------------------------------------------------------------------------
// GetUseCaseValue

TEST(ZelTuningControllerUseCaseValueTest, IsTheNumberOfTheSensorMode) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  EXPECT_THAT(controller->GetUseCaseValue(*Gn1ViewfinderPoint(*controller)),
              IsOkAndHolds(static_cast<int>(vosbrine::FULL_4_3_FULL_15_30FPS)));
  EXPECT_THAT(controller->GetUseCaseValue(
                  *MakePoint(*controller, MakeUseCase(3), Gn1VideoInfo(), AtGain(2))),
              IsOkAndHolds(static_cast<int>(vosbrine::FULL_16_9_1080P_30_60FPS)));
  EXPECT_THAT(controller->GetUseCaseValue(
                  *MakePoint(*controller, Viewfinder(), Imx663BinnedInfo(), AtGain(2))),
              IsOkAndHolds(static_cast<int>(vosbrine::BINNING2X2_4_3_FULL_15_30FPS)));
}

TEST(ZelTuningControllerUseCaseValueTest, IsNotTheNumberOfTheUseCase) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  // A snapshot with torch (SNAPSHOT_TORCH is 7) in the mode FULL_4_3_FULL_15_30FPS (1).
  UseCase snapshot = MakeUseCase(1);
  snapshot.torch = true;
  EXPECT_THAT(controller->GetUseCaseValue(*MakePoint(*controller, snapshot, Gn1Info(), AtGain(2))),
              IsOkAndHolds(1));
}

TEST(ZelTuningControllerUseCaseValueTest, IgnoresTheBringupSwitchAndTheSensor) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  TuningInfo unnamed = Gn1VideoInfo();
  unnamed.sensor_mode_info.sensor_name = "NOSUCHSENSOR";
  const ZelTuningPoint point(MakeUseCase(3), unnamed, AtGain(2), /*use_bringup_tuning=*/true);
  EXPECT_THAT(controller->GetUseCaseValue(point),
              IsOkAndHolds(static_cast<int>(vosbrine::FULL_16_9_1080P_30_60FPS)));
}

TEST(ZelTuningControllerUseCaseValueTest, UnmappableSensorModeFails) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  TuningInfo no_height = Gn1Info();
  no_height.image_size.height = 0;
  EXPECT_THAT(
      controller->GetUseCaseValue(*MakePoint(*controller, Viewfinder(), no_height, AtGain(2))),
      StatusIs(kInvalidArgument, "Cannot get a valid use case"));
}

TEST(ZelTuningControllerUseCaseValueTest, PointOfAnotherClassFails) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  EXPECT_THAT(controller->GetUseCaseValue(ForeignPoint()),
              StatusIs(kInvalidArgument, "Invalid tuning point"));
}

// ---------------------------------------------------------------------------------------------
// CreateTuningPoint

TEST(ZelTuningControllerPointTest, CreateTuningPointCopiesTheFrameAndGivesAFreshFence) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  UseCase use_case = MakeUseCase(2);
  use_case.torch = true;
  use_case.night = true;
  TuningInfo info = Gn1VideoInfo();
  info.bypass_bitmask = 0x1234;
  info.normalized_crop = {.left = 0.1f, .top = 0.2f, .width = 0.5f, .height = 0.25f};
  const TuningCoordinates coordinates = AtGain(3.5f);

  std::shared_ptr<TuningPoint> created = controller->CreateTuningPoint(use_case, info, coordinates);
  auto point = std::dynamic_pointer_cast<ZelTuningPoint>(created);
  ASSERT_THAT(point, NotNull());
  EXPECT_TRUE(point->use_case == use_case);
  EXPECT_EQ(point->tuning_info.sensor_mode_info.sensor_name, "GN1");
  EXPECT_EQ(point->tuning_info.image_size, info.image_size);
  EXPECT_EQ(point->tuning_info.bypass_bitmask, 0x1234u);
  EXPECT_EQ(point->tuning_info.normalized_crop, info.normalized_crop);
  EXPECT_EQ(point->tuning_coordinates.real_gain, 3.5f);
  EXPECT_FALSE(point->use_bringup_tuning);

  ASSERT_THAT(point->GetFence(), NotNull());
  EXPECT_FALSE(point->GetFence()->IsSignalled());
  std::shared_ptr<TuningPoint> other = controller->CreateTuningPoint(use_case, info, coordinates);
  EXPECT_NE(other->GetFence(), point->GetFence());
}

TEST(ZelTuningControllerPointTest, PointIsNotSignalledByAnythingButTheSignalThread) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_ASSERT_OK(controller->Interpolate(point, BlockNames{"BlcTuning"}).status());
  EXPECT_THAT(point->WaitForDone(NeverSignalled()), StatusIs(kDeadlineExceeded, _));
}

// ---------------------------------------------------------------------------------------------
// IsBlockEnabled

TEST(ZelTuningControllerBlockEnabledTest, AnswersFromTheTuningOfThePoint) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "BlcTuning"), IsOkAndHolds(true));
  // Off in the GN1 tuning.
  EXPECT_THAT(controller->IsBlockEnabled(*point, "SensorGammaTuning"), IsOkAndHolds(false));
}

TEST(ZelTuningControllerBlockEnabledTest, UnknownNameFails) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  EXPECT_THAT(controller->IsBlockEnabled(*point, "NoSuchTuning"),
              StatusIs(kFailedPrecondition, "Invalid block name NoSuchTuning"));
  // A tree's field name is not a block name.
  EXPECT_THAT(controller->IsBlockEnabled(*point, "blc"),
              StatusIs(kFailedPrecondition, "Invalid block name blc"));
  EXPECT_THAT(controller->IsBlockEnabled(*point, ""),
              StatusIs(kFailedPrecondition, "Invalid block name "));
}

TEST(ZelTuningControllerBlockEnabledTest, BypassBitOfTheBlockGivesFalse) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TuningInfo info = Gn1Info();
  info.bypass_bitmask = 0x400000;  // StkTuning
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, Viewfinder(), info, AtGain(2));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(false));

  info.bypass_bitmask = ~0x400000u;  // Every bit but that of StkTuning.
  point = MakePoint(*controller, Viewfinder(), info, AtGain(2));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "BlcTuning"), IsOkAndHolds(false));
}

TEST(ZelTuningControllerBlockEnabledTest, SensorGammaCantBeBypassed) {
  // Sensor gamma is on in the bring-up tuning.
  ScopedProperty property(kBringupProperty, "true");
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TuningInfo info = Gn1Info();
  info.bypass_bitmask = 0xFFFFFFFF;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, Viewfinder(), info, AtGain(2));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "SensorGammaTuning"), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "DmscTuning"), IsOkAndHolds(false));
}

TEST(ZelTuningControllerBlockEnabledTest, UseCaseWithoutFileIsAnsweredFromTheDefaultUseCase) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  // GN1, FULL_4_3_FULL_15_30FPS, VIEWFINDER_3P has no file. The nearest file (GN1 viewfinder) has
  // sensor gamma off and Stk on; the default use case has them the other way round.
  UseCase third_party = Viewfinder();
  third_party.first_party = false;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, third_party, Gn1Info(), AtGain(2));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "SensorGammaTuning"), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(false));
}

TEST(ZelTuningControllerBlockEnabledTest, DefaultUseCaseAnswerIgnoresTheBypassMask) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  UseCase third_party = Viewfinder();
  third_party.first_party = false;
  TuningInfo info = Gn1Info();
  info.bypass_bitmask = 0xFFFFFFFF;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, third_party, info, AtGain(2));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "DmscTuning"), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "BlcTuning"), IsOkAndHolds(true));
}

TEST(ZelTuningControllerBlockEnabledTest, UseCaseWithoutFileWarns) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  UseCase third_party = Viewfinder();
  third_party.first_party = false;
  std::shared_ptr<ZelTuningPoint> point = MakePoint(*controller, third_party, Gn1Info(), AtGain(2));
  ScopedLogCapture log;
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(false));
  EXPECT_EQ(log.Count("Cannot find tuning use case: BRIMAL_REAR_GN1_NORMAL, "
                      "FULL_4_3_FULL_15_30FPS, VIEWFINDER_3P. Using default tuning for "
                      "IsSubBlockEnabled()."),
            1);
}

// ---------------------------------------------------------------------------------------------
// IsTuningPointUpdated

struct FieldChange {
  std::string name;
  std::function<void(ZelTuningPoint&)> apply;
};

float NextFloat(float value) { return std::nextafter(value, std::numeric_limits<float>::max()); }

std::vector<FieldChange> ComparedFieldChanges() {
  return {
      {"led_influence",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.led_influence = NextFloat(p.tuning_coordinates.led_influence);
       }},
      {"cct",
       [](ZelTuningPoint& p) { p.tuning_coordinates.cct = NextFloat(p.tuning_coordinates.cct); }},
      {"bv",
       [](ZelTuningPoint& p) { p.tuning_coordinates.bv = NextFloat(p.tuning_coordinates.bv); }},
      {"real_gain",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.real_gain = NextFloat(p.tuning_coordinates.real_gain);
       }},
      {"exp_ratio",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.exp_ratio = NextFloat(p.tuning_coordinates.exp_ratio);
       }},
      {"mired_cct",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.mired_cct = NextFloat(p.tuning_coordinates.mired_cct);
       }},
      {"scaler_ratio",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.scaler_ratio = NextFloat(p.tuning_coordinates.scaler_ratio);
       }},
      {"pre_scaler_ratio",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.pre_scaler_ratio = NextFloat(p.tuning_coordinates.pre_scaler_ratio);
       }},
      {"frame_count", [](ZelTuningPoint& p) { p.tuning_coordinates.frame_count += 1; }},
      {"exposure_time_msecs",
       [](ZelTuningPoint& p) {
         p.tuning_coordinates.exposure_time_msecs =
             NextFloat(p.tuning_coordinates.exposure_time_msecs);
       }},
      {"use_case_type", [](ZelTuningPoint& p) { p.use_case.type = 5; }},
      {"torch", [](ZelTuningPoint& p) { p.use_case.torch = !p.use_case.torch; }},
      {"hdr", [](ZelTuningPoint& p) { p.use_case.hdr = !p.use_case.hdr; }},
      {"night", [](ZelTuningPoint& p) { p.use_case.night = !p.use_case.night; }},
      {"first_party", [](ZelTuningPoint& p) { p.use_case.first_party = !p.use_case.first_party; }},
      {"image_width", [](ZelTuningPoint& p) { p.tuning_info.image_size.width += 1; }},
      {"image_height", [](ZelTuningPoint& p) { p.tuning_info.image_size.height += 1; }},
      {"facing", [](ZelTuningPoint& p) { p.tuning_info.module_spec.facing = 2; }},
      {"lens_type", [](ZelTuningPoint& p) { p.tuning_info.module_spec.lens_type = 1; }},
      {"sensor_kind", [](ZelTuningPoint& p) { p.tuning_info.module_spec.sensor_kind = 1; }},
      {"sensor_fps_min",
       [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.sensor_fps_range.min = 10.0f; }},
      {"sensor_fps_max",
       [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.sensor_fps_range.max = 60.0f; }},
      {"target_fps_min",
       [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.target_fps_range.min = 30.0f; }},
      {"target_fps_max",
       [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.target_fps_range.max = 24.0f; }},
  };
}

std::vector<FieldChange> UncomparedFieldChanges() {
  return {
      {"bypass_bitmask", [](ZelTuningPoint& p) { p.tuning_info.bypass_bitmask = 0xFFFFFFFF; }},
      {"binning_x", [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.binning_x = 2; }},
      {"binning_y", [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.binning_y = 2; }},
      {"sensor_name",
       [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.sensor_name = "IMX663"; }},
      {"mode_width", [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.mode_width = 2040; }},
      {"mode_height", [](ZelTuningPoint& p) { p.tuning_info.sensor_mode_info.mode_height = 1536; }},
      {"crop_left", [](ZelTuningPoint& p) { p.tuning_info.normalized_crop.left = 0.25f; }},
      {"crop_top", [](ZelTuningPoint& p) { p.tuning_info.normalized_crop.top = 0.25f; }},
      {"crop_width", [](ZelTuningPoint& p) { p.tuning_info.normalized_crop.width = 0.5f; }},
      {"crop_height", [](ZelTuningPoint& p) { p.tuning_info.normalized_crop.height = 0.5f; }},
      {"use_bringup_tuning",
       [](ZelTuningPoint& p) { p.use_bringup_tuning = !p.use_bringup_tuning; }},
  };
}

ZelTuningPoint BasePoint() {
  return ZelTuningPoint(Viewfinder(), Gn1Info(), AtGain(2.0f), /*use_bringup_tuning=*/false);
}

std::string FieldChangeName(const ::testing::TestParamInfo<FieldChange>& info) {
  return info.param.name;
}

class ZelTuningControllerComparedFieldTest : public ::testing::TestWithParam<FieldChange> {};

TEST_P(ZelTuningControllerComparedFieldTest, ChangeMakesThePointUpdated) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  const ZelTuningPoint a = BasePoint();
  ZelTuningPoint b = a;
  GetParam().apply(b);
  EXPECT_THAT(controller->IsTuningPointUpdated(a, b), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsTuningPointUpdated(b, a), IsOkAndHolds(true));
}

INSTANTIATE_TEST_SUITE_P(EachField, ZelTuningControllerComparedFieldTest,
                         ::testing::ValuesIn(ComparedFieldChanges()), FieldChangeName);

class ZelTuningControllerUncomparedFieldTest : public ::testing::TestWithParam<FieldChange> {};

TEST_P(ZelTuningControllerUncomparedFieldTest, ChangeLeavesThePointNotUpdated) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  const ZelTuningPoint a = BasePoint();
  ZelTuningPoint b = a;
  GetParam().apply(b);
  EXPECT_THAT(controller->IsTuningPointUpdated(a, b), IsOkAndHolds(false));
  EXPECT_THAT(controller->IsTuningPointUpdated(b, a), IsOkAndHolds(false));
}

INSTANTIATE_TEST_SUITE_P(EachField, ZelTuningControllerUncomparedFieldTest,
                         ::testing::ValuesIn(UncomparedFieldChanges()), FieldChangeName);

TEST(ZelTuningControllerPointUpdateTest, EqualPointsAreNotUpdated) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  EXPECT_THAT(controller->IsTuningPointUpdated(BasePoint(), BasePoint()), IsOkAndHolds(false));
  const ZelTuningPoint point = BasePoint();
  EXPECT_THAT(controller->IsTuningPointUpdated(point, point), IsOkAndHolds(false));
}

TEST(ZelTuningControllerPointUpdateTest, NanCoordinateIsAlwaysUpdated) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  ZelTuningPoint point = BasePoint();
  point.tuning_coordinates.bv = std::numeric_limits<float>::quiet_NaN();
  const ZelTuningPoint copy = point;
  EXPECT_THAT(controller->IsTuningPointUpdated(point, copy), IsOkAndHolds(true));
  EXPECT_THAT(controller->IsTuningPointUpdated(point, point), IsOkAndHolds(true));
}

TEST(ZelTuningControllerPointUpdateTest, SignedZerosAreEqual) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  ZelTuningPoint a = BasePoint();
  ZelTuningPoint b = BasePoint();
  a.tuning_coordinates.led_influence = 0.0f;
  b.tuning_coordinates.led_influence = -0.0f;
  EXPECT_THAT(controller->IsTuningPointUpdated(a, b), IsOkAndHolds(false));
}

// ---------------------------------------------------------------------------------------------
// IsSubBlockBypassed

struct BypassRow {
  std::string_view name;
  uint32_t bit;
};

constexpr BypassRow kBypassRows[] = {
    {"BlcTuning", 0x1},
    {"CcmTuning", 0x2},
    {"ClutTuning", 0x4},
    {"DisparityTuning", 0x8},
    {"DmscTuning", 0x10},
    {"DpcTuning", 0x20},
    {"EdgedetTuning", 0x40},
    {"GammaTuning", 0x80},
    {"GtnrSharpenerTuning", 0x100},
    {"GtnrTuning", 0x200},
    {"HqdnsTuning", 0x400},
    {"LscTuning", 0x800},
    {"LscStatsTuning", 0x1000},
    {"LtmTuning", 0x2000},
    {"LtmDeltaYTuning", 0x4000},
    {"NfltrTuning", 0x8000},
    {"NsmixTuning", 0x10000},
    {"PrcTuning", 0x20000},
    {"RgbYuvConversionTuning", 0x40000},
    {"SharpTuning", 0x80000},
    {"SkindTuning", 0x100000},
    {"SnaddTuning", 0x200000},
    {"StkTuning", 0x400000},
    {"WbTuning", 0x800000},
};

class ZelTuningControllerBypassBitTest : public ::testing::TestWithParam<BypassRow> {};

TEST_P(ZelTuningControllerBypassBitTest, BlockIsBypassedByItsBitAlone) {
  const auto [name, bit] = GetParam();
  EXPECT_TRUE(IsSubBlockBypassed(bit, name));
  EXPECT_TRUE(IsSubBlockBypassed(0xFFFFFFFF, name));
  EXPECT_FALSE(IsSubBlockBypassed(0, name));
  EXPECT_FALSE(IsSubBlockBypassed(~bit, name));
}

INSTANTIATE_TEST_SUITE_P(EachBlock, ZelTuningControllerBypassBitTest,
                         ::testing::ValuesIn(kBypassRows),
                         [](const ::testing::TestParamInfo<BypassRow>& info) {
                           return std::string(info.param.name);
                         });

TEST(ZelTuningControllerBypassTest, SensorGammaHasNoBit) {
  EXPECT_FALSE(IsSubBlockBypassed(0xFFFFFFFF, "SensorGammaTuning"));
}

TEST(ZelTuningControllerBypassTest, UnknownNameIsNeverBypassed) {
  EXPECT_FALSE(IsSubBlockBypassed(0xFFFFFFFF, "NoSuchTuning"));
  EXPECT_FALSE(IsSubBlockBypassed(0xFFFFFFFF, "blc"));
  EXPECT_FALSE(IsSubBlockBypassed(0xFFFFFFFF, ""));
}

TEST(ZelTuningControllerBypassTest, BitsAboveTheTableBypassNothing) {
  for (std::string_view name : AllBlockNames()) {
    EXPECT_FALSE(IsSubBlockBypassed(0xFF000000, name)) << name;
  }
}

// ---------------------------------------------------------------------------------------------
// Interpolate

TEST(ZelTuningControllerInterpolateTest, NullPointFails) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  EXPECT_THAT(controller->Interpolate(nullptr, BlockNames{"BlcTuning"}),
              StatusIs(kFailedPrecondition, "Invalid tuning point"));
}

TEST(ZelTuningControllerInterpolateTest, EmptyNameSetGivesAnEmptyBundle) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(Gn1ViewfinderPoint(*controller), {}));
  ASSERT_THAT(bundle, NotNull());
  for (std::string_view name : AllBlockNames()) EXPECT_EQ(bundle->GetBlock(name), nullptr) << name;
}

TEST(ZelTuningControllerInterpolateTest, EmptyNameSetStillGeneratesTheUseCase) {
  // The use case is seen at work through its warning.
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TuningInfo unnamed = Gn1Info();
  unnamed.sensor_mode_info.sensor_name = "NOSUCHSENSOR";
  ScopedLogCapture log;
  TAVIK_EXPECT_OK(
      controller->Interpolate(MakePoint(*controller, Viewfinder(), unnamed, AtGain(2)), {}));
  EXPECT_EQ(log.Count("INVALID_CAMERA_SENSOR. Using default"), 1);
}

TEST(ZelTuningControllerInterpolateTest, BundleHoldsTheRequestedBlocksOnly) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> bundle,
      controller->Interpolate(Gn1ViewfinderPoint(*controller),
                              BlockNames{"BlcTuning", "WbTuning", "LscTuning"}));
  for (std::string_view name : {"BlcTuning", "WbTuning", "LscTuning"}) {
    const TuningBlock* block = bundle->GetBlock(name);
    ASSERT_THAT(block, NotNull()) << name;
    EXPECT_EQ(block->GetName(), name);
  }
  EXPECT_EQ(bundle->GetBlock("CcmTuning"), nullptr);
  EXPECT_EQ(bundle->GetBlock("SharpTuning"), nullptr);
  // The shading block is one that the shading controller can read tables from.
  EXPECT_THAT(dynamic_cast<const LscTuningBlock*>(bundle->GetBlock("LscTuning")), NotNull());
}

TEST(ZelTuningControllerInterpolateTest, EveryNameButSensorGammaYieldsItsOwnBlock) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::vector<std::string_view> names = AllBlockNames();
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(Gn1ViewfinderPoint(*controller),
                                                     BlockNames(names.begin(), names.end())));
  for (std::string_view name : names) {
    const TuningBlock* block = bundle->GetBlock(name);
    if (name == "SensorGammaTuning") {
      EXPECT_EQ(block, nullptr);
      continue;
    }
    ASSERT_THAT(block, NotNull()) << name;
    EXPECT_EQ(block->GetName(), name);
  }
}

TEST(ZelTuningControllerInterpolateTest, SensorGammaNameYieldsTheSharpBlock) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(point, BlockNames{"SensorGammaTuning"}));
  const TuningBlock* sharp = bundle->GetBlock("SharpTuning");
  ASSERT_THAT(sharp, NotNull());
  EXPECT_EQ(sharp->GetName(), "SharpTuning");
  EXPECT_EQ(bundle->GetBlock("SensorGammaTuning"), nullptr);

  // It is the block of SharpTuning's position: asking for SharpTuning at the same point reuses it.
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> again,
                             controller->Interpolate(point, BlockNames{"SharpTuning"}));
  EXPECT_EQ(again->GetBlock("SharpTuning"), sharp);

  // Both names together give the one block.
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> both,
      controller->Interpolate(point, BlockNames{"SensorGammaTuning", "SharpTuning"}));
  EXPECT_EQ(both->GetBlock("SharpTuning"), sharp);
  EXPECT_EQ(both->GetBlock("SensorGammaTuning"), nullptr);
}

TEST(ZelTuningControllerInterpolateTest, BlockIsInterpolatedAtTheCameraState) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  // The GN1 black level is 64 up to gain 4, 65 from 8 to 16, and 66 (red) from 32 on.
  constexpr std::pair<float, float> kGainAndRed[] = {{2.0f, 64.0f}, {6.0f, 64.5f}, {40.0f, 66.0f}};
  for (const auto& [gain, red] : kGainAndRed) {
    TAVIK_ASSERT_OK_AND_ASSIGN(
        std::shared_ptr<TuningBundle> bundle,
        controller->Interpolate(Gn1ViewfinderPoint(*controller, gain), BlockNames{"BlcTuning"}));
    const BlcTuning* blc = Message<BlcTuning>(*bundle, "BlcTuning");
    ASSERT_THAT(blc, NotNull());
    EXPECT_TRUE(blc->enable());
    EXPECT_THAT(blc->dynamic_param().offsets_r(), ElementsAre(red, red, red, red)) << gain;
  }
}

TEST(ZelTuningControllerInterpolateTest, UnchangedPointReusesTheSameBlockObjects) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller, 40.0f);
  const BlockNames names{"BlcTuning", "GammaTuning", "LscTuning"};
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> first,
                             controller->Interpolate(point, names));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> second,
                             controller->Interpolate(point, names));
  EXPECT_NE(first, second);
  for (std::string_view name : names) {
    ASSERT_THAT(first->GetBlock(name), NotNull()) << name;
    EXPECT_EQ(first->GetBlock(name), second->GetBlock(name)) << name;
  }

  // Another point object with the same values is the same point to the cache.
  std::shared_ptr<ZelTuningPoint> twin = Gn1ViewfinderPoint(*controller, 40.0f);
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> third,
                             controller->Interpolate(twin, names));
  for (std::string_view name : names) EXPECT_EQ(first->GetBlock(name), third->GetBlock(name));
}

TEST(ZelTuningControllerInterpolateTest, CacheHitLogsNothingAndRefreshLogsOnlyUseCaseChanges) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  const BlockNames names{"BlcTuning", "CcmTuning"};
  ScopedLogCapture log;

  // First use of the positions.
  TAVIK_ASSERT_OK(controller->Interpolate(Gn1ViewfinderPoint(*controller, 2), names).status());
  EXPECT_EQ(log.Count(kUsecaseUpdatedGn1Viewfinder), 2);

  // Unchanged point: cache hits.
  log.Clear();
  TAVIK_ASSERT_OK(controller->Interpolate(Gn1ViewfinderPoint(*controller, 2), names).status());
  EXPECT_THAT(log.messages(), Not(Contains(::testing::StartsWith("Tuning usecase is updated"))));

  // A new camera state refreshes the blocks but isn't a new use case.
  log.Clear();
  TAVIK_ASSERT_OK(controller->Interpolate(Gn1ViewfinderPoint(*controller, 3), names).status());
  EXPECT_THAT(log.messages(), Not(Contains(::testing::StartsWith("Tuning usecase is updated"))));

  // A compared field outside the camera state counts as a use-case change, even where the key
  // stays the same (the hdr flag isn't part of the key).
  log.Clear();
  UseCase hdr = Viewfinder();
  hdr.hdr = true;
  TAVIK_ASSERT_OK(
      controller->Interpolate(MakePoint(*controller, hdr, Gn1Info(), AtGain(3)), names).status());
  EXPECT_EQ(log.Count(kUsecaseUpdatedGn1Viewfinder), 2);

  log.Clear();
  UseCase torch = Viewfinder();
  torch.torch = true;
  TAVIK_ASSERT_OK(
      controller->Interpolate(MakePoint(*controller, torch, Gn1Info(), AtGain(3)), names).status());
  EXPECT_EQ(log.Count("Tuning usecase is updated: BRIMAL_REAR_GN1_NORMAL, "
                      "FULL_4_3_FULL_15_30FPS, VIEWFINDER_TORCH"),
            2);
}

TEST(ZelTuningControllerInterpolateTest, BypassMaskOnlyChangeReusesTheCachedBlock) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> plain = Gn1ViewfinderPoint(*controller, 40.0f);
  TuningInfo bypassing = Gn1Info();
  bypassing.bypass_bitmask = 0x1;  // BlcTuning
  std::shared_ptr<ZelTuningPoint> bypassed =
      MakePoint(*controller, Viewfinder(), bypassing, AtGain(40.0f));

  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> first,
                             controller->Interpolate(plain, BlockNames{"BlcTuning"}));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> second,
                             controller->Interpolate(bypassed, BlockNames{"BlcTuning"}));
  ASSERT_THAT(first->GetBlock("BlcTuning"), NotNull());
  EXPECT_EQ(second->GetBlock("BlcTuning"), first->GetBlock("BlcTuning"));
  // So the frame that asked for a bypass gets the enabled, interpolated block.
  const BlcTuning* blc = Message<BlcTuning>(*second, "BlcTuning");
  ASSERT_THAT(blc, NotNull());
  EXPECT_TRUE(blc->enable());
  EXPECT_THAT(blc->dynamic_param().offsets_r(), ElementsAre(66, 66, 66, 66));
}

TEST(ZelTuningControllerInterpolateTest, BypassedBlockHasTheFirstLeafAndIsCachedByPosition) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TuningInfo bypassing = Gn1Info();
  bypassing.bypass_bitmask = 0x1;  // BlcTuning
  // At gain 40 the interpolated black level would be 66; the first leaf holds 64.
  std::shared_ptr<ZelTuningPoint> bypassed =
      MakePoint(*controller, Viewfinder(), bypassing, AtGain(40.0f));

  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> first,
                             controller->Interpolate(bypassed, BlockNames{"BlcTuning"}));
  const BlcTuning* blc = Message<BlcTuning>(*first, "BlcTuning");
  ASSERT_THAT(blc, NotNull());
  EXPECT_FALSE(blc->enable());
  EXPECT_THAT(blc->dynamic_param().offsets_r(), ElementsAre(64, 64, 64, 64));
  EXPECT_THAT(blc->dynamic_param().offsets_b(), ElementsAre(64, 64, 64, 64));

  // Cached like any other block: the same point, and a point that no longer bypasses, get it.
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> again,
                             controller->Interpolate(bypassed, BlockNames{"BlcTuning"}));
  EXPECT_EQ(again->GetBlock("BlcTuning"), first->GetBlock("BlcTuning"));
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> plain,
      controller->Interpolate(Gn1ViewfinderPoint(*controller, 40.0f), BlockNames{"BlcTuning"}));
  EXPECT_EQ(plain->GetBlock("BlcTuning"), first->GetBlock("BlcTuning"));

  // Another block of the same frame isn't bypassed by that bit.
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> stk,
                             controller->Interpolate(bypassed, BlockNames{"StkTuning"}));
  ASSERT_THAT(Message<StkTuning>(*stk, "StkTuning"), NotNull());
  EXPECT_TRUE(Message<StkTuning>(*stk, "StkTuning")->enable());
}

TEST(ZelTuningControllerInterpolateTest, ChangedPointRefreshesTheBlock) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> first,
      controller->Interpolate(Gn1ViewfinderPoint(*controller, 40.0f), BlockNames{"BlcTuning"}));
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> second,
      controller->Interpolate(Gn1ViewfinderPoint(*controller, 2.0f), BlockNames{"BlcTuning"}));
  EXPECT_NE(first->GetBlock("BlcTuning"), second->GetBlock("BlcTuning"));
  EXPECT_THAT(Message<BlcTuning>(*second, "BlcTuning")->dynamic_param().offsets_r(),
              ElementsAre(64, 64, 64, 64));
}

TEST(ZelTuningControllerInterpolateTest, NanCoordinateRefreshesEveryTime) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TuningCoordinates coordinates = AtGain(40.0f);
  // No tree of the black level reads the exposure time.
  coordinates.exposure_time_msecs = std::numeric_limits<float>::quiet_NaN();
  std::shared_ptr<ZelTuningPoint> point =
      MakePoint(*controller, Viewfinder(), Gn1Info(), coordinates);
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> first,
                             controller->Interpolate(point, BlockNames{"BlcTuning"}));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> second,
                             controller->Interpolate(point, BlockNames{"BlcTuning"}));
  ASSERT_THAT(first->GetBlock("BlcTuning"), NotNull());
  EXPECT_NE(first->GetBlock("BlcTuning"), second->GetBlock("BlcTuning"));
}

TEST(ZelTuningControllerInterpolateTest, EarlierBundlesStayValidAfterTheCacheMovedOn) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  TAVIK_ASSERT_OK_AND_ASSIGN(
      std::shared_ptr<TuningBundle> old_bundle,
      controller->Interpolate(Gn1ViewfinderPoint(*controller, 40.0f), BlockNames{"BlcTuning"}));
  // The cache moves on twice, so that nothing but the old bundle holds its block.
  for (float gain : {2.0f, 12.0f}) {
    TAVIK_ASSERT_OK(
        controller->Interpolate(Gn1ViewfinderPoint(*controller, gain), BlockNames{"BlcTuning"})
            .status());
  }
  const BlcTuning* blc = Message<BlcTuning>(*old_bundle, "BlcTuning");
  ASSERT_THAT(blc, NotNull());
  EXPECT_THAT(blc->dynamic_param().offsets_r(), ElementsAre(66, 66, 66, 66));
  EXPECT_THAT(blc->dynamic_param().offsets_gr(), ElementsAre(65.5, 65.5, 65.5, 65.5));

  // And the controller's death doesn't take it either.
  controller.reset();
  EXPECT_THAT(blc->dynamic_param().offsets_b(), ElementsAre(66.5, 66.5, 66.5, 66.5));
}

TEST(ZelTuningControllerInterpolateTest, UnknownNameFailsTheWholeRequestAndCachesNothing) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  std::vector<std::string_view> names = AllBlockNames();
  BlockNames with_unknown(names.begin(), names.end());
  with_unknown.insert("NoSuchTuning");
  EXPECT_THAT(controller->Interpolate(point, with_unknown),
              StatusIs(kInvalidArgument, "Unrecognized block name: NoSuchTuning"));
  EXPECT_THAT(controller->Interpolate(point, BlockNames{"BlcTuning", "blc"}),
              StatusIs(kInvalidArgument, "Unrecognized block name: blc"));

  // Whatever the order of the set, no position was filled: each is new to the cache now, which
  // logs the use case once per position (24: SensorGammaTuning shares SharpTuning's).
  ScopedLogCapture log;
  TAVIK_ASSERT_OK(controller->Interpolate(point, BlockNames(names.begin(), names.end())).status());
  EXPECT_EQ(log.Count(kUsecaseUpdatedGn1Viewfinder), 24);
}

TEST(ZelTuningControllerInterpolateTest, ProductionTakesTheNearestUseCase) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  // GN1, FULL_4_3_FULL_15_30FPS, VIEWFINDER_3P has no file; the nearest key is the GN1
  // viewfinder, where Stk is on (and off in the default use case).
  UseCase third_party = Viewfinder();
  third_party.first_party = false;
  std::shared_ptr<ZelTuningPoint> point =
      MakePoint(*controller, third_party, Gn1Info(), AtGain(40.0f));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(point, BlockNames{"StkTuning"}));
  ASSERT_THAT(Message<StkTuning>(*bundle, "StkTuning"), NotNull());
  EXPECT_TRUE(Message<StkTuning>(*bundle, "StkTuning")->enable());
  // Whereas the query of the switch answers from the default use case.
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(false));
}

// A tuning set of one file, for GN1 viewfinder: a black level of 70, a clut tree that is off and
// has no leaf, and no tree at all for the other blocks.
class ZelTuningControllerFailedFillTest : public ::testing::Test {
 protected:
  void SetUp() override {
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    BlcDynamicParam black;
    for (int i = 0; i < 4; ++i) black.add_offsets_r(70);
    *tree_set.mutable_blc() = MakeTree(true, BlcStaticParam(),
                                       MakeLevel(vosbrine::Level::GAIN, {LeafNode(1, 64, black)}));
    *tree_set.mutable_clut() = MakeTree(false, ClutStaticParam(), vosbrine::Level());
    WriteBinarypb(dir_, "gn1_viewfinder.binarypb",
                  MakeUsecaseData(Gn1ViewfinderUsecase(), tree_set));
    controller_ = std::make_unique<ZelTuningController>(
        kDevice, std::vector<std::string>{dir_.path()}, NoCalibration());
    ASSERT_THAT(controller_->provider(), NotNull());
  }

  static vosbrine::TuningUsecase Gn1ViewfinderUsecase() {
    return MakeUsecase(vosbrine::BRIMAL_REAR_GN1_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS,
                       vosbrine::VIEWFINDER);
  }

  // What the provider says of a block whose tree isn't in the file.
  static std::string MissingTreeText() {
    return "Failed to unpack static_param. " + Gn1ViewfinderUsecase().DebugString();
  }

  TempDir dir_;
  std::unique_ptr<ZelTuningController> controller_;
};

TEST_F(ZelTuningControllerFailedFillTest, FailedFillFailsTheRequest) {
  EXPECT_THAT(controller_->Interpolate(Gn1ViewfinderPoint(*controller_),
                                       BlockNames{"BlcTuning", "CcmTuning"}),
              StatusIs(kInternal, MissingTreeText()));
  EXPECT_THAT(controller_->Interpolate(Gn1ViewfinderPoint(*controller_, 3),
                                       BlockNames{"BlcTuning", "ClutTuning"}),
              StatusIs(kInternal, "First dynamic_param not found."));
}

TEST_F(ZelTuningControllerFailedFillTest, FirstFailureInPositionOrderWins) {
  // Ccm (position 1) fails before Clut (position 2), whatever the order of the set.
  EXPECT_THAT(controller_->Interpolate(Gn1ViewfinderPoint(*controller_),
                                       BlockNames{"ClutTuning", "CcmTuning"}),
              StatusIs(kInternal, MissingTreeText()));
  EXPECT_THAT(controller_->Interpolate(Gn1ViewfinderPoint(*controller_, 3),
                                       BlockNames{"CcmTuning", "ClutTuning"}),
              StatusIs(kInternal, MissingTreeText()));
}

TEST_F(ZelTuningControllerFailedFillTest, FailedFillStillCachesEveryRequestedBlock) {
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller_);
  const BlockNames names{"BlcTuning", "CcmTuning", "ClutTuning"};
  EXPECT_THAT(controller_->Interpolate(point, names), Not(IsOk()));

  // The same point again reuses the blocks as they stand, and succeeds.
  ScopedLogCapture log;
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller_->Interpolate(point, names));
  for (std::string_view name : names) EXPECT_THAT(bundle->GetBlock(name), NotNull()) << name;
  EXPECT_EQ(log.Count(kUsecaseUpdatedGn1Viewfinder), 0);
  // The block that could be filled was filled in the failed request.
  const BlcTuning* blc = Message<BlcTuning>(*bundle, "BlcTuning");
  ASSERT_THAT(blc, NotNull());
  EXPECT_THAT(blc->dynamic_param().offsets_r(), ElementsAre(70, 70, 70, 70));

  // A changed point evaluates again, and fails again.
  EXPECT_THAT(controller_->Interpolate(Gn1ViewfinderPoint(*controller_, 3), names),
              StatusIs(kInternal, MissingTreeText()));
}

// ---------------------------------------------------------------------------------------------
// Signal thread and sessions

// A point that notes, in a shared list, each time its fence is asked for. It keeps its own
// handle on the fence, so that a test can wait on it without being noted.
class RecordingPoint : public TuningPoint {
 public:
  struct Log {
    std::mutex mutex;
    std::vector<int> ids;
  };

  RecordingPoint(int id, std::shared_ptr<Log> log)
      : RecordingPoint(id, std::move(log), std::make_shared<SoftwareFence>()) {}

  SoftwareFence* GetFence() const override {
    {
      std::lock_guard<std::mutex> lock(log_->mutex);
      log_->ids.push_back(id_);
    }
    return fence_.get();
  }

  const SoftwareFence& fence() const { return *fence_; }

 private:
  RecordingPoint(int id, std::shared_ptr<Log> log, std::shared_ptr<SoftwareFence> fence)
      : TuningPoint(fence), id_(id), log_(std::move(log)), fence_(std::move(fence)) {}

  const int id_;
  const std::shared_ptr<Log> log_;
  const std::shared_ptr<SoftwareFence> fence_;
};

// A point without a fence.
class FencelessPoint : public TuningPoint {
 public:
  FencelessPoint() : TuningPoint(nullptr) {}
};

TEST(ZelTuningControllerSessionTest, PointIsSignalledWhileASessionIsOpen) {
  std::unique_ptr<ZelTuningController> controller = SampleController();
  controller->NotifyCaptureSessionOpen();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_ASSERT_OK(controller->Interpolate(point, BlockNames{"BlcTuning"}).status());
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));
  EXPECT_TRUE(point->GetFence()->IsSignalled());
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerSessionTest, PointSignalledWithNoSessionIsNeverSignalled) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  EXPECT_THAT(point->WaitForDone(NeverSignalled()), StatusIs(kDeadlineExceeded, _));
  EXPECT_FALSE(point->GetFence()->IsSignalled());
}

TEST(ZelTuningControllerSessionTest, PointSignalledBetweenSessionsIsDroppedNotKept) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  controller->NotifyCaptureSessionClose();

  std::shared_ptr<ZelTuningPoint> dropped = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(dropped));

  // The next session has a queue of its own, which never saw the dropped point.
  controller->NotifyCaptureSessionOpen();
  std::shared_ptr<ZelTuningPoint> later = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(later));
  TAVIK_EXPECT_OK(later->WaitForDone(MustBeSignalled()));
  EXPECT_THAT(dropped->WaitForDone(NeverSignalled()), StatusIs(kDeadlineExceeded, _));
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerSessionTest, FencesFireInPushOrder) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  auto log = std::make_shared<RecordingPoint::Log>();
  constexpr int kPoints = 500;
  std::vector<std::shared_ptr<RecordingPoint>> points;
  for (int i = 0; i < kPoints; ++i) points.push_back(std::make_shared<RecordingPoint>(i, log));

  controller->NotifyCaptureSessionOpen();
  for (const std::shared_ptr<RecordingPoint>& point : points) {
    TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  }
  TAVIK_ASSERT_OK(points.back()->fence().Wait(MustBeSignalled()));
  for (const std::shared_ptr<RecordingPoint>& point : points) {
    EXPECT_TRUE(point->fence().IsSignalled());
  }
  controller->NotifyCaptureSessionClose();

  std::lock_guard<std::mutex> lock(log->mutex);
  ASSERT_EQ(log->ids.size(), static_cast<size_t>(kPoints));
  for (int i = 0; i < kPoints; ++i) ASSERT_EQ(log->ids[i], i);
}

TEST(ZelTuningControllerSessionTest, LaterFenceFiringMeansEarlierOnesHaveFired) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  std::vector<std::shared_ptr<ZelTuningPoint>> points;
  for (int i = 0; i < 200; ++i) {
    points.push_back(Gn1ViewfinderPoint(*controller, 1.0f + i));
    TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(points.back()));
    if (i % 7 == 6) {
      TAVIK_ASSERT_OK(points.back()->WaitForDone(MustBeSignalled()));
      for (const std::shared_ptr<ZelTuningPoint>& earlier : points) {
        ASSERT_TRUE(earlier->GetFence()->IsSignalled());
      }
    }
  }
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerSessionTest, PointsPushedBeforeTheLastCloseAreSignalledBeforeItReturns) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  std::vector<std::shared_ptr<ZelTuningPoint>> points;
  for (int i = 0; i < 1000; ++i) {
    points.push_back(Gn1ViewfinderPoint(*controller, 1.0f + i));
    TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(points.back()));
  }
  controller->NotifyCaptureSessionClose();
  // No waiting: the close has drained the queue.
  for (const std::shared_ptr<ZelTuningPoint>& point : points) {
    ASSERT_TRUE(point->GetFence()->IsSignalled());
  }
}

TEST(ZelTuningControllerSessionTest, OpenTwiceCloseOnceKeepsTheSignalThread) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  controller->NotifyCaptureSessionOpen();
  controller->NotifyCaptureSessionClose();

  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));

  // The second close stops it.
  controller->NotifyCaptureSessionClose();
  std::shared_ptr<ZelTuningPoint> after = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(after));
  EXPECT_THAT(after->WaitForDone(NeverSignalled()), StatusIs(kDeadlineExceeded, _));
}

TEST(ZelTuningControllerSessionTest, SessionsCanBeOpenedAgainAfterTheLastClose) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  for (int round = 0; round < 3; ++round) {
    controller->NotifyCaptureSessionOpen();
    std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
    TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
    TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled())) << round;
    controller->NotifyCaptureSessionClose();
  }
}

TEST(ZelTuningControllerSessionTest, UnmatchedCloseWrapsTheCountSoTheNextOpenStartsNothing) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  // The count wraps from 0 to its maximum; the next open brings it back to 0.
  controller->NotifyCaptureSessionClose();
  controller->NotifyCaptureSessionOpen();
  std::shared_ptr<ZelTuningPoint> dropped = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(dropped));
  EXPECT_THAT(dropped->WaitForDone(NeverSignalled()), StatusIs(kDeadlineExceeded, _));

  // From 0, an open starts the thread as usual.
  controller->NotifyCaptureSessionOpen();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerSessionTest, PointWithoutFenceIsPassedOver) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(std::make_shared<FencelessPoint>()));
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerSessionTest, SignalThreadHoldsThePointUntilSignalledThenLetsGo) {
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  auto log = std::make_shared<RecordingPoint::Log>();
  auto point = std::make_shared<RecordingPoint>(7, log);
  const std::weak_ptr<RecordingPoint> watcher = point;
  controller->NotifyCaptureSessionOpen();
  // The service lets go of the point at once; the queue shares ownership of it.
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(std::move(point)));
  controller->NotifyCaptureSessionClose();

  EXPECT_TRUE(watcher.expired());
  std::lock_guard<std::mutex> lock(log->mutex);
  EXPECT_THAT(log->ids, ElementsAre(7));
}

// Drops the right to raise priorities for this thread and those it starts: CAP_SYS_NICE from
// the effective set, and the nice limit to none.
bool DropRightToRaisePriority() {
  const rlimit no_raise = {0, 0};
  if (setrlimit(RLIMIT_NICE, &no_raise) != 0) return false;
  __user_cap_header_struct header = {_LINUX_CAPABILITY_VERSION_3, 0};
  __user_cap_data_struct data[_LINUX_CAPABILITY_U32S_3] = {};
  if (syscall(SYS_capget, &header, data) != 0) return false;
  data[CAP_TO_INDEX(CAP_SYS_NICE)].effective &= ~CAP_TO_MASK(CAP_SYS_NICE);
  return syscall(SYS_capset, &header, data) == 0;
}

TEST(ZelTuningControllerSessionTest, SignalThreadRunsOnWhenRaisingPriorityFails) {
  // In a fresh process, as it gives up rights for good.
  ExpectInFreshProcess([]() -> std::string {
    if (!DropRightToRaisePriority()) return "could not drop the right to raise priorities";
    std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
    ScopedLogCapture log;
    controller->NotifyCaptureSessionOpen();
    std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
    if (!controller->SignalProducedTuningPoint(point).ok()) return "signal failed";
    const Status done = point->WaitForDone(MustBeSignalled());
    controller->NotifyCaptureSessionClose();
    if (!done.ok()) return "fence: " + done.ToString();
    // The result of setpriority, -1, is what the line prints.
    return CheckLogCount(log, StrCat("Couldn't nice -10 the thread: ", std::strerror(-1), "(-1)"),
                         1);
  });
}

TEST(ZelTuningControllerSessionTest, SignalThreadRunsWhereRaisingPrioritySucceeds) {
  // Tests here may run with the right to raise priorities; the thread works either way.
  std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
  controller->NotifyCaptureSessionOpen();
  std::shared_ptr<ZelTuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_EXPECT_OK(controller->SignalProducedTuningPoint(point));
  TAVIK_EXPECT_OK(point->WaitForDone(MustBeSignalled()));
  controller->NotifyCaptureSessionClose();
}

TEST(ZelTuningControllerDeathTest, DestroyingWithASessionOpenEndsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_DEATH(
      {
        std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
        controller->NotifyCaptureSessionOpen();
        controller.reset();
      },
      "");
}

TEST(ZelTuningControllerDeathTest, DestroyingAfterTheLastCloseEndsCleanly) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(
      {
        std::unique_ptr<ZelTuningController> controller = ControllerWithoutTuning();
        controller->NotifyCaptureSessionOpen();
        controller->NotifyCaptureSessionOpen();
        controller->NotifyCaptureSessionClose();
        controller->NotifyCaptureSessionClose();
        controller.reset();
        std::_Exit(0);
      },
      ::testing::ExitedWithCode(0), "");
}

TEST(ZelTuningControllerDeathTest, DestroyingANeverOpenedControllerEndsCleanly) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  EXPECT_EXIT(
      {
        SampleController().reset();
        std::_Exit(0);
      },
      ::testing::ExitedWithCode(0), "");
}

}  // namespace
}  // namespace tavik
