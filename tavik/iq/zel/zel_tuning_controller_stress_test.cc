// Many service threads producing frames through one controller while sessions come and go: no
// fence may be lost and each thread's fences must fire in the order its frames were handed back.
// CI also runs this under ThreadSanitizer, which checks the locking of the block cache, the
// session count and the queue.

#include <atomic>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <random>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include "gtest/gtest.h"
#include "tavik/base/fence.h"
#include "tavik/base/strings.h"
#include "tavik/base/time.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_block.h"
#include "tavik/iq/zel/zel_tuning_controller.h"

namespace tavik {
namespace {

constexpr int kServiceThreads = 4;
constexpr int kDefaultFramesPerThread = 2000;
constexpr uint32_t kSeed = 20261105;

// A fence that must fire is waited for this long: far beyond any scheduling delay.
Duration MustBeSignalled() { return Seconds(120); }

// Frames per service thread: 2000, or TAVIK_STRESS_FRAMES for a longer soak. The default runs in
// well under a second in a normal build and in seconds under ThreadSanitizer, so it isn't scaled
// down there.
int FramesPerThread() {
  if (const char* frames = std::getenv("TAVIK_STRESS_FRAMES"); frames != nullptr) {
    const int value = std::atoi(frames);
    if (value > 0) return value;
  }
  return kDefaultFramesPerThread;
}

UseCase MakeUseCase(int32_t type) {
  UseCase use_case;
  use_case.type = type;
  use_case.first_party = true;
  return use_case;
}

TuningInfo RearInfo() {
  TuningInfo info;
  info.sensor_mode_info.sensor_name = "GN1";
  info.sensor_mode_info.mode_width = 4080;
  info.sensor_mode_info.mode_height = 3072;
  info.sensor_mode_info.sensor_fps_range = {15.0f, 30.0f};
  info.sensor_mode_info.target_fps_range = {15.0f, 30.0f};
  info.image_size = {4080, 3072};
  info.module_spec = {.facing = 0, .lens_type = 0, .sensor_kind = 0};
  return info;
}

// What a service thread produces for: threads 0 and 3 share a use case and a camera-state path,
// so they meet on the same cache entries; threads 1 and 2 keep other use cases.
struct Stream {
  UseCase use_case;
  TuningInfo info;
};

Stream StreamOf(int thread_index) {
  switch (thread_index) {
    case 1: {  // Rear video recording, 1080p at 30 to 60 fps.
      TuningInfo info = RearInfo();
      info.sensor_mode_info.sensor_fps_range = {30.0f, 60.0f};
      info.sensor_mode_info.target_fps_range = {30.0f, 60.0f};
      info.image_size = {1920, 1080};
      return {MakeUseCase(3), info};
    }
    case 2: {  // Front viewfinder, binned.
      TuningInfo info = RearInfo();
      info.sensor_mode_info.sensor_name = "IMX663";
      info.sensor_mode_info.binning_x = 2;
      info.sensor_mode_info.binning_y = 2;
      info.image_size = {1632, 1224};
      info.module_spec.facing = 1;
      return {MakeUseCase(0), info};
    }
    default:  // Rear viewfinder.
      return {MakeUseCase(0), RearInfo()};
  }
}

// A camera state that moves every other frame, so that some frames hit the cache and the rest
// refresh what they ask for.
TuningCoordinates StateAt(int frame) {
  const int step = frame / 2;
  TuningCoordinates coordinates;
  coordinates.real_gain = 1.0f + static_cast<float>(step % 64);
  coordinates.cct = 2500.0f + 100.0f * static_cast<float>(step % 50);
  coordinates.bv = -2.0f + 0.25f * static_cast<float>(step % 40);
  coordinates.exp_ratio = 1.0f + static_cast<float>(step % 4);
  coordinates.mired_cct = 1.0e6f / coordinates.cct;
  coordinates.scaler_ratio = 1.0f;
  coordinates.pre_scaler_ratio = 1.0f;
  coordinates.frame_count = step;
  coordinates.exposure_time_msecs = 10.0f + static_cast<float>(step % 20);
  return coordinates;
}

// The block that a request for `name` yields: SensorGammaTuning leads to SharpTuning.
std::string_view YieldedBlock(std::string_view name) {
  return name == "SensorGammaTuning" ? "SharpTuning" : name;
}

struct ThreadReport {
  int frames_done = 0;
  int failed_interpolations = 0;
  int missing_blocks = 0;
  int failed_queries = 0;
  int lost_fences = 0;
  int out_of_order = 0;
  std::string first_failure;

