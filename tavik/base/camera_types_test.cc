#include "tavik/base/camera_types.h"

#include <string>
#include <type_traits>
#include <utility>

#include "absl/hash/hash_testing.h"
#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/containers.h"

namespace tavik {
namespace {

using ::testing::IsEmpty;

TEST(UseCaseTest, DefaultsToAFirstPartyViewfinderWithoutFlags) {
  const UseCase use_case;
  EXPECT_EQ(use_case.type, 0);
  EXPECT_FALSE(use_case.torch);
  EXPECT_FALSE(use_case.hdr);
  EXPECT_FALSE(use_case.night);
  EXPECT_TRUE(use_case.first_party);
}

TEST(UseCaseTest, IsPolymorphicSoThatTheServiceCanExtendIt) {
  EXPECT_TRUE(std::is_polymorphic_v<UseCase>);
  EXPECT_TRUE(std::has_virtual_destructor_v<UseCase>);
}

TEST(UseCaseTest, EqualityComparesEveryField) {
  UseCase base;
  base.type = 3;
  EXPECT_TRUE(base == base);

  UseCase other = base;
  EXPECT_TRUE(other == base);

  other = base;
  other.type = 4;
  EXPECT_FALSE(other == base);

  other = base;
  other.torch = true;
  EXPECT_FALSE(other == base);

  other = base;
  other.hdr = true;
  EXPECT_FALSE(other == base);

  other = base;
  other.night = true;
  EXPECT_FALSE(other == base);

  other = base;
  other.first_party = false;
  EXPECT_FALSE(other == base);
}

TEST(TuningSensorModeInfoTest, DefaultsToAnEmptyUnbinnedMode) {
  const TuningSensorModeInfo info;
  EXPECT_THAT(info.sensor_name, IsEmpty());
  EXPECT_EQ(info.mode_width, 0);
  EXPECT_EQ(info.mode_height, 0);
  EXPECT_EQ(info.sensor_fps_range.min, 0.0f);
  EXPECT_EQ(info.sensor_fps_range.max, 0.0f);
  EXPECT_EQ(info.target_fps_range.min, 0.0f);
  EXPECT_EQ(info.target_fps_range.max, 0.0f);
  EXPECT_EQ(info.binning_x, 1);
  EXPECT_EQ(info.binning_y, 1);
}

TEST(NormalizedCropTest, DefaultsToTheWholeMode) {
  const NormalizedCrop crop;
  EXPECT_EQ(crop.left, 0.0f);
  EXPECT_EQ(crop.top, 0.0f);
  EXPECT_EQ(crop.width, 1.0f);
  EXPECT_EQ(crop.height, 1.0f);
  EXPECT_EQ(crop, (NormalizedCrop{0.0f, 0.0f, 1.0f, 1.0f}));
  EXPECT_FALSE(crop == (NormalizedCrop{0.0f, 0.0f, 0.5f, 1.0f}));
}

TEST(TuningInfoTest, DefaultsToZeroSizesAndNoBypass) {
  const TuningInfo info;
  EXPECT_THAT(info.sensor_mode_info.sensor_name, IsEmpty());
  EXPECT_EQ(info.normalized_crop, (NormalizedCrop{0.0f, 0.0f, 1.0f, 1.0f}));
  EXPECT_EQ(info.image_size.width, 0);
  EXPECT_EQ(info.image_size.height, 0);
  EXPECT_EQ(info.module_spec.facing, 0);
  EXPECT_EQ(info.module_spec.lens_type, 0);
  EXPECT_EQ(info.module_spec.sensor_kind, 0);
  EXPECT_EQ(info.bypass_bitmask, 0u);
}

TEST(TuningCoordinatesTest, DefaultsToZeroEverywhere) {
  const TuningCoordinates coordinates;
  EXPECT_EQ(coordinates.led_influence, 0.0f);
  EXPECT_EQ(coordinates.cct, 0.0f);
  EXPECT_EQ(coordinates.bv, 0.0f);
  EXPECT_EQ(coordinates.real_gain, 0.0f);
  EXPECT_EQ(coordinates.exp_ratio, 0.0f);
  EXPECT_EQ(coordinates.mired_cct, 0.0f);
  EXPECT_EQ(coordinates.scaler_ratio, 0.0f);
  EXPECT_EQ(coordinates.pre_scaler_ratio, 0.0f);
  EXPECT_EQ(coordinates.frame_count, 0);
  EXPECT_EQ(coordinates.exposure_time_msecs, 0.0f);
}

TEST(TuningCoordinatesTest, CountsFramesInAnInteger) {
  EXPECT_TRUE((std::is_same_v<decltype(TuningCoordinates::frame_count), int32_t>));
}

TEST(GenericSizeTest, DefaultsToZeroAndComparesBothSides) {
  const tavik_api::GenericSize<int> size;
  EXPECT_EQ(size.width, 0);
  EXPECT_EQ(size.height, 0);
  EXPECT_EQ((tavik_api::GenericSize<int>{640, 480}), (tavik_api::GenericSize<int>{640, 480}));
  EXPECT_FALSE((tavik_api::GenericSize<int>{640, 480}) == (tavik_api::GenericSize<int>{480, 640}));
  EXPECT_FALSE((tavik_api::GenericSize<int>{640, 480}) == (tavik_api::GenericSize<int>{640, 481}));
}

TEST(RangeTest, DefaultsToZeroAndComparesBothEnds) {
  const tavik_api::Range<float> range;
  EXPECT_EQ(range.min, 0.0f);
  EXPECT_EQ(range.max, 0.0f);
  EXPECT_EQ((tavik_api::Range<float>{15, 30}), (tavik_api::Range<float>{15, 30}));
  EXPECT_FALSE((tavik_api::Range<float>{15, 30}) == (tavik_api::Range<float>{15, 15}));
  EXPECT_FALSE((tavik_api::Range<float>{15, 30}) == (tavik_api::Range<float>{30, 30}));
}

TEST(SensorModuleSpecTest, DefaultsToARearNormalVisibleModule) {
  const tavik_api::SensorModuleSpec module;
  EXPECT_EQ(module.facing, 0);
  EXPECT_EQ(module.lens_type, 0);
  EXPECT_EQ(module.sensor_kind, 0);
}

TEST(SensorModuleSpecTest, IsThreeInt32Words) {
  EXPECT_EQ(sizeof(tavik_api::SensorModuleSpec), 3 * sizeof(int32_t));
  const tavik_api::SensorModuleSpec module{1, 2, 1};
  EXPECT_EQ(module.facing, 1);
  EXPECT_EQ(module.lens_type, 2);
  EXPECT_EQ(module.sensor_kind, 1);
}

TEST(SensorModuleSpecTest, EqualityComparesEveryWord) {
  const tavik_api::SensorModuleSpec module{1, 2, 0};
  EXPECT_EQ(module, (tavik_api::SensorModuleSpec{1, 2, 0}));
  EXPECT_FALSE(module == (tavik_api::SensorModuleSpec{0, 2, 0}));
  EXPECT_FALSE(module == (tavik_api::SensorModuleSpec{1, 0, 0}));
  EXPECT_FALSE(module == (tavik_api::SensorModuleSpec{1, 2, 1}));
}

TEST(LensShadingCalibrationDataTest, DefaultsToAnEmptyGrid) {
  const tavik_api::LensShadingCalibrationData data;
  EXPECT_EQ(data.width, 0);
  EXPECT_EQ(data.height, 0);
  EXPECT_THAT(data.grid_gain_r, IsEmpty());
  EXPECT_THAT(data.grid_gain_gr, IsEmpty());
  EXPECT_THAT(data.grid_gain_gb, IsEmpty());
  EXPECT_THAT(data.grid_gain_b, IsEmpty());
  EXPECT_EQ(data.full_width, 0);
  EXPECT_EQ(data.full_height, 0);
  EXPECT_EQ(data.crop_width, 0);
  EXPECT_EQ(data.crop_height, 0);
  EXPECT_EQ(data.crop_left, 0);
  EXPECT_EQ(data.crop_top, 0);
}

TEST(ColorFilterArrangementTest, UsesTheServiceNumbering) {
  EXPECT_EQ(static_cast<int32_t>(ColorFilterArrangement::kBggr), 0);
  EXPECT_EQ(static_cast<int32_t>(ColorFilterArrangement::kGbrg), 1);
  EXPECT_EQ(static_cast<int32_t>(ColorFilterArrangement::kGrbg), 2);
  EXPECT_EQ(static_cast<int32_t>(ColorFilterArrangement::kRggb), 3);
}

TEST(ColorFilterArrangementTest, ToStringNamesEveryKnownArrangement) {
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kBggr), "BGGR");
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kGbrg), "GBRG");
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kGrbg), "GRBG");
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kRggb), "RGGB");
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kMono), "MONO");
  EXPECT_EQ(ColorFilterArrangementToString(ColorFilterArrangement::kNir), "NIR");
}

