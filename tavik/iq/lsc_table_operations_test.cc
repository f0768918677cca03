#include "tavik/iq/lsc_table_operations.h"

#include <algorithm>
#include <array>
#include <cfloat>
#include <cmath>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "google/protobuf/util/message_differencer.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/iq/protos/lsc_tables.pb.h"

namespace tavik {
namespace {

using ::google::protobuf::RepeatedField;
using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;
using ::testing::ElementsAreArray;
using ::vosbrine::LscCropInfo;
using ::vosbrine::LscTables;

constexpr StatusCode kInvalidArgument = StatusCode::kInvalidArgument;

using Plane = std::vector<float>;

// The four gain planes, in the order of their fields: red, Gr, Gb, blue.
enum PlaneIndex { kRed = 0, kGr = 1, kGb = 2, kBlue = 3 };
constexpr std::array<const char*, 4> kPlaneNames = {"red", "Gr", "Gb", "blue"};

RepeatedField<float>* MutablePlane(LscTables& tables, int plane) {
  switch (plane) {
    case kRed:
      return tables.mutable_lsc_grid_gain_r();
    case kGr:
      return tables.mutable_lsc_grid_gain_gr();
    case kGb:
      return tables.mutable_lsc_grid_gain_gb();
    default:
      return tables.mutable_lsc_grid_gain_b();
  }
}

Plane GetPlane(const LscTables& tables, int plane) {
  const RepeatedField<float>* field = nullptr;
  switch (plane) {
    case kRed:
      field = &tables.lsc_grid_gain_r();
      break;
    case kGr:
      field = &tables.lsc_grid_gain_gr();
      break;
    case kGb:
      field = &tables.lsc_grid_gain_gb();
      break;
    default:
      field = &tables.lsc_grid_gain_b();
      break;
  }
  return Plane(field->begin(), field->end());
}

void SetPlane(LscTables& tables, int plane, const Plane& values) {
  RepeatedField<float>* field = MutablePlane(tables, plane);
  field->Clear();
  field->Add(values.begin(), values.end());
}

LscTables MakeTables(int width, int height, const Plane& r, const Plane& gr, const Plane& gb,
                     const Plane& b) {
  LscTables tables;
  tables.set_width(width);
  tables.set_height(height);
  SetPlane(tables, kRed, r);
  SetPlane(tables, kGr, gr);
  SetPlane(tables, kGb, gb);
  SetPlane(tables, kBlue, b);
  return tables;
}

// Every node of every plane set to `value`.
LscTables UniformTables(int width, int height, float value) {
  const Plane plane(static_cast<size_t>(width) * height, value);
  return MakeTables(width, height, plane, plane, plane, plane);
}

// Each node of each plane holds `gain(plane, row, col)`.
template <typename Gain>
LscTables TablesOf(int width, int height, Gain gain) {
  LscTables tables;
  tables.set_width(width);
  tables.set_height(height);
  for (int plane = 0; plane < 4; ++plane) {
    RepeatedField<float>* field = MutablePlane(tables, plane);
    for (int row = 0; row < height; ++row) {
      for (int col = 0; col < width; ++col) field->Add(gain(plane, row, col));
    }
  }
  return tables;
}

float At(const LscTables& tables, int plane, int row, int col) {
  return GetPlane(tables, plane)[static_cast<size_t>(row) * tables.width() + col];
}

::testing::AssertionResult SameTables(const LscTables& expected, const LscTables& actual) {
  // MessageDifferencer compares floats exactly by default.
  if (google::protobuf::util::MessageDifferencer::Equals(expected, actual)) {
    return ::testing::AssertionSuccess();
  }
  return ::testing::AssertionFailure() << "expected:\n"
                                       << expected.ShortDebugString() << "\nactual:\n"
                                       << actual.ShortDebugString();
}

// One plane calibrated by hand, in single precision: the peak of each measurement, their ratio,
// then ((scale * golden) / device) * tuning for every gain, in that order.
Plane CalibratePlaneByHand(const Plane& device, const Plane& golden, const Plane& tuning) {
  float max_device = 0.0f;
  float max_golden = 0.0f;
  for (size_t i = 0; i < device.size(); ++i) {
    if (device[i] > max_device) max_device = device[i];
    if (golden[i] > max_golden) max_golden = golden[i];
  }
  const float scale = max_device / max_golden;
  Plane result(tuning.size());
  for (size_t i = 0; i < tuning.size(); ++i) {
    const float scaled_golden = scale * golden[i];
    const float ratio = scaled_golden / device[i];
    result[i] = ratio * tuning[i];
  }
  return result;
}

// --- Calibration --------------------------------------------------------------------------------

// Device, golden and tuning planes used by several tests. All calibrated gains lie above 1.1, so
// no renormalisation follows.
const LscTables& Device() {
  static const LscTables* const tables =
      new LscTables(MakeTables(2, 2, {1.3f, 1.7f, 2.9f, 1.1f}, {1.2f, 1.4f, 2.2f, 1.0f},
                               {1.25f, 1.45f, 2.3f, 1.05f}, {1.6f, 1.9f, 3.1f, 1.2f}));
  return *tables;
}

const LscTables& Golden() {
  static const LscTables* const tables =
      new LscTables(MakeTables(2, 2, {1.9f, 1.2f, 2.3f, 1.05f}, {1.1f, 1.5f, 2.0f, 1.3f},
                               {1.15f, 1.35f, 2.5f, 1.0f}, {1.7f, 1.8f, 2.7f, 1.4f}));
  return *tables;
}

const LscTables& Tuning() {
  static const LscTables* const tables =
      new LscTables(MakeTables(2, 2, {1.37f, 2.11f, 1.63f, 1.29f}, {1.5f, 1.8f, 2.4f, 1.9f},
                               {1.6f, 1.7f, 2.2f, 2.0f}, {1.45f, 2.05f, 1.75f, 1.95f}));
  return *tables;
}

TEST(CalibrateLscTablesTest, NullTuningFails) {
  EXPECT_THAT(CalibrateLscTables(Device(), Golden(), nullptr),
              StatusIs(kInvalidArgument, "tuning is nullptr."));
}

TEST(CalibrateLscTablesTest, RedPlaneIsScaledGoldenThenOverDeviceThenTimesTuning) {
  LscTables tuning = Tuning();
  ASSERT_THAT(CalibrateLscTables(Device(), Golden(), &tuning), IsOk());

  // Red by hand. Device peak 2.9, golden peak 2.3.
  const float scale = 2.9f / 2.3f;
  const float expected[4] = {
      ((scale * 1.9f) / 1.3f) * 1.37f,
      ((scale * 1.2f) / 1.7f) * 2.11f,
      ((scale * 2.3f) / 2.9f) * 1.63f,
      ((scale * 1.05f) / 1.1f) * 1.29f,
  };
  EXPECT_THAT(GetPlane(tuning, kRed), ElementsAreArray(expected));
  // The second gain tells this order from the others, and the device from the golden
  // table as denominator.
  EXPECT_NE(GetPlane(tuning, kRed)[1], (scale * (1.2f / 1.7f)) * 2.11f);
  EXPECT_NE(GetPlane(tuning, kRed)[1], ((scale * 1.2f) * 2.11f) / 1.7f);
  EXPECT_NE(GetPlane(tuning, kRed)[1], (((2.3f / 2.9f) * 1.7f) / 1.2f) * 2.11f);
  EXPECT_EQ(tuning.width(), 2);
  EXPECT_EQ(tuning.height(), 2);
}

TEST(CalibrateLscTablesTest, EachPlaneIsScaledByItsOwnPeaks) {
  LscTables tuning = Tuning();
  ASSERT_THAT(CalibrateLscTables(Device(), Golden(), &tuning), IsOk());
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(CalibratePlaneByHand(
                                             GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                             GetPlane(Tuning(), plane))));
  }
}

