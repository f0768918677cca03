#include "tools/tavik-sim/frame_log.h"

#include <fstream>

#include "absl/strings/str_format.h"
#include "absl/strings/str_join.h"
#include "tavik/base/strings.h"

namespace tavik::sim {
namespace {

std::string Quote(std::string_view text) {
  std::string out = "\"";
  for (char c : text) {
    if (c == '"' || c == '\\') {
      out += '\\';
      out += c;
    } else if (static_cast<unsigned char>(c) < 0x20) {
      out += absl::StrFormat("\\u%04x", c);
    } else {
      out += c;
    }
  }
  out += '"';
  return out;
}

// Shortest text that reads back as the same float.
std::string Number(float value) { return absl::StrFormat("%.9g", value); }

}  // namespace

std::string FrameLogLine(const FrameRecord& record) {
  const SimFrame& frame = record.frame;
  const TuningCoordinates& c = frame.coordinates;
  const TuningInfo& info = frame.tuning_info;
  std::string line = StrCat("{\"frame\":", frame.index, ",\"segment\":", Quote(frame.segment_name));
  StrAppend(&line, ",\"use_case\":{\"type\":", frame.use_case.type,
            ",\"torch\":", frame.use_case.torch ? "true" : "false",
            ",\"hdr\":", frame.use_case.hdr ? "true" : "false",
            ",\"night\":", frame.use_case.night ? "true" : "false",
            ",\"first_party\":", frame.use_case.first_party ? "true" : "false", "}");
  StrAppend(&line, ",\"sensor\":", Quote(info.sensor_mode_info.sensor_name), ",\"image_size\":[",
            info.image_size.width, ",", info.image_size.height, "]");
  StrAppend(&line, ",\"state\":{\"led_influence\":", Number(c.led_influence),
            ",\"cct\":", Number(c.cct), ",\"bv\":", Number(c.bv),
            ",\"real_gain\":", Number(c.real_gain), ",\"exp_ratio\":", Number(c.exp_ratio),
            ",\"mired_cct\":", Number(c.mired_cct), ",\"scaler_ratio\":", Number(c.scaler_ratio),
            ",\"pre_scaler_ratio\":", Number(c.pre_scaler_ratio),
            ",\"frame_count\":", c.frame_count,
            ",\"exposure_time_msecs\":", Number(c.exposure_time_msecs), "}");
  StrAppend(&line, ",\"key\":", Quote(record.key),
            ",\"resolved_key\":", Quote(record.resolved_key));
  std::vector<std::string> refreshed;
  for (const std::string& name : record.refreshed_blocks) refreshed.push_back(Quote(name));
  StrAppend(&line, ",\"refreshed\":[", absl::StrJoin(refreshed, ","), "]");
  std::vector<std::string> hardware;
  for (const FrameRecord::Translation& t : record.translations) {
    hardware.push_back(StrCat(Quote(t.translator), ":", t.hardware_json));
  }
  StrAppend(&line, ",\"hardware\":{", absl::StrJoin(hardware, ","), "}");
  std::vector<std::string> failures;
  for (const FrameRecord::Failure& f : record.failures) {
    failures.push_back(
        StrCat("{\"block\":", Quote(f.block), ",\"message\":", Quote(f.message), "}"));
  }
  StrAppend(&line, ",\"failures\":[", absl::StrJoin(failures, ","), "]");
  StrAppend(&line, ",\"fence_signalled\":", record.fence_signalled ? "true" : "false");
  std::vector<std::string> timing;
  static constexpr const char* kTimingNames[kStageCount] = {
      "create_ns", "enabled_checks_ns", "interpolate_ns", "translate_ns", "signal_wait_ns"};
  for (int stage = 0; stage < kStageCount; ++stage) {
    timing.push_back(StrCat("\"", kTimingNames[stage], "\":", record.stage_nanoseconds[stage]));
  }
  StrAppend(&line, ",\"timing\":{", absl::StrJoin(timing, ","), "}}");
  return line;
}

Status WriteFrameLog(const std::string& path, const std::vector<FrameRecord>& records) {
  std::ofstream out(path);
  if (!out) return UnavailableError(StrCat(path, ": cannot write"));
  for (const FrameRecord& record : records) out << FrameLogLine(record) << "\n";
  out.close();
  if (!out) return DataLossError(StrCat(path, ": write failed"));
  return OkStatus();
}

}  // namespace tavik::sim
