// Paths and directories. Fixed device paths ("/data/vendor/...", "/apex/...") keep their exact
// text in the code and pass through `DevicePath` where a file is touched: with TAVIK_DEVICE_ROOT
// set in the environment, they land under that root, so a workstation run reads and writes in a
// sandbox. With the variable unset or empty, a path is used as it stands, as on the device.
#ifndef TAVIK_BASE_FILE_PATH_H_
#define TAVIK_BASE_FILE_PATH_H_

#include <initializer_list>
#include <string>
#include <string_view>

#include "tavik/base/status.h"

namespace tavik {

inline constexpr char kDeviceRootVariable[] = "TAVIK_DEVICE_ROOT";

namespace file_path_internal {
std::string JoinPathImpl(std::initializer_list<std::string_view> parts);
}  // namespace file_path_internal

// Joins with exactly one '/' between non-empty parts: JoinPath("/a/", "b") is "/a/b".
template <typename... Parts>
std::string JoinPath(const Parts&... parts) {
  return file_path_internal::JoinPathImpl({std::string_view(parts)...});
}

// What follows the last '.' of the last path component, without the dot; empty when there is
// none. Extension("/x/a.binarypb") is "binarypb".
std::string_view Extension(std::string_view path);

// Creates `path` and its missing parents (mode 0775). OK when the directory exists already.
Status RecursivelyCreateDir(std::string_view path);

// `path` under the device root of the environment when the variable is set and the path is
// absolute; `path` itself otherwise.
std::string DevicePath(std::string_view path);

}  // namespace tavik

#endif  // TAVIK_BASE_FILE_PATH_H_