TEST(CalibrateLscTablesTest, IdenticalDeviceAndGoldenLeaveTheTuningUnchanged) {
  // The smallest gain is exactly 1.0, so no renormalisation either.
  const LscTables tuning_before =
      MakeTables(2, 2, {1.0f, 1.37f, 2.5f, 1.01f}, {1.05f, 1.5f, 1.09f, 3.0f},
                 {1.2f, 1.3f, 1.4f, 1.5f}, {2.25f, 1.75f, 1.125f, 1.0625f});
  LscTables tuning = tuning_before;
  ASSERT_THAT(CalibrateLscTables(Device(), Device(), &tuning), IsOk());
  EXPECT_TRUE(SameTables(tuning_before, tuning));
}

TEST(CalibrateLscTablesTest, SmallestGainOfPointEightIsDividedOutEverywhere) {
  // Identical measurements keep the tuning as it is; its smallest gain, 0.8, sits in the Gr
  // plane, and every gain of all four planes is divided by it.
  const Plane r = {1.6f, 1.2f, 2.0f, 0.9f};
  const Plane gr = {1.0f, 0.8f, 1.3f, 1.7f};
  const Plane gb = {0.85f, 1.1f, 1.2f, 1.4f};
  const Plane b = {2.4f, 1.9f, 0.95f, 1.05f};
  LscTables tuning = MakeTables(2, 2, r, gr, gb, b);
  ASSERT_THAT(CalibrateLscTables(Device(), Device(), &tuning), IsOk());

  const std::array<Plane, 4> before = {r, gr, gb, b};
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    Plane expected;
    for (float gain : before[plane]) expected.push_back(gain / 0.8f);
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(expected));
  }
  EXPECT_EQ(GetPlane(tuning, kGr)[1], 1.0f);
  float smallest = FLT_MAX;
  for (int plane = 0; plane < 4; ++plane) {
    for (float gain : GetPlane(tuning, plane)) smallest = std::min(smallest, gain);
  }
  EXPECT_EQ(smallest, 1.0f);
}

TEST(CalibrateLscTablesTest, RenormalisationDividesByTheSmallestScaledGain) {
  // The golden peaks lie higher than the device's, so the scale is below 1 and the tuning's
  // centre dips below 1.0: by hand, Gr's second gain is ((2 / 3 * 1) / 1) * 1.3, about 0.87, the
  // smallest of all. Every gain is then divided by it.
  const LscTables device = MakeTables(2, 1, {2.0f, 1.0f}, {2.0f, 1.0f}, {2.0f, 1.0f}, {2.0f, 1.0f});
  const LscTables golden = MakeTables(2, 1, {2.5f, 1.0f}, {3.0f, 1.0f}, {2.2f, 1.0f}, {2.0f, 1.0f});
  const LscTables before =
      MakeTables(2, 1, {1.5f, 1.2f}, {1.6f, 1.3f}, {1.7f, 1.25f}, {1.4f, 1.15f});
  LscTables tuning = before;
  ASSERT_THAT(CalibrateLscTables(device, golden, &tuning), IsOk());

  const float gr_scale = 2.0f / 3.0f;
  const float smallest = ((gr_scale * 1.0f) / 1.0f) * 1.3f;
  std::array<Plane, 4> scaled;
  for (int plane = 0; plane < 4; ++plane) {
    scaled[plane] = CalibratePlaneByHand(GetPlane(device, plane), GetPlane(golden, plane),
                                         GetPlane(before, plane));
    for (float gain : scaled[plane]) ASSERT_GE(gain, smallest);
  }
  ASSERT_LT(smallest, 1.0f);
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    Plane expected;
    for (float gain : scaled[plane]) expected.push_back(gain / smallest);
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(expected));
  }
  EXPECT_EQ(GetPlane(tuning, kGr)[1], 1.0f);
}

TEST(CalibrateLscTablesTest, TuningAboveOnePointOneIsLeftAsThePlanesMadeIt) {
  LscTables tuning = Tuning();
  ASSERT_THAT(CalibrateLscTables(Device(), Golden(), &tuning), IsOk());
  for (int plane = 0; plane < 4; ++plane) {
    const Plane scaled = CalibratePlaneByHand(GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                              GetPlane(Tuning(), plane));
    for (float gain : scaled) ASSERT_GT(gain, 1.1f) << "the data of this test must lie above 1.1";
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(scaled)) << kPlaneNames[plane];
  }
}

TEST(CalibrateLscTablesTest, TuningBetweenOneAndOnePointOneIsNotPulledDown) {
  // The smallest gain, 1.02, is below the scan's start of 1.1 but not below 1.0.
  const LscTables measurement =
      MakeTables(2, 1, {1.5f, 1.0f}, {1.5f, 1.0f}, {1.5f, 1.0f}, {1.5f, 1.0f});
  const LscTables before =
      MakeTables(2, 1, {1.05f, 1.2f}, {1.08f, 1.3f}, {1.02f, 1.25f}, {1.09f, 1.15f});
  LscTables tuning = before;
  ASSERT_THAT(CalibrateLscTables(measurement, measurement, &tuning), IsOk());
  EXPECT_TRUE(SameTables(before, tuning));
}

TEST(CalibrateLscTablesTest, EmptyPlanesEverywhereSucceedAndChangeNothing) {
  const LscTables empty = MakeTables(33, 25, {}, {}, {}, {});
  LscTables tuning = empty;
  EXPECT_THAT(CalibrateLscTables(empty, empty, &tuning), IsOk());
  EXPECT_TRUE(SameTables(empty, tuning));
}

