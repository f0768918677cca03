// Black-level tunings for the tests of the translators that read them (black level and digital
// gain).
#ifndef TAVIK_IQ_TESTING_BLC_TUNINGS_H_
#define TAVIK_IQ_TESTING_BLC_TUNINGS_H_

#include <utility>
#include <vector>

#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik::test {

// A tuning with an empty static part and these offset lists.
inline vosbrine::zelmondrake::BlcTuning MakeBlcTuning(std::vector<float> r, std::vector<float> gr,
                                                      std::vector<float> gb, std::vector<float> b,
                                                      bool enable = true) {
  vosbrine::zelmondrake::BlcTuning tuning;
  tuning.set_enable(enable);
  tuning.mutable_static_param();
  vosbrine::zelmondrake::BlcDynamicParam& dynamic = *tuning.mutable_dynamic_param();
  for (float value : r) dynamic.add_offsets_r(value);
  for (float value : gr) dynamic.add_offsets_gr(value);
  for (float value : gb) dynamic.add_offsets_gb(value);
  for (float value : b) dynamic.add_offsets_b(value);
  return tuning;
}

// Four equal offsets in each list.
inline vosbrine::zelmondrake::BlcTuning UniformBlcTuning(float offset, bool enable = true) {
  const std::vector<float> four(4, offset);
  return MakeBlcTuning(four, four, four, four, enable);
}

inline ZelTuningBlock<vosbrine::zelmondrake::BlcTuning> BlcBlock(
    vosbrine::zelmondrake::BlcTuning tuning) {
  return ZelTuningBlock<vosbrine::zelmondrake::BlcTuning>(std::move(tuning));
}

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_BLC_TUNINGS_H_
