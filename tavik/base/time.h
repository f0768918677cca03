// Time of the platform: Abseil's, under the platform's names.
#ifndef TAVIK_BASE_TIME_H_
#define TAVIK_BASE_TIME_H_

#include "absl/time/clock.h"
#include "absl/time/time.h"

namespace tavik {

using Duration = absl::Duration;
using Time = absl::Time;

using absl::FormatDuration;
using absl::InfiniteDuration;
using absl::Microseconds;
using absl::Milliseconds;
using absl::Nanoseconds;
using absl::Now;
using absl::Seconds;
using absl::ToDoubleMilliseconds;
using absl::ToDoubleNanoseconds;
using absl::ToInt64Milliseconds;
using absl::ToInt64Seconds;
using absl::ZeroDuration;

}  // namespace tavik

#endif  // TAVIK_BASE_TIME_H_
