// A fresh directory for one test, removed with everything in it when the object dies. It lies
// under $TEST_TMPDIR when set, else under $TMPDIR or /tmp.
#ifndef TAVIK_BASE_TESTING_TEMP_DIR_H_
#define TAVIK_BASE_TESTING_TEMP_DIR_H_

#include <string>
#include <string_view>

namespace tavik::test {

class TempDir {
 public:
  TempDir();
  ~TempDir();

  TempDir(const TempDir&) = delete;
  TempDir& operator=(const TempDir&) = delete;

  const std::string& path() const { return path_; }
  // `relative` joined to the directory.
  std::string Path(std::string_view relative) const;
  // Writes `contents` to `relative` (parents created) and returns the full path.
  std::string WriteFile(std::string_view relative, std::string_view contents) const;

 private:
  std::string path_;
};

// Sets TAVIK_DEVICE_ROOT to a fresh temporary directory for the life of a scope, so that fixed
// device paths land in it.
class ScopedDeviceRoot {
 public:
  ScopedDeviceRoot();
  ~ScopedDeviceRoot();

  const std::string& path() const { return root_.path(); }

 private:
  TempDir root_;
  std::string previous_;
  bool had_previous_;
};

}  // namespace tavik::test

#endif  // TAVIK_BASE_TESTING_TEMP_DIR_H_
