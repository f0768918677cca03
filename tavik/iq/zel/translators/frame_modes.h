// The camera service's per-frame processing requests that the denoising and detail translators
// read: whether noise reduction and edge enhancement run at all.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_FRAME_MODES_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_FRAME_MODES_H_

#include <cstdint>

namespace tavik {

// The frame's noise-reduction mode, in the camera service's numbering. Only "off" (0) is told
// apart here: a stage that denoises is bypassed under it, and any other value runs the tuning.
enum class DenoiseMode : int32_t {
  kOff = 0,
  kHighQuality = 2,
};

// The frame's edge-enhancement mode, in the camera service's numbering. Only "off" (0) is told
// apart here: the noise-add stage is bypassed under it, and any other value runs the tuning.
enum class EdgeMode : int32_t {
  kOff = 0,
  kHighQuality = 2,
};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_FRAME_MODES_H_
