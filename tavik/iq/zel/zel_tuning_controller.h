// The tuning controller of this processor generation: the object the camera service holds. It
// maps a frame's description to a tuning key and camera state, evaluates the requested blocks
// (each with a one-deep cache keyed by the point), and signals the points' fences in order on a
// thread of its own while a capture session is open.
#ifndef TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_H_
#define TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_H_

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"
#include "tavik/base/tuning_controller.h"
#include "tavik/base/wait_queue.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/tuning_provider.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {

// Whether `block_name` has a bit in the frame's bypass mask and the bit is set. SensorGammaTuning
// has none and can't be bypassed.
TAVIK_EXPORT bool IsSubBlockBypassed(uint32_t bypass_bitmask, std::string_view block_name);

// The property as a bool; `default_value` when it is unset or not a bool.
TAVIK_EXPORT bool GetBooleanSystemProperty(std::string_view name, bool default_value);

class TAVIK_EXPORT ZelTuningController : public TuningController {
 public:
  // Loads the tuning files of `paths`, calibrated with the modules' factory data. Never fails: a
  // controller whose tuning did not load answers "Invalid provider" where it needs one.
  ZelTuningController(std::string_view device_name, const std::vector<std::string>& paths,
                      const FlatHashMap<TuningSensorKey, tavik_api::LensShadingCalibrationData>&
                          calibration);
  // Sessions must be closed first: the signal thread of an open session is not stopped here.
  ~ZelTuningController() override;

  std::string GetInstanceName() const override;

  StatusOr<std::shared_ptr<TuningBundle>> Interpolate(
      std::shared_ptr<const TuningPoint> point,
      const FlatHashSet<std::string_view>& block_names) const override;

  std::shared_ptr<TuningPoint> CreateTuningPoint(const UseCase& use_case,
                                                 const TuningInfo& tuning_info,
                                                 const TuningCoordinates& coordinates) const override;

  // The tuner's switch of the block for the point's use case; false when the frame bypasses it.
  // A use case with no file of its own is answered from the default use case, not the nearest.
  StatusOr<bool> IsBlockEnabled(const TuningPoint& point,
                                std::string_view block_name) const override;

  // Compares the camera state, the use case, the image size, the module and the frame rates.
  // The bypass mask, binning, sensor name, mode size, crop and bring-up switch are not compared.
  StatusOr<bool> IsTuningPointUpdated(const TuningPoint& a, const TuningPoint& b) const override;

  // The number of the point's sensor mode (not of its use case).
  StatusOr<int> GetUseCaseValue(const TuningPoint& point) const override;

  // Queues the point for its fence to fire; outside a session the point is dropped unsignalled.
  // Must not race with the last NotifyCaptureSessionClose.
  Status SignalProducedTuningPoint(std::shared_ptr<TuningPoint> point) override;

  void NotifyCaptureSessionOpen() override;
  void NotifyCaptureSessionClose() override;

  // The tuning key of the point: the default use case for bring-up, or when any part of the
  // frame's description can't be mapped.
  StatusOr<std::shared_ptr<vosbrine::TuningUsecase>> GenerateTuningUseCase(
      const ZelTuningPoint& point, std::string_view device_name) const;

  // The loaded forest; null when loading failed.
  const vosbrine::zelmondrake::TuningProvider* provider() const { return provider_.get(); }

 private:
  struct BlockCache;
  struct FrameTuning;

  // The use case of the point into `usecase`, as GenerateTuningUseCase gives it. Returns whether
  // the point mapped as it stands (or asked for bring-up): true when nothing was logged.
  bool MapTuningUseCase(const ZelTuningPoint& point, std::string_view device_name,
                        vosbrine::TuningUsecase* usecase) const;
  // The use case of the point and the tree set it takes, from the last frame's when the point's
  // description is the same, for the cost of a comparison.
  FrameTuning GetFrameTuning(const ZelTuningPoint& point) const;

  StatusOr<std::shared_ptr<TuningBundle>> FillSubBlocksTuning(
      const ZelTuningPoint& point, const FlatHashSet<std::string_view>& block_names) const;
  void SignalThreadFunction();

  std::string device_name_;
  std::unique_ptr<vosbrine::zelmondrake::TuningProvider> provider_;
  mutable std::mutex block_cache_mutex_;
  std::unique_ptr<BlockCache> block_cache_;
  FlatHashMap<std::string_view, int> block_name_index_;
  bool use_bringup_tuning_ = false;
  std::unique_ptr<std::thread> signal_thread_;
  std::unique_ptr<WaitQueue<std::shared_ptr<TuningPoint>>> tuning_point_queue_;
  std::mutex session_mutex_;
  uint32_t session_count_ = 0;
};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_ZEL_TUNING_CONTROLLER_H_
