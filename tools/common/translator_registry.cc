#include "tools/common/translator_registry.h"

#include <cstdio>

#include "tavik/base/status_macros.h"
#include "tavik/base/strings.h"
#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/dg_online_translator.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"

namespace tavik::tools {
namespace {

using tavik_registers::zel::g3aa::BlcConfigValue;
using tavik_registers::zel::g3aa::DgConfigValue;
using tavik_registers::zel::g3aa::GammaLutValue;
using tavik_registers::zel::g3aa_generic::GammaConfigValue;

// The tone curve comes from the tuning, as in every capture that has no application curve.
Tonemap TuningTonemap() {
  Tonemap tonemap;
  tonemap.mode = TonemapMode::kHighQuality;
  return tonemap;
}

Status RunBlcIpp(const TuningBlock& block, const FrameFacts& facts, HardwareValues& values) {
  BlcIppOutput output{};
  TAVIK_RETURN_IF_ERROR(TranslateBlc(
      block, BlcInput{facts.bayer_pattern, facts.sensor_type, facts.sensor_bit_depth,
                      facts.digital_gain},
      output));
  values.Words(output, 3);
  values.Field("bypass", output.bypass);
  values.Field("tile_mode", output.tile_mode);
  values.Field("gain_integer_bits", output.gain_integer_bits);
  values.Table("offsets", output.offsets, 16);
  values.Table("gains", output.gains, 16);
  return OkStatus();
}

Status RunBlcG3aa(const TuningBlock& block, const FrameFacts& facts, HardwareValues& values) {
  BlcConfigValue output{};
  TAVIK_RETURN_IF_ERROR(TranslateBlc(
      block, BlcInput{facts.bayer_pattern, facts.sensor_type, facts.sensor_bit_depth,
                      facts.digital_gain},
      &output));
  values.Words(output, 4);
  values.Field("enable", output.enable);
  values.Field("pixel_order", output.pixel_order);
  values.Field("offset_r", output.offset_r);
  values.Field("offset_gr", output.offset_gr);
  values.Field("offset_gb", output.offset_gb);
  values.Field("offset_b", output.OffsetB());
  return OkStatus();
}

Status RunDg(const TuningBlock& block, const FrameFacts& facts, HardwareValues& values) {
  DgConfigValue output{};
  TAVIK_RETURN_IF_ERROR(TranslateDg(
      block, DgInput{facts.bayer_pattern, facts.sensor_bit_depth, facts.digital_gain}, output));
  values.Words(output, 4);
  values.Field("enable", output.enable);
  values.Field("pixel_order", output.pixel_order);
  values.Field("gain_r", output.gain_r);
  values.Field("gain_gr", output.gain_gr);
  values.Field("gain_gb", output.GainGb());
  values.Field("gain_b", output.gain_b);
  return OkStatus();
}

Status RunGammaItp(const TuningBlock& block, const FrameFacts&, HardwareValues& values) {
  GammaItpOutput output{};
  TonemapCurve curve;
  TAVIK_RETURN_IF_ERROR(TranslateGamma(block, TuningTonemap(), output, curve));
  values.Words(output, 4);
  values.Field("bypass", output.bypass);
  values.Field("gamma_r_last_negative", output.gamma_r_last_negative);
  values.Field("gamma_g_last_negative", output.gamma_g_last_negative);
  values.Field("gamma_b_last_negative", output.gamma_b_last_negative);
  values.Table("gamma_x", output.gamma_x, 64);
  values.Field("gamma_x_last_step", output.gamma_x_last_step);
  values.Table("gamma_r", output.gamma_r, 64);
  values.Field("gamma_r_last_step", output.gamma_r_last_step);
  values.Table("gamma_g", output.gamma_g, 64);
  values.Field("gamma_g_last_step", output.gamma_g_last_step);
  values.Table("gamma_b", output.gamma_b, 64);
  values.Field("gamma_b_last_step", output.gamma_b_last_step);
  return OkStatus();
}

Status RunGammaG3aa(const TuningBlock& block, const FrameFacts&, HardwareValues& values) {
  GammaConfigValue config{};
  GammaLutValue lut{};
  TAVIK_RETURN_IF_ERROR(TranslateGamma(block, TuningTonemap(), config, lut));
  values.Words(config, 1);
  values.Field("enable", config.enable);
  values.Table("gamma_lut_values", lut.gamma_lut_values, 96);
  return OkStatus();
}

}  // namespace

void HardwareValues::Field(std::string_view name, int64_t value) {
  entries_.push_back(Entry{std::string(name), {value}, false});
}

std::string HardwareValues::ToText() const {
  std::string text;
  for (const Entry& entry : entries_) {
    StrAppend(&text, "  ", entry.name, " =");
    if (entry.is_word) {
      char hex[16];
      std::snprintf(hex, sizeof(hex), "0x%08llx",
                    static_cast<unsigned long long>(entry.values.front()));
      StrAppend(&text, " ", hex, "\n");
      continue;
    }
    for (int64_t value : entry.values) StrAppend(&text, " ", value);
    if (entry.values.size() == 1 && entry.values.front() > 9) {
      StrAppend(&text, " (0x", absl::Hex(entry.values.front()), ")");
    }
    text += "\n";
  }
  return text;
}

std::string HardwareValues::ToJson() const {
  std::string json = "{";
  for (size_t i = 0; i < entries_.size(); ++i) {
    const Entry& entry = entries_[i];
    if (i > 0) json += ",";
    StrAppend(&json, "\"", entry.name, "\":");
    if (entry.is_word) {
      StrAppend(&json, "\"0x", absl::Hex(entry.values.front(), absl::kZeroPad8), "\"");
    } else if (entry.values.size() == 1) {
      StrAppend(&json, entry.values.front());
    } else {
      json += "[";
      for (size_t j = 0; j < entry.values.size(); ++j) {
        if (j > 0) json += ",";
        StrAppend(&json, entry.values[j]);
      }
      json += "]";
    }
  }
  return json + "}";
}

const std::vector<TranslatorEntry>& Translators() {
  static const auto* const translators = new std::vector<TranslatorEntry>{
      {"TranslateBlc (IPP)", "BlcTuning", RunBlcIpp},
      {"TranslateBlc (G3AA offsets)", "BlcTuning", RunBlcG3aa},
      {"TranslateDg (G3AA gains)", "BlcTuning", RunDg},
      {"TranslateGamma (ITP)", "GammaTuning", RunGammaItp},
      {"TranslateGamma (G3AA)", "GammaTuning", RunGammaG3aa},
  };
  return *translators;
}

}  // namespace tavik::tools
