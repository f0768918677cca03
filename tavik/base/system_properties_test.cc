#include "tavik/base/system_properties.h"

#include "gtest/gtest.h"
#include "tavik/base/testing/property_scope.h"
#include "tavik/base/testing/status_matchers.h"

namespace tavik {
namespace {

using ::tavik::test::IsOkAndHolds;
using ::tavik::test::ScopedProperty;
using ::tavik::test::StatusIs;

constexpr char kName[] = "vendor.camera.debug.test_property";

TEST(SystemPropertiesTest, UnsetPropertyIsAnError) {
  const SystemProperties& properties = SystemProperties::GetInstance();
  EXPECT_THAT(properties.GetAs<bool>("vendor.camera.debug.never_set"),
              StatusIs(StatusCode::kNotFound, "Property not set: vendor.camera.debug.never_set"));
  EXPECT_THAT(properties.GetAs<int>("vendor.camera.debug.never_set"),
              StatusIs(StatusCode::kNotFound, "Property not set: vendor.camera.debug.never_set"));
}

TEST(SystemPropertiesTest, EmptyValueCountsAsUnset) {
  ScopedProperty property(kName, "");
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<bool>(kName),
              StatusIs(StatusCode::kNotFound, ::testing::_));
}

TEST(SystemPropertiesTest, BoolReadsTheUsualSpellings) {
  for (const char* text : {"1", "y", "yes", "on", "true"}) {
    ScopedProperty property(kName, text);
    EXPECT_THAT(SystemProperties::GetInstance().GetAs<bool>(kName), IsOkAndHolds(true)) << text;
  }
  for (const char* text : {"0", "n", "no", "off", "false"}) {
    ScopedProperty property(kName, text);
    EXPECT_THAT(SystemProperties::GetInstance().GetAs<bool>(kName), IsOkAndHolds(false)) << text;
  }
}

TEST(SystemPropertiesTest, BoolRejectsOtherText) {
  ScopedProperty property(kName, "maybe");
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<bool>(kName),
              StatusIs(StatusCode::kInvalidArgument,
                       "Property vendor.camera.debug.test_property is not a bool: maybe"));
}

TEST(SystemPropertiesTest, IntParses) {
  {
    ScopedProperty property(kName, "42");
    EXPECT_THAT(SystemProperties::GetInstance().GetAs<int>(kName), IsOkAndHolds(42));
  }
  {
    ScopedProperty property(kName, "-7");
    EXPECT_THAT(SystemProperties::GetInstance().GetAs<int>(kName), IsOkAndHolds(-7));
  }
}

TEST(SystemPropertiesTest, IntRejectsOtherText) {
  ScopedProperty property(kName, "4x");
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<int>(kName),
              StatusIs(StatusCode::kInvalidArgument,
                       "Property vendor.camera.debug.test_property is not an int: 4x"));
}

TEST(SystemPropertiesTest, StringReadsTheText) {
  ScopedProperty property(kName, "/data/vendor/camera/etc/");
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<std::string>(kName),
              IsOkAndHolds("/data/vendor/camera/etc/"));
}

TEST(SystemPropertiesTest, SetIsSeenByGet) {
  ASSERT_TRUE(SystemProperties::GetInstance().Set(kName, "true").ok());
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<bool>(kName), IsOkAndHolds(true));
  ASSERT_TRUE(SystemProperties::GetInstance().Set(kName, "").ok());
}

TEST(SystemPropertiesTest, ScopedPropertyRestoresThePreviousValue) {
  ScopedProperty outer(kName, "1");
  { ScopedProperty inner(kName, "0"); }
  EXPECT_THAT(SystemProperties::GetInstance().GetAs<int>(kName), IsOkAndHolds(1));
}

}  // namespace
}  // namespace tavik
