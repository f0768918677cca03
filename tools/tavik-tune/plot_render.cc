#include "tools/tavik-tune/plot_render.h"

#include <plplot.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdio>
#include <string_view>
#include <vector>

#include "absl/strings/ascii.h"
#include "tavik/base/file_path.h"
#include "tavik/base/strings.h"

// PLplot's cairo driver reaches fontconfig through pango, which keeps its configuration for the
// life of the process and drops some of it unreachable; PLplot itself keeps the handles of the
// drivers it loads through libltdl. Neither is ours to free, so leak checks leave them out.
extern "C" const char* __lsan_default_suppressions() {
  return "leak:libfontconfig.so\nleak:libltdl.so\n";
}

namespace tavik::tune {
namespace {

// Colour map 0: fixed entries first, then one per line of the chart.
enum Colour : PLINT {
  kBackground = 0,
  kInk = 1,
  kRegionBand = 2,
  kRegionEdge = 3,
  kGrid = 4,
  kFirstLineColour = 5,
};

// Lines without a colour of their own take these in turn (the "tableau" cycle: distinct in hue
// and lightness, and readable by most colour-blind readers).
constexpr std::array<Rgb, 10> kLineCycle = {{{31, 119, 180},
                                             {255, 127, 14},
                                             {44, 160, 44},
                                             {214, 39, 40},
                                             {148, 103, 189},
                                             {140, 86, 75},
                                             {227, 119, 194},
                                             {127, 127, 127},
                                             {188, 189, 34},
                                             {23, 190, 207}}};

// A filled circle of the driver's font, for tuned points.
constexpr char kMarker[] = "\u25CF";
constexpr double kMarkerScale = 0.55;

// PLplot reads '#' as the start of an escape sequence; a literal one is written twice.
std::string PlotText(std::string_view text) {
  std::string escaped;
  for (char c : text) {
    escaped += c;
    if (c == '#') escaped += '#';
  }
  return escaped;
}

const char* DeviceName(ImageFormat format) {
  return format == ImageFormat::kPng ? "pngcairo" : "svgcairo";
}

// A device PLplot doesn't know makes plinit ask for one on the terminal: look first.
bool DeviceInstalled(const char* name) {
  constexpr int kMaxDevices = 128;
  std::array<const char*, kMaxDevices> menus{};
  std::array<const char*, kMaxDevices> names{};
  const char** menu_list = menus.data();
  const char** name_list = names.data();
  int count = kMaxDevices;
  plgFileDevs(&menu_list, &name_list, &count);
  for (int i = 0; i < count; ++i) {
    if (names[i] != nullptr && std::string_view(names[i]) == name) return true;
  }
  return false;
}

bool AllFinite(const std::vector<double>& values) {
  return std::all_of(values.begin(), values.end(), [](double v) { return std::isfinite(v); });
}

Status CheckChart(const LineChart& chart) {
  if (!std::isfinite(chart.x_min) || !std::isfinite(chart.x_max) || chart.x_min >= chart.x_max) {
    return InvalidArgumentError(
        StrCat("x range ", chart.x_min, " to ", chart.x_max, " is empty or not finite"));
  }
  for (const PlotLine& line : chart.lines) {
    if (line.x.size() != line.y.size() || line.marker_x.size() != line.marker_y.size()) {
      return InvalidArgumentError(StrCat("line '", line.label, "' has x and y of other lengths"));
    }
    if (!AllFinite(line.x) || !AllFinite(line.y) || !AllFinite(line.marker_x) ||
        !AllFinite(line.marker_y)) {
      return InvalidArgumentError(StrCat("line '", line.label, "' has values that aren't finite"));
    }
  }
  return OkStatus();
}

Status CheckMaps(const HeatMapGrid& grid) {
  if (grid.maps.empty()) return InvalidArgumentError("no heat map to draw");
  if (!std::isfinite(grid.value_min) || !std::isfinite(grid.value_max) ||
      grid.value_min > grid.value_max) {
    return InvalidArgumentError(StrCat("value range ", grid.value_min, " to ", grid.value_max,
                                       " is inverted or not finite"));
  }
  for (const HeatMap& map : grid.maps) {
    if (map.columns <= 0 || map.rows <= 0 ||
        map.values.size() != static_cast<size_t>(map.columns) * map.rows) {
      return InvalidArgumentError(StrCat("heat map '", map.title, "' has ", map.values.size(),
                                         " values for ", map.columns, " by ", map.rows));
    }
    if (!AllFinite(map.values)) {
      return InvalidArgumentError(
          StrCat("heat map '", map.title, "' has values that aren't finite"));
    }
  }
  return OkStatus();
}

// The smallest and largest of `values`, widened when they meet so that a flat line sits in the
// middle of the chart, and padded so that no line runs along the frame.
std::pair<double, double> PaddedRange(double low, double high) {
  if (low == high) {
    const double half = std::max(std::abs(low) * 0.1, 0.5);
    return {low - half, high + half};
  }
  const double pad = (high - low) * 0.06;
  return {low - pad, high + pad};
}

void SetColour(PLINT index, const Rgb& colour) {
  plscol0(index, colour.red, colour.green, colour.blue);
}

// Text sizes, relative to the driver's default.
constexpr double kTextScale = 0.75;
constexpr double kTitleScale = 1.15;
constexpr double kSubtitleScale = 0.8;

// The title and the lines under it, above the current viewport.
void DrawTitles(const Figure& figure) {
  // Offsets count in heights of the current text; subtitle lines stand 2.1 heights apart.
  constexpr double kLineSpacing = 2.1;
  plcol0(kInk);
  const double lines = static_cast<double>(figure.subtitle.size());
  plschr(0, kTextScale * kTitleScale);
  plmtex("t", 1.2 + (0.8 + lines * kLineSpacing) * kSubtitleScale / kTitleScale, 0.5, 0.5,
         PlotText(figure.title).c_str());
  plschr(0, kTextScale * kSubtitleScale);
  for (size_t i = 0; i < figure.subtitle.size(); ++i) {
    plmtex("t", 0.8 + (lines - 1 - static_cast<double>(i)) * kLineSpacing, 0.5, 0.5,
           PlotText(figure.subtitle[i]).c_str());
  }
  plschr(0, kTextScale);
}

void DrawLineChart(const Figure& figure, const LineChart& chart) {
  double y_min = INFINITY, y_max = -INFINITY;
  for (const PlotLine& line : chart.lines) {
    for (const std::vector<double>* values : {&line.y, &line.marker_y}) {
      for (double v : *values) {
        y_min = std::min(y_min, v);
        y_max = std::max(y_max, v);
      }
    }
  }
  if (y_min > y_max) y_min = y_max = 0;  // Nothing to draw but axes.
  const auto [low, high] = PaddedRange(y_min, y_max);

  plscmap0n(kFirstLineColour + static_cast<PLINT>(chart.lines.size()));
  SetColour(kBackground, {255, 255, 255});
  SetColour(kInk, {0, 0, 0});
  SetColour(kRegionBand, {226, 232, 240});
  SetColour(kRegionEdge, {150, 160, 175});
  SetColour(kGrid, {215, 215, 215});
  for (size_t i = 0; i < chart.lines.size(); ++i) {
    SetColour(kFirstLineColour + static_cast<PLINT>(i),
              chart.lines[i].colour.value_or(kLineCycle[i % kLineCycle.size()]));
  }

  pladv(0);
  plschr(0, kTextScale);
  // Room on the right for the legend, and above for three lines of titles.
  plvpor(0.08, 0.73, 0.1, 0.82);
  plwind(chart.x_min, chart.x_max, low, high);

  // Regions behind everything: a band over each, its edges dashed.
  for (const Region& region : chart.regions) {
    const double left = std::max(region.lower, chart.x_min);
    const double right = std::min(region.upper, chart.x_max);
    if (left > right) continue;
    const std::array<PLFLT, 4> x = {left, right, right, left};
    const std::array<PLFLT, 4> y = {low, low, high, high};
    plcol0(kRegionBand);
    plfill(4, x.data(), y.data());
  }
  plcol0(kRegionEdge);
  pllsty(2);
  plwidth(1.0);
  for (const Region& region : chart.regions) {
    for (double edge : {region.lower, region.upper}) {
      if (edge < chart.x_min || edge > chart.x_max) continue;
      pljoin(edge, low, edge, high);
    }
  }
  pllsty(1);

  plcol0(kInk);
  plwidth(1.0);
  plbox("bcnst", 0, 0, "bcnstv", 0, 0);
  pllab(PlotText(chart.x_label).c_str(), PlotText(chart.y_label).c_str(), "");
  DrawTitles(figure);

  std::vector<PLINT> opts, line_colours, line_styles, symbol_colours, symbol_numbers;
  std::vector<PLFLT> line_widths, symbol_scales;
  std::vector<std::string> labels;
  for (size_t i = 0; i < chart.lines.size(); ++i) {
    const PlotLine& line = chart.lines[i];
    const PLINT colour = kFirstLineColour + static_cast<PLINT>(i);
    const PLINT style = line.style == PlotLine::Style::kSolid    ? 1
                        : line.style == PlotLine::Style::kDashed ? 3
                                                                 : 2;
    plcol0(colour);
    pllsty(style);
    plwidth(2.0);
    if (!line.x.empty()) plline(static_cast<PLINT>(line.x.size()), line.x.data(), line.y.data());
    pllsty(1);
    if (!line.marker_x.empty()) {
      plschr(0, kTextScale * kMarkerScale);
      plstring(static_cast<PLINT>(line.marker_x.size()), line.marker_x.data(), line.marker_y.data(),
               kMarker);
      plschr(0, kTextScale);
    }
    opts.push_back(PL_LEGEND_LINE | (line.marker_x.empty() ? 0 : PL_LEGEND_SYMBOL));
    line_colours.push_back(colour);
    line_styles.push_back(style);
    line_widths.push_back(2.0);
    symbol_colours.push_back(colour);
    symbol_scales.push_back(kMarkerScale);
    symbol_numbers.push_back(1);
    labels.push_back(PlotText(line.label));
  }
  if (chart.lines.empty()) return;
  std::vector<const char*> texts, symbols;
  for (const std::string& label : labels) {
    texts.push_back(label.c_str());
    symbols.push_back(kMarker);
  }
  const std::vector<PLINT> text_colours(labels.size(), kInk);
  PLFLT legend_width = 0, legend_height = 0;
  plwidth(1.0);
  pllegend(&legend_width, &legend_height, PL_LEGEND_BACKGROUND,
           PL_POSITION_RIGHT | PL_POSITION_OUTSIDE | PL_POSITION_VIEWPORT, 0.02, 0.0, 0.06,
           kBackground, kInk, 1, 0, 0, static_cast<PLINT>(labels.size()), opts.data(), 1.0, 0.8,
           2.0, 0.0, text_colours.data(), texts.data(), nullptr, nullptr, nullptr, nullptr,
           line_colours.data(), line_styles.data(), line_widths.data(), symbol_colours.data(),
           symbol_scales.data(), symbol_numbers.data(), symbols.data());
}

// Viridis, by five stops: perceptually even and readable in grey.
void SetHeatColourMap() {
  const std::array<PLFLT, 5> position = {0.0, 0.25, 0.5, 0.75, 1.0};
  const std::array<PLFLT, 5> red = {68 / 255.0, 59 / 255.0, 33 / 255.0, 94 / 255.0, 253 / 255.0};
  const std::array<PLFLT, 5> green = {1 / 255.0, 82 / 255.0, 145 / 255.0, 201 / 255.0, 231 / 255.0};
  const std::array<PLFLT, 5> blue = {84 / 255.0, 139 / 255.0, 140 / 255.0, 98 / 255.0, 37 / 255.0};
  plscmap1n(256);
  plscmap1l(/*itype=rgb*/ 1, 5, position.data(), red.data(), green.data(), blue.data(), nullptr);
}

void DrawHeatMaps(const Figure& figure, const HeatMapGrid& grid) {
  plscmap0n(kFirstLineColour);
  SetColour(kBackground, {255, 255, 255});
  SetColour(kInk, {0, 0, 0});
  SetHeatColourMap();
  pladv(0);
  plschr(0, kTextScale);

  // Up to two maps a row, in the area left of the colour bar.
  const int count = static_cast<int>(grid.maps.size());
  const int columns = std::min(count, 2);
  const int rows = (count + columns - 1) / columns;
  constexpr double kLeft = 0.03, kRight = 0.86, kBottom = 0.04, kTop = 0.84;
  const double cell_width = (kRight - kLeft) / columns;
  const double cell_height = (kTop - kBottom) / rows;
  double value_low = grid.value_min, value_high = grid.value_max;
  if (value_low == value_high) std::tie(value_low, value_high) = PaddedRange(value_low, value_high);

  for (int i = 0; i < count; ++i) {
    const HeatMap& map = grid.maps[i];
    const int column = i % columns;
    const int row = i / columns;
    const double x0 = kLeft + column * cell_width;
    const double y1 = kTop - row * cell_height;
    plvpas(x0 + 0.04, x0 + cell_width - 0.02, y1 - cell_height + 0.05, y1 - 0.04,
           static_cast<PLFLT>(map.rows) / map.columns);
    // Row 0 at the top, as the table lies over the image. The window runs downwards, so
    // plimage, which wants rising bounds, draws value row r at world rows r..r+1.
    plwind(0, map.columns, map.rows, 0);
    std::vector<std::vector<PLFLT>> columns_of_values(map.columns, std::vector<PLFLT>(map.rows));
    std::vector<const PLFLT*> column_pointers(map.columns);
    for (int c = 0; c < map.columns; ++c) {
      for (int r = 0; r < map.rows; ++r) {
        columns_of_values[c][r] = map.values[static_cast<size_t>(r) * map.columns + c];
      }
      column_pointers[c] = columns_of_values[c].data();
    }
    plimage(column_pointers.data(), map.columns, map.rows, 0, map.columns, 0, map.rows, value_low,
            value_high, 0, map.columns, 0, map.rows);
    plcol0(kInk);
    plbox("bcnst", 0, 0, "bcnstv", 0, 0);
    plmtex("t", 0.7, 0.5, 0.5, PlotText(map.title).c_str());
  }

  // One colour bar for all maps, on the right, as tall as the maps' area.
  plvpor(kLeft, kRight, kBottom, kTop);
  plwind(0, 1, 0, 1);
  DrawTitles(figure);
  const char* axis_options[] = {"bcvtm"};
  const std::string label = PlotText(grid.value_label);
  const char* labels[] = {label.c_str()};
  const PLINT label_options[] = {PL_COLORBAR_LABEL_RIGHT};
  const PLFLT ticks[] = {0.0};
  const PLINT sub_ticks[] = {0};
  constexpr int kSteps = 64;
  std::array<PLFLT, kSteps> steps;
  for (int i = 0; i < kSteps; ++i) {
    steps[i] = value_low + (value_high - value_low) * i / (kSteps - 1);
  }
  const PLFLT* values[] = {steps.data()};
  const PLINT value_counts[] = {kSteps};
  PLFLT bar_width = 0, bar_height = 0;
  plcolorbar(&bar_width, &bar_height, PL_COLORBAR_IMAGE,
             PL_POSITION_RIGHT | PL_POSITION_OUTSIDE | PL_POSITION_VIEWPORT, 0.03, 0.0, 0.03, 0.8,
             kBackground, kInk, 1, 0, 0, kInk, 1.0, 1, label_options, labels, 1, axis_options,
             ticks, sub_ticks, value_counts, values);
}

// PLplot calls this before it ends the process on a failure of its own; say that it was the
// plotting library.
int OnPlplotExit(const char* message) {
  std::fprintf(stderr, "tavik-tune: the plotting library failed: %s\n", message);
  return 1;
}

}  // namespace

StatusOr<ImageFormat> ImageFormatOfPath(const std::string& path) {
  const std::string extension = absl::AsciiStrToLower(std::string(Extension(path)));
  if (extension == "png") return ImageFormat::kPng;
  if (extension == "svg") return ImageFormat::kSvg;
  return InvalidArgumentError(StrCat(path, ": write .png or .svg"));
}

Status RenderFigure(const Figure& figure, const std::string& path, ImageSize size) {
  StatusOr<ImageFormat> format = ImageFormatOfPath(path);
  if (!format.ok()) return format.status();
  if (size.width < 64 || size.height < 64) {
    return InvalidArgumentError(
        StrCat("image size ", size.width, " by ", size.height, " is too small"));
  }
  if (const LineChart* chart = std::get_if<LineChart>(&figure.content)) {
    if (Status status = CheckChart(*chart); !status.ok()) return status;
  } else if (Status status = CheckMaps(std::get<HeatMapGrid>(figure.content)); !status.ok()) {
    return status;
  }
  const char* device = DeviceName(*format);
  if (!DeviceInstalled(device)) {
    return FailedPreconditionError(
        StrCat("PLplot has no ", device, " driver: install Debian's plplot-driver-cairo"));
  }
  // PLplot would end the process on a file it can't open.
  if (std::FILE* file = std::fopen(path.c_str(), "wb"); file != nullptr) {
    std::fclose(file);
  } else {
    return NotFoundError(StrCat(path, ": cannot write"));
  }

  // A stream of its own for each figure, so that one run can write several.
  PLINT stream = 0;
  plmkstrm(&stream);
  plsexit(OnPlplotExit);
  plsdev(device);
  plsfnam(path.c_str());
  plspage(0, 0, size.width, size.height, 0, 0);
  plscolbg(255, 255, 255);
  plinit();
  if (const LineChart* chart = std::get_if<LineChart>(&figure.content)) {
    DrawLineChart(figure, *chart);
  } else {
    DrawHeatMaps(figure, std::get<HeatMapGrid>(figure.content));
  }
  plend1();
  return OkStatus();
}

}  // namespace tavik::tune
