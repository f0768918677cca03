#include "tavik/base/fence.h"

#include <algorithm>
#include <chrono>

#include "tavik/base/strings.h"

namespace tavik {

void SoftwareFence::Signal(Status status) {
  {
    std::lock_guard<std::mutex> lock(mutex_);
    if (status_.has_value()) return;
    status_ = std::move(status);
  }
  signalled_.notify_all();
}

bool SoftwareFence::IsSignalled() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return status_.has_value();
}

Status SoftwareFence::Wait(Duration timeout) const {
  std::unique_lock<std::mutex> lock(mutex_);
  auto is_signalled = [this] { return status_.has_value(); };
  if (timeout == InfiniteDuration()) {
    signalled_.wait(lock, is_signalled);
  } else if (!signalled_.wait_for(lock, absl::ToChronoNanoseconds(std::max(timeout, ZeroDuration())),
                                  is_signalled)) {
    return DeadlineExceededError(
        StrCat("Fence not signalled within ", FormatDuration(timeout)));
  }
  return *status_;
}

}  // namespace tavik
