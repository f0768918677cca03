// The family of online translators as one table: a row per translator form, holding its display
// name, the block it translates (by position in the block list), and the call that makes its
// Input record from a frame's facts, runs the translator and fills its output records, whose
// fields are described beside their structs. Whatever handles every translator (the tools, the
// simulator, the generic tests and fuzzer, debug dumps, offline replay) iterates this table.
//
// A unit joins the family by defining its forms beside its translators and declaring them in its
// header, and by one row in TranslatorTable() (translator_table.cc):
//
//   // foo_online_translator.cc
//   namespace translator_forms {
//   constexpr TranslatorForm kFooIpp = MakeTranslatorForm<zm::FooTuning, FooIppOutput>(
//       "TranslateFoo (IPP)", [](const TranslatorFrame& frame, FooIppOutput& output) {
//         return TranslateFoo(frame.Block<zm::FooTuning>(), FooInputOf(frame.facts), output);
//       });
//   }  // namespace translator_forms
//
// The table is explicit rather than filled by static registration objects: the library also
// ships as a static archive, where such objects are silently dropped.
#ifndef TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_TABLE_H_
#define TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_TABLE_H_

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <utility>
#include <vector>

#include "tavik/base/status.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/export.h"
#include "tavik/iq/protos/common.pb.h"
#include "tavik/iq/zel/translators/frame_modes.h"
#include "tavik/iq/zel/translators/record_description.h"
#include "tavik/iq/zel/translators/tonemap.h"
#include "tavik/iq/zel/translators/white_balance_config.h"
#include "tavik/iq/zel/zel_block_list.h"

namespace tavik {

// What a frame tells the translators besides its tuning: the facts their Input records are made
// of. The defaults describe a plain 10-bit Bayer frame of 4032 x 3024 under unit white balance,
// denoised and sharpened, with no face in view, whose tone curve the tuning rules.
struct FrameFacts {
  vosbrine::BayerPattern bayer_pattern = vosbrine::RGGB;
  vosbrine::SensorType sensor_type = vosbrine::SENSOR_TYPE_BAYER;
  int32_t sensor_bit_depth = 10;
  float digital_gain = 1.0f;
  TonemapMode tonemap_mode = TonemapMode::kHighQuality;
  // The raw frame's size in pixels, as the raw stages (disparity, defective pixels, demosaic, the
  // raw denoiser and noise mix) take it: the full 4:3 frame of a 12-megapixel sensor.
  int32_t bayer_width = 4032;
  int32_t bayer_height = 3024;
  // The size in pixels of the image that the ITP stages process (after the raw stages' crop and
  // scaling); the face regions are in its coordinates.
  int32_t image_width = 4032;
  int32_t image_height = 3024;
  tavik_api::WhiteBalanceConfig white_balance;
  // The defective-pixel correction mode of the frame; 0 switches the stage off.
  int32_t dpc_mode = 2;
  DenoiseMode denoise_mode = DenoiseMode::kHighQuality;
  EdgeMode edge_mode = EdgeMode::kHighQuality;
  // The faces detected in the frame, in pixels; the caller keeps them alive.
  std::span<const vosbrine::Roi> face_regions;
};

// A frame as the translators see it: its blocks by position in the block list, and its facts.
struct TranslatorFrame {
  std::array<const TuningBlock*, kZelBlockCount> blocks{};
  FrameFacts facts;

  // The frame's block of tuning type T; where the frame has none, a block that every translator
  // refuses as it refuses a block of another type.
  template <typename T>
  const TuningBlock& Block() const {
    const TuningBlock* block = blocks[kZelBlockPosition<T>];
    return block != nullptr ? *block : AbsentBlock();
  }