TEST(ColorFilterArrangementTest, ToStringNumbersAnUnknownArrangement) {
  EXPECT_EQ(ColorFilterArrangementToString(static_cast<ColorFilterArrangement>(6)), "UNKNOWN(6)");
  EXPECT_EQ(ColorFilterArrangementToString(static_cast<ColorFilterArrangement>(-1)), "UNKNOWN(-1)");
}

TEST(TuningSensorKeyTest, EqualityComparesNameAndModule) {
  const TuningSensorKey key{"IMX363", {0, 0, 0}};
  EXPECT_EQ(key, (TuningSensorKey{"IMX363", {0, 0, 0}}));
  EXPECT_FALSE(key == (TuningSensorKey{"IMX362", {0, 0, 0}}));
  EXPECT_FALSE(key == (TuningSensorKey{"IMX363", {1, 0, 0}}));
  EXPECT_FALSE(key == (TuningSensorKey{"IMX363", {0, 1, 0}}));
  EXPECT_FALSE(key == (TuningSensorKey{"IMX363", {0, 0, 1}}));
}

TEST(TuningSensorKeyTest, ImplementsAbslHashConsistentlyWithEquality) {
  EXPECT_TRUE(absl::VerifyTypeImplementsAbslHashCorrectly({
      TuningSensorKey{},
      TuningSensorKey{"IMX363", {0, 0, 0}},
      TuningSensorKey{"IMX363", {1, 0, 0}},
      TuningSensorKey{"IMX363", {0, 2, 0}},
      TuningSensorKey{"IMX363", {0, 0, 1}},
      TuningSensorKey{"GN1", {0, 0, 0}},
      TuningSensorKey{"OVM7251", {1, 0, 1}},
  }));
}

