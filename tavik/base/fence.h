// Fences: one-shot completion signals that carry a status. A tuning point holds one, which the
// controller's signal thread fires when the point's frame has been handed on.
#ifndef TAVIK_BASE_FENCE_H_
#define TAVIK_BASE_FENCE_H_

#include <condition_variable>
#include <mutex>
#include <optional>

#include "tavik/base/status.h"
#include "tavik/base/time.h"

namespace tavik {

class Fence {
 public:
  virtual ~Fence() = default;

  // Blocks until the fence is signalled, and returns the status it was signalled with; or, after
  // `timeout`, DeadlineExceededError naming the duration. InfiniteDuration() waits for ever.
  virtual Status Wait(Duration timeout) const = 0;
};

// A fence signalled by software. The first Signal counts; later ones are ignored.
class SoftwareFence : public Fence {
 public:
  SoftwareFence() = default;

  SoftwareFence(const SoftwareFence&) = delete;
  SoftwareFence& operator=(const SoftwareFence&) = delete;

  void Signal(Status status);
  bool IsSignalled() const;

  Status Wait(Duration timeout) const override;

 private:
  mutable std::mutex mutex_;
  mutable std::condition_variable signalled_;
  std::optional<Status> status_;
};

}  // namespace tavik

#endif  // TAVIK_BASE_FENCE_H_
