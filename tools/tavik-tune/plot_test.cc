#include "tools/tavik-tune/plot.h"

#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/sensor_factory_calibration_data.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tools/tavik-tune/testing/image_files.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::CompileTestdata;
using ::tavik::tune::test::PngProblem;
using ::tavik::tune::test::SvgProblem;
using ::tavik::tune::test::TestdataPath;
using ::testing::ElementsAre;
using ::testing::ElementsAreArray;
using ::testing::HasSubstr;
using ::testing::SizeIs;

constexpr char kKey[] = "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER";

// The request of `kind` for the rear viewfinder of `directory`, with `extra` options.
StatusOr<PlotRequest> Request(const std::string& kind, const std::string& directory,
                              std::vector<std::string> extra) {
  std::vector<std::string> args = {kind,        directory,
                                   "--sensor",  "BRIMAL_REAR_GN1_NORMAL",
                                   "--mode",    "FULL_4_3_FULL_15_30FPS",
                                   "--usecase", "VIEWFINDER",
                                   "-o",        "out.png"};
  args.insert(args.end(), extra.begin(), extra.end());
  return ParsePlotArgs(args);
}

// The figure that `kind` with `extra` options makes from the forest of `directory`.
StatusOr<Figure> MakeFigure(const std::string& kind, const std::string& directory,
                            std::vector<std::string> extra) {
  StatusOr<PlotRequest> request = Request(kind, directory, std::move(extra));
  if (!request.ok()) return request.status();
  StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> provider =
      LoadForest(request->source);
  if (!provider.ok()) return provider.status();
  return MakePlotFigure(**provider, *request);
}

// Values of the hand-made tuning as the blend computes them: in single precision, two products
// and a sum.
double Blend(float low, float high, float t) { return (1.0f - t) * low + t * high; }

class PlotTest : public ::testing::Test {
 protected:
  void SetUp() override { CompileTestdata(directory_, "plot/gn1_viewfinder"); }

  StatusOr<Figure> Make(const std::string& kind, std::vector<std::string> extra) {
    return MakeFigure(kind, directory_.path(), std::move(extra));
  }

  TempDir directory_;
};

