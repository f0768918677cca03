// Debug switches of the camera service are system properties ("vendor.camera.debug.*"). On a
// device they are the system's; on a workstation libbase keeps them in the process, and tools and
// tests set them with `Set`.
#ifndef TAVIK_BASE_SYSTEM_PROPERTIES_H_
#define TAVIK_BASE_SYSTEM_PROPERTIES_H_

#include <string>
#include <string_view>

#include "tavik/base/status.h"

namespace tavik {

class SystemProperties {
 public:
  static SystemProperties& GetInstance();

  // The property's value as text; NotFoundError when it is not set (an empty value is unset).
  StatusOr<std::string> Get(std::string_view name) const;

  // The value parsed as T, for T in {bool, int, std::string}. A bool reads "1", "y", "yes", "on",
  // "true" and "0", "n", "no", "off", "false". NotFoundError when unset, InvalidArgumentError when
  // the text is not a T.
  template <typename T>
  StatusOr<T> GetAs(std::string_view name) const;

  Status Set(std::string_view name, std::string_view value);

 private:
  SystemProperties() = default;
};

template <>
StatusOr<bool> SystemProperties::GetAs<bool>(std::string_view name) const;
template <>
StatusOr<int> SystemProperties::GetAs<int>(std::string_view name) const;
template <>
StatusOr<std::string> SystemProperties::GetAs<std::string>(std::string_view name) const;

}  // namespace tavik

#endif  // TAVIK_BASE_SYSTEM_PROPERTIES_H_
