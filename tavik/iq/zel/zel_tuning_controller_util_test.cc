#include "tavik/iq/zel/zel_tuning_controller_util.h"

#include <string>
#include <string_view>
#include <vector>

#include "gmock/gmock.h"
#include "google/protobuf/descriptor.h"
#include "gtest/gtest.h"
#include "tavik/base/camera_types.h"
#include "tavik/base/status.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

using ::tavik::test::IsOkAndHolds;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StatusIs;
using ::testing::ElementsAre;
using ::testing::IsEmpty;

constexpr int kFull = 1;
constexpr int kBinning2x2 = 2;

constexpr int kViewfinder = 0;
constexpr int kSnapshot = 1;
constexpr int kVideoViewfinder = 2;
constexpr int kVideoRecording = 3;
constexpr int kVideoLiveShot = 4;
constexpr int kViewfinderAlternate = 5;

tavik_api::SensorModuleSpec Module(int facing, int lens_type, int sensor_kind) {
  tavik_api::SensorModuleSpec module;
  module.facing = facing;
  module.lens_type = lens_type;
  module.sensor_kind = sensor_kind;
  return module;
}

UseCase MakeUseCase(int type, bool torch = false, bool first_party = true, bool night = false) {
  UseCase use_case;
  use_case.type = type;
  use_case.torch = torch;
  use_case.first_party = first_party;
  use_case.night = night;
  return use_case;
}

// A mode whose sensor range starts at the target's minimum, so that the target's range is taken
// as it is.
TuningSensorModeInfo Mode(int binning, float target_min, float target_max) {
  TuningSensorModeInfo info;
  info.sensor_name = "GN1";
  info.mode_width = binning == kBinning2x2 ? 2016 : 4032;
  info.mode_height = binning == kBinning2x2 ? 1512 : 3024;
  info.sensor_fps_range = {target_min, 240};
  info.target_fps_range = {target_min, target_max};
  info.binning_x = binning;
  info.binning_y = binning;
  return info;
}

vosbrine::SensorMode MapMode(int binning, int width, int height, int type, float target_min,
                             float target_max) {
  return ConvertToSensorMode(Mode(binning, target_min, target_max), {width, height},
                             MakeUseCase(type));
}

// The mapping's warnings are rate-limited per call site: a site logs on its first use in the
// process, and not again within 5 seconds. The tests of this suite are the only ones that assert a
// rate-limited warning, one test per site, and each is that site's first use: the suite is
// registered first in this file, so it runs before every other test here when the whole binary
// runs in one process, and nothing else in the binary reaches these sites. A "no log" assertion
// made here also runs before any warning of its site has been spent.
TEST(MappingWarningTest, FacingAboveThreeIsInvalidWithoutALogLine) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX363", Module(4, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(100, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(MappingWarningTest, LensTypeThreeOrFourWithoutInfraredIsInvalidWithoutALogLine) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX363", Module(0, 3, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX363", Module(0, 4, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(1, 3, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(1, 4, 2)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(MappingWarningTest, LensTypeAboveFiveIsInvalidWithoutALogLine) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1RM", Module(0, 6, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1RM", Module(0, 7, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1RM", Module(0, 1000, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_THAT(capture.messages(), IsEmpty());
}

TEST(MappingWarningTest, UnknownSensorNameWarnsWithTheComposedName) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX999", Module(0, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_THAT(capture.messages(android::base::WARNING),
              ElementsAre("INVALID_CAMERA_SENSOR: BRIMAL_REAR_IMX999_NORMAL"));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(MappingWarningTest, ZeroImageHeightWarnsAndIsInvalid) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToSensorMode(Mode(kFull, 30, 30), {1920, 0}, MakeUseCase(kViewfinder)),
            vosbrine::INVALID_SENSOR_MODE);
  EXPECT_THAT(capture.messages(android::base::WARNING), ElementsAre("Image height cannot be 0."));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(MappingWarningTest, UnsupportedBinningWarnsAndIsInvalid) {
  ScopedLogCapture capture;
  TuningSensorModeInfo info = Mode(kFull, 30, 30);
  info.binning_x = 2;
  info.binning_y = 1;
  EXPECT_EQ(ConvertToSensorMode(info, {1920, 1080}, MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
  EXPECT_THAT(capture.messages(android::base::WARNING), ElementsAre("Unsupported binning_factor."));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(MappingWarningTest, ComposedModeWithoutAnEnumRowWarnsWithTheName) {
  ScopedLogCapture capture;
  EXPECT_EQ(MapMode(kBinning2x2, 3840, 2160, kVideoRecording, 30, 30),
            vosbrine::INVALID_SENSOR_MODE);
  EXPECT_THAT(capture.messages(android::base::WARNING),
              ElementsAre("INVALID_SENSOR_MODE: BINNING2X2_16_9_2160P_30FPS"));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(MappingWarningTest, UnknownUseCaseTypeWarnsAndIsInvalid) {
  ScopedLogCapture capture;
  EXPECT_EQ(ConvertToCameraUseCase(MakeUseCase(6)), vosbrine::INVALID_CAMERA_USECASE);
  EXPECT_THAT(capture.messages(android::base::WARNING), ElementsAre("INVALID_CAMERA_USECASE."));
  EXPECT_EQ(capture.lines().size(), 1u);
}

TEST(ConvertToCameraSensorTest, NamesEveryModuleOfTheEnum) {
  struct Case {
    const char* sensor_name;
    tavik_api::SensorModuleSpec module;
    vosbrine::CameraSensor expected;
  };
  const Case cases[] = {
      {"IMX363", Module(0, 0, 0), vosbrine::BRIMAL_REAR_IMX363_NORMAL},
      {"IMX481", Module(0, 2, 0), vosbrine::BRIMAL_REAR_IMX481_TELE},
      {"IMX520", Module(1, 0, 0), vosbrine::BRIMAL_FRONT_IMX520_NORMAL},
      {"OVM7251", Module(1, 0, 1), vosbrine::BRIMAL_FRONT_OVM7251_IR},
      {"IMX355", Module(1, 0, 0), vosbrine::BRIMAL_FRONT_IMX355_NORMAL},
      {"IMX663", Module(1, 0, 0), vosbrine::BRIMAL_FRONT_IMX663_NORMAL},
      {"GN1", Module(0, 0, 0), vosbrine::BRIMAL_REAR_GN1_NORMAL},
      {"IMX386", Module(0, 1, 0), vosbrine::BRIMAL_REAR_IMX386_WIDE},
      {"IMX586", Module(0, 2, 0), vosbrine::BRIMAL_REAR_IMX586_TELE},
      {"GN1RM", Module(0, 5, 0), vosbrine::BRIMAL_REAR_GN1RM_VIRTUAL},
      {"IMX481", Module(0, 1, 0), vosbrine::BRIMAL_REAR_IMX481_WIDE},
      {"IMX663VIRTUAL", Module(1, 5, 0), vosbrine::BRIMAL_FRONT_IMX663VIRTUAL_VIRTUAL},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.sensor_name);
    EXPECT_EQ(ConvertToCameraSensor("brimal", c.sensor_name, c.module), c.expected);
  }
}

TEST(ConvertToCameraSensorTest, FacingZeroIsRearAndOneToThreeAreFront) {
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1", Module(0, 0, 0)),
            vosbrine::BRIMAL_REAR_GN1_NORMAL);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(1, 0, 0)),
            vosbrine::BRIMAL_FRONT_IMX520_NORMAL);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(2, 0, 0)),
            vosbrine::BRIMAL_FRONT_IMX520_NORMAL);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(3, 0, 0)),
            vosbrine::BRIMAL_FRONT_IMX520_NORMAL);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(3, 0, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
}