TEST_F(PlotTest, SweepAlongColourTemperatureEvaluatesStepsAndRegionEdges) {
  StatusOr<Figure> figure = Make("sweep", {"--block", "wb", "--field", "wb_gains[0]", "--along",
                                           "cct", "--gain", "1", "--samples", "5"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "WbTuning along colour temperature (K)");
  EXPECT_THAT(figure->subtitle, ElementsAre(kKey, "gain 1, the others at 0"));
  const LineChart& chart = std::get<LineChart>(figure->content);
  EXPECT_EQ(chart.x_label, "colour temperature (K)");
  EXPECT_EQ(chart.y_label, "wb_gains[0]");
  EXPECT_THAT(chart.regions, ElementsAre(Region{2000, 3000}, Region{5000, 6000}));
  // The regions' span and a tenth of it on each side.
  EXPECT_EQ(chart.x_min, 1600);
  EXPECT_EQ(chart.x_max, 6400);
  ASSERT_THAT(chart.lines, SizeIs(1));
  const PlotLine& red = chart.lines[0];
  EXPECT_EQ(red.label, "wb_gains[0]");
  // Five even steps, and the four region edges.
  EXPECT_THAT(red.x, ElementsAre(1600, 2000, 2800, 3000, 4000, 5000, 5200, 6000, 6400));
  // Tungsten at gain 1 holds 1.2, daylight 2.0; 4000 K lies halfway across the gap.
  const double tungsten = 1.2f, daylight = 2.0f;
  EXPECT_THAT(red.y, ElementsAre(tungsten, tungsten, tungsten, tungsten, Blend(1.2f, 2.0f, 0.5f),
                                 daylight, daylight, daylight, daylight));
  EXPECT_THAT(red.marker_x, ElementsAre(2000, 3000, 5000, 6000));
  EXPECT_THAT(red.marker_y, ElementsAre(tungsten, tungsten, daylight, daylight));
}

TEST_F(PlotTest, SweepPointInTheGapMatchesTheHandBlend) {
  StatusOr<Figure> figure =
      Make("sweep", {"--block", "WbTuning", "--field", "wb_gains", "--along", "CCT", "--gain", "1",
                     "--from", "3000", "--to", "5000", "--samples", "5"});
  ASSERT_THAT(figure, IsOk());
  const LineChart& chart = std::get<LineChart>(figure->content);
  ASSERT_THAT(chart.lines, SizeIs(3));
  EXPECT_EQ(chart.y_label, "value");
  EXPECT_EQ(chart.lines[2].label, "wb_gains[2]");
  EXPECT_THAT(chart.lines[0].x, ElementsAre(3000, 3500, 4000, 4500, 5000));
  // 3500 K lies a quarter of the way from 3000 K to 5000 K.
  EXPECT_EQ(chart.lines[0].y[1], Blend(1.2f, 2.0f, 0.25f));
  EXPECT_EQ(chart.lines[1].y[1], 1.0);
  EXPECT_EQ(chart.lines[2].y[1], Blend(2.6f, 1.6f, 0.25f));
  // Only the edges inside the range are marked.
  EXPECT_THAT(chart.lines[0].marker_x, ElementsAre(3000, 5000));
}

TEST_F(PlotTest, SweepAlongGainFindsTheGainLevelUnderTheRegionOfTheColourTemperature) {
  StatusOr<Figure> figure =
      Make("sweep", {"--block", "wb", "--field", "wb_gains[0]", "--along", "gain", "--cct", "2500",
                     "--from", "0", "--to", "10", "--samples", "2"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "WbTuning along gain");
  EXPECT_THAT(figure->subtitle, ElementsAre(kKey, "cct 2500, the others at 0"));
  const LineChart& chart = std::get<LineChart>(figure->content);
  EXPECT_THAT(chart.regions, ElementsAre(Region{1, 2}, Region{4, 8}));
  EXPECT_THAT(chart.lines[0].x, ElementsAre(0, 1, 2, 4, 8, 10));
  const double low = 1.2f, high = 1.4f;
  EXPECT_THAT(chart.lines[0].y, ElementsAre(low, low, low, high, high, high));

  figure = Make("sweep", {"--block", "wb", "--field", "wb_gains[0]", "--along", "gain", "--cct",
                          "2500", "--from", "1", "--to", "5", "--samples", "5"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(std::get<LineChart>(figure->content).lines[0].y[2], Blend(1.2f, 1.4f, 0.5f));
}

TEST_F(PlotTest, SweepFromTheGapOfAnotherLevelReachesTheLevelsOfBothRegions) {
  // At 4000 K the tungsten region (split by gain) and the daylight leaf both count.
  StatusOr<Figure> figure = Make(
      "sweep", {"--block", "wb", "--field", "wb_gains[0]", "--along", "gain", "--cct", "4000"});
  ASSERT_THAT(figure, IsOk());
  const LineChart& chart = std::get<LineChart>(figure->content);
  EXPECT_THAT(chart.regions, ElementsAre(Region{1, 2}, Region{4, 8}));
  EXPECT_DOUBLE_EQ(chart.x_min, 1 - 0.7);
  EXPECT_DOUBLE_EQ(chart.x_max, 8 + 0.7);
}

TEST_F(PlotTest, SweepWithoutALevelOfTheCoordinateNeedsARange) {
  EXPECT_THAT(Make("sweep",
                   {"--block", "wb", "--field", "wb_gains[0]", "--along", "gain", "--cct", "5500"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "WbTuning has no GAIN level at this state: give --from and --to"));
  StatusOr<Figure> figure =
      Make("sweep", {"--block", "wb", "--field", "wb_gains[0]", "--along", "gain", "--cct", "5500",
                     "--from", "1", "--to", "8", "--samples", "3"});
  ASSERT_THAT(figure, IsOk());
  const LineChart& chart = std::get<LineChart>(figure->content);
  EXPECT_TRUE(chart.regions.empty());
  const double daylight = 2.0f;
  EXPECT_THAT(chart.lines[0].y, ElementsAre(daylight, daylight, daylight));
  EXPECT_TRUE(chart.lines[0].marker_x.empty());
}

TEST_F(PlotTest, DisabledBlockIsFlatAtItsFirstLeafAndSaysSo) {
  StatusOr<Figure> figure = Make(
      "sweep", {"--block", "ccm", "--field", "ccm_gains[0]", "--along", "cct", "--samples", "3"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title,
            "CcmTuning along colour temperature (K), disabled: its first leaf everywhere");
  const double first = 1.9f;
  for (double y : std::get<LineChart>(figure->content).lines[0].y) EXPECT_EQ(y, first);
}

TEST_F(PlotTest, NearestUseCaseIsNamed) {
  StatusOr<PlotRequest> request =
      ParsePlotArgs({"sweep", directory_.path(), "--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode",
                     "FULL_4_3_FULL_15_30FPS", "--usecase", "SNAPSHOT", "-o", "x.svg", "--block",
                     "wb", "--field", "wb_gains[1]", "--along", "cct", "--bv", "3"});
  ASSERT_THAT(request, IsOk());
  auto provider = LoadForest(request->source);
  ASSERT_THAT(provider, IsOk());
  StatusOr<Figure> figure = MakePlotFigure(**provider, *request);
  ASSERT_THAT(figure, IsOk());
  EXPECT_THAT(figure->subtitle, ElementsAre(StrCat(kKey,
                                                   " (nearest to BRIMAL_REAR_GN1_NORMAL, "
                                                   "FULL_4_3_FULL_15_30FPS, SNAPSHOT)"),
                                            "bv 3, the others at 0"));
}

TEST_F(PlotTest, SweepFailuresAreExplained) {
  EXPECT_THAT(Make("sweep", {"--block", "ccm", "--field", "ccm_gains", "--field", "ccm_gains",
                             "--along", "cct"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "18 lines are too many to tell apart (at most 16): pick elements with "
                       "FIELD[i]"));
  EXPECT_THAT(Make("sweep", {"--block", "dmsc", "--field", "enable", "--along", "cct"}),
              StatusIs(StatusCode::kNotFound, StrCat(kKey, " has no tree for DmscTuning")));
  EXPECT_THAT(
      Make("sweep", {"--block", "wb", "--field", "gains", "--along", "cct"}),
      StatusIs(StatusCode::kInvalidArgument, "no field 'gains' in WbTuning or its dynamic_param"));
  EXPECT_THAT(
      Make("sweep", {"--block", "wb", "--field", "wb_gains[3]", "--along", "cct", "--from", "1000",
                     "--to", "2000"}),
      StatusIs(StatusCode::kOutOfRange, "at cct 1000: wb_gains[3] is past the end of 3 values"));
}

TEST_F(PlotTest, ShadingTablesAsTuned) {
  StatusOr<Figure> figure = Make("shading", {"--cct", "2500"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "LscTuning gain tables, as tuned");
  EXPECT_THAT(figure->subtitle, ElementsAre(kKey, "cct 2500, the others at 0"));
  const HeatMapGrid& grid = std::get<HeatMapGrid>(figure->content);
  EXPECT_EQ(grid.value_label, "gain");
  EXPECT_EQ(grid.value_min, 1.0);
  EXPECT_EQ(grid.value_max, 2.5);
  ASSERT_THAT(grid.maps, SizeIs(4));
  EXPECT_EQ(grid.maps[0].title, "R");
  EXPECT_EQ(grid.maps[1].title, "Gr");
  EXPECT_EQ(grid.maps[2].title, "Gb");
  EXPECT_EQ(grid.maps[3].title, "B");
  for (const HeatMap& map : grid.maps) {
    EXPECT_EQ(map.columns, 3);
    EXPECT_EQ(map.rows, 3);
  }
  EXPECT_THAT(grid.maps[0].values, ElementsAre(2.5, 1.5, 2.5, 1.5, 1, 1.5, 2.5, 1.5, 2.5));
  EXPECT_THAT(grid.maps[2].values, ElementsAre(2, 1.25, 2, 1.25, 1, 1.25, 2, 1.25, 2.25));
  EXPECT_THAT(grid.maps[3].values, ElementsAre(1.75, 1.5, 1.75, 1.5, 1, 1.5, 1.75, 1.5, 1.75));
}

TEST(PlotShadingTest, TableOfTheWrongSizeIsRefused) {
  TempDir directory;
  CompileTestdata(directory, "plot/lsc_short_table");
  EXPECT_THAT(MakeFigure("shading", directory.path(), {"--cct", "2500"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "lsc_tables: the Gr table has 8 gains, width * height is 9"));
}

// Shading on the production grid, with a golden record that is 1.0 everywhere but 2.0 at the
// centre node: a flat module then reshapes a flat tuning of 2.0 into 1.0 everywhere but 2.0 at
// the centre.
class PlotCalibratedShadingTest : public ::testing::Test {
 protected:
  static constexpr int kWidth = 33, kHeight = 25, kCentre = 12 * kWidth + 16;

  static vosbrine::LscTables Tables(float everywhere, float centre) {
    vosbrine::LscTables tables;
    tables.set_width(kWidth);
    tables.set_height(kHeight);
    for (auto* plane : {tables.mutable_lsc_grid_gain_r(), tables.mutable_lsc_grid_gain_gr(),
                        tables.mutable_lsc_grid_gain_gb(), tables.mutable_lsc_grid_gain_b()}) {
      plane->Resize(kWidth * kHeight, everywhere);
      plane->Set(kCentre, centre);
    }
    return tables;
  }

  void SetUp() override {
    vosbrine::zelmondrake::LscDynamicParam leaf;
    *leaf.mutable_lsc_tables() = Tables(2.0f, 2.0f);
    vosbrine::zelmondrake::TuningTreeSet set;
    vosbrine::TuningTree& tree = *set.mutable_lsc();
    tree.set_enable(true);
    tree.mutable_static_param()->PackFrom(vosbrine::zelmondrake::LscStaticParam());
    vosbrine::Node* node = tree.mutable_dynamic_top_level()->add_nodes();
    tree.mutable_dynamic_top_level()->set_type(vosbrine::Level::CCT);
    node->set_lower(2000);
    node->set_upper(6000);
    node->mutable_dynamic_param()->PackFrom(leaf);
    vosbrine::TuningUsecaseData data;
    data.mutable_tuning_usecase()->set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
    data.mutable_tuning_usecase()->set_sensor_mode(vosbrine::FULL_4_3_FULL_15_30FPS);
    data.mutable_tuning_usecase()->set_camera_usecase(vosbrine::VIEWFINDER);
    data.mutable_tuning_tree_set()->PackFrom(set);
    directory_.WriteFile("gn1_viewfinder.binarypb", data.SerializeAsString());

    vosbrine::zelmondrake::ZelSensorFactoryCalibrationData calibration;
    *calibration.mutable_lsc() = Tables(1.0f, 2.0f);
    vosbrine::GoldenSensorFactoryCalibrationData golden;
    golden.set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
    golden.mutable_calibration_data()->PackFrom(calibration);
    directory_.WriteFile("gn1_golden_sensor_factory_calibration_data.binarypb",
                         golden.SerializeAsString());
  }

  TempDir directory_;
};

TEST_F(PlotCalibratedShadingTest, AsTunedWithoutCalibration) {
  StatusOr<Figure> figure = MakeFigure("shading", directory_.path(), {});
  ASSERT_THAT(figure, IsOk());
  const HeatMapGrid& grid = std::get<HeatMapGrid>(figure->content);
  EXPECT_EQ(grid.value_min, 2.0);
  EXPECT_EQ(grid.value_max, 2.0);
}

TEST_F(PlotCalibratedShadingTest, CalibratedAsOnTheDevice) {
  StatusOr<Figure> figure = MakeFigure(
      "shading", directory_.path(),
      {"--calibration", TestdataPath("calibration/gn1_flat.textproto"), "--device", "brimal"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "LscTuning gain tables, calibrated by gn1_flat.textproto");
  const HeatMapGrid& grid = std::get<HeatMapGrid>(figure->content);
  // Per plane the scale is the module's peak over the golden one, m / 2, and each gain is
  // multiplied by (m / 2) * golden / m: a half where the golden record is 1.0, one at the centre.
  std::vector<double> expected(kWidth * kHeight, 1.0);
  expected[kCentre] = 2.0;
  ASSERT_THAT(grid.maps, SizeIs(4));
  for (const HeatMap& map : grid.maps) {
    EXPECT_EQ(map.columns, kWidth);
    EXPECT_EQ(map.rows, kHeight);
    EXPECT_THAT(map.values, ElementsAreArray(expected)) << map.title;
  }
  EXPECT_EQ(grid.value_min, 1.0);
  EXPECT_EQ(grid.value_max, 2.0);
}

TEST_F(PlotTest, GammaCurveAgainstItsKnots) {
  StatusOr<Figure> figure = Make("curves", {});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "GammaTuning curves");
  // The translator takes 65 knots only, so it has no curve in force for three.
  EXPECT_THAT(figure->subtitle, ElementsAre(kKey, "every coordinate at 0",
                                            "no tone curve in force: Gamma size is wrong: 3"));
  const LineChart& chart = std::get<LineChart>(figure->content);
  EXPECT_EQ(chart.x_min, 0);
  EXPECT_EQ(chart.x_max, 1);
  ASSERT_THAT(chart.lines, SizeIs(4));
  EXPECT_EQ(chart.lines[0].label, "linear");
  EXPECT_THAT(chart.lines[0].y, ElementsAre(0, 1));
  const double half = 0.5f;
  for (int i = 1; i <= 3; ++i) {
    EXPECT_THAT(chart.lines[i].x, ElementsAre(0, half, 1));
    EXPECT_EQ(chart.lines[i].marker_x, chart.lines[i].x);
    EXPECT_EQ(chart.lines[i].marker_y, chart.lines[i].y);
  }
  EXPECT_EQ(chart.lines[1].label, "gamma_r, tuned");
  EXPECT_THAT(chart.lines[1].y, ElementsAre(0, static_cast<double>(0.75f), 1));
  EXPECT_THAT(chart.lines[2].y, ElementsAre(0, static_cast<double>(0.7f), 1));
  EXPECT_EQ(chart.lines[3].label, "gamma_b, tuned");
  EXPECT_THAT(chart.lines[3].y, ElementsAre(0, static_cast<double>(0.65f), 1));
  EXPECT_EQ(chart.lines[1].colour->red, 214);
}

TEST_F(PlotTest, SensorGammaCurveOnAnEvenAxis) {
  StatusOr<Figure> figure = Make("curves", {"--block", "sensor_gamma", "--gain", "2"});
  ASSERT_THAT(figure, IsOk());
  EXPECT_EQ(figure->title, "SensorGammaTuning curves");
  EXPECT_THAT(figure->subtitle, ElementsAre(kKey, "gain 2, the others at 0"));
  const LineChart& chart = std::get<LineChart>(figure->content);
  ASSERT_THAT(chart.lines, SizeIs(2));
  EXPECT_EQ(chart.lines[1].label, "gamma_y, tuned");
  EXPECT_THAT(chart.lines[1].x, ElementsAre(0, 0.25, 0.5, 0.75, 1));
  EXPECT_THAT(chart.lines[1].y,
              ElementsAre(0, static_cast<double>(0.3f), static_cast<double>(0.55f),
                          static_cast<double>(0.8f), 1));
}

TEST_F(PlotTest, BlockWithoutCurves) {
  EXPECT_THAT(Make("curves", {"--block", "wb"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "WbTuning holds no curve: name GammaTuning or SensorGammaTuning"));
}

TEST(PlotGammaTest, CurveInForceIsTheTranslatorsResampledCurve) {
  // A straight gamma on 65 knots: the ITP translator hands back 64 points on the same line.
  vosbrine::zelmondrake::GammaStaticParam knots;
  vosbrine::zelmondrake::GammaDynamicParam curve;
  for (int i = 0; i <= 64; ++i) {
    knots.add_gamma_x(i / 64.0f);
    curve.add_gamma_r(i / 64.0f);
    curve.add_gamma_g(i / 64.0f);
    curve.add_gamma_b(i / 64.0f);
  }
  vosbrine::zelmondrake::TuningTreeSet set;
  set.mutable_gamma()->set_enable(true);
  set.mutable_gamma()->mutable_static_param()->PackFrom(knots);
  set.mutable_gamma()->mutable_dynamic_top_level()->set_type(vosbrine::Level::CCT);
  set.mutable_gamma()->mutable_dynamic_top_level()->add_nodes()->mutable_dynamic_param()->PackFrom(
      curve);
  vosbrine::TuningUsecaseData data;
  data.mutable_tuning_usecase()->set_camera_sensor(vosbrine::BRIMAL_REAR_GN1_NORMAL);
  data.mutable_tuning_usecase()->set_sensor_mode(vosbrine::FULL_4_3_FULL_15_30FPS);
  data.mutable_tuning_usecase()->set_camera_usecase(vosbrine::VIEWFINDER);
  data.mutable_tuning_tree_set()->PackFrom(set);
  TempDir directory;
  directory.WriteFile("gamma.binarypb", data.SerializeAsString());

  StatusOr<Figure> figure = MakeFigure("curves", directory.path(), {});
  ASSERT_THAT(figure, IsOk());
  EXPECT_THAT(figure->subtitle, SizeIs(2));
  const LineChart& chart = std::get<LineChart>(figure->content);
  ASSERT_THAT(chart.lines, SizeIs(7));
  for (int i = 4; i < 7; ++i) {
    const PlotLine& line = chart.lines[i];
    EXPECT_EQ(line.style, PlotLine::Style::kDashed);
    ASSERT_THAT(line.x, SizeIs(64));
    EXPECT_EQ(line.x.front(), 0);
    EXPECT_EQ(line.x.back(), 1);
    for (size_t k = 0; k < line.x.size(); ++k) EXPECT_NEAR(line.y[k], line.x[k], 1e-6);
  }
  EXPECT_EQ(chart.lines[4].label, "red in force (ITP)");
  EXPECT_EQ(chart.lines[6].label, "blue in force (ITP)");
  EXPECT_EQ(chart.lines[5].x[9], 9 / 63.0f);
}

TEST_F(PlotTest, RequestsMadeByHandAreCheckedToo) {
  StatusOr<PlotRequest> request = Request(
      "sweep", directory_.path(), {"--block", "wb", "--field", "wb_gains", "--along", "cct"});
  ASSERT_THAT(request, IsOk());
  auto provider = LoadForest(request->source);
  ASSERT_THAT(provider, IsOk());
  request->samples = 1;
  EXPECT_THAT(MakePlotFigure(**provider, *request),
              StatusIs(StatusCode::kInvalidArgument, "a sweep takes at least 2 steps, not 1"));
  request->block = nullptr;
  EXPECT_THAT(MakePlotFigure(**provider, *request),
              StatusIs(StatusCode::kInvalidArgument, "no block to plot"));
}

TEST_F(PlotTest, RunPlotWritesThePicture) {
  for (const char* name : {"wb.png", "wb.svg"}) {
    TempDir out;
    StatusOr<PlotRequest> request =
        Request("sweep", directory_.path(),
                {"--block", "wb", "--field", "wb_gains", "--along", "cct", "--width", "480",
                 "--height", "320", "-o", out.Path(name)});
    ASSERT_THAT(request, IsOk());
    ASSERT_THAT(RunPlot(*request), IsOk());
    if (std::string(name).ends_with(".png")) {
      EXPECT_EQ(PngProblem(out.Path(name), 480, 320), "");
    } else {
      EXPECT_EQ(SvgProblem(out.Path(name)), "");
    }
  }
}

TEST(PlotRunTest, ForestThatDoesNotLoad) {
  TempDir empty;
  StatusOr<PlotRequest> request = Request("shading", empty.path(), {"-o", empty.Path("x.png")});
  ASSERT_THAT(request, IsOk());
  EXPECT_THAT(RunPlot(*request), StatusIs(StatusCode::kInvalidArgument, "Empty input paths."));
}

TEST(PlotArgsTest, KindsAndTheirDefaults) {
  StatusOr<PlotRequest> shading =
      Request("shading", "dir", {"--cct", "4750", "--device", "x", "--calibration", "c.textproto"});
  ASSERT_THAT(shading, IsOk());
  EXPECT_EQ(shading->kind, PlotKind::kShading);
  EXPECT_EQ(shading->block->message->name(), "LscTuning");
  EXPECT_THAT(shading->source.paths, ElementsAre("dir"));
  EXPECT_EQ(shading->source.calibration_path, "c.textproto");
  EXPECT_EQ(shading->source.device_name, "x");
  EXPECT_EQ(shading->state.level_coordinates().cct(), 4750.0f);
  EXPECT_EQ(shading->output, "out.png");
  EXPECT_EQ(shading->size.width, 960);
  EXPECT_EQ(shading->size.height, 600);

  StatusOr<PlotRequest> curves = Request("curves", "dir", {"-o", "gamma.svg"});
  ASSERT_THAT(curves, IsOk());
  EXPECT_EQ(curves->kind, PlotKind::kCurves);
  EXPECT_EQ(curves->block->message->name(), "GammaTuning");
  EXPECT_EQ(curves->output, "gamma.svg");

  StatusOr<PlotRequest> sweep =
      Request("sweep", "dir",
              {"--block", "wb", "--field", "wb_gains", "--field", "enable", "--along", "exp-ratio",
               "--width", "640", "--height", "400"});
  ASSERT_THAT(sweep, IsOk());
  EXPECT_EQ(sweep->kind, PlotKind::kSweep);
  EXPECT_THAT(sweep->fields, ElementsAre("wb_gains", "enable"));
  EXPECT_EQ(sweep->along, "exp-ratio");
  EXPECT_EQ(sweep->samples, 201);
  EXPECT_FALSE(sweep->from.has_value());
  EXPECT_EQ(sweep->size.width, 640);
  EXPECT_EQ(sweep->size.height, 400);
}

TEST(PlotArgsTest, BadArgumentsAreExplained) {
  auto sweep = [](std::vector<std::string> extra) {
    std::vector<std::string> args = {"--block", "wb", "--field", "wb_gains", "--along", "cct"};
    args.insert(args.end(), extra.begin(), extra.end());
    return Request("sweep", "dir", args);
  };
  EXPECT_THAT(ParsePlotArgs({}), StatusIs(StatusCode::kInvalidArgument,
                                          "name what to plot: sweep, shading or curves"));
  EXPECT_THAT(
      ParsePlotArgs({"pie", "dir"}),
      StatusIs(StatusCode::kInvalidArgument, "unknown plot 'pie': sweep, shading or curves"));
  EXPECT_THAT(ParsePlotArgs({"shading", "dir", "--sensor", "BRIMAL_REAR_GN1_NORMAL", "--mode",
                             "FULL_4_3_FULL_15_30FPS", "--usecase", "VIEWFINDER"}),
              StatusIs(StatusCode::kInvalidArgument, "-o FILE is required"));
  EXPECT_THAT(ParsePlotArgs({"shading", "dir", "-o"}),
              StatusIs(StatusCode::kInvalidArgument, "-o needs a value"));
  EXPECT_THAT(
      ParsePlotArgs({"shading", "dir", "-o", "x.png"}),
      StatusIs(StatusCode::kInvalidArgument, "--sensor, --mode and --usecase are all required"));
  EXPECT_THAT(Request("shading", "dir", {"-o", "x.gif"}),
              StatusIs(StatusCode::kInvalidArgument, "x.gif: write .png or .svg"));
  EXPECT_THAT(Request("sweep", "dir", {"--field", "wb_gains", "--along", "cct"}),
              StatusIs(StatusCode::kInvalidArgument, "sweep needs --block"));
  EXPECT_THAT(Request("sweep", "dir", {"--block", "wb", "--along", "cct"}),
              StatusIs(StatusCode::kInvalidArgument, "sweep needs --field"));
  EXPECT_THAT(Request("sweep", "dir", {"--block", "wb", "--field", "wb_gains"}),
              StatusIs(StatusCode::kInvalidArgument, "sweep needs --along"));
  EXPECT_THAT(sweep({"--along", "colour"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown coordinate 'colour'"));
  EXPECT_THAT(sweep({"--from", "5000", "--to", "2000"}),
              StatusIs(StatusCode::kInvalidArgument, "--from must be below --to"));
  EXPECT_THAT(sweep({"--from", "warm"}),
              StatusIs(StatusCode::kInvalidArgument, "--from takes a number, not 'warm'"));
  EXPECT_THAT(sweep({"--samples", "1"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "--samples takes a whole number from 2 to 100000, not '1'"));
  EXPECT_THAT(sweep({"--width", "12.5"}),
              StatusIs(StatusCode::kInvalidArgument,
                       "--width takes a whole number from 64 to 10000, not '12.5'"));
  EXPECT_THAT(sweep({"--block", "ccm"}),
              StatusIs(StatusCode::kInvalidArgument, "one --block at a time"));
  EXPECT_THAT(sweep({"--translate"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown option --translate"));
  EXPECT_THAT(sweep({"--colour", "1"}),
              StatusIs(StatusCode::kInvalidArgument, "unknown option --colour"));
  EXPECT_THAT(Request("shading", "dir", {"--block", "wb"}),
              StatusIs(StatusCode::kInvalidArgument, "shading draws LscTuning only"));
  EXPECT_THAT(
      Request("curves", "dir", {"--along", "cct"}),
      StatusIs(StatusCode::kInvalidArgument, "--field, --along, --from and --to are for sweep"));
}

}  // namespace
}  // namespace tavik::tune