TEST(CalibrateLscTablesTest, EmptyPlaneInAllThreeTablesPassesItsPlane) {
  // The red plane is empty in all three tables: its plane step succeeds without change, the
  // other planes are scaled, and only the final length check fails.
  LscTables device = Device();
  LscTables golden = Golden();
  LscTables tuning = Tuning();
  device.clear_lsc_grid_gain_r();
  golden.clear_lsc_grid_gain_r();
  tuning.clear_lsc_grid_gain_r();
  EXPECT_THAT(CalibrateLscTables(device, golden, &tuning),
              StatusIs(kInvalidArgument, "LscTables dimensions are wrong."));
  EXPECT_TRUE(GetPlane(tuning, kRed).empty());
  for (int plane : {kGr, kGb, kBlue}) {
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(CalibratePlaneByHand(
                                             GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                             GetPlane(Tuning(), plane))))
        << kPlaneNames[plane];
  }
}

TEST(CalibrateLscTablesTest, PlanesOfDifferentLengthsFailAfterScaling) {
  // Every plane agrees with its measurements, but the blue plane has one gain fewer.
  LscTables device = Device();
  LscTables golden = Golden();
  LscTables tuning = Tuning();
  device.mutable_lsc_grid_gain_b()->RemoveLast();
  golden.mutable_lsc_grid_gain_b()->RemoveLast();
  tuning.mutable_lsc_grid_gain_b()->RemoveLast();
  const LscTables tuning_before = tuning;
  EXPECT_THAT(CalibrateLscTables(device, golden, &tuning),
              StatusIs(kInvalidArgument, "LscTables dimensions are wrong."));
  for (int plane = 0; plane < 4; ++plane) {
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(CalibratePlaneByHand(
                                             GetPlane(device, plane), GetPlane(golden, plane),
                                             GetPlane(tuning_before, plane))))
        << kPlaneNames[plane];
  }
}

TEST(CalibrateLscTablesTest, PlaneLengthMismatchFailsAndEarlierPlanesStayScaled) {
  // Red is done last: blue, Gb and Gr are scaled when red's mismatch is found.
  for (const char* short_table : {"device", "golden", "tuning"}) {
    SCOPED_TRACE(short_table);
    LscTables device = Device();
    LscTables golden = Golden();
    LscTables tuning = Tuning();
    const std::string which = short_table;
    LscTables& shortened = which == "device" ? device : which == "golden" ? golden : tuning;
    shortened.mutable_lsc_grid_gain_r()->RemoveLast();
    const Plane red_before = GetPlane(tuning, kRed);
    EXPECT_THAT(CalibrateLscTables(device, golden, &tuning),
                StatusIs(kInvalidArgument, "grid_gain size mismatch."));
    EXPECT_EQ(GetPlane(tuning, kRed), red_before);
    for (int plane : {kGr, kGb, kBlue}) {
      EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(CalibratePlaneByHand(
                                               GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                               GetPlane(Tuning(), plane))))
          << kPlaneNames[plane];
    }
  }
}

TEST(CalibrateLscTablesTest, DeviceGainBelowPointOneFailsAfterGainsThatPassed) {
  // 0.09 stands last in the device's red plane; the three gains before it passed. Red is the last
  // plane done, so blue, Gb and Gr stay scaled and red is untouched.
  LscTables device = Device();
  device.mutable_lsc_grid_gain_r()->Set(3, 0.09f);
  LscTables tuning = Tuning();
  EXPECT_THAT(
      CalibrateLscTables(device, Golden(), &tuning),
      StatusIs(kInvalidArgument, "Device or golden EEPROM LscTables' value is smaller than 0.1"));
  EXPECT_EQ(GetPlane(tuning, kRed), GetPlane(Tuning(), kRed));
  for (int plane : {kGr, kGb, kBlue}) {
    EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(CalibratePlaneByHand(
                                             GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                             GetPlane(Tuning(), plane))))
        << kPlaneNames[plane];
  }
}

TEST(CalibrateLscTablesTest, PlanesAreDoneBlueGbGrRed) {
  // A golden gain of 0.09 in one plane: the planes done before it are scaled, that plane and the
  // ones after it are not.
  const std::array<int, 4> order = {kBlue, kGb, kGr, kRed};
  for (size_t failing = 0; failing < order.size(); ++failing) {
    SCOPED_TRACE(std::string("failing plane: ") + kPlaneNames[order[failing]]);
    LscTables golden = Golden();
    MutablePlane(golden, order[failing])->Set(2, 0.09f);
    LscTables tuning = Tuning();
    EXPECT_THAT(
        CalibrateLscTables(Device(), golden, &tuning),
        StatusIs(kInvalidArgument, "Device or golden EEPROM LscTables' value is smaller than 0.1"));
    for (size_t k = 0; k < order.size(); ++k) {
      const int plane = order[k];
      const Plane expected =
          k < failing ? CalibratePlaneByHand(GetPlane(Device(), plane), GetPlane(Golden(), plane),
                                             GetPlane(Tuning(), plane))
                      : GetPlane(Tuning(), plane);
      EXPECT_THAT(GetPlane(tuning, plane), ElementsAreArray(expected)) << kPlaneNames[plane];
    }
  }
}

TEST(CalibrateLscTablesTest, GainOfExactlyPointOneIsAccepted) {
  // The comparison is strict: 0.1f itself passes.
  const LscTables measurement =
      MakeTables(2, 1, {0.1f, 1.0f}, {0.1f, 1.0f}, {0.1f, 1.0f}, {0.1f, 1.0f});
  LscTables tuning = MakeTables(2, 1, {1.5f, 1.5f}, {1.5f, 1.5f}, {1.5f, 1.5f}, {1.5f, 1.5f});
  EXPECT_THAT(CalibrateLscTables(measurement, measurement, &tuning), IsOk());
}

TEST(CalibrateLscTablesTest, ScaledGainBelowPointOneFails) {
  // Golden 0.15 against its peak 3.0 on a flat device: (1 / 3 * 0.15) / 1 * 1.0 is about 0.05.
  const LscTables device = MakeTables(2, 1, {1.0f, 1.0f}, {1.0f, 1.0f}, {1.0f, 1.0f}, {1.0f, 1.0f});
  const LscTables golden =
      MakeTables(2, 1, {1.0f, 1.0f}, {1.0f, 1.0f}, {1.0f, 1.0f}, {0.15f, 3.0f});
  LscTables tuning = MakeTables(2, 1, {1.5f, 1.5f}, {1.5f, 1.5f}, {1.5f, 1.5f}, {1.0f, 1.0f});
  EXPECT_THAT(CalibrateLscTables(device, golden, &tuning),
              StatusIs(kInvalidArgument, "LscTables' value is smaller than 0.1"));
  // The planes stay as scaled.
  const float scale = 1.0f / 3.0f;
  EXPECT_THAT(GetPlane(tuning, kBlue),
              ElementsAreArray({((scale * 0.15f) / 1.0f) * 1.0f, ((scale * 3.0f) / 1.0f) * 1.0f}));
  EXPECT_THAT(GetPlane(tuning, kRed), ElementsAreArray({1.5f, 1.5f}));
}

