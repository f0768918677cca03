#include "tools/tavik-tune/plot.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <memory>

#include "absl/strings/ascii.h"
#include "absl/strings/str_join.h"
#include "google/protobuf/message.h"
#include "tavik/base/file_path.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"
#include "tavik/iq/zel/zel_tuning_block.h"
#include "tools/tavik-tune/eval.h"
#include "tools/tavik-tune/field_path.h"

namespace tavik::tune {
namespace {

using google::protobuf::Message;
using vosbrine::Level;
using vosbrine::LevelCoordinates;

// More lines than this can't be told apart in one chart.
constexpr size_t kMaxLines = 16;

// A coordinate of the camera state: its option (as eval takes it), its field and the levels
// that split on it.
struct Coordinate {
  const char* option;
  const char* field;
  Level::Type level;
  const char* axis_label;
};

constexpr std::array<Coordinate, 10> kCoordinates = {{
    {"led", "led_influence", Level::LED, "LED influence"},
    {"cct", "cct", Level::CCT, "colour temperature (K)"},
    {"bv", "bv", Level::BV, "brightness value"},
    {"gain", "real_gain", Level::GAIN, "gain"},
    {"exp-ratio", "exp_ratio", Level::EXP_RATIO, "exposure ratio"},
    {"scaler-ratio", "scaler_ratio", Level::SCALER_RATIO, "scaler ratio"},
    {"mired-cct", "mired_cct", Level::MIRED_CCT, "colour temperature (mired)"},
    {"pre-scaler-ratio", "pre_scaler_ratio", Level::PRE_SCALER_RATIO, "pre-scaler ratio"},
    {"frame-count", "frame_count", Level::FRAME_COUNT, "frame count"},
    {"exposure-time-msecs", "exposure_time_msecs", Level::EXPOSURE_TIME_MSECS,
     "exposure time (ms)"},
}};

// By option ("gain") or level type ("GAIN"), in any case.
const Coordinate* FindCoordinate(const std::string& name) {
  const std::string lower = absl::AsciiStrToLower(name);
  for (const Coordinate& coordinate : kCoordinates) {
    if (lower == coordinate.option ||
        lower == absl::AsciiStrToLower(Level::Type_Name(coordinate.level))) {
      return &coordinate;
    }
  }
  return nullptr;
}

const Coordinate* CoordinateOfLevel(Level::Type type) {
  for (const Coordinate& coordinate : kCoordinates) {
    if (coordinate.level == type) return &coordinate;
  }
  return nullptr;
}

const google::protobuf::FieldDescriptor* CoordinateField(const Coordinate& coordinate) {
  return LevelCoordinates::descriptor()->FindFieldByName(coordinate.field);
}

float GetCoordinate(const LevelCoordinates& coordinates, const Coordinate& coordinate) {
  return coordinates.GetReflection()->GetFloat(coordinates, CoordinateField(coordinate));
}

void SetCoordinate(LevelCoordinates& coordinates, const Coordinate& coordinate, float value) {
  coordinates.GetReflection()->SetFloat(&coordinates, CoordinateField(coordinate), value);
}

std::string FileName(const std::string& path) { return path.substr(path.rfind('/') + 1); }

std::string FormatNumber(double value) {
  char text[32];
  std::snprintf(text, sizeof(text), "%g", value);
  return text;
}

// "cct 4750, gain 6": the coordinates set in `coordinates`, by option name, but `skipped`.
std::string DescribeState(const LevelCoordinates& coordinates, const Coordinate* skipped) {
  std::vector<std::string> parts;
  for (const Coordinate& coordinate : kCoordinates) {
    if (&coordinate == skipped) continue;
    if (!coordinates.GetReflection()->HasField(coordinates, CoordinateField(coordinate))) continue;
    parts.push_back(
        StrCat(coordinate.option, " ", FormatNumber(GetCoordinate(coordinates, coordinate))));
  }
  if (parts.empty()) return "every coordinate at 0";
  return StrCat(absl::StrJoin(parts, ", "), ", the others at 0");
}

// Which tuning a figure shows: "KEY (nearest to WANTED)", and "cct 4750, the others at 0".
std::vector<std::string> DescribeSource(const vosbrine::zelmondrake::TuningProvider& provider,
                                        const PlotRequest& request, const Coordinate* swept) {
  const std::string key = ResolvedUsecaseKey(provider, request.usecase);
  const std::string wanted = vosbrine::EncodeUsecaseKey(request.usecase);
  std::string use_case = key;
  if (key != wanted) StrAppend(&use_case, " (nearest to ", wanted, ")");
  return {use_case, DescribeState(request.state.level_coordinates(), swept)};
}

StatusOr<const vosbrine::TuningTree*> FindTree(
    const vosbrine::zelmondrake::TuningProvider& provider, const PlotRequest& request) {
  const Message* tree_set = provider.GetTuningTreeSet(request.usecase, /*fallback=*/true);
  if (tree_set == nullptr) return NotFoundError("the forest is empty");
  const auto* reflection = tree_set->GetReflection();
  if (!reflection->HasField(*tree_set, request.block->tree_field)) {
    return NotFoundError(StrCat(ResolvedUsecaseKey(provider, request.usecase), " has no tree for ",
                                request.block->message->name()));
  }
  return static_cast<const vosbrine::TuningTree*>(
      &reflection->GetMessage(*tree_set, request.block->tree_field));
}

// The regions of every level that splits on `swept` and that an evaluation at `at`, with `swept`
// anywhere, can reach: at levels of other coordinates the walk follows the one or two regions
// that the evaluation takes, as the interpolator picks them.
void CollectRegions(const Level& level, const Coordinate& swept, const LevelCoordinates& at,
                    std::vector<Region>* regions) {
  const auto& nodes = level.nodes();
  if (nodes.empty()) return;
  if (level.type() == swept.level) {
    for (const vosbrine::Node& node : nodes) {
      regions->push_back({node.lower(), node.upper()});
      if (node.has_child_level()) CollectRegions(node.child_level(), swept, at, regions);
    }
    return;
  }
  const Coordinate* coordinate = CoordinateOfLevel(level.type());
  if (coordinate == nullptr) return;  // Evaluation fails there; the sweep will say so.
  const float x = GetCoordinate(at, *coordinate);
  auto reaching = std::lower_bound(
      nodes.begin(), nodes.end(), x,
      [](const vosbrine::Node& node, float value) { return node.upper() < value; });
  if (reaching == nodes.end()) --reaching;
  const int i = static_cast<int>(reaching - nodes.begin());
  const bool single_region = nodes[i].lower() <= x || i == 0;
  for (int j = single_region ? i : i - 1; j <= i; ++j) {
    if (nodes[j].has_child_level()) CollectRegions(nodes[j].child_level(), swept, at, regions);
  }
}

// Even steps over the range, and the region edges inside it, where the value bends.
std::vector<double> SweepPositions(double from, double to, int samples,
                                   const std::vector<Region>& regions) {
  // Coordinates are floats in the camera state: each position is the value evaluated.
  std::vector<double> positions;
  for (int i = 0; i < samples; ++i) {
    positions.push_back(static_cast<float>(from + (to - from) * i / (samples - 1)));
  }
  for (const Region& region : regions) {
    for (double edge : {region.lower, region.upper}) {
      if (edge >= from && edge <= to) positions.push_back(edge);
    }
  }
  std::sort(positions.begin(), positions.end());
  positions.erase(std::unique(positions.begin(), positions.end()), positions.end());
  return positions;
}

StatusOr<Figure> MakeSweepFigure(const vosbrine::zelmondrake::TuningProvider& provider,
                                 const PlotRequest& request) {
  const Coordinate* swept = FindCoordinate(request.along);
  if (swept == nullptr)
    return InvalidArgumentError(StrCat("unknown coordinate '", request.along, "'"));
  std::vector<FieldPath> paths;
  for (const std::string& field : request.fields) {
    StatusOr<FieldPath> path = FieldPath::Parse(request.block->message, field);
    if (!path.ok()) return path.status();
    paths.push_back(*std::move(path));
  }
  StatusOr<const vosbrine::TuningTree*> tree = FindTree(provider, request);
  if (!tree.ok()) return tree.status();

  LineChart chart;
  CollectRegions((*tree)->dynamic_top_level(), *swept, request.state.level_coordinates(),
                 &chart.regions);
  std::sort(chart.regions.begin(), chart.regions.end());
  chart.regions.erase(std::unique(chart.regions.begin(), chart.regions.end()), chart.regions.end());
  if (chart.regions.empty() && (!request.from || !request.to)) {
    return InvalidArgumentError(StrCat(request.block->message->name(), " has no ",
                                       Level::Type_Name(swept->level),
                                       " level at this state: give --from and --to"));
  }
  double low = INFINITY, high = -INFINITY;
  for (const Region& region : chart.regions) {
    low = std::min({low, region.lower, region.upper});
    high = std::max({high, region.lower, region.upper});
  }
  // A margin on each side shows that the end regions hold their values beyond their edges.
  const double margin = high > low ? (high - low) * 0.1 : std::max(std::abs(low) * 0.1, 1.0);
  chart.x_min = request.from.value_or(low - margin);
  chart.x_max = request.to.value_or(high + margin);
  if (!(chart.x_min < chart.x_max)) {
    return InvalidArgumentError(
        StrCat("empty range ", FormatNumber(chart.x_min), " to ", FormatNumber(chart.x_max)));
  }
  const std::vector<double> positions =
      SweepPositions(chart.x_min, chart.x_max, request.samples, chart.regions);

  // values[path][element][position]
  std::vector<std::vector<std::vector<double>>> values(paths.size());
  std::unique_ptr<Message> block = NewBlockMessage(request.block->message);
  bool enabled = true;
  for (size_t p = 0; p < positions.size(); ++p) {
    vosbrine::CameraState state = request.state;
    SetCoordinate(*state.mutable_level_coordinates(), *swept, static_cast<float>(positions[p]));
    const std::string where = StrCat("at ", swept->option, " ", FormatNumber(positions[p]), ": ");
    if (Status status = FillBlock(provider, request.usecase, state, *block); !status.ok()) {
      return Status(status.code(), StrCat(where, status.message()));
    }
    if (const auto* enable = block->GetDescriptor()->FindFieldByName("enable");
        enable != nullptr && p == 0) {
      enabled = block->GetReflection()->GetBool(*block, enable);
    }
    for (size_t i = 0; i < paths.size(); ++i) {
      StatusOr<std::vector<double>> read = paths[i].Read(*block);
      if (!read.ok()) return Status(read.status().code(), StrCat(where, read.status().message()));
      if (p == 0) {
        values[i].resize(read->size());
      } else if (read->size() != values[i].size()) {
        return InvalidArgumentError(StrCat(where, paths[i].text(), " has ", read->size(),
                                           " values, ", values[i].size(), " at ",
                                           FormatNumber(positions[0])));
      }
      for (size_t e = 0; e < read->size(); ++e) values[i][e].push_back((*read)[e]);
    }
  }

  size_t line_count = 0;
  for (const auto& elements : values) line_count += elements.size();
  if (line_count == 0) return InvalidArgumentError("no values to draw: the fields are empty");
  if (line_count > kMaxLines) {
    return InvalidArgumentError(StrCat(line_count, " lines are too many to tell apart (at most ",
                                       kMaxLines, "): pick elements with FIELD[i]"));
  }
  for (size_t i = 0; i < paths.size(); ++i) {
    for (size_t e = 0; e < values[i].size(); ++e) {
      PlotLine line;
      line.label = paths[i].ElementLabel(e);
      line.x = positions;
      line.y = values[i][e];
      // The tuned values: what the regions hold at their edges.
      for (const Region& region : chart.regions) {
        for (double edge : {region.lower, region.upper}) {
          const auto at = std::lower_bound(positions.begin(), positions.end(), edge);
          if (at == positions.end() || *at != edge) continue;
          line.marker_x.push_back(edge);
          line.marker_y.push_back(line.y[at - positions.begin()]);
        }
      }
      chart.lines.push_back(std::move(line));
    }
  }
  chart.x_label = swept->axis_label;
  chart.y_label = line_count == 1 ? chart.lines[0].label : "value";

  Figure figure;
  figure.title = StrCat(request.block->message->name(), " along ", swept->axis_label);
  if (!enabled) StrAppend(&figure.title, ", disabled: its first leaf everywhere");
  figure.subtitle = DescribeSource(provider, request, swept);
  figure.content = std::move(chart);
  return figure;
}

StatusOr<Figure> MakeShadingFigure(const vosbrine::zelmondrake::TuningProvider& provider,
                                   const PlotRequest& request) {
  vosbrine::zelmondrake::LscTuning lsc;
  if (Status status = FillBlock(provider, request.usecase, request.state, lsc); !status.ok()) {
    return status;
  }
  const vosbrine::LscTables& tables = lsc.dynamic_param().lsc_tables();
  const int cells = tables.width() * tables.height();
  if (tables.width() <= 0 || tables.height() <= 0) {
    return InvalidArgumentError(StrCat("lsc_tables is ", tables.width(), " by ", tables.height()));
  }
  HeatMapGrid grid;
  grid.value_label = "gain";
  grid.value_min = INFINITY;
  grid.value_max = -INFINITY;
  for (const auto& [name, plane] :
       {std::pair<const char*, const google::protobuf::RepeatedField<float>*>{
            "R", &tables.lsc_grid_gain_r()},
        {"Gr", &tables.lsc_grid_gain_gr()},
        {"Gb", &tables.lsc_grid_gain_gb()},
        {"B", &tables.lsc_grid_gain_b()}}) {
    if (plane->size() != cells) {
      return InvalidArgumentError(StrCat("lsc_tables: the ", name, " table has ", plane->size(),
                                         " gains, width * height is ", cells));
    }
    HeatMap map{name, tables.width(), tables.height(), {plane->begin(), plane->end()}};
    for (double gain : map.values) {
      grid.value_min = std::min(grid.value_min, gain);
      grid.value_max = std::max(grid.value_max, gain);
    }
    grid.maps.push_back(std::move(map));
  }
  Figure figure;
  figure.title = request.source.calibration_path.empty()
                     ? "LscTuning gain tables, as tuned"
                     : StrCat("LscTuning gain tables, calibrated by ",
                              FileName(request.source.calibration_path));
  figure.subtitle = DescribeSource(provider, request, nullptr);
  figure.content = std::move(grid);
  return figure;
}

// The curves a block holds: y against the knots of `x_path`, or against an even axis over 0..1
// when there is none.
struct CurveBlock {
  const char* block;
  const char* x_path;
  std::array<const char*, 3> y_paths;
  std::array<Rgb, 3> colours;
};

constexpr Rgb kRed = {214, 39, 40}, kGreen = {44, 160, 44}, kBlue = {31, 119, 180};
constexpr std::array<CurveBlock, 2> kCurveBlocks = {{
    {"GammaTuning",
     "static_param.gamma_x",
     {"gamma_r", "gamma_g", "gamma_b"},
     {kRed, kGreen, kBlue}},
    {"SensorGammaTuning", nullptr, {"gamma_y", nullptr, nullptr}, {kGreen}},
}};

const CurveBlock* FindCurveBlock(const BlockType& block) {
  for (const CurveBlock& curves : kCurveBlocks) {
    if (block.message->name() == curves.block) return &curves;
  }
  return nullptr;
}

// The tone curve that the ITP gamma translator hands back as the one in force, when the tuning
// rules: the tuned curve resampled at 64 points.
void AddCurveInForce(const vosbrine::zelmondrake::GammaTuning& gamma, LineChart& chart,
                     std::vector<std::string>& notes) {
  ZelTuningBlock<vosbrine::zelmondrake::GammaTuning> block(gamma);
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kHighQuality;
  GammaItpOutput output{};
  TonemapCurve curve;
  if (Status status = TranslateGamma(block, tonemap, output, curve); !status.ok()) {
    notes.push_back(StrCat("no tone curve in force: ", status.message()));
    return;
  }
  for (const auto& [name, points, colour] : {std::tuple{"red", &curve.red, kRed},
                                             {"green", &curve.green, kGreen},
                                             {"blue", &curve.blue, kBlue}}) {
    PlotLine line;
    line.label = StrCat(name, " in force (ITP)");
    line.style = PlotLine::Style::kDashed;
    line.colour = colour;
    for (const auto& point : *points) {
      line.x.push_back(point.x);
      line.y.push_back(point.y);
    }
    chart.lines.push_back(std::move(line));
  }
}

StatusOr<Figure> MakeCurveFigure(const vosbrine::zelmondrake::TuningProvider& provider,
                                 const PlotRequest& request) {
  const CurveBlock* curves = FindCurveBlock(*request.block);
  if (curves == nullptr) {
    return InvalidArgumentError(StrCat(request.block->message->name(),
                                       " holds no curve: name GammaTuning or SensorGammaTuning"));
  }
  std::unique_ptr<Message> block = NewBlockMessage(request.block->message);
  if (Status status = FillBlock(provider, request.usecase, request.state, *block); !status.ok()) {
    return status;
  }
  LineChart chart;
  chart.x_label = "input";
  chart.y_label = "output";
  chart.x_min = 0;
  chart.x_max = 1;
  chart.lines.push_back(
      {"linear", {0, 1}, {0, 1}, {}, {}, PlotLine::Style::kDotted, Rgb{127, 127, 127}});

  std::vector<double> knots;
  if (curves->x_path != nullptr) {
    StatusOr<FieldPath> path = FieldPath::Parse(request.block->message, curves->x_path);
    if (!path.ok()) return path.status();
    StatusOr<std::vector<double>> read = path->Read(*block);
    if (!read.ok()) return read.status();
    knots = *std::move(read);
  }
  for (size_t i = 0; i < curves->y_paths.size() && curves->y_paths[i] != nullptr; ++i) {
    StatusOr<FieldPath> path = FieldPath::Parse(request.block->message, curves->y_paths[i]);
    if (!path.ok()) return path.status();
    StatusOr<std::vector<double>> y = path->Read(*block);
    if (!y.ok()) return y.status();
    if (curves->x_path == nullptr) {
      // Knots evenly over 0..1, as the translator lays them.
      knots.clear();
      for (size_t k = 0; k < y->size(); ++k) {
        knots.push_back(y->size() > 1 ? static_cast<double>(k) / (y->size() - 1) : 0.0);
      }
    }
    if (y->size() != knots.size()) {
      return InvalidArgumentError(StrCat(curves->y_paths[i], " has ", y->size(), " values, ",
                                         curves->x_path, " ", knots.size()));
    }
    PlotLine line;
    line.label = StrCat(curves->y_paths[i], ", tuned");
    line.x = knots;
    line.y = *y;
    line.marker_x = knots;
    line.marker_y = *y;
    line.colour = curves->colours[i];
    chart.lines.push_back(std::move(line));
  }

  Figure figure;
  figure.title = StrCat(request.block->message->name(), " curves");
  figure.subtitle = DescribeSource(provider, request, nullptr);
  if (const auto* gamma = dynamic_cast<const vosbrine::zelmondrake::GammaTuning*>(block.get())) {
    AddCurveInForce(*gamma, chart, figure.subtitle);
  }
  figure.content = std::move(chart);
  return figure;
}

StatusOr<double> ParseNumber(const std::string& option, const std::string& value) {
  double number = 0;
  const auto [end, error] = std::from_chars(value.data(), value.data() + value.size(), number);
  if (value.empty() || error != std::errc() || end != value.data() + value.size() ||
      !std::isfinite(number)) {
    return InvalidArgumentError(StrCat(option, " takes a number, not '", value, "'"));
  }
  return number;
}

StatusOr<int> ParseCount(const std::string& option, const std::string& value, int low, int high) {
  StatusOr<double> number = ParseNumber(option, value);
  if (!number.ok()) return number.status();
  if (*number != std::floor(*number) || *number < low || *number > high) {
    return InvalidArgumentError(
        StrCat(option, " takes a whole number from ", low, " to ", high, ", not '", value, "'"));
  }
  return static_cast<int>(*number);
}

// eval's options that mean nothing to a picture.
bool IsTranslationOption(const std::string& arg) {
  return arg == "--translate" || arg == "--bayer-pattern" || arg == "--sensor-type" ||
         arg == "--bit-depth" || arg == "--digital-gain";
}

// Takes the options of plot out of `args`, and leaves eval's in `rest`.
Status ParsePlotOptions(const std::vector<std::string>& args, PlotRequest& request,
                        std::vector<std::string>& rest, int& blocks_named) {
  for (size_t i = 0; i < args.size(); ++i) {
    const std::string& arg = args[i];
    if (IsTranslationOption(arg)) return InvalidArgumentError(StrCat("unknown option ", arg));
    const bool takes_value = arg == "-o" || arg == "--output" || arg == "--field" ||
                             arg == "--along" || arg == "--from" || arg == "--to" ||
                             arg == "--samples" || arg == "--width" || arg == "--height";
    if (!takes_value) {
      if (arg == "--block") ++blocks_named;
      rest.push_back(arg);
      continue;
    }
    if (i + 1 >= args.size()) return InvalidArgumentError(StrCat(arg, " needs a value"));
    const std::string& value = args[++i];
    if (arg == "-o" || arg == "--output") {
      request.output = value;
    } else if (arg == "--field") {
      request.fields.push_back(value);
    } else if (arg == "--along") {
      if (FindCoordinate(value) == nullptr) {
        return InvalidArgumentError(StrCat("unknown coordinate '", value, "'"));
      }
      request.along = value;
    } else if (arg == "--from" || arg == "--to") {
      StatusOr<double> number = ParseNumber(arg, value);
      if (!number.ok()) return number.status();
      (arg == "--from" ? request.from : request.to) = *number;
    } else if (arg == "--samples") {
      StatusOr<int> count = ParseCount(arg, value, 2, 100000);
      if (!count.ok()) return count.status();
      request.samples = *count;
    } else {
      StatusOr<int> pixels = ParseCount(arg, value, 64, 10000);
      if (!pixels.ok()) return pixels.status();
      (arg == "--width" ? request.size.width : request.size.height) = *pixels;
    }
  }
  return OkStatus();
}

}  // namespace

const char kPlotHelp[] =
    "Draws a tuning as eval evaluates it, into a PNG or SVG file:\n"
    "  sweep    fields of one block along one coordinate, the other coordinates fixed; the\n"
    "           tuned regions as bands with dashed edges, the tuned values at the edges marked\n"
    "  shading  the four gain tables of LscTuning as heat maps on one colour scale, as tuned,\n"
    "           or calibrated by a device's module calibration as on the device\n"
    "  curves   the curve of GammaTuning (red, green, blue against gamma_x, and the ITP\n"
    "           translator's tone curve in force) or SensorGammaTuning (gamma_y)\n"
    "\n"
    "  -o FILE        the picture, .png or .svg (required)\n"
    "  --sensor S, --mode M, --usecase U   the use case (enum names), all three required;\n"
    "                 the nearest use case when it has no file of its own\n"
    "  --cct, --gain, --bv, --led, --exp-ratio, --scaler-ratio, --mired-cct,\n"
    "  --pre-scaler-ratio, --frame-count, --exposure-time-msecs   coordinates (default 0)\n"
    "  --block NAME   the block, by message (WbTuning) or tree field (wb); sweep needs one,\n"
    "                 curves takes GammaTuning unless told otherwise\n"
    "  --calibration FILE, --device NAME   a device's module calibration, as for eval\n"
    "  --width N, --height N   size in pixels (960 by 600)\n"
    "sweep:\n"
    "  --along COORD  the coordinate swept: an option name above without dashes (cct, gain)\n"
    "                 or a level type (CCT, GAIN)\n"
    "  --field PATH   a number of the block, repeatable: a field of dynamic_param\n"
    "                 (wb_gains), an element (wb_gains[0]), a nested field\n"
    "                 (lsc_tables.lsc_grid_gain_r[412]) or a field of the block\n"
    "                 (static_param.gamma_x[3], enable); a list draws a line per element\n"
    "  --from X, --to X   the range (the tuned regions and a tenth of their span each side)\n"
    "  --samples N    even steps over the range (201); region edges are evaluated besides\n";

StatusOr<PlotRequest> ParsePlotArgs(const std::vector<std::string>& args) {
  PlotRequest request;
  if (args.empty()) return InvalidArgumentError("name what to plot: sweep, shading or curves");
  if (args[0] == "sweep") {
    request.kind = PlotKind::kSweep;
  } else if (args[0] == "shading") {
    request.kind = PlotKind::kShading;
  } else if (args[0] == "curves") {
    request.kind = PlotKind::kCurves;
  } else {
    return InvalidArgumentError(StrCat("unknown plot '", args[0], "': sweep, shading or curves"));
  }
  std::vector<std::string> eval_args;
  int blocks_named = 0;
  if (Status status =
          ParsePlotOptions({args.begin() + 1, args.end()}, request, eval_args, blocks_named);
      !status.ok()) {
    return status;
  }
  StatusOr<EvalRequest> evaluation = ParseEvalArgs(eval_args);
  if (!evaluation.ok()) return evaluation.status();
  request.source.paths = evaluation->paths;
  request.source.calibration_path = evaluation->calibration_path;
  request.source.device_name = evaluation->device_name;
  request.usecase = evaluation->usecase;
  request.state = evaluation->state;
  if (blocks_named > 1) return InvalidArgumentError("one --block at a time");
  if (blocks_named == 1) request.block = evaluation->blocks.front();

  if (request.output.empty()) return InvalidArgumentError("-o FILE is required");
  if (StatusOr<ImageFormat> format = ImageFormatOfPath(request.output); !format.ok()) {
    return format.status();
  }
  switch (request.kind) {
    case PlotKind::kSweep:
      if (request.block == nullptr) return InvalidArgumentError("sweep needs --block");
      if (request.fields.empty()) return InvalidArgumentError("sweep needs --field");
      if (request.along.empty()) return InvalidArgumentError("sweep needs --along");
      if (request.from && request.to && !(*request.from < *request.to)) {
        return InvalidArgumentError("--from must be below --to");
      }
      break;
    case PlotKind::kShading:
      if (request.block == nullptr) request.block = FindBlockType("LscTuning");
      if (request.block->message->name() != "LscTuning") {
        return InvalidArgumentError("shading draws LscTuning only");
      }
      break;
    case PlotKind::kCurves:
      if (request.block == nullptr) request.block = FindBlockType("GammaTuning");
      break;
  }
  if (request.kind != PlotKind::kSweep &&
      (!request.fields.empty() || !request.along.empty() || request.from || request.to)) {
    return InvalidArgumentError("--field, --along, --from and --to are for sweep");
  }
  return request;
}

StatusOr<Figure> MakePlotFigure(const vosbrine::zelmondrake::TuningProvider& provider,
                                const PlotRequest& request) {
  if (request.block == nullptr) return InvalidArgumentError("no block to plot");
  if (request.kind == PlotKind::kSweep && request.samples < 2) {
    return InvalidArgumentError(StrCat("a sweep takes at least 2 steps, not ", request.samples));
  }
  switch (request.kind) {
    case PlotKind::kSweep:
      return MakeSweepFigure(provider, request);
    case PlotKind::kShading:
      return MakeShadingFigure(provider, request);
    case PlotKind::kCurves:
      return MakeCurveFigure(provider, request);
  }
  return InvalidArgumentError("unknown plot");
}

Status RunPlot(const PlotRequest& request) {
  StatusOr<std::unique_ptr<vosbrine::zelmondrake::TuningProvider>> provider =
      LoadForest(request.source);
  if (!provider.ok()) return provider.status();
  StatusOr<Figure> figure = MakePlotFigure(**provider, request);
  if (!figure.ok()) return figure.status();
  return RenderFigure(*figure, request.output, request.size);
}

}  // namespace tavik::tune
