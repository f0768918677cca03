#include "tools/tavik-tune/plot_render.h"

#include <cmath>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/tavik-tune/testing/image_files.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::IsOkAndHolds;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::PngProblem;
using ::tavik::tune::test::SvgProblem;

Figure LineFigure() {
  LineChart chart;
  chart.x_label = "colour temperature (K)";
  chart.y_label = "value";
  chart.x_min = 1600;
  chart.x_max = 6400;
  chart.regions = {{2000, 3000}, {5000, 6000}};
  PlotLine red;
  red.label = "wb_gains[0]";
  red.x = {1600, 2000, 3000, 5000, 6000, 6400};
  red.y = {1.2, 1.2, 1.2, 2.0, 2.0, 2.0};
  red.marker_x = {2000, 3000, 5000, 6000};
  red.marker_y = {1.2, 1.2, 2.0, 2.0};
  PlotLine reference{"reference # 1",          {1600, 6400},      {1, 1}, {}, {},
                     PlotLine::Style::kDotted, Rgb{127, 127, 127}};
  chart.lines = {red, reference};
  return {"WbTuning along colour temperature (K)", {"KEY", "gain 1, the others at 0"}, chart};
}

Figure MapFigure() {
  HeatMapGrid grid;
  grid.value_label = "gain";
  grid.value_min = 1.0;
  grid.value_max = 2.0;
  for (const char* name : {"R", "Gr", "Gb", "B"}) {
    grid.maps.push_back({name, 3, 2, {2.0, 1.5, 2.0, 1.5, 1.0, 1.5}});
  }
  return {"LscTuning gain tables, as tuned", {"KEY"}, grid};
}

TEST(ImageFormatTest, ByExtensionInAnyCase) {
  EXPECT_THAT(ImageFormatOfPath("out/wb.png"), IsOkAndHolds(ImageFormat::kPng));
  EXPECT_THAT(ImageFormatOfPath("WB.SVG"), IsOkAndHolds(ImageFormat::kSvg));
  EXPECT_THAT(ImageFormatOfPath("wb.jpg"),
              StatusIs(StatusCode::kInvalidArgument, "wb.jpg: write .png or .svg"));
  EXPECT_THAT(ImageFormatOfPath("png"),
              StatusIs(StatusCode::kInvalidArgument, "png: write .png or .svg"));
}

TEST(RenderFigureTest, LineChartAsPng) {
  TempDir directory;
  const std::string path = directory.Path("wb.png");
  ASSERT_THAT(RenderFigure(LineFigure(), path, {640, 400}), IsOk());
  EXPECT_EQ(PngProblem(path, 640, 400), "");
}

TEST(RenderFigureTest, LineChartAsSvg) {
  TempDir directory;
  const std::string path = directory.Path("wb.svg");
  ASSERT_THAT(RenderFigure(LineFigure(), path), IsOk());
  EXPECT_EQ(SvgProblem(path), "");
}

TEST(RenderFigureTest, HeatMapsAsPngAndSvg) {
  TempDir directory;
  ASSERT_THAT(RenderFigure(MapFigure(), directory.Path("lsc.png"), {800, 500}), IsOk());
  EXPECT_EQ(PngProblem(directory.Path("lsc.png"), 800, 500), "");
  ASSERT_THAT(RenderFigure(MapFigure(), directory.Path("lsc.svg")), IsOk());
  EXPECT_EQ(SvgProblem(directory.Path("lsc.svg")), "");
}

TEST(RenderFigureTest, FlatHeatMapsAndChartsWithoutLinesStillDraw) {
  TempDir directory;
  Figure maps = MapFigure();
  auto& grid = std::get<HeatMapGrid>(maps.content);
  grid.value_min = grid.value_max = 1.5;
  ASSERT_THAT(RenderFigure(maps, directory.Path("flat.png")), IsOk());
  EXPECT_EQ(PngProblem(directory.Path("flat.png"), 960, 600), "");
  Figure empty = LineFigure();
  std::get<LineChart>(empty.content).lines.clear();
  ASSERT_THAT(RenderFigure(empty, directory.Path("empty.png")), IsOk());
  EXPECT_EQ(PngProblem(directory.Path("empty.png"), 960, 600), "");
}

TEST(RenderFigureTest, FiguresThatCantBeDrawnAreRefusedBeforeDrawing) {
  TempDir directory;
  const std::string path = directory.Path("bad.png");
  Figure figure = LineFigure();
  auto& chart = std::get<LineChart>(figure.content);
  chart.lines[0].y.pop_back();
  EXPECT_THAT(
      RenderFigure(figure, path),
      StatusIs(StatusCode::kInvalidArgument, "line 'wb_gains[0]' has x and y of other lengths"));
  chart = std::get<LineChart>(LineFigure().content);
  chart.lines[0].y[1] = NAN;
  EXPECT_THAT(
      RenderFigure(figure, path),
      StatusIs(StatusCode::kInvalidArgument, "line 'wb_gains[0]' has values that aren't finite"));
  chart = std::get<LineChart>(LineFigure().content);
  chart.x_max = chart.x_min;
  EXPECT_THAT(RenderFigure(figure, path), StatusIs(StatusCode::kInvalidArgument,
                                                   "x range 1600 to 1600 is empty or not finite"));

  Figure maps = MapFigure();
  auto& grid = std::get<HeatMapGrid>(maps.content);
  grid.maps[1].values.pop_back();
  EXPECT_THAT(RenderFigure(maps, path),
              StatusIs(StatusCode::kInvalidArgument, "heat map 'Gr' has 5 values for 3 by 2"));
  grid = std::get<HeatMapGrid>(MapFigure().content);
  grid.value_min = 3;
  EXPECT_THAT(RenderFigure(maps, path), StatusIs(StatusCode::kInvalidArgument,
                                                 "value range 3 to 2 is inverted or not finite"));
  grid.maps.clear();
  EXPECT_THAT(RenderFigure(maps, path),
              StatusIs(StatusCode::kInvalidArgument, "no heat map to draw"));

  EXPECT_THAT(RenderFigure(LineFigure(), path, {10, 600}),
              StatusIs(StatusCode::kInvalidArgument, "image size 10 by 600 is too small"));
  EXPECT_THAT(
      RenderFigure(LineFigure(), directory.Path("wb.gif")),
      StatusIs(StatusCode::kInvalidArgument, directory.Path("wb.gif") + ": write .png or .svg"));
  // Nothing was drawn.
  EXPECT_EQ(PngProblem(path, 960, 600), path + ": cannot open");
}

TEST(RenderFigureTest, PathThatCantBeWritten) {
  TempDir directory;
  const std::string path = directory.Path("missing/wb.png");
  EXPECT_THAT(RenderFigure(LineFigure(), path),
              StatusIs(StatusCode::kNotFound, path + ": cannot write"));
}

}  // namespace
}  // namespace tavik::tune
