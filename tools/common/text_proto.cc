#include "tools/common/text_proto.h"

#include <fstream>
#include <sstream>

#include "google/protobuf/io/tokenizer.h"
#include "google/protobuf/text_format.h"
#include "tavik/base/strings.h"

namespace tavik::tools {
namespace {

// Keeps the parser's first complaint; the later ones follow from it.
class FirstErrorCollector : public google::protobuf::io::ErrorCollector {
 public:
  explicit FirstErrorCollector(std::string_view source) : source_(source) {}

  void AddError(int line, google::protobuf::io::ColumnNumber column,
                const std::string& message) override {
    if (first_.empty()) first_ = StrCat(source_, ":", line + 1, ":", column + 1, ": ", message);
  }

  const std::string& first() const { return first_; }

 private:
  std::string_view source_;
  std::string first_;
};

}  // namespace

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

Status ParseTextProto(std::string_view text, std::string_view source,
                      google::protobuf::Message& message) {
  FirstErrorCollector errors(source);
  google::protobuf::TextFormat::Parser parser;
  parser.RecordErrorsTo(&errors);
  if (!parser.ParseFromString(std::string(text), &message)) {
    return InvalidArgumentError(errors.first().empty() ? StrCat(source, ": not valid text format")
                                                       : errors.first());
  }
  return OkStatus();
}

Status ParseTextProtoFile(const std::string& path, google::protobuf::Message& message) {
  StatusOr<std::string> text = ReadFileToString(path);
  if (!text.ok()) return text.status();
  return ParseTextProto(*text, path, message);
}

}  // namespace tavik::tools
