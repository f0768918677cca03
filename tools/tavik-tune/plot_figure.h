// What a picture of a tuning shows, as plain data: the lines of a chart with the tuned regions
// behind them, or gain tables as heat maps. Figures are made from evaluated tunings
// (plot.h) and drawn by the plotting library (plot_render.h); tests check what is drawn here.
#ifndef TOOLS_TAVIK_TUNE_PLOT_FIGURE_H_
#define TOOLS_TAVIK_TUNE_PLOT_FIGURE_H_

#include <cstdint>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace tavik::tune {

struct Rgb {
  uint8_t red = 0;
  uint8_t green = 0;
  uint8_t blue = 0;
};

// One line of a chart: points joined in order, and markers on some of them.
struct PlotLine {
  enum class Style { kSolid, kDashed, kDotted };

  std::string label;
  std::vector<double> x;
  std::vector<double> y;
  // Points marked with a symbol: the tuned values at the region edges, or the knots of a curve.
  std::vector<double> marker_x;
  std::vector<double> marker_y;
  Style style = Style::kSolid;
  std::optional<Rgb> colour;  // A colour of the chart's cycle when unset.
};

// A closed span [lower, upper] of one level's region along the chart's x axis.
struct Region {
  double lower = 0;
  double upper = 0;

  friend bool operator==(const Region&, const Region&) = default;
  friend auto operator<=>(const Region&, const Region&) = default;
};

struct LineChart {
  std::string x_label;
  std::string y_label;
  double x_min = 0;
  double x_max = 1;
  // Regions where the tuning holds a value flat; between them it is blended. Drawn as bands with
  // their edges marked.
  std::vector<Region> regions;
  std::vector<PlotLine> lines;
};

// A grid of values, row by row from the top row: value (row, column) at row * columns + column.
struct HeatMap {
  std::string title;
  int columns = 0;
  int rows = 0;
  std::vector<double> values;
};

// Heat maps side by side on one colour scale.
struct HeatMapGrid {
  std::string value_label;
  double value_min = 0;
  double value_max = 1;
  std::vector<HeatMap> maps;
};

struct Figure {
  std::string title;
  // Lines under the title: the use case, the camera state, notes.
  std::vector<std::string> subtitle;
  std::variant<LineChart, HeatMapGrid> content;
};

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_PLOT_FIGURE_H_