TEST(CalibrateLscTablesTest, TuningGainBelowPointOneFailsEvenWithIdenticalMeasurements) {
  LscTables tuning = MakeTables(2, 1, {1.5f, 0.05f}, {1.5f, 1.5f}, {1.5f, 1.5f}, {1.5f, 1.5f});
  const LscTables measurement =
      MakeTables(2, 1, {1.5f, 1.0f}, {1.5f, 1.0f}, {1.5f, 1.0f}, {1.5f, 1.0f});
  EXPECT_THAT(CalibrateLscTables(measurement, measurement, &tuning),
              StatusIs(kInvalidArgument, "LscTables' value is smaller than 0.1"));
}

// --- Factorisation -------------------------------------------------------------------------------

// The factorisation worked out step by step on a grid of rows, independently of the library.
struct HandFactorization {
  std::vector<float> cells;
  std::vector<std::vector<float>> map;  // [row][col], the cells expanded to nodes.
  LscTables remainder;
};

HandFactorization FactorizeByHand(const LscTables& full) {
  const int width = full.width();
  const int height = full.height();
  HandFactorization result;
  // The smallest of the four channel gains at each node.
  std::vector<std::vector<float>> m(height, std::vector<float>(width));
  for (int row = 0; row < height; ++row) {
    for (int col = 0; col < width; ++col) {
      float smallest = At(full, kRed, row, col);
      for (int plane : {kGr, kGb, kBlue}) smallest = std::min(smallest, At(full, plane, row, col));
      m[row][col] = smallest;
    }
  }
  // One cell per odd-odd node: the 3 by 3 minimum, at least 1.0.
  const int cells_wide = width / 2;
  result.cells.assign(static_cast<size_t>(cells_wide) * (height / 2), -1.0f);
  for (int row = 1; row < height; row += 2) {
    for (int col = 1; col < width; col += 2) {
      float cell = FLT_MAX;
      for (int r = row - 1; r <= row + 1; ++r) {
        for (int c = col - 1; c <= col + 1; ++c) cell = std::min(cell, m[r][c]);
      }
      if (cell < 1.0f) cell = 1.0f;
      result.cells[(row / 2) * cells_wide + col / 2] = cell;
    }
  }
  // a. cells at the odd-odd nodes.
  for (int row = 1; row < height; row += 2) {
    for (int col = 1; col < width; col += 2)
      m[row][col] = result.cells[(row / 2) * cells_wide + col / 2];
  }
  // b. odd rows, interior even columns: mean of left and right.
  if (width >= 4 && height >= 3) {
    for (int row = 1; row < height; row += 2) {
      for (int col = 2; col <= width - 3; col += 2) {
        m[row][col] = 0.5f * (m[row][col - 1] + m[row][col + 1]);
      }
    }
  }
  // c. interior even rows, columns 1 to width - 1: mean of the rows above and below.
  if (height >= 4) {
    for (int row = 2; row <= height - 3; row += 2) {
      for (int col = 1; col <= width - 1; ++col) {
        m[row][col] = 0.5f * (m[row - 1][col] + m[row + 1][col]);
      }
    }
  }
  // d. first and last rows copy their neighbours, columns 1 to width - 2.
  if (width >= 3) {
    for (int col = 1; col <= width - 2; ++col) {
      m[0][col] = m[1][col];
      m[height - 1][col] = m[height - 2][col];
    }
  }
  // e. first and last columns copy their neighbours, last of all.
  for (int row = 0; row < height; ++row) {
    m[row][0] = m[row][1];
    m[row][width - 1] = m[row][width - 2];
  }
  result.map = m;
  result.remainder = TablesOf(width, height, [&](int plane, int row, int col) {
    return At(full, plane, row, col) / m[row][col];
  });
  return result;
}

// A 33 by 25 table with radial falloff around a centre a little off the grid's, each channel with
// its own strength; the greens dip below 1.0 near the centre, so some cells are floored.
LscTables RadialTable() {
  constexpr std::array<float, 4> kBase = {1.02f, 0.97f, 0.98f, 1.04f};
  constexpr std::array<float, 4> kStrength = {1.0f, 0.8f, 0.85f, 1.2f};
  return TablesOf(33, 25, [&](int plane, int row, int col) {
    const float x = (static_cast<float>(col) - 17.5f) / 16.0f;
    const float y = (static_cast<float>(row) - 11.0f) / 12.0f;
    return kBase[plane] + kStrength[plane] * (x * x + y * y);
  });
}

TEST(FactorizeLscTest, EvenWidthOrHeightFails) {
  for (const auto& [width, height] : {std::pair{32, 25}, std::pair{33, 24}, std::pair{4, 4}}) {
    SCOPED_TRACE(std::to_string(width) + " by " + std::to_string(height));
    const LscTables full = UniformTables(width, height, 1.5f);
    LscTables high;
    std::vector<float> low;
    EXPECT_THAT(FactorizeLsc(full, high, low),
                StatusIs(kInvalidArgument, "full_lsc dimensions must be odd."));
  }
}

TEST(FactorizeLscTest, RadialTableMatchesTheStepByStepFactorization) {
  const LscTables full = RadialTable();
  const HandFactorization expected = FactorizeByHand(full);
  // The test table must exercise the floor at 1.0 and cells above it.
  ASSERT_NE(std::count(expected.cells.begin(), expected.cells.end(), 1.0f), 0);
  ASSERT_GT(*std::max_element(expected.cells.begin(), expected.cells.end()), 1.5f);

  LscTables high;
  std::vector<float> low = {7.0f};
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  ASSERT_EQ(low.size(), 192u);
  EXPECT_THAT(low, ElementsAreArray(expected.cells));
  EXPECT_TRUE(SameTables(expected.remainder, high));

  // Remainder times the expanded map gives the table back.
  for (int plane = 0; plane < 4; ++plane) {
    for (int row = 0; row < 25; ++row) {
      for (int col = 0; col < 33; ++col) {
        const float original = At(full, plane, row, col);
        EXPECT_NEAR(At(high, plane, row, col) * expected.map[row][col], original, 1e-6 * original)
            << kPlaneNames[plane] << " (" << row << ", " << col << ")";
      }
    }
  }
}

