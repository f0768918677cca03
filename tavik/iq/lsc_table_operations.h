// Operations on lens-shading tables: calibration against factory measurements, factoring into a
// coarse grey map and a remainder, decimation, and bilinear crop and resize. A table is a grid of
// width by height nodes with four gain planes stored row by row; a gain of 1.0 means no
// correction. All arithmetic is single precision, in the order written, so results are bit-exact.
#ifndef TAVIK_IQ_LSC_TABLE_OPERATIONS_H_
#define TAVIK_IQ_LSC_TABLE_OPERATIONS_H_

#include <vector>

#include "tavik/base/status.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/lsc_tables.pb.h"

namespace tavik {

// Reshapes `tuning` (tuned on the golden module) for this device: each gain is multiplied by
// golden / device, each measurement normalised by its own peak; then, if the smallest gain fell
// below 1.0, every gain is divided by it. Planes are done blue, Gb, Gr, red; after a failure the
// planes done so far stay changed, so the tuning must be treated as spoilt.
TAVIK_EXPORT Status CalibrateLscTables(const vosbrine::LscTables& device,
                                       const vosbrine::LscTables& golden,
                                       vosbrine::LscTables* tuning);

// Splits `full` (odd width and height, at least 3 by 3) into a coarse grey gain map of
// (width / 2) by (height / 2) cells, row by row in `low_frequency`, and the remainder
// `high_frequency`, so that full = remainder times the map expanded to node resolution.
TAVIK_EXPORT Status FactorizeLsc(const vosbrine::LscTables& full,
                                 vosbrine::LscTables& high_frequency,
                                 std::vector<float>& low_frequency);

// Keeps every other node of a table of odd width and height: (width + 1) / 2 by
// (height + 1) / 2 nodes, border rows and columns included.
TAVIK_EXPORT Status LscDownsample2x(const vosbrine::LscTables& in, vosbrine::LscTables* out);

// Resamples the part of `in` that `crop` leaves inside its margins to `out_width` by
// `out_height` nodes, bilinearly. Input node 0 stands at frame coordinate 0 and the last node at
// the crop's full width (height); the first and last output nodes sample the crop's edges.
TAVIK_EXPORT Status LscCropAndResize(const vosbrine::LscCropInfo& crop, int out_height,
                                     int out_width, const vosbrine::LscTables& in,
                                     vosbrine::LscTables* out);

// LscCropAndResize to the input's own size.
TAVIK_EXPORT Status LscCrop(const vosbrine::LscCropInfo& crop, const vosbrine::LscTables& in,
                            vosbrine::LscTables* out);

}  // namespace tavik

#endif  // TAVIK_IQ_LSC_TABLE_OPERATIONS_H_
