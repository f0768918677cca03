// Arbitrary trees, camera states and leaf types: evaluating a tree must fail cleanly or succeed,
// never crash, hang or leak.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>

#include "android-base/logging.h"
#include "google/protobuf/stubs/logging.h"
#include "tavik/iq/private/interpolator.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  // Broken input makes the library and protobuf complain on every run; only findings matter.
  android::base::SetMinimumLogSeverity(android::base::FATAL);
  google::protobuf::SetLogHandler(nullptr);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider input(data, size);
  vosbrine::CameraState state;
  vosbrine::LevelCoordinates* coordinates = state.mutable_level_coordinates();
  const auto* fields = coordinates->GetDescriptor();
  for (int i = 0; i < fields->field_count(); ++i) {
    if (input.ConsumeBool()) {
      coordinates->GetReflection()->SetFloat(coordinates, fields->field(i),
                                             input.ConsumeFloatingPoint<float>());
    }
  }
  // Leaf types with scalars, repeated floats, nested and repeated messages.
  std::unique_ptr<google::protobuf::Message> out;
  switch (input.ConsumeIntegralInRange<int>(0, 5)) {
    case 0: out = std::make_unique<vosbrine::zelmondrake::BlcDynamicParam>(); break;
    case 1: out = std::make_unique<vosbrine::zelmondrake::GammaDynamicParam>(); break;
    case 2: out = std::make_unique<vosbrine::zelmondrake::LscDynamicParam>(); break;
    case 3: out = std::make_unique<vosbrine::zelmondrake::ClutStaticParam>(); break;
    case 4: out = std::make_unique<vosbrine::zelmondrake::SkindDynamicParam>(); break;
    default: out = std::make_unique<vosbrine::zelmondrake::GtnrDynamicParam>(); break;
  }
  const std::string bytes = input.ConsumeRemainingBytesAsString();
  vosbrine::TuningTree tree;
  if (!tree.ParseFromString(bytes)) return 0;
  (void)tavik::InterpolateTree(tree, state, out.get());
  return 0;
}
