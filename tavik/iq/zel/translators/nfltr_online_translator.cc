#include "tavik/iq/zel/translators/nfltr_online_translator.h"

#include <cstdint>

#include "tavik/base/status_macros.h"
#include "tavik/base/trace.h"
#include "tavik/iq/zel/translators/bayer_pattern_util.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/translators/translator_util.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik {
namespace {

namespace zm = ::vosbrine::zelmondrake;

// 1.0 in the inverse gains' Q5.
constexpr float kInverseOne = 32.0f;

// round(32 / gain), masked to the 6-bit field. The division is not guarded: a gain of 0 (or a
// NaN) gives no finite quotient, and wraps to 0.
int64_t InverseGainCode(float gain) { return RoundWrapping(kInverseOne / gain); }

NfltrInput NfltrInputOf(const FrameFacts& facts) {
  return {facts.bayer_pattern, &facts.white_balance};
}

}  // namespace

Status TranslateNfltr(const TuningBlock& block, const NfltrInput& input, NfltrItpOutput& output) {
  PerfTrace trace(kTranslatorTraceCategory, "TranslateNfltr");
  TAVIK_ASSIGN_OR_RETURN(const zm::NfltrTuning* tuning, RequireTuning<zm::NfltrTuning>(block));
  TAVIK_RETURN_IF_ERROR(RequireDynamic(*tuning));
  TAVIK_RETURN_IF_ERROR(RequireStatic(*tuning));
  if (input.wb == nullptr) return InvalidArgumentError("Config data doesn't have WB info.");

  const tavik_api::WhiteBalanceConfig& wb = *input.wb;
  output.bypass = tuning->enable() ? 0 : 1;
  TAVIK_SET_FIELD(output, inverse_wb_r, InverseGainCode(wb.r));
  TAVIK_SET_FIELD(output, inverse_wb_g, InverseGainCode((wb.gr + wb.gb) * 0.5f));
  TAVIK_SET_FIELD(output, inverse_wb_b, InverseGainCode(wb.b));
  output.pixel_order = vosbrine::GetMainIspPixelOrder(input.bayer_pattern);
  return OkStatus();
}

// Written from constants rather than translated: the tuning has no values, and a pipeline is
// configured before any frame brings its white balance.
Status GetDefaultNfltr(NfltrItpOutput& output, NfltrItpFixedOutput& fixed) {
  PerfTrace trace(kTranslatorTraceCategory, "GetDefaultNfltr");
  output.bypass = 0;
  output.inverse_wb_r = 30;
  output.inverse_wb_g = 32;
  output.inverse_wb_b = 18;
  output.pixel_order = 1;

  uint32_t* words = fixed.words;
  WriteFixedBits(words[0], ~uint32_t{0xFF}, 63);
  WriteFixedBits(words[1], ~uint32_t{0x3FF}, 3);
  WriteFixedBits(words[2], ~uint32_t{0x3FF}, 12);
  WriteFixedBits(words[3], ~uint32_t{0x1F001F}, 0);
  WriteFixedBits(words[4], ~uint32_t{0x1}, 0);
  WriteFixedBits(words[5], ~uint32_t{0x1F}, 0);
  WriteFixedBits(words[6], ~uint32_t{0xF}, 0);
  WriteFixedBits(words[7], ~uint32_t{0x7FF}, 0);
  return OkStatus();
}

namespace translator_forms {

constexpr TranslatorForm kNfltr = MakeTranslatorForm<zm::NfltrTuning, NfltrItpOutput>(
    "TranslateNfltr (ITP)", [](const TranslatorFrame& frame, NfltrItpOutput& output) {
      return TranslateNfltr(frame.Block<zm::NfltrTuning>(), NfltrInputOf(frame.facts), output);
    });

}  // namespace translator_forms
}  // namespace tavik