TEST(ConvertToCameraSensorTest, FacingWordMustMatchTheRow) {
  // "BRIMAL_FRONT_GN1_NORMAL" and "BRIMAL_REAR_IMX520_NORMAL" have no rows.
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1", Module(1, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(0, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, FacingAboveThreeIsInvalidEvenForAKnownSensor) {
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX520", Module(4, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, InfraredKindWinsOverLensType) {
  // With the infrared kind, lens_type isn't looked at: refused and unknown values pass.
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 0, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 2, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 3, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 4, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 5, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 9, 1)),
            vosbrine::BRIMAL_FRONT_OVM7251_IR);
}

TEST(ConvertToCameraSensorTest, InfraredKindReplacesTheLensWord) {
  // "BRIMAL_REAR_GN1_IR" has no row, although "BRIMAL_REAR_GN1_NORMAL" has.
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1", Module(0, 0, 1)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, OtherSensorKindsUseTheLensType) {
  EXPECT_EQ(ConvertToCameraSensor("brimal", "GN1", Module(0, 0, 2)),
            vosbrine::BRIMAL_REAR_GN1_NORMAL);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX386", Module(0, 1, 7)),
            vosbrine::BRIMAL_REAR_IMX386_WIDE);
  // "BRIMAL_FRONT_OVM7251_NORMAL" has no row.
  EXPECT_EQ(ConvertToCameraSensor("brimal", "OVM7251", Module(1, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, LensWordMustMatchTheRow) {
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX481", Module(0, 2, 0)),
            vosbrine::BRIMAL_REAR_IMX481_TELE);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX481", Module(0, 1, 0)),
            vosbrine::BRIMAL_REAR_IMX481_WIDE);
  // "BRIMAL_REAR_IMX481_NORMAL" and "BRIMAL_REAR_IMX481_VIRTUAL" have no rows.
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX481", Module(0, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "IMX481", Module(0, 5, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, FennelmooreDeviceNamesHaveTheirOwnPrefix) {
  // "FENNELMOORE_REAR_GN1_NORMAL" has no row: the device's one row is its bring-up sensor, which
  // a composed name can't reach.
  EXPECT_EQ(ConvertToCameraSensor("fennelmoore", "GN1", Module(0, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("fennelmoore", "OVM7251", Module(1, 0, 1)),
            vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, OnlyTheExactFennelmooreDeviceNameChangesThePrefix) {
  const char* const devices[] = {"",       "brimal",       "Fennelmoore",  "FENNELMOORE",
                                 "fennel", "fennelmoore2", " fennelmoore", "fennelmoore "};
  for (const char* device : devices) {
    SCOPED_TRACE(device);
    EXPECT_EQ(ConvertToCameraSensor(device, "GN1", Module(0, 0, 0)),
              vosbrine::BRIMAL_REAR_GN1_NORMAL);
  }
}

TEST(ConvertToCameraSensorTest, SensorNameIsMatchedExactly) {
  EXPECT_EQ(ConvertToCameraSensor("brimal", "gn1", Module(0, 0, 0)),
            vosbrine::INVALID_CAMERA_SENSOR);
  EXPECT_EQ(ConvertToCameraSensor("brimal", "", Module(0, 0, 0)), vosbrine::INVALID_CAMERA_SENSOR);
}

TEST(ConvertToCameraSensorTest, SensorNameMayBeAViewIntoALongerText) {
  const std::string text = "GN1RM";
  EXPECT_EQ(ConvertToCameraSensor("brimal", std::string_view(text).substr(0, 3), Module(0, 0, 0)),
            vosbrine::BRIMAL_REAR_GN1_NORMAL);
}

struct ModeCase {
  const char* name;  // The composed name, for the failure message.
  int binning;
  int width;
  int height;
  int type;
  float target_min;
  float target_max;
  vosbrine::SensorMode expected;
};

// Every name the mapping composes, per binning, candidate frame rate and resolution or aspect.
// Names without an enum row map to INVALID_SENSOR_MODE.
TEST(SensorModeMappingTest, VideoBranchMapsEveryCandidateRateAndResolution) {
  const ModeCase cases[] = {
      // Full readout, 720P.
      {"FULL_16_9_720P_15FPS", kFull, 1280, 720, kVideoRecording, 15, 15,
       vosbrine::FULL_16_9_720P_15FPS},
      {"FULL_16_9_720P_30FPS", kFull, 1280, 720, kVideoRecording, 15, 30,
       vosbrine::FULL_16_9_720P_30FPS},
      {"FULL_16_9_720P_30FPS", kFull, 1280, 720, kVideoRecording, 30, 30,
       vosbrine::FULL_16_9_720P_30FPS},
      {"FULL_16_9_1080P_30_60FPS", kFull, 1280, 720, kVideoRecording, 30, 60,
       vosbrine::FULL_16_9_1080P_30_60FPS},
      {"FULL_16_9_720P_60FPS", kFull, 1280, 720, kVideoRecording, 60, 60,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_90FPS", kFull, 1280, 720, kVideoRecording, 90, 90,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_120FPS", kFull, 1280, 720, kVideoRecording, 120, 120,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_240FPS", kFull, 1280, 720, kVideoRecording, 240, 240,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_720P_0FPS", kFull, 1280, 720, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Full readout, 1080P.
      {"FULL_16_9_1080P_15FPS", kFull, 1920, 1080, kVideoRecording, 15, 15,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_30FPS", kFull, 1920, 1080, kVideoRecording, 15, 30,
       vosbrine::FULL_16_9_1080P_30FPS},
      {"FULL_16_9_1080P_30FPS", kFull, 1920, 1080, kVideoRecording, 30, 30,
       vosbrine::FULL_16_9_1080P_30FPS},
      {"FULL_16_9_1080P_30_60FPS", kFull, 1920, 1080, kVideoRecording, 30, 60,
       vosbrine::FULL_16_9_1080P_30_60FPS},
      {"FULL_16_9_1080P_60FPS", kFull, 1920, 1080, kVideoRecording, 60, 60,
       vosbrine::FULL_16_9_1080P_60FPS},
      {"FULL_16_9_1080P_90FPS", kFull, 1920, 1080, kVideoRecording, 90, 90,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_120FPS", kFull, 1920, 1080, kVideoRecording, 120, 120,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_240FPS", kFull, 1920, 1080, kVideoRecording, 240, 240,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_0FPS", kFull, 1920, 1080, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Full readout, 2160P.
      {"FULL_16_9_2160P_15FPS", kFull, 3840, 2160, kVideoRecording, 15, 15,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_2160P_30FPS", kFull, 3840, 2160, kVideoRecording, 15, 30,
       vosbrine::FULL_16_9_2160P_30FPS},
      {"FULL_16_9_2160P_30FPS", kFull, 3840, 2160, kVideoRecording, 30, 30,
       vosbrine::FULL_16_9_2160P_30FPS},
      {"FULL_16_9_1080P_30_60FPS", kFull, 3840, 2160, kVideoRecording, 30, 60,
       vosbrine::FULL_16_9_1080P_30_60FPS},
      {"FULL_16_9_2160P_60FPS", kFull, 3840, 2160, kVideoRecording, 60, 60,
       vosbrine::FULL_16_9_2160P_60FPS},
      {"FULL_16_9_1080P_90FPS", kFull, 3840, 2160, kVideoRecording, 90, 90,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_120FPS", kFull, 3840, 2160, kVideoRecording, 120, 120,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_1080P_240FPS", kFull, 3840, 2160, kVideoRecording, 240, 240,
       vosbrine::INVALID_SENSOR_MODE},
      {"FULL_16_9_2160P_0FPS", kFull, 3840, 2160, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Binned readout, 720P. The (240, 240) candidate always names 1080P, so the row
      // BINNING2X2_16_9_720P_240FPS is never produced.
      {"BINNING2X2_16_9_720P_15FPS", kBinning2x2, 1280, 720, kVideoRecording, 15, 15,
       vosbrine::BINNING2X2_16_9_720P_15FPS},
      {"BINNING2X2_16_9_720P_30FPS", kBinning2x2, 1280, 720, kVideoRecording, 15, 30,
       vosbrine::BINNING2X2_16_9_720P_30FPS},
      {"BINNING2X2_16_9_720P_30FPS", kBinning2x2, 1280, 720, kVideoRecording, 30, 30,
       vosbrine::BINNING2X2_16_9_720P_30FPS},
      {"BINNING2X2_16_9_1080P_30_60FPS", kBinning2x2, 1280, 720, kVideoRecording, 30, 60,
       vosbrine::BINNING2X2_16_9_1080P_30_60FPS},
      {"BINNING2X2_16_9_720P_60FPS", kBinning2x2, 1280, 720, kVideoRecording, 60, 60,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_90FPS", kBinning2x2, 1280, 720, kVideoRecording, 90, 90,
       vosbrine::BINNING2X2_16_9_1080P_90FPS},
      {"BINNING2X2_16_9_1080P_120FPS", kBinning2x2, 1280, 720, kVideoRecording, 120, 120,
       vosbrine::BINNING2X2_16_9_1080P_120FPS},
      {"BINNING2X2_16_9_1080P_240FPS", kBinning2x2, 1280, 720, kVideoRecording, 240, 240,
       vosbrine::BINNING2X2_16_9_1080P_240FPS},
      {"BINNING2X2_16_9_720P_0FPS", kBinning2x2, 1280, 720, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Binned readout, 1080P.
      {"BINNING2X2_16_9_1080P_15FPS", kBinning2x2, 1920, 1080, kVideoRecording, 15, 15,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_30FPS", kBinning2x2, 1920, 1080, kVideoRecording, 15, 30,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_30FPS", kBinning2x2, 1920, 1080, kVideoRecording, 30, 30,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_30_60FPS", kBinning2x2, 1920, 1080, kVideoRecording, 30, 60,
       vosbrine::BINNING2X2_16_9_1080P_30_60FPS},
      {"BINNING2X2_16_9_1080P_60FPS", kBinning2x2, 1920, 1080, kVideoRecording, 60, 60,
       vosbrine::BINNING2X2_16_9_1080P_60FPS},
      {"BINNING2X2_16_9_1080P_90FPS", kBinning2x2, 1920, 1080, kVideoRecording, 90, 90,
       vosbrine::BINNING2X2_16_9_1080P_90FPS},
      {"BINNING2X2_16_9_1080P_120FPS", kBinning2x2, 1920, 1080, kVideoRecording, 120, 120,
       vosbrine::BINNING2X2_16_9_1080P_120FPS},
      {"BINNING2X2_16_9_1080P_240FPS", kBinning2x2, 1920, 1080, kVideoRecording, 240, 240,
       vosbrine::BINNING2X2_16_9_1080P_240FPS},
      {"BINNING2X2_16_9_1080P_0FPS", kBinning2x2, 1920, 1080, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Binned readout, 2160P.
      {"BINNING2X2_16_9_2160P_15FPS", kBinning2x2, 3840, 2160, kVideoRecording, 15, 15,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_2160P_30FPS", kBinning2x2, 3840, 2160, kVideoRecording, 15, 30,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_2160P_30FPS", kBinning2x2, 3840, 2160, kVideoRecording, 30, 30,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_30_60FPS", kBinning2x2, 3840, 2160, kVideoRecording, 30, 60,
       vosbrine::BINNING2X2_16_9_1080P_30_60FPS},
      {"BINNING2X2_16_9_2160P_60FPS", kBinning2x2, 3840, 2160, kVideoRecording, 60, 60,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_1080P_90FPS", kBinning2x2, 3840, 2160, kVideoRecording, 90, 90,
       vosbrine::BINNING2X2_16_9_1080P_90FPS},
      {"BINNING2X2_16_9_1080P_120FPS", kBinning2x2, 3840, 2160, kVideoRecording, 120, 120,
       vosbrine::BINNING2X2_16_9_1080P_120FPS},
      {"BINNING2X2_16_9_1080P_240FPS", kBinning2x2, 3840, 2160, kVideoRecording, 240, 240,
       vosbrine::BINNING2X2_16_9_1080P_240FPS},
      {"BINNING2X2_16_9_2160P_0FPS", kBinning2x2, 3840, 2160, kVideoRecording, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
  };
  for (const ModeCase& c : cases) {
    SCOPED_TRACE(testing::Message() << c.name << " from " << c.width << "x" << c.height << " at "
                                    << c.target_min << "-" << c.target_max);
    EXPECT_EQ(MapMode(c.binning, c.width, c.height, c.type, c.target_min, c.target_max),
              c.expected);
  }
}

TEST(SensorModeMappingTest, StillBranchMapsEveryCandidateRateAndAspect) {
  const ModeCase cases[] = {
      // Full readout, 16:9.
      {"FULL_16_9_FULL_15FPS", kFull, 1920, 1080, kViewfinder, 15, 15,
       vosbrine::FULL_16_9_FULL_15FPS},
      {"FULL_16_9_FULL_15_30FPS", kFull, 1920, 1080, kViewfinder, 15, 30,
       vosbrine::FULL_16_9_FULL_15_30FPS},
      {"FULL_16_9_FULL_30FPS", kFull, 1920, 1080, kViewfinder, 30, 30,
       vosbrine::FULL_16_9_FULL_30FPS},
      {"FULL_16_9_FULL_30_60FPS", kFull, 1920, 1080, kViewfinder, 30, 60,
       vosbrine::FULL_16_9_FULL_30_60FPS},
      {"FULL_16_9_FULL_60FPS", kFull, 1920, 1080, kViewfinder, 60, 60,
       vosbrine::FULL_16_9_FULL_60FPS},
      {"FULL_16_9_FULL_30_60FPS", kFull, 1920, 1080, kViewfinder, 90, 90,
       vosbrine::FULL_16_9_FULL_30_60FPS},
      {"FULL_16_9_FULL_30_60FPS", kFull, 1920, 1080, kViewfinder, 120, 120,
       vosbrine::FULL_16_9_FULL_30_60FPS},
      {"FULL_16_9_FULL_30_60FPS", kFull, 1920, 1080, kViewfinder, 240, 240,
       vosbrine::FULL_16_9_FULL_30_60FPS},
      {"FULL_16_9_FULL_30_60FPS", kFull, 1920, 1080, kViewfinder, 0, 0,
       vosbrine::FULL_16_9_FULL_30_60FPS},
      // Binned readout, 16:9.
      {"BINNING2X2_16_9_FULL_15FPS", kBinning2x2, 1920, 1080, kViewfinder, 15, 15,
       vosbrine::BINNING2X2_16_9_FULL_15FPS},
      {"BINNING2X2_16_9_FULL_15_30FPS", kBinning2x2, 1920, 1080, kViewfinder, 15, 30,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_30FPS", kBinning2x2, 1920, 1080, kViewfinder, 30, 30,
       vosbrine::BINNING2X2_16_9_FULL_30FPS},
      {"BINNING2X2_16_9_FULL_30_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 30, 60,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 60, 60,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_30_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 90, 90,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_30_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 120, 120,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_30_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 240, 240,
       vosbrine::INVALID_SENSOR_MODE},
      {"BINNING2X2_16_9_FULL_30_60FPS", kBinning2x2, 1920, 1080, kViewfinder, 0, 0,
       vosbrine::INVALID_SENSOR_MODE},
      // Full readout, 4:3: one rate word whatever the range.
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 15, 15,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 15, 30,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 30, 30,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 30, 60,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 60, 60,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 90, 90,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 120, 120,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 240, 240,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      {"FULL_4_3_FULL_15_30FPS", kFull, 4032, 3024, kViewfinder, 0, 0,
       vosbrine::FULL_4_3_FULL_15_30FPS},
      // Binned readout, 4:3.
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 15, 15,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 15, 30,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 30, 30,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 30, 60,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 60, 60,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 90, 90,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 120, 120,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 240, 240,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
      {"BINNING2X2_4_3_FULL_15_30FPS", kBinning2x2, 2016, 1512, kViewfinder, 0, 0,
       vosbrine::BINNING2X2_4_3_FULL_15_30FPS},
  };
  for (const ModeCase& c : cases) {
    SCOPED_TRACE(testing::Message() << c.name << " from " << c.width << "x" << c.height << " at "
                                    << c.target_min << "-" << c.target_max);
    EXPECT_EQ(MapMode(c.binning, c.width, c.height, c.type, c.target_min, c.target_max),
              c.expected);
  }
}

TEST(SensorModeMappingTest, ThirtyFpsFullHdViewfinderTakesTheStillBranch) {
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kViewfinder, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
}

TEST(SensorModeMappingTest, ThirtyFpsFullHdRecordingTakesTheVideoBranch) {
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kVideoRecording, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
}

TEST(SensorModeMappingTest, VideoHeightOf1088Is1080P) {
  EXPECT_EQ(MapMode(kFull, 1920, 1088, kVideoRecording, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
}

TEST(SensorModeMappingTest, VideoHeightOf1440Is2160P) {
  EXPECT_EQ(MapMode(kFull, 2560, 1440, kVideoRecording, 30, 30), vosbrine::FULL_16_9_2160P_30FPS);
}

TEST(SensorModeMappingTest, VgaVideoIsA720PSixteenByNineMode) {
  // 640 by 480 is 4:3, but the video branch always says 16_9.
  EXPECT_EQ(MapMode(kFull, 640, 480, kVideoRecording, 30, 30), vosbrine::FULL_16_9_720P_30FPS);
  EXPECT_EQ(MapMode(kBinning2x2, 640, 480, kVideoRecording, 15, 15),
            vosbrine::BINNING2X2_16_9_720P_15FPS);
  // The same size in a viewfinder is 4:3.
  EXPECT_EQ(MapMode(kFull, 640, 480, kViewfinder, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
}

TEST(SensorModeMappingTest, EveryVideoSizeGetsTheResolutionOfItsHeight) {
  struct Case {
    int width;
    int height;
    vosbrine::SensorMode expected;
  };
  const Case cases[] = {
      {1920, 1080, vosbrine::FULL_16_9_1080P_30FPS}, {1920, 1088, vosbrine::FULL_16_9_1080P_30FPS},
      {3840, 2160, vosbrine::FULL_16_9_2160P_30FPS}, {2048, 1080, vosbrine::FULL_16_9_1080P_30FPS},
      {720, 480, vosbrine::FULL_16_9_720P_30FPS},    {640, 480, vosbrine::FULL_16_9_720P_30FPS},
      {704, 480, vosbrine::FULL_16_9_720P_30FPS},    {4096, 2160, vosbrine::FULL_16_9_2160P_30FPS},
      {1280, 720, vosbrine::FULL_16_9_720P_30FPS},   {352, 288, vosbrine::FULL_16_9_720P_30FPS},
      {176, 144, vosbrine::FULL_16_9_720P_30FPS},    {2560, 1440, vosbrine::FULL_16_9_2160P_30FPS},
      {320, 240, vosbrine::FULL_16_9_720P_30FPS},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << c.width << "x" << c.height);
    EXPECT_EQ(MapMode(kFull, c.width, c.height, kVideoRecording, 30, 30), c.expected);
  }
}

TEST(SensorModeMappingTest, EveryTypeFromTwoUpTakesTheVideoBranchForAVideoSize) {
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kVideoViewfinder, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kVideoRecording, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kVideoLiveShot, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
  // Type 5 is a viewfinder, but the branch is chosen by the number alone.
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kViewfinderAlternate, 30, 30),
            vosbrine::FULL_16_9_1080P_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1080, 7, 30, 30), vosbrine::FULL_16_9_1080P_30FPS);
}

TEST(SensorModeMappingTest, TypesBelowTwoTakeTheStillBranchForAVideoSize) {
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kViewfinder, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1080, kSnapshot, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1080, -1, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
}

TEST(SensorModeMappingTest, VideoTypeWithAnotherSizeTakesTheStillBranch) {
  EXPECT_EQ(MapMode(kFull, 4032, 3024, kVideoRecording, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
  EXPECT_EQ(MapMode(kFull, 4000, 2250, kVideoRecording, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
  // Sizes are matched as (width, height): a portrait frame is not a video size.
  EXPECT_EQ(MapMode(kFull, 1080, 1920, kVideoRecording, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
  EXPECT_EQ(MapMode(kFull, 1920, 1090, kVideoRecording, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
}

TEST(SensorModeMappingTest, AspectTieBetweenSixteenByNineAndFourByThreeIsFourByThree) {
  // 21 / 32 = 0.65625 lies exactly halfway between 0.5625 and 0.75.
  EXPECT_EQ(MapMode(kFull, 32, 21, kViewfinder, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
  // Just below halfway is 16:9, just above is 4:3.
  EXPECT_EQ(MapMode(kFull, 3200, 2099, kViewfinder, 30, 30), vosbrine::FULL_16_9_FULL_30FPS);
  EXPECT_EQ(MapMode(kFull, 3200, 2101, kViewfinder, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
}

TEST(SensorModeMappingTest, SquareAndTallFramesAreFourByThree) {
  EXPECT_EQ(MapMode(kFull, 1000, 1000, kViewfinder, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
  EXPECT_EQ(MapMode(kFull, 1080, 1920, kViewfinder, 30, 30), vosbrine::FULL_4_3_FULL_15_30FPS);
}

TEST(SensorModeMappingTest, ZeroModeHeightIsInvalid) {
  TuningSensorModeInfo info = Mode(kFull, 30, 30);
  info.mode_height = 0;
  EXPECT_EQ(ConvertToSensorMode(info, {1920, 1080}, MakeUseCase(kViewfinder)),
            vosbrine::INVALID_SENSOR_MODE);
}

TEST(SensorModeMappingTest, ZeroImageHeightIsInvalid) {
  EXPECT_EQ(ConvertToSensorMode(Mode(kFull, 30, 30), {1920, 0}, MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
}

TEST(SensorModeMappingTest, OnlyOneByOneAndTwoByTwoBinningAreSupported) {
  const int factors[][2] = {{1, 2}, {2, 1}, {0, 0}, {3, 3}, {4, 4}, {2, 4}};
  for (const auto& factor : factors) {
    SCOPED_TRACE(testing::Message() << factor[0] << "x" << factor[1]);
    TuningSensorModeInfo info = Mode(kFull, 30, 30);
    info.binning_x = factor[0];
    info.binning_y = factor[1];
    EXPECT_EQ(ConvertToSensorMode(info, {1920, 1080}, MakeUseCase(kViewfinder)),
              vosbrine::INVALID_SENSOR_MODE);
  }
}

TuningSensorModeInfo ModeWithRanges(int binning, tavik_api::Range<float> sensor,
                                    tavik_api::Range<float> target) {
  TuningSensorModeInfo info = Mode(binning, 0, 0);
  info.sensor_fps_range = sensor;
  info.target_fps_range = target;
  return info;
}

// In a 16:9 viewfinder at full readout the rates (15, 15), (15, 30), (30, 30) and (60, 60) each
// have a row of their own; in a binned 1080P recording (30, 60), (60, 60), (90, 90), (120, 120)
// and (240, 240) have.
vosbrine::SensorMode StillRate(tavik_api::Range<float> sensor, tavik_api::Range<float> target) {
  return ConvertToSensorMode(ModeWithRanges(kFull, sensor, target), {1920, 1080},
                             MakeUseCase(kViewfinder));
}
vosbrine::SensorMode BinnedVideoRate(tavik_api::Range<float> sensor,
                                     tavik_api::Range<float> target) {
  return ConvertToSensorMode(ModeWithRanges(kBinning2x2, sensor, target), {1920, 1080},
                             MakeUseCase(kVideoRecording));
}

TEST(FrameRateMappingTest, TargetIsTakenAsItIsWhenTheSensorStartsNoHigher) {
  EXPECT_EQ(StillRate({15, 30}, {15, 30}), vosbrine::FULL_16_9_FULL_15_30FPS);
  EXPECT_EQ(StillRate({7.5f, 30}, {15, 30}), vosbrine::FULL_16_9_FULL_15_30FPS);
  EXPECT_EQ(StillRate({0, 0}, {15, 30}), vosbrine::FULL_16_9_FULL_15_30FPS);
}

TEST(FrameRateMappingTest, SensorStartingAboveTheTargetFixesTheRateAtTheTargetMaximum) {
  // lower = upper = 30: only (30, 30) fits.
  EXPECT_EQ(StillRate({30, 30}, {15, 30}), vosbrine::FULL_16_9_FULL_30FPS);
  EXPECT_EQ(StillRate({15.5f, 60}, {15, 30}), vosbrine::FULL_16_9_FULL_30FPS);
  // lower = upper = 60: (60, 60) rather than (30, 60).
  EXPECT_EQ(StillRate({60, 60}, {30, 60}), vosbrine::FULL_16_9_FULL_60FPS);
  EXPECT_EQ(StillRate({30, 60}, {30, 60}), vosbrine::FULL_16_9_FULL_30_60FPS);
  EXPECT_EQ(BinnedVideoRate({31, 120}, {30, 60}), vosbrine::BINNING2X2_16_9_1080P_60FPS);
  EXPECT_EQ(BinnedVideoRate({30, 120}, {30, 60}), vosbrine::BINNING2X2_16_9_1080P_30_60FPS);
}

TEST(FrameRateMappingTest, SensorMaximumIsNotLookedAt) {
  EXPECT_EQ(StillRate({15, 15}, {30, 30}), vosbrine::FULL_16_9_FULL_30FPS);
  EXPECT_EQ(BinnedVideoRate({0, 30}, {240, 240}), vosbrine::BINNING2X2_16_9_1080P_240FPS);
}

TEST(FrameRateMappingTest, CandidateWithTheLeastSlackIsChosen) {
  // (10, 35): (15, 15) and (30, 30) have 25 of slack, (15, 30) has 10.
  EXPECT_EQ(StillRate({10, 35}, {10, 35}), vosbrine::FULL_16_9_FULL_15_30FPS);
  // (15, 29): only (15, 15) fits.
  EXPECT_EQ(StillRate({15, 29}, {15, 29}), vosbrine::FULL_16_9_FULL_15FPS);
  // (25, 100): (30, 60) has 45 of slack; (30, 30), (60, 60) and (90, 90) have 75.
  EXPECT_EQ(BinnedVideoRate({25, 100}, {25, 100}), vosbrine::BINNING2X2_16_9_1080P_30_60FPS);
  // (100, 130): (120, 120) alone.
  EXPECT_EQ(BinnedVideoRate({100, 130}, {100, 130}), vosbrine::BINNING2X2_16_9_1080P_120FPS);
  // (200, 1000): (240, 240) alone.
  EXPECT_EQ(BinnedVideoRate({200, 1000}, {200, 1000}), vosbrine::BINNING2X2_16_9_1080P_240FPS);
}

TEST(FrameRateMappingTest, TieKeepsTheEarlierCandidate) {
  // (60, 120): (60, 60), (90, 90) and (120, 120) all have 60 of slack.
  EXPECT_EQ(BinnedVideoRate({60, 120}, {60, 120}), vosbrine::BINNING2X2_16_9_1080P_60FPS);
  // (100, 250): (120, 120) and (240, 240) both have 150.
  EXPECT_EQ(BinnedVideoRate({100, 250}, {100, 250}), vosbrine::BINNING2X2_16_9_1080P_120FPS);
  // (90, 240): (90, 90), (120, 120) and (240, 240) all have 150.
  EXPECT_EQ(BinnedVideoRate({90, 240}, {90, 240}), vosbrine::BINNING2X2_16_9_1080P_90FPS);
}

TEST(FrameRateMappingTest, NoFittingCandidateGivesZeroRateAndAnInvalidVideoMode) {
  // "FULL_16_9_1080P_0FPS" has no row.
  EXPECT_EQ(ConvertToSensorMode(ModeWithRanges(kFull, {16, 29}, {16, 29}), {1920, 1080},
                                MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
  // 29.97 is below the 30 of every 30 fps candidate.
  EXPECT_EQ(ConvertToSensorMode(ModeWithRanges(kFull, {29.97f, 29.97f}, {29.97f, 29.97f}),
                                {1920, 1080}, MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
  EXPECT_EQ(ConvertToSensorMode(ModeWithRanges(kFull, {241, 300}, {241, 300}), {3840, 2160},
                                MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
  EXPECT_EQ(ConvertToSensorMode(ModeWithRanges(kFull, {0, 0}, {0, 0}), {1280, 720},
                                MakeUseCase(kVideoRecording)),
            vosbrine::INVALID_SENSOR_MODE);
}

TEST(FrameRateMappingTest, NoFittingCandidateInASixteenByNineViewfinderNamesThirtyToSixty) {
  // (0, 0) is neither a fixed rate nor has 30 as its maximum, so its rate word is "30_60FPS".
  EXPECT_EQ(StillRate({16, 29}, {16, 29}), vosbrine::FULL_16_9_FULL_30_60FPS);
  // "BINNING2X2_16_9_FULL_30_60FPS" has no row.
  EXPECT_EQ(ConvertToSensorMode(ModeWithRanges(kBinning2x2, {16, 29}, {16, 29}), {1920, 1080},
                                MakeUseCase(kViewfinder)),
            vosbrine::INVALID_SENSOR_MODE);
}

TEST(FrameRateMappingTest, CandidatesAreTheEightRangesInOrder) {
  const std::vector<tavik_api::Range<float>> expected = {
      {15, 15}, {15, 30}, {30, 30}, {30, 60}, {60, 60}, {90, 90}, {120, 120}, {240, 240}};
  EXPECT_EQ(FrameRateCandidates(), expected);
}

TEST(VideoSizeMappingTest, VideoSizesAreTheFourteenRowsInOrder) {
  const std::vector<tavik_api::GenericSize<int>> expected = {
      {1920, 1080}, {1920, 1088}, {3840, 2160}, {2048, 1080}, {720, 480},   {640, 480}, {704, 480},
      {4096, 2160}, {1280, 720},  {352, 288},   {176, 144},   {2560, 1440}, {320, 240}, {640, 480}};
  EXPECT_EQ(VideoSizes(), expected);
}

TEST(UseCaseMappingTest, MapsEveryTypeTorchPartyAndNightCombination) {
  struct Case {
    int type;
    bool torch;
    bool first_party;
    bool night;
    vosbrine::CameraUsecase expected;
  };
  const Case cases[] = {
      // Viewfinder.
      {0, false, true, false, vosbrine::VIEWFINDER},
      {0, true, true, false, vosbrine::VIEWFINDER_TORCH},
      {0, false, false, false, vosbrine::VIEWFINDER_3P},
      {0, true, false, false, vosbrine::VIEWFINDER_TORCH_3P},
      {0, false, true, true, vosbrine::VIEWFINDER_NOCTARELLE},
      {0, true, true, true, vosbrine::VIEWFINDER_NOCTARELLE},
      {0, false, false, true, vosbrine::VIEWFINDER_NOCTARELLE_3P},
      {0, true, false, true, vosbrine::VIEWFINDER_NOCTARELLE_3P},
      // Snapshot: night is not read.
      {1, false, true, false, vosbrine::SNAPSHOT},
      {1, true, true, false, vosbrine::SNAPSHOT_TORCH},
      {1, false, false, false, vosbrine::SNAPSHOT_3P},
      {1, true, false, false, vosbrine::SNAPSHOT_TORCH_3P},
      {1, false, true, true, vosbrine::SNAPSHOT},
      {1, true, true, true, vosbrine::SNAPSHOT_TORCH},
      {1, false, false, true, vosbrine::SNAPSHOT_3P},
      {1, true, false, true, vosbrine::SNAPSHOT_TORCH_3P},
      // Video viewfinder.
      {2, false, true, false, vosbrine::VIDEO_VIEWFINDER},
      {2, true, true, false, vosbrine::VIDEO_VIEWFINDER_TORCH},
      {2, false, false, false, vosbrine::VIDEO_VIEWFINDER_3P},
      {2, true, false, false, vosbrine::VIDEO_VIEWFINDER_TORCH_3P},
      {2, false, true, true, vosbrine::VIDEO_VIEWFINDER},
      {2, true, true, true, vosbrine::VIDEO_VIEWFINDER_TORCH},
      {2, false, false, true, vosbrine::VIDEO_VIEWFINDER_3P},
      {2, true, false, true, vosbrine::VIDEO_VIEWFINDER_TORCH_3P},
      // Video recording.
      {3, false, true, false, vosbrine::VIDEO_RECORDING},
      {3, true, true, false, vosbrine::VIDEO_RECORDING_TORCH},
      {3, false, false, false, vosbrine::VIDEO_RECORDING_3P},
      {3, true, false, false, vosbrine::VIDEO_RECORDING_TORCH_3P},
      {3, false, true, true, vosbrine::VIDEO_RECORDING},
      {3, true, true, true, vosbrine::VIDEO_RECORDING_TORCH},
      {3, false, false, true, vosbrine::VIDEO_RECORDING_3P},
      {3, true, false, true, vosbrine::VIDEO_RECORDING_TORCH_3P},
      // Video live shot.
      {4, false, true, false, vosbrine::VIDEO_LIVESHOT},
      {4, true, true, false, vosbrine::VIDEO_LIVESHOT_TORCH},
      {4, false, false, false, vosbrine::VIDEO_LIVESHOT_3P},
      {4, true, false, false, vosbrine::VIDEO_LIVESHOT_TORCH_3P},
      {4, false, true, true, vosbrine::VIDEO_LIVESHOT},
      {4, true, true, true, vosbrine::VIDEO_LIVESHOT_TORCH},
      {4, false, false, true, vosbrine::VIDEO_LIVESHOT_3P},
      {4, true, false, true, vosbrine::VIDEO_LIVESHOT_TORCH_3P},
      // Type 5 is a viewfinder too.
      {5, false, true, false, vosbrine::VIEWFINDER},
      {5, true, true, false, vosbrine::VIEWFINDER_TORCH},
      {5, false, false, false, vosbrine::VIEWFINDER_3P},
      {5, true, false, false, vosbrine::VIEWFINDER_TORCH_3P},
      {5, false, true, true, vosbrine::VIEWFINDER_NOCTARELLE},
      {5, true, true, true, vosbrine::VIEWFINDER_NOCTARELLE},
      {5, false, false, true, vosbrine::VIEWFINDER_NOCTARELLE_3P},
      {5, true, false, true, vosbrine::VIEWFINDER_NOCTARELLE_3P},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(testing::Message() << "type " << c.type << " torch " << c.torch << " first party "
                                    << c.first_party << " night " << c.night);
    EXPECT_EQ(ConvertToCameraUseCase(MakeUseCase(c.type, c.torch, c.first_party, c.night)),
              c.expected);
  }
}

TEST(UseCaseMappingTest, HdrFlagIsNotRead) {
  UseCase use_case = MakeUseCase(kViewfinder);
  use_case.hdr = true;
  EXPECT_EQ(ConvertToCameraUseCase(use_case), vosbrine::VIEWFINDER);
  use_case.torch = true;
  EXPECT_EQ(ConvertToCameraUseCase(use_case), vosbrine::VIEWFINDER_TORCH);
}

TEST(UseCaseMappingTest, UnknownTypesAreInvalid) {
  const int types[] = {-1, 6, 7, 100};
  for (int type : types) {
    SCOPED_TRACE(type);
    EXPECT_EQ(ConvertToCameraUseCase(MakeUseCase(type)), vosbrine::INVALID_CAMERA_USECASE);
    EXPECT_EQ(ConvertToCameraUseCase(MakeUseCase(type, /*torch=*/true, /*first_party=*/false,
                                                 /*night=*/true)),
              vosbrine::INVALID_CAMERA_USECASE);
  }
}

ZelTuningPoint PointAt(const TuningCoordinates& coordinates) {
  return ZelTuningPoint(MakeUseCase(kViewfinder), TuningInfo(), coordinates,
                        /*use_bringup_tuning=*/false);
}

TEST(ConvertToCameraStateTest, CopiesAllTenCoordinates) {
  TuningCoordinates coordinates;
  coordinates.led_influence = 0.25f;
  coordinates.cct = 5003.5f;
  coordinates.bv = 6.75f;
  coordinates.real_gain = 3.5f;
  coordinates.exp_ratio = 2.0f;
  coordinates.mired_cct = 199.875f;
  coordinates.scaler_ratio = 0.5f;
  coordinates.pre_scaler_ratio = 0.75f;
  coordinates.frame_count = 42;
  coordinates.exposure_time_msecs = 33.25f;

  const vosbrine::CameraState state = ConvertToCameraState(PointAt(coordinates));
  ASSERT_TRUE(state.has_level_coordinates());
  const vosbrine::LevelCoordinates& level = state.level_coordinates();
  EXPECT_EQ(level.led_influence(), 0.25f);
  EXPECT_EQ(level.cct(), 5003.5f);
  EXPECT_EQ(level.bv(), 6.75f);
  EXPECT_EQ(level.real_gain(), 3.5f);
  EXPECT_EQ(level.exp_ratio(), 2.0f);
  EXPECT_EQ(level.mired_cct(), 199.875f);
  EXPECT_EQ(level.scaler_ratio(), 0.5f);
  EXPECT_EQ(level.pre_scaler_ratio(), 0.75f);
  EXPECT_EQ(level.frame_count(), 42.0f);
  EXPECT_EQ(level.exposure_time_msecs(), 33.25f);
}

TEST(ConvertToCameraStateTest, SetsEveryCoordinateEvenWhenZero) {
  const vosbrine::CameraState state = ConvertToCameraState(PointAt(TuningCoordinates()));
  ASSERT_TRUE(state.has_level_coordinates());
  const vosbrine::LevelCoordinates& level = state.level_coordinates();
  EXPECT_TRUE(level.has_led_influence());
  EXPECT_TRUE(level.has_cct());
  EXPECT_TRUE(level.has_bv());
  EXPECT_TRUE(level.has_real_gain());
  EXPECT_TRUE(level.has_exp_ratio());
  EXPECT_TRUE(level.has_mired_cct());
  EXPECT_TRUE(level.has_scaler_ratio());
  EXPECT_TRUE(level.has_pre_scaler_ratio());
  EXPECT_TRUE(level.has_frame_count());
  EXPECT_TRUE(level.has_exposure_time_msecs());
  EXPECT_EQ(level.cct(), 0.0f);
  EXPECT_EQ(level.frame_count(), 0.0f);
}

TEST(ConvertToCameraStateTest, LeavesTheSensorConfigUnset) {
  TuningCoordinates coordinates;
  coordinates.cct = 6500.0f;
  const vosbrine::CameraState state = ConvertToCameraState(PointAt(coordinates));
  // Through reflection, for the field is deprecated.
  const google::protobuf::FieldDescriptor* sensor_config =
      vosbrine::CameraState::descriptor()->FindFieldByName("sensor_config");
  ASSERT_NE(sensor_config, nullptr);
  EXPECT_FALSE(state.GetReflection()->HasField(state, sensor_config));
}

TEST(ConvertToCameraStateTest, FrameCountBecomesTheNearestFloat) {
  TuningCoordinates coordinates;
  coordinates.frame_count = -3;
  EXPECT_EQ(ConvertToCameraState(PointAt(coordinates)).level_coordinates().frame_count(), -3.0f);
  // 2^24 + 1 has no float; it rounds to 2^24.
  coordinates.frame_count = 16777217;
  EXPECT_EQ(ConvertToCameraState(PointAt(coordinates)).level_coordinates().frame_count(),
            16777216.0f);
}

TEST(ConvertToCameraStateTest, KeepsNegativeAndFractionalCoordinates) {
  TuningCoordinates coordinates;
  coordinates.bv = -2.5f;
  coordinates.led_influence = 0.1f;
  const vosbrine::CameraState state = ConvertToCameraState(PointAt(coordinates));
  EXPECT_EQ(state.level_coordinates().bv(), -2.5f);
  EXPECT_EQ(state.level_coordinates().led_influence(), 0.1f);
}

TEST(ConvertToBayerPatternTest, MapsTheFourBayerArrangements) {
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kBggr), IsOkAndHolds(vosbrine::BGGR));
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kGbrg), IsOkAndHolds(vosbrine::GBRG));
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kGrbg), IsOkAndHolds(vosbrine::GRBG));
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kRggb), IsOkAndHolds(vosbrine::RGGB));
}

TEST(ConvertToBayerPatternTest, ArrangementNumbersMapToPatternNumbers) {
  // The two numberings differ: arrangement 0 is pattern 1, and so on.
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(0)), IsOkAndHolds(1));
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(1)), IsOkAndHolds(3));
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(2)), IsOkAndHolds(2));
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(3)), IsOkAndHolds(0));
}

TEST(ConvertToBayerPatternTest, MonochromeIsNotConvertible) {
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kMono),
              StatusIs(StatusCode::kInvalidArgument,
                       "Color filter arrangement (MONO) not convertible to Bayer pattern"));
}

TEST(ConvertToBayerPatternTest, InfraredIsNotConvertible) {
  EXPECT_THAT(ConvertToBayerPattern(ColorFilterArrangement::kNir),
              StatusIs(StatusCode::kInvalidArgument,
                       "Color filter arrangement (NIR) not convertible to Bayer pattern"));
}

TEST(ConvertToBayerPatternTest, UnknownArrangementIsNotConvertible) {
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(7)),
              StatusIs(StatusCode::kInvalidArgument,
                       "Color filter arrangement (UNKNOWN(7)) not convertible to Bayer pattern"));
  EXPECT_THAT(ConvertToBayerPattern(static_cast<ColorFilterArrangement>(-1)),
              StatusIs(StatusCode::kInvalidArgument,
                       "Color filter arrangement (UNKNOWN(-1)) not convertible to Bayer pattern"));
}

}  // namespace
}  // namespace tavik
