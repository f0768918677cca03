// The camera service's white-balance gains of a frame, as the denoising translators read them:
// noise strength and the noise filter's weights follow the gains applied to each colour.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_WHITE_BALANCE_CONFIG_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_WHITE_BALANCE_CONFIG_H_

namespace tavik_api {

// Gains of the four Bayer channels; 1.0 leaves a channel as it is.
struct WhiteBalanceConfig {
  float r = 1.0f;
  float gr = 1.0f;
  float gb = 1.0f;
  float b = 1.0f;

  friend bool operator==(const WhiteBalanceConfig&, const WhiteBalanceConfig&) = default;
};

}  // namespace tavik_api

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_WHITE_BALANCE_CONFIG_H_
