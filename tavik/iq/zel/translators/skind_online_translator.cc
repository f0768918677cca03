#include "tavik/iq/zel/translators/skind_online_translator.h"

#include <cstdint>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;

constexpr float kDegrees = 360.0f;
constexpr float kHueScale = 768.0f;
constexpr int64_t kHueMax = 768;
constexpr int64_t kSatValScale = 1023;
constexpr int64_t kSmoothShiftScale = 8;

// One class's nine values, as the tuning names them.
struct ClassTuning {
  float hue_min;
  float hue_max;
  float sat_min;
  float sat_max;
  float val_min;
  float val_max;
  float hue_smooth_shift;
  float sat_smooth_shift;
  float val_smooth_shift;
};

void WriteClass(const ClassTuning& tuning, SkindClassRanges& ranges) {
  // The two hue bounds are scaled in different orders, which can differ in the last place; the
  // stage's tables were made this way, so both orders stay.
  TAVIK_SET_FIELD(ranges, hue_min,
                  RoundAndLimit(tuning.hue_min * kHueScale / kDegrees, 0, kHueMax));
  TAVIK_SET_FIELD(ranges, hue_max,
                  RoundAndLimit(tuning.hue_max / kDegrees * kHueScale, 0, kHueMax));
  TAVIK_SET_FIELD(ranges, sat_min, ToScaledCode(tuning.sat_min, kSatValScale));
  TAVIK_SET_FIELD(ranges, sat_max, ToScaledCode(tuning.sat_max, kSatValScale));
  TAVIK_SET_FIELD(ranges, val_min, ToScaledCode(tuning.val_min, kSatValScale));
  TAVIK_SET_FIELD(ranges, val_max, ToScaledCode(tuning.val_max, kSatValScale));
  TAVIK_SET_FIELD(ranges, hue_smooth_shift,
                  ToScaledCode(tuning.hue_smooth_shift, kSmoothShiftScale));
  TAVIK_SET_FIELD(ranges, sat_smooth_shift,
                  ToScaledCode(tuning.sat_smooth_shift, kSmoothShiftScale));
  TAVIK_SET_FIELD(ranges, val_smooth_shift,
                  ToScaledCode(tuning.val_smooth_shift, kSmoothShiftScale));
}

// Every class's mode bits set; the enables are the caller's.
void WriteClassModes(SkindOutput& output) {
  output.class_mode = 1;
  output.skin_mode = 7;
  output.skin_b_mode = 7;
  output.sky_mode = 7;
  output.grass_mode = 7;
  output.extra_mode = 7;
}

}  // namespace

Status TranslateSkind(const TuningBlock& block, SkindOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateSkind");
  TAVIK_ASSIGN_OR_RETURN(const zm::SkindTuning* tuning, RequireTuning<zm::SkindTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));

  const zm::SkindStaticParam& s = tuning->static_param();
  output.bypass = tuning->enable() ? 0 : 1;
  output.enable_low_power = s.enable_low_power() ? 1 : 0;
  WriteClassModes(output);
  output.enable_skin = s.enable_skin() ? 1 : 0;
  output.enable_skin_b = s.enable_skin_b() ? 1 : 0;
  output.enable_sky = s.enable_sky() ? 1 : 0;
  output.enable_grass = s.enable_grass() ? 1 : 0;
  output.enable_extra = s.enable_extra() ? 1 : 0;

  const zm::SkindDynamicParam& d = tuning->dynamic_param();
  WriteClass({d.skin_hue_min(), d.skin_hue_max(), d.skin_sat_min(), d.skin_sat_max(),
              d.skin_val_min(), d.skin_val_max(), d.skin_hue_smooth_shift(),
              d.skin_sat_smooth_shift(), d.skin_val_smooth_shift()},
             output.skin);
  WriteClass({d.skin_b_hue_min(), d.skin_b_hue_max(), d.skin_b_sat_min(), d.skin_b_sat_max(),
              d.skin_b_val_min(), d.skin_b_val_max(), d.skin_b_hue_smooth_shift(),
              d.skin_b_sat_smooth_shift(), d.skin_b_val_smooth_shift()},
             output.skin_b);
  WriteClass({d.sky_hue_min(), d.sky_hue_max(), d.sky_sat_min(), d.sky_sat_max(), d.sky_val_min(),
              d.sky_val_max(), d.sky_hue_smooth_shift(), d.sky_sat_smooth_shift(),
              d.sky_val_smooth_shift()},
             output.sky);
  WriteClass({d.grass_hue_min(), d.grass_hue_max(), d.grass_sat_min(), d.grass_sat_max(),
              d.grass_val_min(), d.grass_val_max(), d.grass_hue_smooth_shift(),
              d.grass_sat_smooth_shift(), d.grass_val_smooth_shift()},
             output.grass);
  WriteClass({d.extra_hue_min(), d.extra_hue_max(), d.extra_sat_min(), d.extra_sat_max(),
              d.extra_val_min(), d.extra_val_max(), d.extra_hue_smooth_shift(),
              d.extra_sat_smooth_shift(), d.extra_val_smooth_shift()},
             output.extra);
  return OkStatus();
}

Status GetDefaultSkind(SkindOutput& output, SkindFixedOutput& fixed) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultSkind");
  output.bypass = 0;
  output.enable_low_power = 0;
  WriteClassModes(output);
  output.enable_skin = 0;
  output.enable_skin_b = 0;
  output.enable_sky = 0;
  output.enable_grass = 0;
  output.enable_extra = 0;
  constexpr ClassTuning kNoRange = {};
  for (SkindClassRanges* ranges :
       {&output.skin, &output.skin_b, &output.sky, &output.grass, &output.extra}) {
    WriteClass(kNoRange, *ranges);
  }
  fixed = SkindFixedOutput{};
  return OkStatus();
}

namespace translator_forms {

constexpr TranslatorForm kSkind = MakeTranslatorForm<zm::SkindTuning, SkindOutput>(
    "TranslateSkind (SKIND)", [](const TranslatorFrame& frame, SkindOutput& output) {
      return TranslateSkind(frame.Block<zm::SkindTuning>(), output);
    });

}  // namespace translator_forms
}  // namespace tavik
