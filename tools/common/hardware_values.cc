#include "tools/common/hardware_values.h"

#include <cstring>
#include <set>
#include <string_view>

#include "tavik/base/strings.h"

namespace tavik::tools {
namespace {

uint64_t Word(const void* record, size_t index, int word_bits) {
  const auto* bytes = static_cast<const char*>(record);
  if (word_bits == 64) {
    uint64_t word = 0;
    std::memcpy(&word, bytes + 8 * index, 8);
    return word;
  }
  uint32_t word = 0;
  std::memcpy(&word, bytes + 4 * index, 4);
  return word;
}

std::string Hex(uint64_t word, int word_bits) {
  return StrCat("0x", absl::Hex(word, word_bits == 64 ? absl::kZeroPad16 : absl::kZeroPad8));
}

}  // namespace

HardwareValues HardwareValues::Of(const TranslatorRecords& records) {
  HardwareValues values;
  std::set<std::string> used;
  auto unique = [&used](std::string_view record, std::string name) {
    if (!used.insert(name).second) {
      name = StrCat(record, ".", name);
      used.insert(name);
    }
    return name;
  };
  for (size_t r = 0; r < records.size(); ++r) {
    const RecordDescription& description = records.description(r);
    const void* record = records.record(r);
    const size_t word_bytes = static_cast<size_t>(description.word_bits) / 8;
    for (size_t i = 0; i < description.header_size / word_bytes; ++i) {
      values.entries_.push_back(
          Entry{unique(description.name, StrCat("word[", i, "]")),
                {static_cast<int64_t>(Word(record, i, description.word_bits))},
                description.word_bits});
    }
    for (const FieldDescription& field : description.fields) {
      Entry entry{unique(description.name, std::string(field.name)), {}, 0};
      for (int i = 0; i < field.count; ++i) {
        entry.values.push_back(static_cast<int64_t>(field.get(record, i)));
      }
      values.entries_.push_back(std::move(entry));
    }
  }
  return values;
}

std::string HardwareValues::ToText() const {
  std::string text;
  for (const Entry& entry : entries_) {
    StrAppend(&text, "  ", entry.name, " =");
    if (entry.word_bits != 0) {
      StrAppend(&text, " ", Hex(static_cast<uint64_t>(entry.values.front()), entry.word_bits),
                "\n");
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
    if (entry.word_bits != 0) {
      StrAppend(&json, "\"", Hex(static_cast<uint64_t>(entry.values.front()), entry.word_bits),
                "\"");
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

}  // namespace tavik::tools