  void Fail(int* counter, std::string what) {
    ++*counter;
    if (first_failure.empty()) first_failure = std::move(what);
  }
};

void RunServiceThread(ZelTuningController& controller, int thread_index, int frames,
                      ThreadReport* report) {
  std::mt19937 rng(kSeed + static_cast<uint32_t>(thread_index));
  std::bernoulli_distribution requested(0.3);
  std::uniform_int_distribution<size_t> any_block(0, kZelBlockCount - 1);
  std::uniform_int_distribution<size_t> batch_size(1, 4);
  const Stream stream = StreamOf(thread_index);

  // Frames handed back but not yet seen fired, oldest first.
  std::vector<std::shared_ptr<TuningPoint>> pending;
  size_t batch = batch_size(rng);
  for (int frame = 0; frame < frames; ++frame) {
    std::shared_ptr<TuningPoint> point =
        controller.CreateTuningPoint(stream.use_case, stream.info, StateAt(frame));

    FlatHashSet<std::string_view> names;
    for (std::string_view name : kZelBlockNames) {
      if (requested(rng)) names.insert(name);
    }
    StatusOr<std::shared_ptr<TuningBundle>> bundle = controller.Interpolate(point, names);
    if (!bundle.ok()) {
      report->Fail(&report->failed_interpolations,
                   StrCat("frame ", frame, ": ", bundle.status().ToString()));
    } else {
      for (std::string_view name : names) {
        const TuningBlock* block = (*bundle)->GetBlock(YieldedBlock(name));
        if (block == nullptr || block->GetName() != YieldedBlock(name)) {
          report->Fail(&report->missing_blocks, StrCat("frame ", frame, ": no ", name));
        }
      }
      // Read a block's contents while other threads replace the cache entries.
      if (const TuningBlock* blc = (*bundle)->GetBlock("BlcTuning"); blc != nullptr) {
        const auto* message = GetTuningProto<vosbrine::zelmondrake::BlcTuning>(*blc);
        if (message == nullptr || message->dynamic_param().offsets_r_size() == 0 ||
            message->dynamic_param().offsets_r(0) < 0.0f) {
          report->Fail(&report->missing_blocks, StrCat("frame ", frame, ": bad black"));
        }
      }
    }
    if (StatusOr<bool> enabled = controller.IsBlockEnabled(*point, kZelBlockNames[any_block(rng)]);
        !enabled.ok()) {
      report->Fail(&report->failed_queries,
                   StrCat("frame ", frame, ": ", enabled.status().ToString()));
    }

    if (Status signalled = controller.SignalProducedTuningPoint(point); !signalled.ok()) {
      report->Fail(&report->lost_fences, signalled.ToString());
    }
    pending.push_back(std::move(point));

    if (pending.size() < batch && frame + 1 < frames) continue;
    // Wait for the newest frame only; once it has fired, every earlier frame of this thread must
    // have fired too.
    if (Status done = pending.back()->WaitForDone(MustBeSignalled()); !done.ok()) {
      report->Fail(&report->lost_fences, StrCat("frame ", frame, ": ", done.ToString()));
    }
    for (size_t i = 0; i + 1 < pending.size(); ++i) {
      if (!pending[i]->GetFence()->IsSignalled()) {
        report->Fail(&report->out_of_order,
                     StrCat("frame ", frame - static_cast<int>(pending.size() - 1 - i),
                            " not signalled after frame ", frame));
      }
      if (Status done = pending[i]->WaitForDone(MustBeSignalled()); !done.ok()) {
        report->Fail(&report->lost_fences, done.ToString());
      }
    }
    report->frames_done += static_cast<int>(pending.size());
    pending.clear();
    batch = batch_size(rng);
  }
}

TEST(ZelTuningControllerStressTest, FencesOfConcurrentFramesAreNeverLostAndFireInOrder) {
  ZelTuningController controller("brimal", {TAVIK_SAMPLE_TUNING_DIR}, {});
  ASSERT_NE(controller.provider(), nullptr);
  const int frames = FramesPerThread();

  // The main session stays open throughout, so the queue that the service threads push to never
  // changes under them; the extra sessions only count.
  controller.NotifyCaptureSessionOpen();

  std::atomic<bool> service_done{false};
  std::atomic<int> session_cycles{0};
  std::thread session_thread([&] {
    std::mt19937 rng(kSeed);
    std::uniform_int_distribution<int> depth(1, 3);
    do {
      const int opened = depth(rng);
      for (int i = 0; i < opened; ++i) controller.NotifyCaptureSessionOpen();
      std::this_thread::yield();
      for (int i = 0; i < opened; ++i) controller.NotifyCaptureSessionClose();
      session_cycles.fetch_add(1, std::memory_order_relaxed);
    } while (!service_done.load(std::memory_order_acquire));
  });

  std::vector<ThreadReport> reports(kServiceThreads);
  std::vector<std::thread> service_threads;
  for (int t = 0; t < kServiceThreads; ++t) {
    service_threads.emplace_back([&controller, t, frames, &reports] {
      RunServiceThread(controller, t, frames, &reports[t]);
    });
  }
  for (std::thread& thread : service_threads) thread.join();
  service_done.store(true, std::memory_order_release);
  session_thread.join();

  controller.NotifyCaptureSessionClose();

  EXPECT_GT(session_cycles.load(), 0);
  for (int t = 0; t < kServiceThreads; ++t) {
    const ThreadReport& report = reports[t];
    SCOPED_TRACE(StrCat("service thread ", t, ", first failure: ", report.first_failure));
    EXPECT_EQ(report.frames_done, frames);
    EXPECT_EQ(report.failed_interpolations, 0);
    EXPECT_EQ(report.missing_blocks, 0);
    EXPECT_EQ(report.failed_queries, 0);
    EXPECT_EQ(report.lost_fences, 0);
    EXPECT_EQ(report.out_of_order, 0);
  }
}

}  // namespace
}  // namespace tavik