TEST(FactorizeLscTest, CornersTakeTheirColumnNeighbourAfterTheRowCopies) {
  // The last step copies columns, so a corner of the map is its row-copied neighbour: the map at
  // (0, 0) is the cell at (1, 1), by way of node (0, 1).
  const LscTables full = RadialTable();
  const HandFactorization expected = FactorizeByHand(full);
  LscTables high;
  std::vector<float> low;
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  EXPECT_EQ(At(high, kRed, 0, 0), At(full, kRed, 0, 0) / low[0]);
  EXPECT_EQ(At(high, kRed, 24, 32), At(full, kRed, 24, 32) / low[191]);
  EXPECT_EQ(expected.map[0][0], expected.cells[0]);
}

TEST(FactorizeLscTest, AllOnesGiveUnitCellsAndAUnitRemainder) {
  const LscTables full = UniformTables(33, 25, 1.0f);
  LscTables high;
  std::vector<float> low;
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  EXPECT_THAT(low, ElementsAreArray(std::vector<float>(192, 1.0f)));
  EXPECT_TRUE(SameTables(full, high));
}

TEST(FactorizeLscTest, GainsAllBelowOneGiveCellsOfExactlyOne) {
  const LscTables full = TablesOf(33, 25, [](int plane, int row, int col) {
    return 0.5f + 0.01f * static_cast<float>(plane) + static_cast<float>(row * 33 + col) / 2048.0f;
  });
  ASSERT_LT(At(full, kBlue, 24, 32), 1.0f);
  LscTables high;
  std::vector<float> low;
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  EXPECT_THAT(low, ElementsAreArray(std::vector<float>(192, 1.0f)));
  // Divided by 1.0, the remainder is the table.
  EXPECT_TRUE(SameTables(full, high));
}

TEST(FactorizeLscTest, ThreeByThreeTableHasOneCellThatFillsTheMap) {
  const LscTables full = MakeTables(3, 3, {2.0f, 1.8f, 2.1f, 1.6f, 1.5f, 1.7f, 2.2f, 1.9f, 2.4f},
                                    {1.9f, 1.7f, 2.0f, 1.5f, 1.25f, 1.6f, 2.1f, 1.8f, 2.3f},
                                    {1.95f, 1.75f, 2.05f, 1.55f, 1.3f, 1.65f, 2.15f, 1.85f, 2.35f},
                                    {2.1f, 1.9f, 2.2f, 1.7f, 1.6f, 1.8f, 2.3f, 2.0f, 2.5f});
  LscTables high;
  std::vector<float> low;
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  // The smallest gain of all nine nodes, Gr's centre.
  EXPECT_THAT(low, ElementsAreArray({1.25f}));
  LscTables expected = full;
  for (int plane = 0; plane < 4; ++plane) {
    for (float& gain : *MutablePlane(expected, plane)) gain = gain / 1.25f;
  }
  EXPECT_TRUE(SameTables(expected, high));
}

TEST(FactorizeLscTest, RemainderIsAFullCopyWhateverTheOutputHeld) {
  const LscTables full = UniformTables(5, 3, 2.0f);
  LscTables high = UniformTables(33, 25, 9.0f);
  std::vector<float> low(500, 9.0f);
  ASSERT_THAT(FactorizeLsc(full, high, low), IsOk());
  EXPECT_THAT(low, ElementsAreArray({2.0f, 2.0f}));
  EXPECT_TRUE(SameTables(UniformTables(5, 3, 1.0f), high));
}

// --- Decimation ----------------------------------------------------------------------------------

// Distinct, exactly representable gains: plane + 1 + node index / 1024.
LscTables NumberedTable(int width, int height) {
  return TablesOf(width, height, [width](int plane, int row, int col) {
    return static_cast<float>(plane + 1) + static_cast<float>(row * width + col) / 1024.0f;
  });
}

TEST(LscDownsample2xTest, NullOutputFails) {
  EXPECT_THAT(LscDownsample2x(NumberedTable(33, 25), nullptr),
              StatusIs(kInvalidArgument, "out is nullptr."));
}

TEST(LscDownsample2xTest, EvenWidthOrHeightFails) {
  for (const auto& [width, height] : {std::pair{32, 25}, std::pair{33, 24}}) {
    LscTables out = NumberedTable(3, 3);
    const LscTables before = out;
    EXPECT_THAT(LscDownsample2x(NumberedTable(width, height), &out),
                StatusIs(kInvalidArgument, "Input Lsc dimensions must be odd."));
    EXPECT_TRUE(SameTables(before, out));
  }
}

TEST(LscDownsample2xTest, KeepsEveryOtherNodeWithBothBorders) {
  const LscTables in = NumberedTable(33, 25);
  LscTables out;
  ASSERT_THAT(LscDownsample2x(in, &out), IsOk());
  EXPECT_EQ(out.width(), 17);
  EXPECT_EQ(out.height(), 13);
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    ASSERT_EQ(GetPlane(out, plane).size(), 221u);
    for (int i = 0; i < 13; ++i) {
      for (int j = 0; j < 17; ++j) ASSERT_EQ(At(out, plane, i, j), At(in, plane, 2 * i, 2 * j));
    }
    EXPECT_EQ(At(out, plane, 0, 0), At(in, plane, 0, 0));
    EXPECT_EQ(At(out, plane, 0, 16), At(in, plane, 0, 32));
    EXPECT_EQ(At(out, plane, 12, 0), At(in, plane, 24, 0));
    EXPECT_EQ(At(out, plane, 12, 16), At(in, plane, 24, 32));
  }
}

TEST(LscDownsample2xTest, OutputOfAnotherSizeIsResized) {
  LscTables out = NumberedTable(40, 40);
  ASSERT_THAT(LscDownsample2x(NumberedTable(33, 25), &out), IsOk());
  EXPECT_EQ(out.width(), 17);
  EXPECT_EQ(out.height(), 13);
  for (int plane = 0; plane < 4; ++plane) EXPECT_EQ(GetPlane(out, plane).size(), 221u);
  EXPECT_EQ(At(out, kBlue, 12, 16), At(NumberedTable(33, 25), kBlue, 24, 32));
}

TEST(LscDownsample2xTest, PresizedOutputIsWrittenInPlace) {
  LscTables out = UniformTables(17, 13, -1.0f);
  const float* const red_storage = out.lsc_grid_gain_r().data();
  const LscTables in = NumberedTable(33, 25);
  ASSERT_THAT(LscDownsample2x(in, &out), IsOk());
  EXPECT_EQ(out.width(), 17);
  EXPECT_EQ(out.height(), 13);
  EXPECT_EQ(out.lsc_grid_gain_r().data(), red_storage);
  for (int plane = 0; plane < 4; ++plane) {
    ASSERT_EQ(GetPlane(out, plane).size(), 221u);
    for (int i = 0; i < 13; ++i) {
      for (int j = 0; j < 17; ++j) EXPECT_EQ(At(out, plane, i, j), At(in, plane, 2 * i, 2 * j));
    }
  }
}

