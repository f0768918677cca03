#include "tools/tavik-tune/proto_files.h"

#include <fstream>
#include <sstream>

#include "google/protobuf/io/tokenizer.h"
#include "google/protobuf/text_format.h"
#include "tavik/base/strings.h"
#include "tavik/iq/protos/golden_sensor_factory_calibration_data.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"

namespace tavik::tune {
namespace {

// Collects the parser's complaints as "file:line:column: message" lines.
class ErrorCollector : public google::protobuf::io::ErrorCollector {
 public:
  explicit ErrorCollector(std::string path) : path_(std::move(path)) {}

  void AddError(int line, google::protobuf::io::ColumnNumber column,
                const std::string& message) override {
    if (!errors_.empty()) errors_ += "\n";
    StrAppend(&errors_, path_, ":", line + 1, ":", column + 1, ": ", message);
  }

  const std::string& errors() const { return errors_; }

 private:
  std::string path_;
  std::string errors_;
};

}  // namespace

std::unique_ptr<google::protobuf::Message> NewMessageForPath(std::string_view path) {
  if (path.find(kGoldenCalibrationMarker) != std::string_view::npos) {
    return std::make_unique<vosbrine::GoldenSensorFactoryCalibrationData>();
  }
  return std::make_unique<vosbrine::TuningUsecaseData>();
}

StatusOr<std::string> ReadFileToString(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  if (!in) return NotFoundError(StrCat(path, ": cannot open"));
  std::ostringstream contents;
  contents << in.rdbuf();
  if (in.bad()) return InternalError(StrCat(path, ": read failed"));
  return contents.str();
}

Status WriteStringToFile(const std::string& path, std::string_view contents) {
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  if (!out) return InternalError(StrCat(path, ": cannot open for writing"));
  out.write(contents.data(), static_cast<std::streamsize>(contents.size()));
  out.close();
  if (!out) return InternalError(StrCat(path, ": write failed"));
  return OkStatus();
}

Status ParseTextFile(const std::string& path, google::protobuf::Message& message) {
  StatusOr<std::string> text = ReadFileToString(path);
  if (!text.ok()) return text.status();
  ErrorCollector errors(path);
  google::protobuf::TextFormat::Parser parser;
  parser.RecordErrorsTo(&errors);
  if (!parser.ParseFromString(*text, &message)) {
    return InvalidArgumentError(errors.errors().empty() ? StrCat(path, ": not valid text format")
                                                        : errors.errors());
  }
  return OkStatus();
}

Status ParseBinaryFile(const std::string& path, google::protobuf::Message& message) {
  StatusOr<std::string> bytes = ReadFileToString(path);
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
