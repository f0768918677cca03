#include "tools/tavik-tune/keys.h"

#include <sstream>

#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/tavik-tune/testing/testdata.h"

namespace tavik::tune {
namespace {

using ::tavik::test::IsOk;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::tune::test::CompileTestdata;

TEST(KeysTest, KeysInSortOrderWithTheFileThatWonEach) {
  TempDir directory;
  const std::string eval = CompileTestdata(directory, "eval/gn1_viewfinder");
  const std::string first = CompileTestdata(directory, "lint/duplicate_key_a");
  const std::string second = CompileTestdata(directory, "lint/duplicate_key_b");
  const std::string front = CompileTestdata(directory, "keys/front_snapshot");
  std::ostringstream out;
  ASSERT_THAT(RunKeys({first, second, eval, front}, out), IsOk());
  // The front camera sorts first although it was read last; the first file of a key wins.
  EXPECT_EQ(out.str(),
            "BRIMAL_FRONT_IMX663_NORMAL, FULL_4_3_FULL_15_30FPS, SNAPSHOT\t" + front + "\n" +
                "BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER\t" + first + "\n" +
                "  dropped, read after the winner:\t" + second + "\n" +
                "  dropped, read after the winner:\t" + eval + "\n");
}

TEST(KeysTest, GoldenAndForeignFilesAreNotKeys) {
  TempDir directory;
  directory.WriteFile("notes.txt", "x");
  directory.WriteFile("broken.binarypb", "\xff");
  std::ostringstream out;
  EXPECT_THAT(RunKeys({directory.path()}, out),
              StatusIs(StatusCode::kNotFound, "no tuning file yields a key"));
  EXPECT_EQ(out.str(), "");
}

}  // namespace
}  // namespace tavik::tune
