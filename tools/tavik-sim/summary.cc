#include "tools/tavik-sim/summary.h"

#include <algorithm>
#include <cstdint>
#include <map>
#include <utility>

#include "absl/strings/str_format.h"
#include "tavik/base/strings.h"

namespace tavik::sim {
namespace {

// The budget of a frame at 30 frames per second.
constexpr double kFrameBudgetMilliseconds = 33.0;

double Percentile(std::vector<int64_t> values, double fraction) {
  if (values.empty()) return 0;
  std::sort(values.begin(), values.end());
  const size_t index = std::min(values.size() - 1,
                                static_cast<size_t>(fraction * static_cast<double>(values.size())));
  return static_cast<double>(values[index]);
}

}  // namespace

bool RunFailed(const std::vector<FrameRecord>& records) {
  for (const FrameRecord& record : records) {
    if (!record.fence_signalled || !record.failures.empty()) return true;
  }
  return false;
}

std::string FormatSummary(const std::vector<FrameRecord>& records) {
  std::string out;
  int timeouts = 0;
  int out_of_order = 0;
  // Key -> (frames, the forest key that answered it).
  std::map<std::string, std::pair<int, std::string>> keys;
  std::map<std::string, std::pair<int, int>> cache;  // Block -> (hits, refreshes).
  std::map<std::pair<std::string, std::string>, int> failures;
  for (const FrameRecord& record : records) {
    if (record.fence_timed_out) ++timeouts;
    if (!record.earlier_fences_signalled) ++out_of_order;
    auto& key = keys[record.key.empty() ? "(no key)" : record.key];
    ++key.first;
    key.second = record.resolved_key;
    for (size_t i = 0; i < kZelBlockCount; ++i) {
      if (record.in_bundle[i]) ++cache[std::string(kZelBlockNames[i])].first;
    }
    for (const std::string& name : record.refreshed_blocks) {
      --cache[name].first;
      ++cache[name].second;
    }
    for (const FrameRecord::Failure& failure : record.failures) {
      ++failures[{failure.block, failure.message}];
    }
  }

  absl::StrAppendFormat(&out,
                        "Frames: %d (fences signalled: %d, timed out: %d, out of order: %d)\n",
                        static_cast<int>(records.size()),
                        static_cast<int>(records.size()) - timeouts, timeouts, out_of_order);

  absl::StrAppendFormat(&out, "\nUse-case keys (%d distinct):\n", static_cast<int>(keys.size()));
  for (const auto& [key, entry] : keys) {
    absl::StrAppendFormat(&out, "  %4d  %s\n", entry.first, key);
    if (entry.second.empty()) {
      absl::StrAppendFormat(&out, "        -> no tuning found\n");
    } else if (entry.second != key) {
      absl::StrAppendFormat(&out, "        -> nearest key %s\n", entry.second);
    }
  }

  int unchanged_frames = 0;
  for (const FrameRecord& record : records) {
    if (record.refreshed_blocks.empty()) ++unchanged_frames;
  }
  absl::StrAppendFormat(&out,
                        "\nBlock cache: %d frames served wholly from the cache\n"
                        "  (hits/refreshes; a block missing from the bundle counts as neither)\n",
                        unchanged_frames);
  std::string row;
  int column = 0;
  for (std::string_view name : kZelBlockNames) {
    const auto& [hits, refreshes] = cache[std::string(name)];
    absl::StrAppendFormat(&row, "  %-22s %3d/%-3d", name, hits, refreshes);
    if (++column % 3 == 0 || column == static_cast<int>(kZelBlockCount)) {
      row.erase(row.find_last_not_of(' ') + 1);
      out += row + "\n";
      row.clear();
    }
  }

  absl::StrAppendFormat(&out, "\nTranslator and call failures:%s\n",
                        failures.empty() ? " none" : "");
  for (const auto& [what, count] : failures) {
    absl::StrAppendFormat(&out, "  %4d  %s: %s\n", count, what.first, what.second);
  }

  absl::StrAppendFormat(&out, "\nStage time per frame     p50 ms    p99 ms   p50 share of 33 ms\n");
  std::vector<int64_t> total;
  for (const FrameRecord& record : records) {
    int64_t sum = 0;
    for (int64_t ns : record.stage_nanoseconds) sum += ns;
    total.push_back(sum);
  }
  for (int stage = 0; stage < kStageCount; ++stage) {
    std::vector<int64_t> values;
    for (const FrameRecord& record : records) values.push_back(record.stage_nanoseconds[stage]);
    const double p50 = Percentile(values, 0.5) / 1e6;
    const double p99 = Percentile(values, 0.99) / 1e6;
    absl::StrAppendFormat(&out, "  %-20s %9.3f %9.3f   %6.1f%%\n", kStageNames[stage], p50, p99,
                          100.0 * p50 / kFrameBudgetMilliseconds);
  }
  const double p50 = Percentile(total, 0.5) / 1e6;
  absl::StrAppendFormat(&out, "  %-20s %9.3f %9.3f   %6.1f%%\n", "frame", p50,
                        Percentile(total, 0.99) / 1e6, 100.0 * p50 / kFrameBudgetMilliseconds);
  return out;
}

}  // namespace tavik::sim
