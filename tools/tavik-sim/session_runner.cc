#include "tools/tavik-sim/session_runner.h"

#include <chrono>
#include <memory>
#include <string_view>

#include "tavik/base/containers.h"
#include "tavik/base/strings.h"
#include "tavik/base/trace.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tools/common/hardware_values.h"

namespace tavik::sim {
namespace {

int64_t MonotonicNanoseconds() {
  return std::chrono::duration_cast<std::chrono::nanoseconds>(
             std::chrono::steady_clock::now().time_since_epoch())
      .count();
}

// Times one stage into the record and shows it on the trace timeline.
class StageTimer {
 public:
  StageTimer(FrameRecord& record, Stage stage)
      : record_(record),
        stage_(stage),
        trace_(kStageNames[stage]),
        start_(MonotonicNanoseconds()) {}
  ~StageTimer() { record_.stage_nanoseconds[stage_] = MonotonicNanoseconds() - start_; }

 private:
  FrameRecord& record_;
  Stage stage_;
  ScopedTrace trace_;
  int64_t start_;
};

const FlatHashSet<std::string_view>& AllBlockNames() {
  static const auto* const names =
      new FlatHashSet<std::string_view>(kZelBlockNames.begin(), kZelBlockNames.end());
  return *names;
}

// The point's key, and the forest key that answers it with the nearest-key fallback.
void ResolveKey(const ZelTuningController& controller, const ZelTuningPoint& point,
                FrameRecord& record) {
  StatusOr<std::shared_ptr<vosbrine::TuningUsecase>> usecase =
      controller.GenerateTuningUseCase(point, "");
  if (!usecase.ok()) {
    record.failures.push_back({"use case key", std::string(usecase.status().message())});
    return;
  }
  record.key = vosbrine::EncodeUsecaseKey(**usecase);
  const vosbrine::zelmondrake::TuningProvider* provider = controller.provider();
  if (provider == nullptr) return;
  const google::protobuf::Message* tree_set =
      provider->GetTuningTreeSet(**usecase, /*fallback=*/true);
  for (const auto& [key, message] : provider->forest()) {
    if (message.get() == tree_set) {
      record.resolved_key = key;
      break;
    }
  }
}

}  // namespace

std::vector<FrameRecord> RunSession(ZelTuningController& controller,
                                    const std::vector<SimFrame>& frames,
                                    const RunOptions& options) {
  std::vector<FrameRecord> records;
  records.reserve(frames.size());
  std::array<const TuningBlock*, kZelBlockCount> previous_blocks{};
  // Bundles are kept for one frame so that the previous frame's block pointers stay valid.
  std::shared_ptr<TuningBundle> previous_bundle;
  std::shared_ptr<TuningPoint> previous_point;

  // Each form's records are made once and reused frame after frame, as a pipeline node does.
  std::vector<TranslatorRecords> translations;
  for (const TranslatorForm* form : TranslatorTable()) translations.emplace_back(*form);

  controller.NotifyCaptureSessionOpen();
  for (const SimFrame& frame : frames) {
    FrameRecord& record = records.emplace_back();
    record.frame = frame;
    ScopedTrace frame_trace(StrCat("frame ", frame.index));

    std::shared_ptr<TuningPoint> point;
    {
      StageTimer timer(record, kCreate);
      point = controller.CreateTuningPoint(frame.use_case, frame.tuning_info, frame.coordinates);
    }
    if (point == nullptr) {
      record.failures.push_back({"CreateTuningPoint", "no tuning point"});
      continue;
    }
    const auto* zel_point = dynamic_cast<const ZelTuningPoint*>(point.get());
    if (zel_point != nullptr) ResolveKey(controller, *zel_point, record);

    {
      StageTimer timer(record, kEnabledChecks);
      for (size_t i = 0; i < kZelBlockCount; ++i) {
        StatusOr<bool> enabled = controller.IsBlockEnabled(*point, kZelBlockNames[i]);
        if (enabled.ok()) {
          record.enabled[i] = *enabled;
        } else {
          record.failures.push_back(
              {std::string(kZelBlockNames[i]), std::string(enabled.status().message())});
        }
      }
    }

    std::shared_ptr<TuningBundle> bundle;
    {
      StageTimer timer(record, kInterpolate);
      StatusOr<std::shared_ptr<TuningBundle>> interpolated =
          controller.Interpolate(point, AllBlockNames());
      if (interpolated.ok()) {
        bundle = *std::move(interpolated);
      } else {
        record.failures.push_back({"Interpolate", std::string(interpolated.status().message())});
      }
    }
    std::array<const TuningBlock*, kZelBlockCount> blocks{};
    if (bundle != nullptr) {
      for (size_t i = 0; i < kZelBlockCount; ++i) {
        blocks[i] = bundle->GetBlock(kZelBlockNames[i]);
        record.in_bundle[i] = blocks[i] != nullptr;
        if (blocks[i] != previous_blocks[i]) {
          record.refreshed_blocks.emplace_back(kZelBlockNames[i]);
        }
      }
    }

    {
      StageTimer timer(record, kTranslate);
      TranslatorFrame translator_frame;
      translator_frame.blocks = blocks;
      for (TranslatorRecords& translation : translations) {
        const TranslatorForm& form = translation.form();
        if (blocks[form.block] == nullptr) continue;
        if (Status status = translation.Translate(translator_frame); !status.ok()) {
          record.failures.push_back(
              {std::string(kZelBlockNames[form.block]), std::string(status.message())});
          continue;
        }
        record.translations.push_back({std::string(form.name),
                                       std::string(kZelBlockNames[form.block]),
                                       tools::HardwareValues::Of(translation).ToJson()});
      }
    }

    {
      StageTimer timer(record, kSignalWait);
      if (Status status = controller.SignalProducedTuningPoint(point); !status.ok()) {
        record.failures.push_back({"SignalProducedTuningPoint", std::string(status.message())});
      }
      const Status done = point->WaitForDone(options.fence_timeout);
      record.fence_signalled = point->GetFence()->IsSignalled();
      record.fence_timed_out = !record.fence_signalled;
      if (!done.ok() && record.fence_signalled) {
        record.failures.push_back({"fence", std::string(done.message())});
      }
    }
    record.earlier_fences_signalled =
        previous_point == nullptr || previous_point->GetFence()->IsSignalled();

    previous_blocks = blocks;
    previous_bundle = std::move(bundle);
    previous_point = std::move(point);
    if (options.on_frame) options.on_frame(static_cast<int>(records.size()), frames.size());
  }
  controller.NotifyCaptureSessionClose();
  return records;
}

}  // namespace tavik::sim