TEST(LscDownsample2xTest, ThreeByThreeGivesTheFourCorners) {
  const LscTables in = NumberedTable(3, 3);
  LscTables out;
  ASSERT_THAT(LscDownsample2x(in, &out), IsOk());
  EXPECT_EQ(out.width(), 2);
  EXPECT_EQ(out.height(), 2);
  EXPECT_THAT(GetPlane(out, kGb), ElementsAreArray({3.0f, 3.0f + 2.0f / 1024.0f,
                                                    3.0f + 6.0f / 1024.0f, 3.0f + 8.0f / 1024.0f}));
}

// --- Crop and resize -----------------------------------------------------------------------------

LscCropInfo Crop(float width, float height, float left, float right, float top, float bottom) {
  LscCropInfo crop;
  crop.set_width(width);
  crop.set_height(height);
  crop.set_margin_left(left);
  crop.set_margin_right(right);
  crop.set_margin_top(top);
  crop.set_margin_bottom(bottom);
  return crop;
}

// The bilinear step, worked by hand: (index, fraction) along each axis.
float BilinearByHand(const LscTables& in, int plane, int row, float row_fraction, int col,
                     float col_fraction) {
  const float a = At(in, plane, row, col);
  const float b = At(in, plane, row, col + 1);
  const float c = At(in, plane, row + 1, col);
  const float d = At(in, plane, row + 1, col + 1);
  const float top = a + (b - a) * col_fraction;
  const float bottom = c + (d - c) * col_fraction;
  return top + row_fraction * (bottom - top);
}

// 5 nodes wide, 4 high; gains 1 + col^2 / 8 + row / 4 + row * col / 16, plus half a unit per
// plane. Every value and every interpolation at multiples of 1/16 below is exact.
LscTables SmallTable() {
  return TablesOf(5, 4, [](int plane, int row, int col) {
    return 1.0f + static_cast<float>(col * col) * 0.125f + static_cast<float>(row) * 0.25f +
           static_cast<float>(row * col) * 0.0625f + 0.5f * static_cast<float>(plane);
  });
}

TEST(LscCropAndResizeTest, NullOutputFails) {
  EXPECT_THAT(LscCropAndResize(Crop(400, 300, 0, 0, 0, 0), 4, 5, SmallTable(), nullptr),
              StatusIs(kInvalidArgument, "output is nullptr."));
  EXPECT_THAT(LscCrop(Crop(400, 300, 0, 0, 0, 0), SmallTable(), nullptr),
              StatusIs(kInvalidArgument, "output is nullptr."));
}

TEST(LscCropAndResizeTest, EmptyInputFailsAndLeavesTheOutputUntouched) {
  const LscTables before = NumberedTable(3, 3);
  for (const auto& [width, height] :
       {std::pair{0, 4}, std::pair{5, 0}, std::pair{-1, 4}, std::pair{5, -2}}) {
    SCOPED_TRACE(std::to_string(width) + " by " + std::to_string(height));
    LscTables in = SmallTable();
    in.set_width(width);
    in.set_height(height);
    LscTables out = before;
    EXPECT_THAT(LscCropAndResize(Crop(400, 300, 10, 10, 10, 10), 25, 33, in, &out),
                StatusIs(kInvalidArgument, "Input width or height <= 0."));
    EXPECT_TRUE(SameTables(before, out));
  }
}

TEST(LscCropAndResizeTest, LessThanOnePixelLeftFailsAndLeavesTheOutputUntouched) {
  const LscTables before = NumberedTable(3, 3);
  for (const LscCropInfo& crop :
       {Crop(400, 300, 200, 199.5f, 0, 0), Crop(400, 300, 0, 0, 100, 199.25f),
        Crop(400, 300, 300, 300, 0, 0), Crop(0, 0, 0, 0, 0, 0)}) {
    SCOPED_TRACE(crop.ShortDebugString());
    LscTables out = before;
    EXPECT_THAT(LscCropAndResize(crop, 25, 33, SmallTable(), &out),
                StatusIs(kInvalidArgument, "Crop margins are wrong."));
    EXPECT_TRUE(SameTables(before, out));
  }
}

TEST(LscCropAndResizeTest, ExactlyOnePixelLeftIsEnough) {
  LscTables out;
  EXPECT_THAT(LscCropAndResize(Crop(400, 300, 200, 199, 100, 199), 3, 3, SmallTable(), &out),
              IsOk());
}

TEST(LscCropZeroMarginsTest, IsACopyWhateverTheFrameSize) {
  const LscTables in = SmallTable();
  for (const LscCropInfo& crop : {Crop(400, 300, 0, 0, 0, 0), Crop(4032, 3024, 0, 0, 0, 0),
                                  Crop(0, 0, 0, 0, 0, 0), Crop(-5, 1, 0, 0, 0, 0)}) {
    SCOPED_TRACE(crop.ShortDebugString());
    LscTables out = NumberedTable(33, 25);
    ASSERT_THAT(LscCrop(crop, in, &out), IsOk());
    EXPECT_TRUE(SameTables(in, out));
  }
}

