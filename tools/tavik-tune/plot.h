// Pictures of a tuning, evaluated as the controller evaluates it: a block's fields swept along one
// coordinate with the tuned regions behind them, the shading gain tables as heat maps, and the
// gamma curves.
#ifndef TOOLS_TAVIK_TUNE_PLOT_H_
#define TOOLS_TAVIK_TUNE_PLOT_H_

#include <optional>
#include <string>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tools/tavik-tune/forest.h"
#include "tools/tavik-tune/plot_figure.h"
#include "tools/tavik-tune/plot_render.h"
#include "tools/tavik-tune/tuning_files.h"

namespace tavik::tune {

enum class PlotKind {
  kSweep,    // Fields of a block along one coordinate, the others fixed.
  kShading,  // The four gain tables of LscTuning.
  kCurves,   // The curve of GammaTuning or SensorGammaTuning.
};

struct PlotRequest {
  PlotKind kind = PlotKind::kSweep;
  ForestSource source;
  vosbrine::TuningUsecase usecase;
  vosbrine::CameraState state;  // The fixed coordinates.
  const BlockType* block = nullptr;
  // kSweep: the fields (field_path.h), the coordinate by its option name ("cct", "gain"), the
  // range (the tuned regions' span and a margin when unset) and the number of even steps; the
  // region edges are evaluated besides.
  std::vector<std::string> fields;
  std::string along;
  std::optional<double> from;
  std::optional<double> to;
  int samples = 201;
  std::string output;  // .png or .svg
  ImageSize size;
};

// Parses "KIND DIR --sensor S --mode M --usecase U [coordinates] [--block NAME] -o OUT" with the
// options of kPlotHelp; eval's options name the use case, the coordinates and the calibration.
StatusOr<PlotRequest> ParsePlotArgs(const std::vector<std::string>& args);

// The figure of a request, from a loaded forest.
StatusOr<Figure> MakePlotFigure(const vosbrine::zelmondrake::TuningProvider& provider,
                                const PlotRequest& request);

// Loads the forest, makes the figure and writes it.
Status RunPlot(const PlotRequest& request);

// The text of --help.
extern const char kPlotHelp[];

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_PLOT_H_
