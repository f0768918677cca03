#include "tavik/iq/zel/translators/translator_table.h"

#include <algorithm>
#include <cstring>
#include <string>

#include "tavik/iq/zel/translators/blc_online_translator.h"
#include "tavik/iq/zel/translators/dg_online_translator.h"
#include "tavik/iq/zel/translators/disparity_online_translator.h"
#include "tavik/iq/zel/translators/dmsc_online_translator.h"
#include "tavik/iq/zel/translators/dpc_online_translator.h"
#include "tavik/iq/zel/translators/edgedet_online_translator.h"
#include "tavik/iq/zel/translators/gamma_online_translator.h"
#include "tavik/iq/zel/translators/hqdns_online_translator.h"
#include "tavik/iq/zel/translators/nfltr_online_translator.h"
#include "tavik/iq/zel/translators/nsmix_online_translator.h"
#include "tavik/iq/zel/translators/prc_online_translator.h"
#include "tavik/iq/zel/translators/sensor_gamma_online_translator.h"
#include "tavik/iq/zel/translators/sharp_online_translator.h"
#include "tavik/iq/zel/translators/skind_online_translator.h"
#include "tavik/iq/zel/translators/snadd_online_translator.h"

namespace tavik {
namespace {

// One row per form, in the blocks' position order.
constexpr const TranslatorForm* kTable[] = {
    &translator_forms::kBlcIpp,
    &translator_forms::kBlcG3aaOffsets,
    &translator_forms::kBlcG3aaGains,
    &translator_forms::kDg,
    &translator_forms::kDisparityIpp,
    &translator_forms::kDisparityG3aa,
    &translator_forms::kDmsc,
    &translator_forms::kDpcIpp,
    &translator_forms::kDpcG3aa,
    &translator_forms::kEdgedet,
    &translator_forms::kGammaItp,
    &translator_forms::kGammaG3aa,
    &translator_forms::kHqdns,
    &translator_forms::kHqdnsB0,
    &translator_forms::kNfltr,
    &translator_forms::kNsmix,
    &translator_forms::kNsmixB0,
    &translator_forms::kPrc,
    &translator_forms::kSensorGammaProIpp,
    &translator_forms::kSensorGammaG3aa,
    &translator_forms::kSharp,
    &translator_forms::kSharpB0,
    &translator_forms::kSkind,
    &translator_forms::kSnadd,
};

// Stands for a block that the frame does not have. No translator's type matches it, so each
// refuses it the way it refuses a block of another type.
class AbsentTuningBlock final : public TuningBlock {
 public:
  std::string GetName() const override { return "absent block"; }
};

size_t AlignUp(size_t offset, size_t alignment) {
  return (offset + alignment - 1) / alignment * alignment;
}

}  // namespace

const TuningBlock& TranslatorFrame::AbsentBlock() {
  static const AbsentTuningBlock* const absent = new AbsentTuningBlock();
  return *absent;
}

std::span<const TranslatorForm* const> TranslatorTable() { return kTable; }

TranslatorRecords::TranslatorRecords(const TranslatorForm& form) : form_(&form) {
  // One block of storage, each record at its own alignment.
  std::vector<size_t> offsets;
  size_t size = 0;
  for (const RecordDescription* record : form.records) {
    size = AlignUp(size, record->alignment);
    offsets.push_back(size);
    size += record->size;
  }
  storage_ = std::make_unique<std::byte[]>(std::max<size_t>(size, 1));
  for (size_t offset : offsets) pointers_.push_back(storage_.get() + offset);
}

Status TranslatorRecords::Translate(const TranslatorFrame& frame) {
  for (size_t i = 0; i < pointers_.size(); ++i) {
    std::memset(pointers_[i], 0, form_->records[i]->size);
  }
  return form_->translate(frame, pointers_.data());
}

}  // namespace tavik
