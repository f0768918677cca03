#include "tavik/iq/zel/tuning_controller_factory.h"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/fence.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/property_scope.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/base/time.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/zel_tuning_block.h"
#include "tavik/iq/zel/zel_tuning_controller.h"

namespace tavik {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::IsOkAndHolds;
using ::tavik::test::MakeUsecase;
using ::tavik::test::ScopedDeviceRoot;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::ScopedProperty;
using ::tavik::test::StatusIs;
using ::testing::_;
using ::testing::ElementsAre;
using ::testing::Not;
using ::testing::NotNull;

using Calibration = FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>;
using BlockNames = FlatHashSet<std::string_view>;

constexpr absl::StatusCode kFailedPrecondition = absl::StatusCode::kFailedPrecondition;
constexpr absl::StatusCode kDeadlineExceeded = absl::StatusCode::kDeadlineExceeded;

constexpr char kRedirectProperty[] = "vendor.camera.debug.redirect_tuning_binary";
constexpr char kApexDir[] = "/apex/com.qarmont.varro.camera.hal/etc/lib64/camera/";
constexpr char kDataDir[] = "/data/vendor/camera/etc/";
constexpr char kDevice[] = "brimal";

constexpr char kGn1ViewfinderFile[] = "brimal_rear_gn1_normal_full_4_3_full_15_30fps_viewfinder";
constexpr char kBringupFile[] = "brimal_sensor_bringup_full_4_3_full_15_30fps_viewfinder";

const Calibration& NoCalibration() {
  static const auto* const calibration = new Calibration();
  return *calibration;
}

vosbrine::TuningUsecase Gn1Viewfinder() {
  return MakeUsecase(vosbrine::BRIMAL_REAR_GN1_NORMAL, vosbrine::FULL_4_3_FULL_15_30FPS,
                     vosbrine::VIEWFINDER);
}

vosbrine::TuningUsecase Bringup() {
  return MakeUsecase(vosbrine::BRIMAL_SENSOR_BRINGUP, vosbrine::FULL_4_3_FULL_15_30FPS,
                     vosbrine::VIEWFINDER);
}

// Copies sample tuning files (by stem; all when none is named) into `device_dir` under `root`.
void CopySampleTuning(const ScopedDeviceRoot& root, std::string_view device_dir,
                      const std::vector<std::string>& stems = {}) {
  namespace fs = std::filesystem;
  const fs::path target = fs::path(root.path()) / fs::path(device_dir).relative_path();
  fs::create_directories(target);
  for (const fs::directory_entry& entry : fs::directory_iterator(TAVIK_SAMPLE_TUNING_DIR)) {
    if (entry.path().extension() != ".binarypb") continue;
    const std::string stem = entry.path().stem().string();
    if (!stems.empty() && std::find(stems.begin(), stems.end(), stem) == stems.end()) continue;
    fs::copy_file(entry.path(), target / entry.path().filename());
  }
}

std::shared_ptr<TuningController> Create(std::string_view device = kDevice) {
  StatusOr<std::shared_ptr<TuningController>> controller =
      CreateTuningController(device, NoCalibration());
  EXPECT_TRUE(controller.ok()) << controller.status();
  return controller.ok() ? *controller : nullptr;
}

const vosbrine::zelmondrake::TuningProvider* ProviderOf(const TuningController& controller) {
  const auto* zel = dynamic_cast<const ZelTuningController*>(&controller);
  EXPECT_THAT(zel, NotNull());
  return zel == nullptr ? nullptr : zel->provider();
}

TuningInfo Gn1Info() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "GN1";
  info.sensor_mode_info.mode_width = 4080;
  info.sensor_mode_info.mode_height = 3072;
  info.sensor_mode_info.sensor_fps_range = {15.0f, 30.0f};
  info.sensor_mode_info.target_fps_range = {15.0f, 30.0f};
  info.image_size = {4080, 3072};
  info.module_spec = {.facing = 0, .lens_type = 0, .sensor_kind = 0};
  return info;
}

std::shared_ptr<TuningPoint> Gn1ViewfinderPoint(const TuningController& controller) {
  UseCase viewfinder;
  viewfinder.type = 0;
  viewfinder.first_party = true;
  TuningCoordinates coordinates;
  coordinates.real_gain = 2.0f;
  coordinates.cct = 5000.0f;
  return controller.CreateTuningPoint(viewfinder, Gn1Info(), coordinates);
}

