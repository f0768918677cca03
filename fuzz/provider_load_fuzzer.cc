// Arbitrary bytes as a tuning file on disk: loading it and filling every block at a few camera
// states must fail cleanly or succeed, never crash, hang or leak.
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

#include "android-base/logging.h"
#include "google/protobuf/stubs/logging.h"
#include "google/protobuf/message.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tools/tavik-tune/tuning_files.h"

namespace {

// One file, rewritten for every input, in a directory of this process.
const std::string& FuzzFilePath() {
  static const std::string* const path = [] {
    char pattern[] = "/tmp/tavik_fuzz_XXXXXX";
    const char* directory = mkdtemp(pattern);
    return new std::string(std::string(directory != nullptr ? directory : "/tmp") +
                           "/fuzz.binarypb");
  }();
  return *path;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  // Broken input makes the library and protobuf complain on every run; only findings matter.
  android::base::SetMinimumLogSeverity(android::base::FATAL);
  google::protobuf::SetLogHandler(nullptr);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string& path = FuzzFilePath();
  if (FILE* file = std::fopen(path.c_str(), "wb")) {
    std::fwrite(data, 1, size, file);
    std::fclose(file);
  }
  auto provider = vosbrine::zelmondrake::TuningProvider::Create({path}, nullptr);
  if (!provider.ok()) return 0;

  vosbrine::TuningUsecase usecase;  // Falls back to whatever key the file has.
  for (float cct : {0.0f, 4000.0f, 1e9f}) {
    vosbrine::CameraState state;
    state.mutable_level_coordinates()->set_cct(cct);
    state.mutable_level_coordinates()->set_real_gain(cct / 500.0f);
    state.mutable_level_coordinates()->set_led_influence(0.5f);
    for (const tavik::tune::BlockType& block_type : tavik::tune::AllBlockTypes()) {
      const google::protobuf::Descriptor* type = block_type.message;
      std::unique_ptr<google::protobuf::Message> block(
          google::protobuf::MessageFactory::generated_factory()->GetPrototype(type)->New());
      (void)(*provider)->FillSubBlockTuning(usecase, state, block.get(), /*fallback=*/true,
                                            /*bypassed=*/cct == 0.0f);
      (void)(*provider)->IsSubBlockEnabled(usecase, type->name(), true);
    }
  }
  return 0;
}