TEST(LscCropAndResizeTest, FirstAndLastNodesSampleTheEdgesOfTheCrop) {
  // Frame 400 by 300 over a 5 by 4 grid: node k of a row stands at 100 k, of a column at 100 k.
  // Margins 50 | 150 across give column positions 0.5 to 2.5; margins 100 | 50 down give row
  // positions 1.0 to 2.5. Five by four output nodes make steps of 0.5 in both directions.
  const LscTables in = SmallTable();
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(400, 300, 50, 150, 100, 50), 4, 5, in, &out), IsOk());
  ASSERT_EQ(out.width(), 5);
  ASSERT_EQ(out.height(), 4);

  // Red, by hand.
  // Top left, row 1.0, column 0.5: a = in(1, 0) = 1.25, b = in(1, 1) = 1.4375,
  //   top = 1.25 + 0.1875 * 0.5 = 1.34375; row fraction 0.
  // Top right, row 1.0, column 2.5: a = in(1, 2) = 1.875, b = in(1, 3) = 2.5625,
  //   top = 1.875 + 0.6875 * 0.5 = 2.21875.
  // Bottom left, row 2.5, column 0.5: a = 1.5, b = 1.75, c = in(3, 0) = 1.75, d = 2.0625;
  //   top = 1.625, bottom = 1.90625, value = 1.625 + 0.5 * 0.28125 = 1.765625.
  // Bottom right, row 2.5, column 2.5: a = in(2, 2) = 2.25, b = 3.0, c = 2.625, d = 3.4375;
  //   top = 2.625, bottom = 3.03125, value = 2.625 + 0.5 * 0.40625 = 2.828125.
  // The other planes are the same plus half a unit per plane.
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    const float offset = 0.5f * static_cast<float>(plane);
    EXPECT_EQ(At(out, plane, 0, 0), 1.34375f + offset);
    EXPECT_EQ(At(out, plane, 0, 4), 2.21875f + offset);
    EXPECT_EQ(At(out, plane, 3, 0), 1.765625f + offset);
    EXPECT_EQ(At(out, plane, 3, 4), 2.828125f + offset);
    // Every node, at rows 1.0 + 0.5 i and columns 0.5 + 0.5 j.
    for (int i = 0; i < 4; ++i) {
      for (int j = 0; j < 5; ++j) {
        const float row_position = 1.0f + 0.5f * static_cast<float>(i);
        const float col_position = 0.5f + 0.5f * static_cast<float>(j);
        const int row = std::min(static_cast<int>(row_position), 2);
        const int col = std::min(static_cast<int>(col_position), 3);
        EXPECT_EQ(At(out, plane, i, j),
                  BilinearByHand(in, plane, row, row_position - static_cast<float>(row), col,
                                 col_position - static_cast<float>(col)))
            << "(" << i << ", " << j << ")";
      }
    }
  }
}

TEST(LscCropAndResizeTest, OutputPlanesAreResizedToTheRequestedSize) {
  LscTables out = NumberedTable(40, 40);
  ASSERT_THAT(LscCropAndResize(Crop(400, 300, 50, 150, 100, 50), 4, 5, SmallTable(), &out), IsOk());
  EXPECT_EQ(out.width(), 5);
  EXPECT_EQ(out.height(), 4);
  for (int plane = 0; plane < 4; ++plane) EXPECT_EQ(GetPlane(out, plane).size(), 20u);
}

TEST(LscCropAndResizeTest, PositionsPastTheLastNodeExtrapolateFromTheLastPair) {
  // A negative right margin reaches past the grid: columns 0, 1.25, 2.5, 3.75 and 5.0. The last
  // takes index 3 (the top of the clamp) and fraction 2.0. A negative top margin gives row -0.75:
  // index 0 and fraction -0.75.
  const LscTables in = SmallTable();
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(400, 300, 0, -100, -75, 75), 2, 5, in, &out), IsOk());
  // Rows: -75 * 3 / 300 = -0.75, then + 300 * 3 / (300 * 1) = 3 gives 2.25.
  EXPECT_EQ(At(out, kRed, 0, 4), BilinearByHand(in, kRed, 0, -0.75f, 3, 2.0f));
  EXPECT_EQ(At(out, kRed, 0, 0), BilinearByHand(in, kRed, 0, -0.75f, 0, 0.0f));
  EXPECT_EQ(At(out, kRed, 1, 4), BilinearByHand(in, kRed, 2, 0.25f, 3, 2.0f));
  // in(0, 3) = 2.125, in(0, 4) = 3.0: top = 2.125 + 0.875 * 2 = 3.875, past the last node.
  EXPECT_EQ(BilinearByHand(in, kRed, 0, 0.0f, 3, 2.0f), 3.875f);
}

TEST(LscCropAndResizeTest, OutputWidthOfOneTakesOnlyTheLeftMargin) {
  // One column: position 150 * 4 / 400 = 1.5; the step (a division by zero) is never used.
  const LscTables in = SmallTable();
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(400, 300, 150, 50, 0, 0), 4, 1, in, &out), IsOk());
  ASSERT_EQ(out.width(), 1);
  ASSERT_EQ(out.height(), 4);
  for (int plane = 0; plane < 4; ++plane) {
    for (int row = 0; row < 3; ++row) {
      EXPECT_EQ(At(out, plane, row, 0), BilinearByHand(in, plane, row, 0.0f, 1, 0.5f))
          << kPlaneNames[plane] << " row " << row;
    }
    EXPECT_EQ(At(out, plane, 3, 0), BilinearByHand(in, plane, 2, 1.0f, 1, 0.5f));
  }
  // in(0, 1) = 1.125, in(0, 2) = 1.5: halfway is 1.3125.
  EXPECT_EQ(At(out, kRed, 0, 0), 1.3125f);

  // With no left margin the single column is column 0.
  ASSERT_THAT(LscCropAndResize(Crop(400, 300, 0, 200, 0, 0), 4, 1, in, &out), IsOk());
  for (int row = 0; row < 4; ++row) EXPECT_EQ(At(out, kGr, row, 0), At(in, kGr, row, 0));
}

TEST(LscCropAndResizeTest, ResizeWithZeroMarginsKeepsTheCornersExactlyWhenTheStepIsExact) {
  // 17 by 13 to 33 by 25: steps of exactly 0.5 node, so the accumulated positions are exact and
  // the last node sits on the last input node (index 15, fraction 1.0).
  const LscTables in = RadialTable();
  LscTables small;
  ASSERT_THAT(LscDownsample2x(in, &small), IsOk());
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(4032, 3024, 0, 0, 0, 0), 25, 33, small, &out), IsOk());
  ASSERT_EQ(out.width(), 33);
  ASSERT_EQ(out.height(), 25);
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    EXPECT_EQ(At(out, plane, 0, 0), At(small, plane, 0, 0));
    EXPECT_EQ(At(out, plane, 0, 32), At(small, plane, 0, 16));
    EXPECT_EQ(At(out, plane, 24, 0), At(small, plane, 12, 0));
    EXPECT_EQ(At(out, plane, 24, 32), At(small, plane, 12, 16));
    // A node between two input nodes is their mean: column 1 is halfway from 0 to 1.
    EXPECT_EQ(At(out, plane, 0, 1),
              At(small, plane, 0, 0) + (At(small, plane, 0, 1) - At(small, plane, 0, 0)) * 0.5f);
  }
}

