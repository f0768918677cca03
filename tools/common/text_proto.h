// Files of the tools: whole files in and out, and protobuf text parsed with the parser's first
// complaint as "SOURCE:LINE:COLUMN: message", one line a person can act on.
#ifndef TOOLS_COMMON_TEXT_PROTO_H_
#define TOOLS_COMMON_TEXT_PROTO_H_

#include <string>
#include <string_view>

#include "google/protobuf/message.h"
#include "tavik/base/status.h"

namespace tavik::tools {

// NotFoundError "PATH: cannot open" when the file can't be read.
StatusOr<std::string> ReadFileToString(const std::string& path);
Status WriteStringToFile(const std::string& path, std::string_view contents);

// Parses `text`, which came from `source` (a path, or a name like "<default>"), into `message`.
Status ParseTextProto(std::string_view text, std::string_view source,
                      google::protobuf::Message& message);
// Reads and parses the file at `path`.
Status ParseTextProtoFile(const std::string& path, google::protobuf::Message& message);

}  // namespace tavik::tools

#endif  // TOOLS_COMMON_TEXT_PROTO_H_
