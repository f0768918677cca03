#include "tavik/base/system_properties.h"

#include "android-base/parsebool.h"
#include "android-base/parseint.h"
#include "android-base/properties.h"
#include "tavik/base/strings.h"

namespace tavik {

SystemProperties& SystemProperties::GetInstance() {
  static SystemProperties* const instance = new SystemProperties();
  return *instance;
}

StatusOr<std::string> SystemProperties::Get(std::string_view name) const {
  std::string value = android::base::GetProperty(std::string(name), "");
  if (value.empty()) return NotFoundError(StrCat("Property not set: ", name));
  return value;
}

template <>
StatusOr<std::string> SystemProperties::GetAs<std::string>(std::string_view name) const {
  return Get(name);
}

template <>
StatusOr<bool> SystemProperties::GetAs<bool>(std::string_view name) const {
  StatusOr<std::string> text = Get(name);
  if (!text.ok()) return text.status();
  switch (android::base::ParseBool(*text)) {
    case android::base::ParseBoolResult::kTrue:
      return true;
    case android::base::ParseBoolResult::kFalse:
      return false;
    case android::base::ParseBoolResult::kError:
      break;
  }
  return InvalidArgumentError(StrCat("Property ", name, " is not a bool: ", *text));
}

template <>
StatusOr<int> SystemProperties::GetAs<int>(std::string_view name) const {
  StatusOr<std::string> text = Get(name);
  if (!text.ok()) return text.status();
  int value = 0;
  if (!android::base::ParseInt(*text, &value)) {
    return InvalidArgumentError(StrCat("Property ", name, " is not an int: ", *text));
  }
  return value;
}

Status SystemProperties::Set(std::string_view name, std::string_view value) {
  if (!android::base::SetProperty(std::string(name), std::string(value))) {
    return InternalError(StrCat("Failed to set property ", name));
  }
  return OkStatus();
}

}  // namespace tavik
