#include "tavik/base/testing/temp_dir.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "gtest/gtest.h"
#include "tavik/base/file_path.h"

namespace tavik::test {
namespace {

std::string TempRoot() {
  for (const char* variable : {"TEST_TMPDIR", "TMPDIR"}) {
    const char* value = std::getenv(variable);
    if (value != nullptr && value[0] != '\0') return value;
  }
  return "/tmp";
}

}  // namespace

TempDir::TempDir() {
  std::string pattern = JoinPath(TempRoot(), "tavik_test_XXXXXX");
  if (mkdtemp(pattern.data()) == nullptr) {
    ADD_FAILURE() << "mkdtemp failed for " << pattern;
  }
  path_ = pattern;
}

TempDir::~TempDir() {
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

std::string TempDir::Path(std::string_view relative) const { return JoinPath(path_, relative); }

std::string TempDir::WriteFile(std::string_view relative, std::string_view contents) const {
  const std::string full = Path(relative);
  std::filesystem::create_directories(std::filesystem::path(full).parent_path());
  std::ofstream out(full, std::ios::binary | std::ios::trunc);
  out.write(contents.data(), static_cast<std::streamsize>(contents.size()));
  EXPECT_TRUE(out.good()) << "could not write " << full;
  return full;
}

ScopedDeviceRoot::ScopedDeviceRoot() {
  const char* previous = std::getenv(kDeviceRootVariable);
  had_previous_ = previous != nullptr;
  if (had_previous_) previous_ = previous;
  setenv(kDeviceRootVariable, root_.path().c_str(), /*overwrite=*/1);
}

ScopedDeviceRoot::~ScopedDeviceRoot() {
  if (had_previous_) {
    setenv(kDeviceRootVariable, previous_.c_str(), 1);
  } else {
    unsetenv(kDeviceRootVariable);
  }
}

}  // namespace tavik::test