TEST(TuningSensorKeyTest, KeysAFlatHashMapByNameAndModule) {
  FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData> calibrations;
  tavik_api::LensShadingCalibrationData rear;
  rear.width = 17;
  tavik_api::LensShadingCalibrationData front;
  front.width = 9;
  tavik_api::LensShadingCalibrationData rear_tele;
  rear_tele.width = 5;

  EXPECT_TRUE(calibrations.emplace(TuningSensorKey{"IMX363", {0, 0, 0}}, rear).second);
  EXPECT_TRUE(calibrations.emplace(TuningSensorKey{"IMX363", {1, 0, 0}}, front).second);
  EXPECT_TRUE(calibrations.emplace(TuningSensorKey{"IMX363", {0, 2, 0}}, rear_tele).second);
  // An equal key is the same entry.
  EXPECT_FALSE(calibrations.emplace(TuningSensorKey{"IMX363", {0, 0, 0}}, front).second);
  ASSERT_EQ(calibrations.size(), 3u);

  const auto found_rear = calibrations.find(TuningSensorKey{"IMX363", {0, 0, 0}});
  ASSERT_NE(found_rear, calibrations.end());
  EXPECT_EQ(found_rear->second.width, 17);
  const auto found_front = calibrations.find(TuningSensorKey{"IMX363", {1, 0, 0}});
  ASSERT_NE(found_front, calibrations.end());
  EXPECT_EQ(found_front->second.width, 9);
  const auto found_tele = calibrations.find(TuningSensorKey{"IMX363", {0, 2, 0}});
  ASSERT_NE(found_tele, calibrations.end());
  EXPECT_EQ(found_tele->second.width, 5);

  EXPECT_FALSE(calibrations.contains(TuningSensorKey{"IMX363", {0, 0, 1}}));
  EXPECT_FALSE(calibrations.contains(TuningSensorKey{"GN1", {0, 0, 0}}));
}

TEST(TuningSensorKeyTest, KeysAFlatHashSet) {
  FlatHashSet<TuningSensorKey> keys;
  keys.insert(TuningSensorKey{"GN1", {0, 0, 0}});
  keys.insert(TuningSensorKey{"GN1", {0, 0, 0}});
  keys.insert(TuningSensorKey{"GN1", {0, 5, 0}});
  EXPECT_EQ(keys.size(), 2u);
  EXPECT_TRUE(keys.contains(TuningSensorKey{"GN1", {0, 5, 0}}));
  EXPECT_FALSE(keys.contains(TuningSensorKey{"GN1", {1, 0, 0}}));
}

}  // namespace
}  // namespace tavik
