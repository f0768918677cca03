#include "tavik/iq/lsc_table_operations.h"

#include <algorithm>
#include <array>
#include <cfloat>
#include <cmath>

#include "absl/container/inlined_vector.h"
#include "tavik/base/strings.h"

namespace tavik {
namespace {

using google::protobuf::RepeatedField;

// No factory measurement holds a gain below this.
constexpr float kMinimumGain = 0.1f;
// The minimum scan of a calibrated table starts here, so that a table lying wholly above it is
// reported as this value and left alone.
constexpr float kMinimumScanStart = 1.1f;

using Planes = std::array<RepeatedField<float>*, 4>;
using ConstPlanes = std::array<const RepeatedField<float>*, 4>;

Planes MutablePlanes(vosbrine::LscTables* tables) {
  return {tables->mutable_lsc_grid_gain_r(), tables->mutable_lsc_grid_gain_gr(),
          tables->mutable_lsc_grid_gain_gb(), tables->mutable_lsc_grid_gain_b()};
}

ConstPlanes GetPlanes(const vosbrine::LscTables& tables) {
  return {&tables.lsc_grid_gain_r(), &tables.lsc_grid_gain_gr(), &tables.lsc_grid_gain_gb(),
          &tables.lsc_grid_gain_b()};
}

// Whether every plane holds width * height gains, so that node indexing stays in bounds.
bool PlanesMatchGrid(const vosbrine::LscTables& tables) {
  const int64_t nodes = static_cast<int64_t>(tables.width()) * tables.height();
  for (const RepeatedField<float>* plane : GetPlanes(tables)) {
    if (plane->size() != nodes) return false;
  }
  return true;
}

// Sets the grid size and gives every plane width * height gains, new ones 0.
void ResizeTables(int width, int height, vosbrine::LscTables* tables) {
  tables->set_width(width);
  tables->set_height(height);
  for (RepeatedField<float>* plane : MutablePlanes(tables)) plane->Resize(width * height, 0.0f);
}

Status CalibrateGridGain(const RepeatedField<float>& device, const RepeatedField<float>& golden,
                         RepeatedField<float>* tuning) {
  if (device.size() != golden.size() || device.size() != tuning->size()) {
    return InvalidArgumentError("grid_gain size mismatch.");
  }
  if (device.empty()) return OkStatus();
  float max_device = 0.0f;
  float max_golden = 0.0f;
  for (int i = 0; i < device.size(); ++i) {
    if (device[i] < kMinimumGain || golden[i] < kMinimumGain) {
      return InvalidArgumentError(
          StrCat("Device or golden EEPROM LscTables' value is smaller than ", kMinimumGain));
    }
    max_device = std::max(max_device, device[i]);
    max_golden = std::max(max_golden, golden[i]);
  }
  const float scale = max_device / max_golden;
  float* values = tuning->mutable_data();
  for (int i = 0; i < tuning->size(); ++i) {
    values[i] = ((scale * golden[i]) / device[i]) * values[i];
  }
  return OkStatus();
}

// Grid positions of the output nodes along one axis, as an input node index and the fraction
// towards the next node. The position is accumulated by repeated addition.
// On the stack for any grid up to the production size, so that the per-frame crop allocates
// nothing.
struct AxisSamples {
  absl::InlinedVector<int, 64> index;
  absl::InlinedVector<float, 64> fraction;
};

AxisSamples SampleAxis(float margin, float frame, float cropped, int in_nodes, int out_nodes) {
  AxisSamples samples;
  samples.index.resize(out_nodes);
  samples.fraction.resize(out_nodes);
  const float span = static_cast<float>(in_nodes - 1);
  float position = margin * span / frame;
  // Unused with a single output node, which samples the margin only.
  const float step =
      out_nodes > 1 ? cropped * span / (frame * static_cast<float>(out_nodes - 1)) : 0.0f;
  const int last_index = std::max(in_nodes - 2, 0);
  for (int i = 0; i < out_nodes; ++i) {
    // Truncation clamped to [0, in_nodes - 2], without converting a value out of int's range.
    int index = 0;
    if (position >= static_cast<float>(last_index)) {
      index = last_index;
    } else if (position > 0.0f) {
      index = static_cast<int>(position);
    }
    samples.index[i] = index;
    samples.fraction[i] = position - static_cast<float>(index);
    position += step;
  }
  return samples;
}

}  // namespace

Status CalibrateLscTables(const vosbrine::LscTables& device, const vosbrine::LscTables& golden,
                          vosbrine::LscTables* tuning) {
  if (tuning == nullptr) return InvalidArgumentError("tuning is nullptr.");
  const ConstPlanes device_planes = GetPlanes(device);
  const ConstPlanes golden_planes = GetPlanes(golden);
  const Planes tuning_planes = MutablePlanes(tuning);
  // Blue first, red last.
  for (int plane = 3; plane >= 0; --plane) {
    const Status status =
        CalibrateGridGain(*device_planes[plane], *golden_planes[plane], tuning_planes[plane]);
    if (!status.ok()) return status;
  }
  const int count = tuning_planes[0]->size();
  for (const RepeatedField<float>* plane : tuning_planes) {
    if (plane->size() != count) return InvalidArgumentError("LscTables dimensions are wrong.");
  }
  if (count <= 0) return OkStatus();
  float minimum = kMinimumScanStart;
  for (const RepeatedField<float>* plane : tuning_planes) {
    for (float gain : *plane) minimum = std::min(minimum, gain);
  }
  if (minimum < kMinimumGain) {
    return InvalidArgumentError(StrCat("LscTables' value is smaller than ", kMinimumGain));
  }
  // Only a table that dips below 1.0 is renormalised; one that lies above is kept as it is.
  if (minimum < 1.0f) {
    for (RepeatedField<float>* plane : tuning_planes) {
      for (float& gain : *plane) gain = gain / minimum;
    }
  }
  return OkStatus();
}

Status FactorizeLsc(const vosbrine::LscTables& full, vosbrine::LscTables& high_frequency,
                    std::vector<float>& low_frequency) {
  const int width = full.width();
  const int height = full.height();
  if (width % 2 != 1 || height % 2 != 1) {
    return InvalidArgumentError("full_lsc dimensions must be odd.");
  }
  if (width < 3 || height < 3) return InvalidArgumentError("full_lsc must be at least 3 by 3.");
  if (!PlanesMatchGrid(full)) {
    return InvalidArgumentError("full_lsc planes must hold width * height gains.");
  }
  const int cells_wide = width / 2;
  low_frequency.resize(static_cast<size_t>(cells_wide) * (height / 2));

  // The gain common to the four channels at each node.
  const ConstPlanes planes = GetPlanes(full);
  // The work plane, on the stack for grids up to the production 33 by 25.
  absl::InlinedVector<float, 1024> m(static_cast<size_t>(width) * height);
  for (size_t i = 0; i < m.size(); ++i) {
    m[i] = std::min(std::min((*planes[0])[i], (*planes[1])[i]),
                    std::min((*planes[2])[i], (*planes[3])[i]));
  }
  auto at = [&m, width](int row, int col) -> float& { return m[row * width + col]; };

  // Cells: the 3 by 3 minimum around each odd-odd node, floored at 1.0.
  for (int r = 1; r < height; r += 2) {
    for (int c = 1; c < width; c += 2) {
      float cell = FLT_MAX;
      for (int dr = -1; dr <= 1; ++dr) {
        for (int dc = -1; dc <= 1; ++dc) cell = std::min(cell, at(r + dr, c + dc));
      }
      low_frequency[(r / 2) * cells_wide + c / 2] = std::max(cell, 1.0f);
    }
  }

  // The map expanded back to nodes. The column copies run last, which decides the corners.
  for (int r = 1; r < height; r += 2) {
    for (int c = 1; c < width; c += 2) at(r, c) = low_frequency[(r / 2) * cells_wide + c / 2];
  }
  if (width >= 4 && height >= 3) {
    for (int r = 1; r < height; r += 2) {
      for (int c = 2; c <= width - 3; c += 2) at(r, c) = 0.5f * (at(r, c - 1) + at(r, c + 1));
    }
  }
  if (height >= 4) {
    for (int r = 2; r <= height - 3; r += 2) {
      for (int c = 1; c < width - 1; ++c) at(r, c) = 0.5f * (at(r - 1, c) + at(r + 1, c));
    }
  }
  if (width >= 3) {
    for (int c = 1; c <= width - 2; ++c) {
      at(0, c) = at(1, c);
      at(height - 1, c) = at(height - 2, c);
    }
  }
  for (int r = 0; r < height; ++r) {
    at(r, 0) = at(r, 1);
    at(r, width - 1) = at(r, width - 2);
  }

  high_frequency.CopyFrom(full);
  for (RepeatedField<float>* plane : MutablePlanes(&high_frequency)) {
    float* gains = plane->mutable_data();
    for (size_t i = 0; i < m.size(); ++i) gains[i] = gains[i] / m[i];
  }
  return OkStatus();
}

Status LscDownsample2x(const vosbrine::LscTables& in, vosbrine::LscTables* out) {
  if (out == nullptr) return InvalidArgumentError("out is nullptr.");
  if (in.width() % 2 != 1 || in.height() % 2 != 1) {
    return InvalidArgumentError("Input Lsc dimensions must be odd.");
  }
  if (!PlanesMatchGrid(in)) {
    return InvalidArgumentError("Input Lsc planes must hold width * height gains.");
  }
  const int out_width = (in.width() + 1) / 2;
  const int out_height = (in.height() + 1) / 2;
  if (out == &in) {
    const vosbrine::LscTables copy = in;
    return LscDownsample2x(copy, out);
  }
  // Planes of the right size are written in place; others (a new or mis-sized output) resized.
  if (out->width() != out_width || out->height() != out_height || !PlanesMatchGrid(*out)) {
    ResizeTables(out_width, out_height, out);
  }
  const ConstPlanes in_planes = GetPlanes(in);
  const Planes out_planes = MutablePlanes(out);
  for (int plane = 0; plane < 4; ++plane) {
    for (int i = 0; i < out_height; ++i) {
      for (int j = 0; j < out_width; ++j) {
        out_planes[plane]->Set(i * out_width + j, (*in_planes[plane])[2 * i * in.width() + 2 * j]);
      }
    }
  }
  return OkStatus();
}

Status LscCropAndResize(const vosbrine::LscCropInfo& crop, int out_height, int out_width,
                        const vosbrine::LscTables& in, vosbrine::LscTables* out) {
  if (out == nullptr) return InvalidArgumentError("output is nullptr.");
  const int in_width = in.width();
  const int in_height = in.height();
  if (in_width <= 0 || in_height <= 0) return InvalidArgumentError("Input width or height <= 0.");
  if (!PlanesMatchGrid(in)) {
    return InvalidArgumentError("Input Lsc planes must hold width * height gains.");
  }
  if (out_width <= 0 || out_height <= 0) {
    return InvalidArgumentError("Output width or height <= 0.");
  }
  if (crop.margin_left() == 0.0f && crop.margin_right() == 0.0f && crop.margin_top() == 0.0f &&
      crop.margin_bottom() == 0.0f && out_height == in_height && out_width == in_width) {
    if (out != &in) out->CopyFrom(in);
    return OkStatus();
  }
  const float crop_width = crop.width() - crop.margin_left() - crop.margin_right();
  const float crop_height = crop.height() - crop.margin_top() - crop.margin_bottom();
  if (!(crop_width >= 1.0f) || !(crop_height >= 1.0f)) {
    return InvalidArgumentError("Crop margins are wrong.");
  }
  if (out == &in) {
    const vosbrine::LscTables copy = in;
    return LscCropAndResize(crop, out_height, out_width, copy, out);
  }

  const AxisSamples columns =
      SampleAxis(crop.margin_left(), crop.width(), crop_width, in_width, out_width);
  const AxisSamples rows =
      SampleAxis(crop.margin_top(), crop.height(), crop_height, in_height, out_height);
  ResizeTables(out_width, out_height, out);
  const ConstPlanes in_planes = GetPlanes(in);
  const Planes out_planes = MutablePlanes(out);
  // A one-node axis has no next node; it reads its only node twice.
  const int next_column = in_width > 1 ? 1 : 0;
  const int next_row = in_height > 1 ? in_width : 0;
  for (int plane = 0; plane < 4; ++plane) {
    const float* input = in_planes[plane]->data();
    float* output = out_planes[plane]->mutable_data();
    for (int i = 0; i < out_height; ++i) {
      const float row_fraction = rows.fraction[i];
      for (int j = 0; j < out_width; ++j) {
        const float col_fraction = columns.fraction[j];
        const float* corner = input + rows.index[i] * in_width + columns.index[j];
        const float a = corner[0];
        const float b = corner[next_column];
        const float c = corner[next_row];
        const float d = corner[next_row + next_column];
        const float top = a + (b - a) * col_fraction;
        const float bottom = c + (d - c) * col_fraction;
        output[i * out_width + j] = top + row_fraction * (bottom - top);
      }
    }
  }
  return OkStatus();
}

Status LscCrop(const vosbrine::LscCropInfo& crop, const vosbrine::LscTables& in,
               vosbrine::LscTables* out) {
  return LscCropAndResize(crop, in.height(), in.width(), in, out);
}

}  // namespace tavik