TEST(TuningControllerFactoryTest, PathListsAreTheDeviceDirectories) {
  {
    ScopedProperty redirect(kRedirectProperty, "");
    EXPECT_THAT(TuningBinaryPaths(), ElementsAre(kApexDir));
  }
  {
    ScopedProperty redirect(kRedirectProperty, "false");
    EXPECT_THAT(TuningBinaryPaths(), ElementsAre(kApexDir));
  }
  {
    ScopedProperty redirect(kRedirectProperty, "true");
    EXPECT_THAT(TuningBinaryPaths(), ElementsAre(kDataDir));
  }
  // The lists are static: every call gives the same object.
  ScopedProperty redirect(kRedirectProperty, "");
  EXPECT_EQ(&TuningBinaryPaths(), &TuningBinaryPaths());
}

TEST(TuningControllerFactoryTest, LoadsFromTheApexDirectoryByDefault) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir, {kBringupFile});
  CopySampleTuning(root, kDataDir, {kGn1ViewfinderFile});

  ScopedLogCapture log;
  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  const vosbrine::zelmondrake::TuningProvider* provider = ProviderOf(*controller);
  ASSERT_THAT(provider, NotNull());
  EXPECT_TRUE(provider->HasTuningUsecase(Bringup()));
  EXPECT_FALSE(provider->HasTuningUsecase(Gn1Viewfinder()));
  EXPECT_FALSE(log.Contains("Redirect Tuning Binary Paths to "));
}

TEST(TuningControllerFactoryTest, RedirectLoadsFromTheDataDirectoryOnly) {
  ScopedProperty redirect(kRedirectProperty, "true");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir, {kBringupFile});
  CopySampleTuning(root, kDataDir, {kGn1ViewfinderFile});

  ScopedLogCapture log;
  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  const vosbrine::zelmondrake::TuningProvider* provider = ProviderOf(*controller);
  ASSERT_THAT(provider, NotNull());
  // No merge with the APEX directory.
  EXPECT_TRUE(provider->HasTuningUsecase(Gn1Viewfinder()));
  EXPECT_FALSE(provider->HasTuningUsecase(Bringup()));
  EXPECT_EQ(log.Count("Redirect Tuning Binary Paths to /data/vendor/camera/etc/"), 1);
}

TEST(TuningControllerFactoryTest, RedirectDoesntLookAtTheApexDirectory) {
  ScopedProperty redirect(kRedirectProperty, "true");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);  // All of the sample tuning, and nothing in the data dir.

  ScopedLogCapture log;
  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  EXPECT_EQ(ProviderOf(*controller), nullptr);
  for (const std::string& line : log.messages()) {
    EXPECT_THAT(line, Not(::testing::HasSubstr("/apex/"))) << line;
  }
}

TEST(TuningControllerFactoryTest, DefaultDoesntFallBackToTheDataDirectory) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kDataDir);

  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  EXPECT_EQ(ProviderOf(*controller), nullptr);
}

TEST(TuningControllerFactoryTest, MissingTuningStillGivesAControllerWhichAnswersInvalidProvider) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;  // Empty.

  StatusOr<std::shared_ptr<TuningController>> created =
      CreateTuningController(kDevice, NoCalibration());
  ASSERT_TRUE(created.ok()) << created.status();
  std::shared_ptr<TuningController> controller = *created;
  ASSERT_THAT(controller, NotNull());
  EXPECT_EQ(controller->GetInstanceName(), "zel-tuning-controller");
  std::shared_ptr<TuningPoint> point = Gn1ViewfinderPoint(*controller);
  EXPECT_THAT(controller->Interpolate(point, BlockNames{"BlcTuning"}),
              StatusIs(kFailedPrecondition, "Invalid provider"));
  EXPECT_THAT(controller->IsBlockEnabled(*point, "BlcTuning"),
              StatusIs(kFailedPrecondition, "Invalid provider"));
}

