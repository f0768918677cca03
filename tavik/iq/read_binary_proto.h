// Reading of one binary protobuf file, the file work under the tuning provider.
#ifndef TAVIK_IQ_READ_BINARY_PROTO_H_
#define TAVIK_IQ_READ_BINARY_PROTO_H_

#include <string>

#include "google/protobuf/message.h"
#include "tavik/base/status.h"
#include "tavik/iq/export.h"

namespace tavik {

// Parses the file at `path` into `message`. NotFoundError when the file can't be opened,
// InvalidArgumentError when its bytes are not a `message` or leave required fields unset.
TAVIK_EXPORT Status ReadBinaryProto(const std::string& path, google::protobuf::Message& message);

}  // namespace tavik

#endif  // TAVIK_IQ_READ_BINARY_PROTO_H_
