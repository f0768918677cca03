// A number, or a list of numbers, of a block picked by a path: "wb_gains", "wb_gains[0]",
// "lsc_tables.lsc_grid_gain_r[412]", "static_param.gamma_x", "enable". Names are looked up in the
// block's dynamic_param first, then in the block message itself; a repeated field takes an index
// in brackets, which picks one element.
#ifndef TOOLS_TAVIK_TUNE_FIELD_PATH_H_
#define TOOLS_TAVIK_TUNE_FIELD_PATH_H_

#include <string>
#include <string_view>
#include <vector>

#include "google/protobuf/descriptor.h"
#include "google/protobuf/message.h"
#include "tavik/base/status.h"

namespace tavik::tune {

class FieldPath {
 public:
  // Fails on an unknown name, an index on a field that isn't repeated, a repeated message without
  // an index, or a path that doesn't end on a number (float, double, integer, bool or enum).
  static StatusOr<FieldPath> Parse(const google::protobuf::Descriptor* block,
                                   std::string_view text);

  // The values in `block`, a message of the type the path was parsed for: one for a single
  // number, every element, in order, for a repeated number without an index (none when it is
  // empty). Fails when an index lies past the end of its list.
  StatusOr<std::vector<double>> Read(const google::protobuf::Message& block) const;

  // Whether Read gives a list rather than one value.
  bool IsList() const;

  // The path as written.
  const std::string& text() const { return text_; }

  // The label of element `index` of a list: "wb_gains[2]"; the path itself for a single value.
  std::string ElementLabel(size_t index) const;

 private:
  struct Step {
    const google::protobuf::FieldDescriptor* field;
    int index;  // The element of a repeated field, or kWhole.
  };
  static constexpr int kWhole = -1;

  FieldPath(std::string text, std::vector<Step> steps)
      : text_(std::move(text)), steps_(std::move(steps)) {}

  std::string text_;
  std::vector<Step> steps_;  // From the block message down to the number.
};

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_FIELD_PATH_H_
