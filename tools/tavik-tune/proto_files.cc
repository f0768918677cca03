#include "tools/tavik-tune/proto_files.h"

#include "google/protobuf/text_format.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tools/common/text_proto.h"

namespace tavik::tune {

std::unique_ptr<google::protobuf::Message> NewMessageForPath(std::string_view path) {
  if (path.find(kGoldenCalibrationMarker) != std::string_view::npos) {
    return std::make_unique<vosbrine::GoldenSensorFactoryCalibrationData>();
  }
  return std::make_unique<vosbrine::TuningUsecaseData>();
}

Status ParseBinaryFile(const std::string& path, google::protobuf::Message& message) {
  StatusOr<std::string> bytes = tools::ReadFileToString(path);
  if (!bytes.ok()) return bytes.status();
  if (!message.ParseFromString(*bytes)) {
    return InvalidArgumentError(StrCat(path, ": not a binary ", message.GetTypeName()));
  }
  return OkStatus();
}

std::string ToText(const google::protobuf::Message& message) {
  google::protobuf::TextFormat::Printer printer;
  printer.SetExpandAny(true);
  std::string text;
  printer.PrintToString(message, &text);
  return text;
}

}  // namespace tavik::tune
