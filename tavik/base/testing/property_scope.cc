#include "tavik/base/testing/property_scope.h"

#include "android-base/properties.h"

namespace tavik::test {

ScopedProperty::ScopedProperty(std::string_view name, std::string_view value)
    : name_(name), previous_(android::base::GetProperty(name_, "")) {
  android::base::SetProperty(name_, std::string(value));
}

ScopedProperty::~ScopedProperty() { android::base::SetProperty(name_, previous_); }

}  // namespace tavik::test
