// Skind: detects five colour classes (skin, a second skin class, sky, grass and a spare) by ranges
// in hue, saturation and value; its maps feed the noise-add stage.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_SKIND_ONLINE_TRANSLATOR_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_SKIND_ONLINE_TRANSLATOR_H_

#include <cstddef>
#include <cstdint>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"
#include "tavik/iq/zel/translators/record_description.h"

namespace tavik {

// The ranges of one colour class, four words. Hues are in 768ths of 360 degrees (0..768),
// saturations and values of full scale 1023, smoothing shifts of full scale 8.
struct SkindClassRanges {
  uint32_t hue_min : 10;
  uint32_t : 6;
  uint32_t hue_max : 10;
  uint32_t : 6;
  uint32_t sat_min : 10;
  uint32_t : 6;
  uint32_t sat_max : 10;
  uint32_t : 6;
  uint32_t val_min : 11;
  uint32_t : 5;
  uint32_t val_max : 11;
  uint32_t : 5;
  uint32_t hue_smooth_shift : 4;
  uint32_t : 4;
  uint32_t sat_smooth_shift : 4;
  uint32_t : 4;
  uint32_t val_smooth_shift : 4;
  uint32_t : 12;
};
static_assert(sizeof(SkindClassRanges) == 16);

// The stage's values, 23 words.
struct SkindOutput {
  // Word 0.
  uint32_t bypass : 1;
  uint32_t : 31;
  // Word 1.
  uint32_t enable_low_power : 1;
  uint32_t : 31;
  // Word 2: per class an enable bit, each followed by three set bits, after one set bit. With
  // every class off the low 21 bits read 0x1DDDDD.
  uint32_t class_mode : 1;  // Set.
  uint32_t enable_skin : 1;
  uint32_t skin_mode : 3;  // All set, as are the other classes' modes.
  uint32_t enable_skin_b : 1;
  uint32_t skin_b_mode : 3;
  uint32_t enable_sky : 1;
  uint32_t sky_mode : 3;
  uint32_t enable_grass : 1;
  uint32_t grass_mode : 3;
  uint32_t enable_extra : 1;
  uint32_t extra_mode : 3;
  uint32_t : 11;
  // Words 3 to 22.
  SkindClassRanges skin;
  SkindClassRanges skin_b;
  SkindClassRanges sky;
  SkindClassRanges grass;
  SkindClassRanges extra;
};
static_assert(sizeof(SkindOutput) == 23 * 4);
static_assert(offsetof(SkindOutput, skin) == 3 * 4);
static_assert(offsetof(SkindOutput, extra) == 19 * 4);

#define TAVIK_SKIND_CLASS_(c)                                                                     \
  TAVIK_FIELD(c.hue_min), TAVIK_FIELD(c.hue_max), TAVIK_FIELD(c.sat_min), TAVIK_FIELD(c.sat_max), \
      TAVIK_FIELD(c.val_min), TAVIK_FIELD(c.val_max), TAVIK_FIELD(c.hue_smooth_shift),            \
      TAVIK_FIELD(c.sat_smooth_shift), TAVIK_FIELD(c.val_smooth_shift)
TAVIK_DESCRIBE_RECORD(SkindOutput, 32, TAVIK_FIELD(bypass), TAVIK_FIELD(enable_low_power),
                      TAVIK_FIELD(class_mode), TAVIK_FIELD(enable_skin), TAVIK_FIELD(skin_mode),
                      TAVIK_FIELD(enable_skin_b), TAVIK_FIELD(skin_b_mode), TAVIK_FIELD(enable_sky),
                      TAVIK_FIELD(sky_mode), TAVIK_FIELD(enable_grass), TAVIK_FIELD(grass_mode),
                      TAVIK_FIELD(enable_extra), TAVIK_FIELD(extra_mode), TAVIK_SKIND_CLASS_(skin),
                      TAVIK_SKIND_CLASS_(skin_b), TAVIK_SKIND_CLASS_(sky),
                      TAVIK_SKIND_CLASS_(grass), TAVIK_SKIND_CLASS_(extra));
#undef TAVIK_SKIND_CLASS_

// The stage's settings that no tuning drives, written by GetDefaultSkind alone: further words of
// the stage, zero in every configuration; their meaning is the stage's own.
struct SkindFixedOutput {
  uint32_t reserved[4];
};
static_assert(sizeof(SkindFixedOutput) == 16);
TAVIK_DESCRIBE_RECORD(SkindFixedOutput, 32, TAVIK_TABLE(reserved, 32));

// Fails on an empty tuning ("Invalid TuningBlock!", then region info, then static info), before
// anything is written.
TAVIK_EXPORT Status TranslateSkind(const TuningBlock& block, SkindOutput& output);

// The stage on, at full power, with every class off and zero ranges; the fixed record whole. No
// tuning is translated: with every class off there is nothing for one to say.
TAVIK_EXPORT Status GetDefaultSkind(SkindOutput& output, SkindFixedOutput& fixed);

// The unit's row of the translator table.
struct TranslatorForm;
namespace translator_forms {
extern const TranslatorForm kSkind;
}  // namespace translator_forms

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_SKIND_ONLINE_TRANSLATOR_H_
