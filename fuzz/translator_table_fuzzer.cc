// Any form of the translator table on tuning messages and frame facts made of arbitrary bytes: it
// must succeed or fail with a status, never crash, read out of bounds or leak. Every translator
// that joins the table is fuzzed here with no further code.
#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>

#include "android-base/logging.h"
#include "fuzz/translator_input.h"
#include "google/protobuf/stubs/logging.h"
#include "tavik/iq/zel/translators/translator_table.h"
#include "tavik/iq/zel/zel_block_list.h"
#include "tavik/iq/zel/zel_tuning_block.h"

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  // Broken tunings make translators log on every run; only findings matter.
  android::base::SetMinimumLogSeverity(android::base::FATAL);
  google::protobuf::SetLogHandler(nullptr);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace tavik;
  if (size < fuzz::kTranslatorInputHeaderSize) return 0;
  const fuzz::TranslatorInputHeader header = fuzz::ReadHeader(data);
  const auto table = TranslatorTable();
  const TranslatorForm& form = *table[header.form % table.size()];

  const uint8_t* message = data + fuzz::kTranslatorInputHeaderSize;
  const int message_size = static_cast<int>(size - fuzz::kTranslatorInputHeaderSize);
  std::array<std::unique_ptr<TuningBlock>, kZelBlockCount> blocks;
  TranslatorFrame frame;
  frame.facts = fuzz::FactsOf(header);
  ForEachZelBlockType([&]<size_t Position, typename T>() {
    auto block = std::make_unique<ZelTuningBlock<T>>();
    if (!block->message.ParseFromArray(message, message_size)) return;
    frame.blocks[Position] = block.get();
    blocks[Position] = std::move(block);
  });

  TranslatorRecords records(form);
  (void)records.Translate(frame);
  return 0;
}
