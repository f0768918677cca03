// The provider's forest at the scale of a device with many sensors, modes and use cases: forests
// of generated tuning files, each a real tree set of the sample set under another key, loaded and
// searched. The largest holds 2,000 files: 10 sensors (the sensor enum names 13), 20 sensor modes
// and 10 use cases. Loading should cost the same per file whatever the count; an exact lookup
// should not depend on the forest's size; a nearest-key lookup (a use case with no file of its
// own) may grow with the logarithm of it, not faster.
//
//   BM_ForestScale_Load/<files>           time and heap per load; per_file is the time per file
//   BM_ForestScale_ExactLookup/<files>    GetTuningTreeSet of keys that have a file
//   BM_ForestScale_NearestLookup/<files>  GetTuningTreeSet of keys that have none, with fallback
#include <malloc.h>
#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include "android-base/logging.h"
#include "bench/allocation_counter.h"
#include "benchmark/benchmark.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/zel/tuning_provider.h"

namespace tavik {
namespace {

constexpr int kSensors = 10;
constexpr int kModes = 20;
constexpr int kUsecases = 10;

// Use cases with files come from the first kUsecases of the enum; lookups that must fall back ask
// for the ones after them.
vosbrine::TuningUsecase Usecase(int sensor, int mode, int usecase) {
  vosbrine::TuningUsecase key;
  key.set_camera_sensor(static_cast<vosbrine::CameraSensor>(
      vosbrine::CameraSensor_descriptor()->value(1 + sensor)->number()));
  key.set_sensor_mode(static_cast<vosbrine::SensorMode>(
      vosbrine::SensorMode_descriptor()->value(1 + mode)->number()));
  key.set_camera_usecase(static_cast<vosbrine::CameraUsecase>(
      vosbrine::CameraUsecase_descriptor()->value(1 + usecase)->number()));
  return key;
}

// A directory of `files` tuning files (sensor after sensor, mode after mode, use case after use
// case), made once per process and removed at exit.
class GeneratedForest {
 public:
  static const GeneratedForest& Get(int files) {
    // Destroyed at exit, which removes the files.
    static std::vector<std::unique_ptr<GeneratedForest>> forests;
    for (const auto& forest : forests) {
      if (forest->files_ == files) return *forest;
    }
    forests.push_back(std::unique_ptr<GeneratedForest>(new GeneratedForest(files)));
    return *forests.back();
  }

  ~GeneratedForest() {
    std::error_code ignored;
    if (!directory_.empty()) std::filesystem::remove_all(directory_, ignored);
  }

  const std::string& directory() const { return directory_; }
  int files() const { return files_; }
  bool ok() const { return ok_; }

 private:
  explicit GeneratedForest(int files) : files_(files) {
    std::string pattern = (std::filesystem::temp_directory_path() / "tavik-forest-XXXXXX").string();
    if (mkdtemp(pattern.data()) == nullptr) return;
    directory_ = pattern;
    std::vector<vosbrine::TuningUsecaseData> templates;
    for (const auto& entry : std::filesystem::directory_iterator(TAVIK_SAMPLE_TUNING_DIR)) {
      const std::string path = entry.path().string();
      if (entry.path().extension() != ".binarypb" ||
          path.find("golden_sensor_factory_calibration_data") != std::string::npos) {
        continue;
      }
      vosbrine::TuningUsecaseData data;
      if (ReadBinaryProto(path, data).ok()) templates.push_back(std::move(data));
    }
    if (templates.empty()) return;
    for (int i = 0; i < files; ++i) {
      vosbrine::TuningUsecaseData data = templates[i % templates.size()];
      *data.mutable_tuning_usecase() =
          Usecase(i / (kModes * kUsecases), i / kUsecases % kModes, i % kUsecases);
      std::ofstream out(directory_ + "/" + std::to_string(i) + ".binarypb", std::ios::binary);
      if (!data.SerializeToOstream(&out)) return;
    }
    ok_ = true;
  }

