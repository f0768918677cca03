// Reading and writing the two kinds of tuning file, in binary and in text form. Which message a
// file holds follows from its name: golden calibration files carry
// "golden_sensor_factory_calibration_data" in their path, every other file is a tuning use case.
#ifndef TOOLS_TAVIK_TUNE_PROTO_FILES_H_
#define TOOLS_TAVIK_TUNE_PROTO_FILES_H_

#include <memory>
#include <string>
#include <string_view>

#include "google/protobuf/message.h"
#include "tavik/base/status.h"

namespace tavik::tune {

inline constexpr char kGoldenCalibrationMarker[] = "golden_sensor_factory_calibration_data";

// A new, empty message of the kind that `path` holds.
std::unique_ptr<google::protobuf::Message> NewMessageForPath(std::string_view path);

// Parses a binary file into `message`. (Text files: tools/common/text_proto.h.)
Status ParseBinaryFile(const std::string& path, google::protobuf::Message& message);

// Text form of `message`, with Any fields expanded to the message they pack.
std::string ToText(const google::protobuf::Message& message);

}  // namespace tavik::tune

#endif  // TOOLS_TAVIK_TUNE_PROTO_FILES_H_
