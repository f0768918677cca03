// The hardware values of one translation as named entries, for people (text) and files (JSON):
// for each record of the form, the raw words of its bit-field header at the record's own word
// size, then its fields and tables in record order, all read through the records' descriptions.
#ifndef TOOLS_COMMON_HARDWARE_VALUES_H_
#define TOOLS_COMMON_HARDWARE_VALUES_H_

#include <cstdint>
#include <string>
#include <vector>

#include "tavik/iq/zel/translators/translator_table.h"

namespace tavik::tools {

class HardwareValues {
 public:
  struct Entry {
    std::string name;
    std::vector<int64_t> values;
    int word_bits = 0;  // A raw record word of this many bits, shown in hex; 0 for a field.
  };

  // The values of `records` as they stand. A name that an earlier record of the form already
  // used is prefixed with its own record's name ("GtnrMergeOutput.bypass").
  static HardwareValues Of(const TranslatorRecords& records);

  const std::vector<Entry>& entries() const { return entries_; }
  // One line per entry: "  name = value (0xhex)", tables as their values, words in hex.
  std::string ToText() const;
  // {"name": value or [values], ...}, words as "0x..." strings of the word's size.
  std::string ToJson() const;

 private:
  std::vector<Entry> entries_;
};

}  // namespace tavik::tools

#endif  // TOOLS_COMMON_HARDWARE_VALUES_H_
