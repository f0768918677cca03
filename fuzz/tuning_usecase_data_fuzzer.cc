// Arbitrary bytes as a tuning file: parsing, unpacking the tree set and printing must never crash,
// whatever a broken or hostile file holds.
#include <cstddef>
#include <cstdint>
#include <string>

#include "google/protobuf/text_format.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  vosbrine::TuningUsecaseData usecase_data;
  if (!usecase_data.ParseFromArray(data, static_cast<int>(size))) return 0;
  vosbrine::zelmondrake::TuningTreeSet tree_set;
  if (usecase_data.tuning_tree_set().UnpackTo(&tree_set)) {
    google::protobuf::TextFormat::Printer printer;
    printer.SetExpandAny(true);
    std::string text;
    printer.PrintToString(tree_set, &text);
  }
  return 0;
}
