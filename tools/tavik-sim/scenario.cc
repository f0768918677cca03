#include "tools/tavik-sim/scenario.h"

#include "tavik/base/strings.h"
#include "tools/common/text_proto.h"

namespace tavik::sim {

const char kDefaultScenarioText[] = R"pb(
  segments {
    name: "tungsten indoor, high gain"
    frames: 40
    hold_frame_count: 0
    use_case { type: VIEWFINDER }
    sensor { name: "GN1" facing: 0 lens_type: LENS_NORMAL }
    mode_size { width: 4032 height: 3024 }
    image_size { width: 4032 height: 3024 }
    sensor_fps { min: 15 max: 30 }
    target_fps { min: 15 max: 30 }
    binning: 1
    cct { start: 2800 }
    real_gain { start: 16 }
    bv { start: 1 }
    exp_ratio { start: 1 }
    scaler_ratio { start: 1 }
    exposure_time_msecs { start: 33 }
  }
  segments {
    name: "walking out to daylight"
    frames: 80
    cct { start: 2800 end: 6000 }
    real_gain { start: 16 end: 1.5 }
    bv { start: 1 end: 8 }
    exposure_time_msecs { start: 33 end: 4 }
  }
  segments { name: "daylight" frames: 30 hold_frame_count: 120 }
  segments {
    name: "torch on"
    frames: 25
    use_case { type: VIEWFINDER torch: true }
    led_influence { start: 0 end: 1 }
  }
  segments {
    name: "torch fading"
    frames: 25
    led_influence { start: 1 end: 0 }
  }
  segments {
    name: "snapshot"
    frames: 20
    hold_frame_count: 200
    use_case { type: SNAPSHOT }
  }
  segments {
    name: "video recording"
    frames: 80
    use_case { type: VIDEO_RECORDING }
    image_size { width: 1920 height: 1080 }
    sensor_fps { min: 30 max: 30 }
    target_fps { min: 30 max: 30 }
  }
)pb";

namespace {

Status CheckScenario(const Scenario& scenario, std::string_view source) {
  if (scenario.segments().empty()) return InvalidArgumentError(StrCat(source, ": no segments"));
  for (int i = 0; i < scenario.segments_size(); ++i) {
    const Segment& segment = scenario.segments(i);
    const std::string where = StrCat(source, ": segment ", i + 1, ": ");
    if (segment.frames() < 0) {
      return InvalidArgumentError(StrCat(where, "negative frame count ", segment.frames()));
    }
    if (segment.frames() == 0) return InvalidArgumentError(StrCat(where, "no frames"));
    if (i == 0) {
      if (!segment.has_sensor()) return InvalidArgumentError(StrCat(where, "no sensor"));
      if (!segment.has_mode_size()) return InvalidArgumentError(StrCat(where, "no mode_size"));
      if (!segment.has_image_size()) return InvalidArgumentError(StrCat(where, "no image_size"));
    }
    if (segment.has_binning() && segment.binning() < 1) {
      return InvalidArgumentError(StrCat(where, "binning ", segment.binning(), " is not positive"));
    }
    if (segment.has_hold_frame_count() && segment.hold_frame_count() < 0) {
      return InvalidArgumentError(
          StrCat(where, "negative hold_frame_count ", segment.hold_frame_count()));
    }
  }
  return OkStatus();
}

// `segment` with what it leaves unset taken from `previous`, the segment before it resolved the
// same way. Carried coordinates hold at the previous end value.
Segment Resolve(const Segment& previous, const Segment& segment) {
  Segment resolved = segment;
  if (!segment.has_use_case()) *resolved.mutable_use_case() = previous.use_case();
  if (!segment.has_sensor()) *resolved.mutable_sensor() = previous.sensor();
  if (!segment.has_mode_size()) *resolved.mutable_mode_size() = previous.mode_size();
  if (!segment.has_image_size()) *resolved.mutable_image_size() = previous.image_size();
  if (!segment.has_sensor_fps()) *resolved.mutable_sensor_fps() = previous.sensor_fps();
  if (!segment.has_target_fps()) *resolved.mutable_target_fps() = previous.target_fps();
  if (!segment.has_binning() && previous.has_binning()) resolved.set_binning(previous.binning());
  if (!segment.has_bypass_mask() && previous.has_bypass_mask()) {
    resolved.set_bypass_mask(previous.bypass_mask());
  }
  const auto carry = [](bool has, const Ramp& before, Ramp* ramp) {
    if (has) return;
    ramp->set_start(before.has_end() ? before.end() : before.start());
  };
  carry(segment.has_led_influence(), previous.led_influence(), resolved.mutable_led_influence());
  carry(segment.has_cct(), previous.cct(), resolved.mutable_cct());
  carry(segment.has_bv(), previous.bv(), resolved.mutable_bv());
  carry(segment.has_real_gain(), previous.real_gain(), resolved.mutable_real_gain());
  carry(segment.has_exp_ratio(), previous.exp_ratio(), resolved.mutable_exp_ratio());
  carry(segment.has_mired_cct(), previous.mired_cct(), resolved.mutable_mired_cct());
  carry(segment.has_scaler_ratio(), previous.scaler_ratio(), resolved.mutable_scaler_ratio());
  carry(segment.has_pre_scaler_ratio(), previous.pre_scaler_ratio(),
        resolved.mutable_pre_scaler_ratio());
  carry(segment.has_exposure_time_msecs(), previous.exposure_time_msecs(),
        resolved.mutable_exposure_time_msecs());
  return resolved;
}

// The ramp's value on frame `i` of `count`.
float RampAt(const Ramp& ramp, int i, int count) {
  if (!ramp.has_end() || count <= 1) return ramp.start();
  const double t = static_cast<double>(i) / (count - 1);
  return static_cast<float>(ramp.start() + (ramp.end() - ramp.start()) * t);
}

}  // namespace