TEST(LscCropAndResizeTest, ResizeWithZeroMarginsKeepsTheCornersUpToPositionRounding) {
  // 33 by 25 to 20 by 15: steps of 32 / 19 and 24 / 14 nodes, not exact in binary. The last
  // position is the sum of 19 (14) rounded additions, each off by at most half a unit in the last
  // place of a value below 32 (2^-20), so it may miss the last node by up to about 2e-5 node along
  // each axis. With neighbouring corner gains less than 0.25 apart, a corner moves by 1e-5 at most;
  // the tolerance of 2e-5 leaves room for the rounding of the blend itself (units of 2.4e-7).
  const LscTables in = RadialTable();
  for (int plane = 0; plane < 4; ++plane) {
    for (const auto& [row, next_row] : {std::pair{0, 1}, std::pair{24, 23}}) {
      for (const auto& [col, next_col] : {std::pair{0, 1}, std::pair{32, 31}}) {
        ASSERT_LT(std::abs(At(in, plane, row, col) - At(in, plane, row, next_col)), 0.25f);
        ASSERT_LT(std::abs(At(in, plane, row, col) - At(in, plane, next_row, col)), 0.25f);
      }
    }
  }
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(4080, 3072, 0, 0, 0, 0), 15, 20, in, &out), IsOk());
  ASSERT_EQ(out.width(), 20);
  ASSERT_EQ(out.height(), 15);
  for (int plane = 0; plane < 4; ++plane) {
    SCOPED_TRACE(kPlaneNames[plane]);
    // The first node is at position 0 exactly.
    EXPECT_EQ(At(out, plane, 0, 0), At(in, plane, 0, 0));
    EXPECT_NEAR(At(out, plane, 0, 19), At(in, plane, 0, 32), 2e-5);
    EXPECT_NEAR(At(out, plane, 14, 0), At(in, plane, 24, 0), 2e-5);
    EXPECT_NEAR(At(out, plane, 14, 19), At(in, plane, 24, 32), 2e-5);
  }
}

// Sampling positions along one axis: the margin's position, then the step added
// once per node in single precision.
std::vector<float> AccumulatedPositions(float margin, float frame, float cropped, int in_nodes,
                                        int out_nodes) {
  std::vector<float> positions;
  float position = margin * static_cast<float>(in_nodes - 1) / frame;
  const float step =
      cropped * static_cast<float>(in_nodes - 1) / (frame * static_cast<float>(out_nodes - 1));
  for (int i = 0; i < out_nodes; ++i) {
    positions.push_back(position);
    position += step;
  }
  return positions;
}

TEST(LscCropAndResizeTest, PositionsAreAccumulatedStepByStep) {
  // A module's geometry: 4032 by 3024 in 4080 by 3072, 12 pixels from the left and 24 from the
  // top, a 17 by 13 grid to 33 by 25.
  const LscTables full = RadialTable();
  LscTables in;
  ASSERT_THAT(LscDownsample2x(full, &in), IsOk());
  const std::vector<float> cols = AccumulatedPositions(12, 4080, 4032, 17, 33);
  const std::vector<float> rows = AccumulatedPositions(24, 3072, 3024, 13, 25);
  // The sums differ from positions computed afresh from the node number, so this test tells the
  // two apart.
  int differing = 0;
  const float col_step = 4032.0f * 16.0f / (4080.0f * 32.0f);
  for (int j = 0; j < 33; ++j) {
    if (cols[j] != cols[0] + static_cast<float>(j) * col_step) ++differing;
  }
  ASSERT_GT(differing, 0);
  // The first position is (margin * 16) / 4080, which differs from margin * (16 / 4080) for this
  // margin.
  ASSERT_NE(cols[0], 12.0f * (16.0f / 4080.0f));

  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(4080, 3072, 12, 36, 24, 24), 25, 33, in, &out), IsOk());
  for (int plane = 0; plane < 4; ++plane) {
    for (int i = 0; i < 25; ++i) {
      for (int j = 0; j < 33; ++j) {
        const int row = std::clamp(static_cast<int>(rows[i]), 0, 11);
        const int col = std::clamp(static_cast<int>(cols[j]), 0, 15);
        ASSERT_EQ(At(out, plane, i, j),
                  BilinearByHand(in, plane, row, rows[i] - static_cast<float>(row), col,
                                 cols[j] - static_cast<float>(col)))
            << kPlaneNames[plane] << " (" << i << ", " << j << ")";
      }
    }
  }
}

TEST(LscCropAndResizeTest, FirstPositionIsMarginTimesSpanThenOverTheFrame) {
  // 12 * 16 / 4080 and 12 * (16 / 4080) differ by one unit in the last place. Neighbours 2^20
  // apart, the first of them cancelling most of the product, make that unit show in the output.
  const float a = -49152.0f;
  const float b = a + 1048576.0f;
  const LscTables in = TablesOf(17, 2, [&](int, int, int col) {
    return col == 0 ? a : col == 1 ? b : 0.0f;
  });
  const float fraction = 12.0f * 16.0f / 4080.0f;
  const float expected = a + (b - a) * fraction;
  ASSERT_NE(expected, a + (b - a) * (12.0f * (16.0f / 4080.0f)));
  LscTables out;
  ASSERT_THAT(LscCropAndResize(Crop(4080, 100, 12, 0, 0, 0), 2, 1, in, &out), IsOk());
  for (int plane = 0; plane < 4; ++plane) {
    EXPECT_EQ(At(out, plane, 0, 0), expected) << kPlaneNames[plane];
    EXPECT_EQ(At(out, plane, 1, 0), expected) << kPlaneNames[plane];
  }
}

TEST(LscCropTest, KeepsTheInputSizeAndSamplesTheCrop) {
  // The calibration geometry of a module: 4032 by 3024 centred in 4080 by 3072, 24 pixels each
  // side, over a 17 by 13 grid. The first node is at 24 * 16 / 4080 across and 24 * 12 / 3072
  // down, both within the first cell.
  const LscTables full = RadialTable();
  LscTables in;
  ASSERT_THAT(LscDownsample2x(full, &in), IsOk());
  LscTables out;
  ASSERT_THAT(LscCrop(Crop(4080, 3072, 24, 24, 24, 24), in, &out), IsOk());
  ASSERT_EQ(out.width(), 17);
  ASSERT_EQ(out.height(), 13);
  const float col_fraction = 24.0f * 16.0f / 4080.0f;
  const float row_fraction = 24.0f * 12.0f / 3072.0f;
  for (int plane = 0; plane < 4; ++plane) {
    EXPECT_EQ(At(out, plane, 0, 0), BilinearByHand(in, plane, 0, row_fraction, 0, col_fraction))
        << kPlaneNames[plane];
    // The last node samples the crop's far edge, 4056 * 16 / 4080 across and 3048 * 12 / 3072
    // down, up to the rounding of 16 and 12 accumulated steps.
    const float last_col = 4056.0f * 16.0f / 4080.0f;
    const float last_row = 3048.0f * 12.0f / 3072.0f;
    EXPECT_NEAR(At(out, plane, 12, 16),
                BilinearByHand(in, plane, 11, last_row - 11.0f, 15, last_col - 15.0f), 1e-5)
        << kPlaneNames[plane];
  }
}

}  // namespace
}  // namespace tavik