  int files_;
  std::string directory_;
  bool ok_ = false;
};

std::unique_ptr<vosbrine::zelmondrake::TuningProvider> Load(const GeneratedForest& forest) {
  auto provider = vosbrine::zelmondrake::TuningProvider::Create({forest.directory()}, nullptr);
  return provider.ok() ? std::move(*provider) : nullptr;
}

// The bytes that malloc holds for the program.
double HeapBytes() { return static_cast<double>(mallinfo2().uordblks); }

void BM_ForestScale_Load(benchmark::State& state) {
  const GeneratedForest& forest = GeneratedForest::Get(static_cast<int>(state.range(0)));
  if (!forest.ok()) {
    state.SkipWithError("could not write the tuning files");
    return;
  }
  double heap = 0;
  bench::AllocationCounter allocations;
  for (auto _ : state) {
    const double before = HeapBytes();
    std::unique_ptr<vosbrine::zelmondrake::TuningProvider> provider = Load(forest);
    heap += HeapBytes() - before;
    if (provider == nullptr) {
      state.SkipWithError("the forest did not load");
      break;
    }
    state.PauseTiming();
    provider.reset();
    state.ResumeTiming();
  }
  allocations.Report(state);
  state.counters["files"] = forest.files();
  state.counters["per_file"] = benchmark::Counter(
      forest.files(), benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
  state.counters["heap_MB"] = benchmark::Counter(heap / 1e6, benchmark::Counter::kAvgIterations);
  state.counters["heap_kB_per_file"] =
      benchmark::Counter(heap / 1e3 / forest.files(), benchmark::Counter::kAvgIterations);
}

// One forest loaded at a time, for the lookups.
const vosbrine::zelmondrake::TuningProvider* LoadedForest(int files) {
  static int loaded_files = 0;
  static auto* const provider = new std::unique_ptr<vosbrine::zelmondrake::TuningProvider>;
  if (loaded_files != files) {
    provider->reset();
    const GeneratedForest& forest = GeneratedForest::Get(files);
    if (forest.ok()) *provider = Load(forest);
    loaded_files = files;
  }
  return provider->get();
}

void RunLookups(benchmark::State& state, bool with_file) {
  const int files = static_cast<int>(state.range(0));
  const vosbrine::zelmondrake::TuningProvider* provider = LoadedForest(files);
  if (provider == nullptr) {
    state.SkipWithError("the forest did not load");
    return;
  }
  // Keys spread over the forest; those without a file take a use case after the generated ones.
  std::vector<vosbrine::TuningUsecase> keys;
  for (int i = 0; i < 64; ++i) {
    const int file = static_cast<int>((i * 7919L) % files);
    keys.push_back(Usecase(file / (kModes * kUsecases), file / kUsecases % kModes,
                           with_file ? file % kUsecases : kUsecases + i % 4));
  }
  bench::AllocationCounter allocations;
  size_t next = 0;
  for (auto _ : state) {
    const google::protobuf::Message* tree_set =
        provider->GetTuningTreeSet(keys[next], /*fallback=*/!with_file);
    benchmark::DoNotOptimize(tree_set);
    if (++next == keys.size()) next = 0;
  }
  allocations.Report(state);
}

void BM_ForestScale_ExactLookup(benchmark::State& state) { RunLookups(state, true); }
void BM_ForestScale_NearestLookup(benchmark::State& state) { RunLookups(state, false); }

BENCHMARK(BM_ForestScale_ExactLookup)->Arg(20)->Arg(200)->Arg(2000);
BENCHMARK(BM_ForestScale_NearestLookup)->Arg(20)->Arg(200)->Arg(2000);
BENCHMARK(BM_ForestScale_Load)->Arg(200)->Arg(2000)->Unit(benchmark::kMillisecond)->Iterations(3);

}  // namespace
}  // namespace tavik

int main(int argc, char** argv) {
  // Loading reports "." and ".." as rejected files.
  android::base::SetMinimumLogSeverity(android::base::FATAL);
  benchmark::Initialize(&argc, argv);
  benchmark::RunSpecifiedBenchmarks();
  benchmark::Shutdown();
  return 0;
}