StatusOr<Scenario> ParseScenario(std::string_view text, std::string_view source) {
  Scenario scenario;
  if (Status status = tools::ParseTextProto(text, source, scenario); !status.ok()) return status;
  if (Status status = CheckScenario(scenario, source); !status.ok()) return status;
  return scenario;
}

StatusOr<Scenario> ReadScenarioFile(const std::string& path) {
  StatusOr<std::string> text = tools::ReadFileToString(path);
  if (!text.ok()) return text.status();
  return ParseScenario(*text, path);
}

StatusOr<Scenario> DefaultScenario() { return ParseScenario(kDefaultScenarioText, "<default>"); }

std::vector<SimFrame> ExpandScenario(const Scenario& scenario, int max_frames) {
  std::vector<SimFrame> frames;
  Segment previous;
  for (int s = 0; s < scenario.segments_size(); ++s) {
    const Segment segment = Resolve(previous, scenario.segments(s));
    const int count = segment.frames();
    for (int i = 0; i < count; ++i) {
      if (max_frames >= 0 && static_cast<int>(frames.size()) >= max_frames) return frames;
      SimFrame& frame = frames.emplace_back();
      frame.index = static_cast<int>(frames.size()) - 1;
      frame.segment = s;
      frame.segment_name = segment.name();
      frame.use_case.type = static_cast<int32_t>(segment.use_case().type());
      frame.use_case.torch = segment.use_case().torch();
      frame.use_case.hdr = segment.use_case().hdr();
      frame.use_case.night = segment.use_case().night();
      frame.use_case.first_party =
          !segment.use_case().has_first_party() || segment.use_case().first_party();

      TuningInfo& info = frame.tuning_info;
      info.sensor_mode_info.sensor_name = segment.sensor().name();
      info.sensor_mode_info.mode_width = segment.mode_size().width();
      info.sensor_mode_info.mode_height = segment.mode_size().height();
      info.sensor_mode_info.sensor_fps_range = {segment.sensor_fps().min(),
                                                segment.sensor_fps().max()};
      info.sensor_mode_info.target_fps_range = {segment.target_fps().min(),
                                                segment.target_fps().max()};
      const int binning = segment.has_binning() ? segment.binning() : 1;
      info.sensor_mode_info.binning_x = binning;
      info.sensor_mode_info.binning_y = binning;
      info.image_size = {segment.image_size().width(), segment.image_size().height()};
      info.module_spec.facing = segment.sensor().facing();
      info.module_spec.lens_type = static_cast<int32_t>(segment.sensor().lens_type());
      info.module_spec.sensor_kind = segment.sensor().sensor_kind();
      info.bypass_bitmask = segment.bypass_mask();

      TuningCoordinates& c = frame.coordinates;
      c.led_influence = RampAt(segment.led_influence(), i, count);
      c.cct = RampAt(segment.cct(), i, count);
      c.bv = RampAt(segment.bv(), i, count);
      c.real_gain = RampAt(segment.real_gain(), i, count);
      c.exp_ratio = RampAt(segment.exp_ratio(), i, count);
      c.mired_cct = RampAt(segment.mired_cct(), i, count);
      c.scaler_ratio = RampAt(segment.scaler_ratio(), i, count);
      c.pre_scaler_ratio = RampAt(segment.pre_scaler_ratio(), i, count);
      c.exposure_time_msecs = RampAt(segment.exposure_time_msecs(), i, count);
      c.frame_count = segment.has_hold_frame_count() ? segment.hold_frame_count() : frame.index;
    }
    previous = segment;
  }
  return frames;
}

}  // namespace tavik::sim
