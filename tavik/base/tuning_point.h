// The request for one frame's tuning. It carries the fence that tells the service when the
// tuning of its frame has been handed on.
#ifndef TAVIK_BASE_TUNING_POINT_H_
#define TAVIK_BASE_TUNING_POINT_H_

#include <memory>

#include "tavik/base/fence.h"
#include "tavik/base/status.h"
#include "tavik/base/time.h"

namespace tavik {

class TuningPoint {
 public:
  explicit TuningPoint(std::shared_ptr<SoftwareFence> fence) : fence_(std::move(fence)) {}
  virtual ~TuningPoint() = default;

  // Waits on the point's fence (see Fence::Wait).
  virtual Status WaitForDone(Duration timeout) const { return GetFence()->Wait(timeout); }
  virtual SoftwareFence* GetFence() const { return fence_.get(); }

 protected:
  // Copies share the fence.
  TuningPoint(const TuningPoint&) = default;
  TuningPoint& operator=(const TuningPoint&) = default;

 private:
  std::shared_ptr<SoftwareFence> fence_;
};

}  // namespace tavik

#endif  // TAVIK_BASE_TUNING_POINT_H_
