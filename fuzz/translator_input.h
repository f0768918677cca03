// The layout of a translator fuzz input, shared by the fuzz target and the program that makes its
// seeds: a form of the translator table, a frame's facts, then a serialised tuning message that
// every block of the frame is parsed from (as its own type), so that a form's own block and any
// other block it reads are all made of the fuzzer's bytes.
#ifndef FUZZ_TRANSLATOR_INPUT_H_
#define FUZZ_TRANSLATOR_INPUT_H_

#include <cstdint>
#include <cstring>
#include <string>

#include "tavik/iq/zel/translators/translator_table.h"

namespace tavik::fuzz {

struct TranslatorInputHeader {
  uint8_t form;  // Index into the table, modulo its size.
  int32_t bayer_pattern;
  int32_t sensor_type;
  int32_t sensor_bit_depth;
  float digital_gain;
  int32_t tonemap_mode;
};

inline constexpr size_t kTranslatorInputHeaderSize = 1 + 5 * 4;

inline TranslatorInputHeader ReadHeader(const uint8_t* data) {
  TranslatorInputHeader header;
  header.form = data[0];
  std::memcpy(&header.bayer_pattern, data + 1, 4);
  std::memcpy(&header.sensor_type, data + 5, 4);
  std::memcpy(&header.sensor_bit_depth, data + 9, 4);
  std::memcpy(&header.digital_gain, data + 13, 4);
  std::memcpy(&header.tonemap_mode, data + 17, 4);
  return header;
}

inline std::string WriteHeader(const TranslatorInputHeader& header) {
  std::string bytes(kTranslatorInputHeaderSize, '\0');
  bytes[0] = static_cast<char>(header.form);
  std::memcpy(bytes.data() + 1, &header.bayer_pattern, 4);
  std::memcpy(bytes.data() + 5, &header.sensor_type, 4);
  std::memcpy(bytes.data() + 9, &header.sensor_bit_depth, 4);
  std::memcpy(bytes.data() + 13, &header.digital_gain, 4);
  std::memcpy(bytes.data() + 17, &header.tonemap_mode, 4);
  return bytes;
}

// The facts as the header gives them; enums take any value, as a caller's may.
inline FrameFacts FactsOf(const TranslatorInputHeader& header) {
  FrameFacts facts;
  facts.bayer_pattern = static_cast<vosbrine::BayerPattern>(header.bayer_pattern);
  facts.sensor_type = static_cast<vosbrine::SensorType>(header.sensor_type);
  facts.sensor_bit_depth = header.sensor_bit_depth;
  facts.digital_gain = header.digital_gain;
  facts.tonemap_mode = static_cast<TonemapMode>(header.tonemap_mode);
  return facts;
}

}  // namespace tavik::fuzz

#endif  // FUZZ_TRANSLATOR_INPUT_H_
