#include "tavik/base/file_path.h"

#include <sys/stat.h>

#include <string>

#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"

namespace tavik {
namespace {

using ::tavik::test::ScopedDeviceRoot;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;

bool IsDirectory(const std::string& path) {
  struct stat info;
  return stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

TEST(JoinPathTest, PutsExactlyOneSlashBetweenParts) {
  EXPECT_EQ(JoinPath("/data/vendor/camera/", "imx363_lsc_eeprom.txt"),
            "/data/vendor/camera/imx363_lsc_eeprom.txt");
  EXPECT_EQ(JoinPath("/data", "/vendor"), "/data/vendor");
  EXPECT_EQ(JoinPath("a", "b", "c"), "a/b/c");
  EXPECT_EQ(JoinPath("a/", "/b"), "a/b");
}

TEST(JoinPathTest, SkipsEmptyParts) {
  EXPECT_EQ(JoinPath("", "b"), "b");
  EXPECT_EQ(JoinPath("a", ""), "a");
  EXPECT_EQ(JoinPath(), "");
}

TEST(ExtensionTest, IsWhatFollowsTheLastDotOfTheName) {
  EXPECT_EQ(Extension("/x/tuning.binarypb"), "binarypb");
  EXPECT_EQ(Extension("a.tar.gz"), "gz");
  EXPECT_EQ(Extension("/x.d/name"), "");
  EXPECT_EQ(Extension("noext"), "");
  EXPECT_EQ(Extension("trailing."), "");
}

TEST(RecursivelyCreateDirTest, CreatesMissingParents) {
  TempDir dir;
  const std::string path = dir.Path("a/b/c");
  TAVIK_ASSERT_OK(RecursivelyCreateDir(path));
  EXPECT_TRUE(IsDirectory(path));
}

TEST(RecursivelyCreateDirTest, ExistingDirectoryIsFine) {
  TempDir dir;
  TAVIK_ASSERT_OK(RecursivelyCreateDir(dir.path()));
  TAVIK_ASSERT_OK(RecursivelyCreateDir(dir.path() + "/"));
}

TEST(RecursivelyCreateDirTest, FileInTheWayIsAnError) {
  TempDir dir;
  const std::string file = dir.WriteFile("f", "x");
  EXPECT_THAT(RecursivelyCreateDir(file + "/sub"),
              StatusIs(StatusCode::kInternal, "Failed to create directory " + file +
                                                  "/sub: Not a directory"));
}

TEST(RecursivelyCreateDirTest, EmptyPathIsAnError) {
  EXPECT_THAT(RecursivelyCreateDir(""),
              StatusIs(StatusCode::kInvalidArgument, "Empty directory path"));
}

TEST(DevicePathTest, UnchangedWithoutADeviceRoot) {
  unsetenv(kDeviceRootVariable);
  EXPECT_EQ(DevicePath("/data/vendor/camera/"), "/data/vendor/camera/");
}

TEST(DevicePathTest, AbsolutePathsGoUnderTheDeviceRoot) {
  ScopedDeviceRoot root;
  EXPECT_EQ(DevicePath("/data/vendor/camera/debug_config.txt"),
            root.path() + "/data/vendor/camera/debug_config.txt");
}

TEST(DevicePathTest, RelativePathsAreLeftAlone) {
  ScopedDeviceRoot root;
  EXPECT_EQ(DevicePath("tuning/a.binarypb"), "tuning/a.binarypb");
}

TEST(DevicePathTest, DirectoriesCanBeMadeInTheSandbox) {
  ScopedDeviceRoot root;
  TAVIK_ASSERT_OK(RecursivelyCreateDir(DevicePath("/data/vendor/camera/debug_dump/")));
  EXPECT_TRUE(IsDirectory(root.path() + "/data/vendor/camera/debug_dump"));
}

}  // namespace
}  // namespace tavik
