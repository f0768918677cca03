// The translators that the tools run on a frame's blocks, and their hardware values as named
// fields for people and files. A new translator joins the tools by one entry in Translators().
#ifndef TOOLS_COMMON_TRANSLATOR_REGISTRY_H_
#define TOOLS_COMMON_TRANSLATOR_REGISTRY_H_

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/protos/common.pb.h"

namespace tavik::tools {

// What a frame tells the translators besides its tuning.
struct FrameFacts {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::SENSOR_TYPE_BAYER;
  int32_t sensor_bit_depth = 10;
  float digital_gain = 1.0f;
};

// The hardware values of one translation, in record order: named fields, tables, and the raw
// words of the record's bit-field header.
class HardwareValues {
 public:
  struct Entry {
    std::string name;
    std::vector<int64_t> values;
    bool is_word = false;  // A raw record word, shown in hex.
  };

  void Field(std::string_view name, int64_t value);
  template <typename Element>
  void Table(std::string_view name, const Element* values, size_t count) {
    Entry& entry = entries_.emplace_back(Entry{std::string(name), {}, false});
    entry.values.assign(values, values + count);
  }
  // The first `count` 32-bit words of `record`.
  template <typename Record>
  void Words(const Record& record, size_t count) {
    static_assert(std::is_trivially_copyable_v<Record>);
    for (size_t i = 0; i < count && (i + 1) * 4 <= sizeof(Record); ++i) {
      uint32_t word = 0;
      std::memcpy(&word, reinterpret_cast<const char*>(&record) + 4 * i, 4);
      entries_.push_back(Entry{"word[" + std::to_string(i) + "]", {word}, true});
    }
  }

  const std::vector<Entry>& entries() const { return entries_; }
  // One line per entry: "  name = value (0xhex)", tables as their values.
  std::string ToText() const;
  // {"name": value or [values], ...}, words as "0x..." strings.
  std::string ToJson() const;

 private:
  std::vector<Entry> entries_;
};

struct TranslatorEntry {
  std::string_view name;        // "TranslateBlc (IPP)"
  std::string_view block_name;  // The block it reads: "BlcTuning".
  Status (*run)(const TuningBlock& block, const FrameFacts& facts, HardwareValues& values);
};

// Every translator the tools run, in the blocks' position order.
const std::vector<TranslatorEntry>& Translators();

}  // namespace tavik::tools

#endif  // TOOLS_COMMON_TRANSLATOR_REGISTRY_H_
