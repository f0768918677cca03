// Test data of tavik-tune: tuning files kept as protobuf text under testdata/, compiled into a
// temporary directory as the build compiles the sample set.
#ifndef TOOLS_TAVIK_TUNE_TESTING_TESTDATA_H_
#define TOOLS_TAVIK_TUNE_TESTING_TESTDATA_H_

#include <memory>
#include <string>

#include "gtest/gtest.h"
#include "tavik/base/file_path.h"
#include "tavik/base/testing/temp_dir.h"
#include "tools/common/text_proto.h"
#include "tools/tavik-tune/proto_files.h"

namespace tavik::tune::test {

inline std::string TestdataPath(const std::string& relative) {
  return JoinPath(TAVIK_TUNE_TESTDATA_DIR, relative);
}

// Compiles testdata/<name>.textproto to <directory>/<file name>.binarypb and returns its path.
inline std::string CompileTestdata(const tavik::test::TempDir& directory, const std::string& name,
                                   std::string file_name = "") {
  if (file_name.empty()) file_name = name.substr(name.rfind('/') + 1);
  const std::string source = TestdataPath(name + ".textproto");
  std::unique_ptr<google::protobuf::Message> message = NewMessageForPath(source);
  const Status status = tools::ParseTextProtoFile(source, *message);
  EXPECT_TRUE(status.ok()) << status;
  return directory.WriteFile(file_name + ".binarypb", message->SerializeAsString());
}

}  // namespace tavik::tune::test

#endif  // TOOLS_TAVIK_TUNE_TESTING_TESTDATA_H_