TEST(TuningControllerFactoryTest, ControllerWorksOnTheDeviceTuning) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);

  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  EXPECT_EQ(controller->GetInstanceName(), "zel-tuning-controller");
  std::shared_ptr<TuningPoint> point = Gn1ViewfinderPoint(*controller);
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> bundle,
                             controller->Interpolate(point, BlockNames{"BlcTuning"}));
  EXPECT_THAT(bundle->GetBlock("BlcTuning"), NotNull());
  EXPECT_THAT(controller->IsBlockEnabled(*point, "StkTuning"), IsOkAndHolds(true));
}

TEST(TuningControllerFactoryTest, DeviceNameReachesTheController) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);

  // Stk is on in the GN1 viewfinder tuning and off in the default (bring-up) one. On
  // "fennelmoore" the GN1 can't be named, and the default use case answers.
  std::shared_ptr<TuningController> brimal = Create("brimal");
  std::shared_ptr<TuningController> fennelmoore = Create("fennelmoore");
  ASSERT_THAT(brimal, NotNull());
  ASSERT_THAT(fennelmoore, NotNull());
  EXPECT_THAT(brimal->IsBlockEnabled(*Gn1ViewfinderPoint(*brimal), "StkTuning"),
              IsOkAndHolds(true));
  EXPECT_THAT(fennelmoore->IsBlockEnabled(*Gn1ViewfinderPoint(*fennelmoore), "StkTuning"),
              IsOkAndHolds(false));
}

TEST(TuningControllerFactoryTest, EmptyCalibrationLoadsUncalibratedTuning) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);
  std::shared_ptr<TuningController> controller = Create();
  ASSERT_THAT(controller, NotNull());
  EXPECT_THAT(ProviderOf(*controller), NotNull());
}

TEST(TuningControllerFactoryTest, EmptyCalibrationLogsNoEepromData) {
  // The line is rate-limited per call site; a new log capture restarts the site.
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);
  ScopedLogCapture log;
  StatusOr<std::shared_ptr<TuningController>> controller =
      CreateTuningController(kDevice, NoCalibration());
  ASSERT_THAT(controller, IsOk());
  const auto* zel = dynamic_cast<const ZelTuningController*>(controller->get());
  ASSERT_NE(zel, nullptr);
  EXPECT_NE(zel->provider(), nullptr);
  EXPECT_EQ(log.Count("BuildTuningEepromData: No eeprom data available"), 1);
}

TEST(TuningControllerFactoryTest, TwoControllersShareNeitherCacheNorSessions) {
  ScopedProperty redirect(kRedirectProperty, "");
  ScopedDeviceRoot root;
  CopySampleTuning(root, kApexDir);
  std::shared_ptr<TuningController> first = Create();
  std::shared_ptr<TuningController> second = Create();
  ASSERT_THAT(first, NotNull());
  ASSERT_THAT(second, NotNull());
  EXPECT_NE(first, second);

  // Each caches its own blocks.
  std::shared_ptr<TuningPoint> point = Gn1ViewfinderPoint(*first);
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> from_first,
                             first->Interpolate(point, BlockNames{"BlcTuning"}));
  TAVIK_ASSERT_OK_AND_ASSIGN(std::shared_ptr<TuningBundle> from_second,
                             second->Interpolate(point, BlockNames{"BlcTuning"}));
  ASSERT_THAT(from_first->GetBlock("BlcTuning"), NotNull());
  EXPECT_NE(from_first->GetBlock("BlcTuning"), from_second->GetBlock("BlcTuning"));

  // A session of one is no session of the other.
  first->NotifyCaptureSessionOpen();
  std::shared_ptr<TuningPoint> to_second = Gn1ViewfinderPoint(*second);
  TAVIK_EXPECT_OK(second->SignalProducedTuningPoint(to_second));
  std::shared_ptr<TuningPoint> to_first = Gn1ViewfinderPoint(*first);
  TAVIK_EXPECT_OK(first->SignalProducedTuningPoint(to_first));
  TAVIK_EXPECT_OK(to_first->WaitForDone(Seconds(10)));
  EXPECT_THAT(to_second->WaitForDone(Milliseconds(50)), StatusIs(kDeadlineExceeded, _));
  first->NotifyCaptureSessionClose();
}

}  // namespace
}  // namespace tavik
