#include "tavik/base/file_path.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

#include "tavik/base/strings.h"

namespace tavik {
namespace file_path_internal {

std::string JoinPathImpl(std::initializer_list<std::string_view> parts) {
  std::string result;
  for (std::string_view part : parts) {
    if (part.empty()) continue;
    if (result.empty()) {
      result.assign(part);
      continue;
    }
    const bool ends_with_slash = result.back() == '/';
    const bool starts_with_slash = part.front() == '/';
    if (ends_with_slash && starts_with_slash) {
      part.remove_prefix(1);
    } else if (!ends_with_slash && !starts_with_slash) {
      result.push_back('/');
    }
    result.append(part);
  }
  return result;
}

}  // namespace file_path_internal

std::string_view Extension(std::string_view path) {
  const size_t slash = path.rfind('/');
  std::string_view base = slash == std::string_view::npos ? path : path.substr(slash + 1);
  const size_t dot = base.rfind('.');
  if (dot == std::string_view::npos) return {};
  return base.substr(dot + 1);
}

Status RecursivelyCreateDir(std::string_view path) {
  if (path.empty()) return InvalidArgumentError("Empty directory path");
  std::string partial;
  size_t position = 0;
  while (position != std::string_view::npos) {
    position = path.find('/', position + 1);
    partial.assign(path.substr(0, position));
    if (partial.empty() || partial == "/") continue;
    if (mkdir(partial.c_str(), 0775) != 0 && errno != EEXIST) {
      return InternalError(StrCat("Failed to create directory ", partial, ": ", strerror(errno)));
    }
  }
  struct stat info;
  if (stat(std::string(path).c_str(), &info) != 0 || !S_ISDIR(info.st_mode)) {
    return InternalError(StrCat("Not a directory: ", path));
  }
  return OkStatus();
}

std::string DevicePath(std::string_view path) {
  const char* root = std::getenv(kDeviceRootVariable);
  if (root == nullptr || root[0] == '\0' || path.empty() || path.front() != '/') {
    return std::string(path);
  }
  return JoinPath(root, path);
}

}  // namespace tavik
