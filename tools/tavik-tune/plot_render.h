// Draws a figure into a PNG or SVG file with PLplot, through its cairo driver: axes, ticks,
// legends, colour bars and images are the library's, so that this unit only lays a figure out.
// PLplot keeps per-process state and is not thread-safe: render from one thread.
#ifndef TOOLS_TAVIK_TUNE_PLOT_RENDER_H_
#define TOOLS_TAVIK_TUNE_PLOT_RENDER_H_

#include <string>

#include "tavik/base/status.h"
#include "tools/tavik-tune/plot_figure.h"

namespace tavik::tune {

enum class ImageFormat { kPng, kSvg };

// By extension: ".png" or ".svg", any case. InvalidArgumentError for anything else.
StatusOr<ImageFormat> ImageFormatOfPath(const std::string& path);

struct ImageSize {
  int width = 960;  // Pixels, or points for SVG.
  int height = 600;
};

// Writes `figure` to `path` in the format its extension names. Everything is checked before
// drawing starts, since PLplot ends the process on its own failures: the path must be writable,
// the format's driver installed (Debian's plplot-driver-cairo), and the figure drawable: lines
// whose x and y have equal lengths, heat maps whose values fill their grids, finite ranges.
Status RenderFigure(const Figure& figure, const std::string& path, ImageSize size = {});

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_PLOT_RENDER_H_
