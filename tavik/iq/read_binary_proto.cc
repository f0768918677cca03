#include "tavik/iq/read_binary_proto.h"

#include <fcntl.h>

#include "google/protobuf/io/zero_copy_stream_impl.h"
#include "tavik/base/strings.h"

namespace tavik {

Status ReadBinaryProto(const std::string& path, google::protobuf::Message& message) {
  const int file_descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC);
  if (file_descriptor == -1) {
    return NotFoundError(
        StrCat("Failed to open file: ", path, ", file_descriptor: ", file_descriptor));
  }
  google::protobuf::io::FileInputStream stream(file_descriptor);
  stream.SetCloseOnDelete(true);
  if (!message.ParsePartialFromZeroCopyStream(&stream)) {
    return InvalidArgumentError(StrCat("Could not parse file contents of ", path,
                                       " as wire-format protobuf of type ",
                                       message.GetTypeName()));
  }
  if (!message.IsInitialized()) {
    return InvalidArgumentError(StrCat("Could not parse file contents of ", path,
                                       ", result uninitialized: ",
                                       message.InitializationErrorString()));
  }
  return OkStatus();
}

}  // namespace tavik
