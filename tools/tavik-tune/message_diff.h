// Field-by-field comparison of two messages of one type, by reflection: every field of the
// type, set or not (a proto3 zero is a value), nested messages entered, repeated fields compared
// element by element.
#ifndef TOOLS_TAVIK_TUNE_MESSAGE_DIFF_H_
#define TOOLS_TAVIK_TUNE_MESSAGE_DIFF_H_

#include <string>
#include <vector>

#include "google/protobuf/message.h"

namespace tavik::tune {

struct FieldChange {
  std::string path;  // "lsc_tables.lsc_grid_gain_r[412]", "input_lut[1].lut", "enable"
  std::string old_value;
  std::string new_value;
  // In place of the two values, for a change told as a whole ("825 of 825 values changed, ...").
  std::string summary;

  // "PATH: OLD -> NEW", or "PATH: SUMMARY".
  std::string ToString() const;

  friend bool operator==(const FieldChange&, const FieldChange&) = default;
};

struct MessageDiffOptions {
  // A repeated number with more changed elements than this is told in one line: how many changed
  // and the largest change. Zero tells every element.
  int max_elements_per_list = 8;
};

// The changes from `old_message` to `new_message`, in field order. Numbers are equal when their
// bits are, so 0 and -0 differ and a NaN equals itself; floats print in their shortest exact
// form. A list whose length changed is one change, "N values -> M values"; a submessage set on
// one side only is compared against the type's defaults. Messages of different types give one
// change of "type".
std::vector<FieldChange> DiffMessages(const google::protobuf::Message& old_message,
                                      const google::protobuf::Message& new_message,
                                      const MessageDiffOptions& options = {});

// A number as DiffMessages prints it: the shortest text that reads back as the same float.
std::string FormatFloat(float value);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_MESSAGE_DIFF_H_