  TAVIK_EXPORT static const TuningBlock& AbsentBlock();
};

// One translator form: a Translate<Block> overload (or one stage of it), with its output records.
struct TranslatorForm {
  // "TranslateBlc (IPP)": the function's name, then the stage in brackets.
  std::string_view name;
  // The block it translates, by position in the block list.
  size_t block = 0;
  // Its output records, in argument order.
  std::span<const RecordDescription* const> records;
  // Makes the Input from `frame` and translates into `records` (one pointer per record, each to
  // storage of that record's type).
  Status (*translate)(const TranslatorFrame& frame, void* const* records) = nullptr;
  // Fields of the records (by their described names) that the translator writes from the frame's
  // facts before it reads the tuning, as a stage whose geometry is programmed whatever the tuning
  // holds; a block it refuses leaves every other bit as it was. Empty for most forms.
  std::span<const std::string_view> fields_before_tuning;

  // The function's name alone, which is also the name of its trace: "TranslateBlc".
  constexpr std::string_view function_name() const { return name.substr(0, name.find(' ')); }

  // This form, telling the fields it writes before it reads the tuning:
  //   constexpr std::string_view kGeometry[] = {"image_width", "image_height"};
  //   constexpr TranslatorForm kFoo = MakeTranslatorForm<...>(...).WritingBeforeTuning(kGeometry);
  constexpr TranslatorForm WritingBeforeTuning(std::span<const std::string_view> fields) const {
    TranslatorForm form = *this;
    form.fields_before_tuning = fields;
    return form;
  }
};

namespace translator_table_internal {

template <typename... Records>
inline constexpr std::array<const RecordDescription*, sizeof...(Records)> kRecordsOf = {
    &RecordDescriptionOf<Records>()...};

template <typename Call, typename... Records, size_t... Index>
Status CallWithRecords(const TranslatorFrame& frame, void* const* records,
                       std::index_sequence<Index...>) {
  return Call{}(frame, *static_cast<Records*>(records[Index])...);
}

}  // namespace translator_table_internal

// The form of a translator of tuning type `Tuning` writing `Records...`. `call` is a lambda
// without captures: `Status(const TranslatorFrame&, Records&...)`.
template <typename Tuning, DescribedRecord... Records, typename Call>
constexpr TranslatorForm MakeTranslatorForm(std::string_view name, Call) {
  static_assert(std::is_empty_v<Call> && std::is_default_constructible_v<Call>,
                "a form's call is a lambda without captures");
  return TranslatorForm{name,
                        kZelBlockPosition<Tuning>,
                        translator_table_internal::kRecordsOf<Records...>,
                        [](const TranslatorFrame& frame, void* const* records) -> Status {
                          return translator_table_internal::CallWithRecords<Call, Records...>(
                              frame, records, std::index_sequence_for<Records...>());
                        },
                        {}};
}

// Every form of the family, in the blocks' position order.
TAVIK_EXPORT std::span<const TranslatorForm* const> TranslatorTable();

// The records of one form, made once and reused frame after frame: Translate zero-fills them and
// runs the form into them, allocating nothing.
class TAVIK_EXPORT TranslatorRecords {
 public:
  explicit TranslatorRecords(const TranslatorForm& form);

  TranslatorRecords(const TranslatorRecords&) = delete;
  TranslatorRecords& operator=(const TranslatorRecords&) = delete;
  TranslatorRecords(TranslatorRecords&&) = default;
  TranslatorRecords& operator=(TranslatorRecords&&) = default;

  Status Translate(const TranslatorFrame& frame);

  const TranslatorForm& form() const { return *form_; }
  size_t size() const { return pointers_.size(); }
  const RecordDescription& description(size_t index) const { return *form_->records[index]; }
  const void* record(size_t index) const { return pointers_[index]; }
  // One pointer per record, as the form's translate takes them.
  void* const* pointers() const { return pointers_.data(); }

 private:
  const TranslatorForm* form_;
  std::unique_ptr<std::byte[]> storage_;
  std::vector<void*> pointers_;
};

}  // namespace tavik

#endif  // TAVIK_IQ_ZEL_TRANSLATORS_TRANSLATOR_TABLE_H_
