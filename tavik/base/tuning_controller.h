// What the camera service holds to get a frame's tuning: it makes a point for the frame, asks for
// the blocks the frame's pipeline needs, and hands the point back when done, upon which the
// point's fence fires, in order, while a capture session is open.
#ifndef TAVIK_BASE_TUNING_CONTROLLER_H_
#define TAVIK_BASE_TUNING_CONTROLLER_H_

#include <memory>
#include <string>
#include <string_view>

#include "tavik/base/camera_types.h"
#include "tavik/base/containers.h"
#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/base/tuning_point.h"

namespace tavik {

class TuningController {
 public:
  virtual ~TuningController() = default;

  virtual std::string GetInstanceName() const = 0;

  // The bundle of the named blocks for the point's frame.
  virtual StatusOr<std::shared_ptr<TuningBundle>> Interpolate(
      std::shared_ptr<const TuningPoint> point,
      const FlatHashSet<std::string_view>& block_names) const = 0;

  virtual std::shared_ptr<TuningPoint> CreateTuningPoint(
      const UseCase& use_case, const TuningInfo& tuning_info,
      const TuningCoordinates& coordinates) const = 0;

  virtual StatusOr<bool> IsBlockEnabled(const TuningPoint& point,
                                        std::string_view block_name) const = 0;

  // Whether the two points differ in anything that changes a block.
  virtual StatusOr<bool> IsTuningPointUpdated(const TuningPoint& a,
                                              const TuningPoint& b) const = 0;

  virtual StatusOr<int> GetUseCaseValue(const TuningPoint& point) const = 0;

  // Hands a point back; its fence fires once the points before it have fired.
  virtual Status SignalProducedTuningPoint(std::shared_ptr<TuningPoint> point) = 0;

  virtual void NotifyCaptureSessionOpen() = 0;
  virtual void NotifyCaptureSessionClose() = 0;
};

}  // namespace tavik

#endif  // TAVIK_BASE_TUNING_CONTROLLER_H_
