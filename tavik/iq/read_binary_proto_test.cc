#include "tavik/iq/read_binary_proto.h"

#include <filesystem>
#include <memory>
#include <string>
#include <system_error>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"

namespace tavik {
namespace {

using ::google::protobuf::Message;
using ::tavik::test::DynamicSchema;
using ::tavik::test::IsOk;
using ::tavik::test::ParseText;
using ::tavik::test::ProtoEquals;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::vosbrine::TuningUsecaseData;
using ::vosbrine::zelmondrake::GammaDynamicParam;

// A proto2 message with required fields: none of the library's schemas has one.
constexpr char kRequiredSchema[] = R"pb(
  name: "tavik/iq/required_fields_for_reading.proto"
  package: "tavik_test"
  syntax: "proto2"
  message_type {
    name: "Required"
    field { name: "id" number: 1 label: LABEL_REQUIRED type: TYPE_INT32 }
    field { name: "name" number: 2 label: LABEL_REQUIRED type: TYPE_STRING }
    field { name: "note" number: 3 label: LABEL_OPTIONAL type: TYPE_STRING }
  }
)pb";

TEST(ReadBinaryProtoTest, ReadsAWireFormatFile) {
  TempDir dir;
  const GammaDynamicParam written = ParseText<GammaDynamicParam>("gamma_r: [0, 0.25, 1]");
  const std::string path = dir.WriteFile("gamma.binarypb", written.SerializeAsString());
  GammaDynamicParam read;
  TAVIK_ASSERT_OK(ReadBinaryProto(path, read));
  EXPECT_TRUE(ProtoEquals(written, read));
}

TEST(ReadBinaryProtoTest, ReplacesWhatTheMessageHeldBefore) {
  TempDir dir;
  const std::string path = dir.WriteFile(
      "gamma.binarypb", ParseText<GammaDynamicParam>("gamma_g: 0.5").SerializeAsString());
  GammaDynamicParam read = ParseText<GammaDynamicParam>("gamma_r: 1 gamma_g: 2");
  TAVIK_ASSERT_OK(ReadBinaryProto(path, read));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaDynamicParam>("gamma_g: 0.5"), read));
}

TEST(ReadBinaryProtoTest, EmptyFileIsAnEmptyMessage) {
  TempDir dir;
  const std::string path = dir.WriteFile("empty.binarypb", "");
  TuningUsecaseData read;
  TAVIK_ASSERT_OK(ReadBinaryProto(path, read));
  EXPECT_TRUE(ProtoEquals(TuningUsecaseData(), read));
}

TEST(ReadBinaryProtoTest, MissingFileIsNotFoundWithTheDescriptorNumber) {
  TempDir dir;
  const std::string path = dir.Path("absent.binarypb");
  TuningUsecaseData read;
  EXPECT_THAT(ReadBinaryProto(path, read),
              StatusIs(absl::StatusCode::kNotFound,
                       "Failed to open file: " + path + ", file_descriptor: -1"));
}

TEST(ReadBinaryProtoTest, BytesThatAreNoWireFormatFailNamingPathAndType) {
  TempDir dir;
  // 'g' is field 12 with wire type 7, which does not exist.
  const std::string path = dir.WriteFile("garbage.binarypb", "garbage");
  TuningUsecaseData read;
  EXPECT_THAT(ReadBinaryProto(path, read),
              StatusIs(absl::StatusCode::kInvalidArgument,
                       "Could not parse file contents of " + path +
                           " as wire-format protobuf of type vosbrine.TuningUsecaseData"));
}

TEST(ReadBinaryProtoTest, TruncatedFileFailsNamingPathAndType) {
  TempDir dir;
  const std::string bytes =
      ParseText<GammaDynamicParam>("gamma_r: [0, 0.25, 1]").SerializeAsString();
  const std::string path = dir.WriteFile("short.binarypb", bytes.substr(0, bytes.size() - 2));
  GammaDynamicParam read;
  EXPECT_THAT(
      ReadBinaryProto(path, read),
      StatusIs(absl::StatusCode::kInvalidArgument,
               "Could not parse file contents of " + path +
                   " as wire-format protobuf of type vosbrine.zelmondrake.GammaDynamicParam"));
}

TEST(ReadBinaryProtoTest, MissingRequiredFieldsFailAsUninitializedListingThem) {
  DynamicSchema schema(kRequiredSchema);
  TempDir dir;
  const std::string empty = dir.WriteFile("empty.binarypb", "");
  std::unique_ptr<Message> read = schema.New("tavik_test.Required");
  EXPECT_THAT(ReadBinaryProto(empty, *read), StatusIs(absl::StatusCode::kInvalidArgument,
                                                      "Could not parse file contents of " + empty +
                                                          ", result uninitialized: id, name"));

  std::unique_ptr<Message> partial = schema.New("tavik_test.Required");
  partial->GetReflection()->SetInt32(partial.get(), partial->GetDescriptor()->FindFieldByName("id"),
                                     3);
  const std::string path = dir.WriteFile("partial.binarypb", partial->SerializePartialAsString());
  EXPECT_THAT(ReadBinaryProto(path, *read), StatusIs(absl::StatusCode::kInvalidArgument,
                                                     "Could not parse file contents of " + path +
                                                         ", result uninitialized: name"));

  std::unique_ptr<Message> complete = schema.New("tavik_test.Required");
  test::ParseTextInto("id: 3 name: \"y\"", complete.get());
  const std::string complete_path =
      dir.WriteFile("complete.binarypb", complete->SerializeAsString());
  TAVIK_ASSERT_OK(ReadBinaryProto(complete_path, *read));
  EXPECT_TRUE(ProtoEquals(*complete, *read));
}

// Open descriptors of this process, or -1 where they can't be listed.
int OpenDescriptorCount() {
  std::error_code error;
  std::filesystem::directory_iterator entries("/proc/self/fd", error);
  if (error) return -1;
  int count = 0;
  for (auto it = entries; it != std::filesystem::directory_iterator(); it.increment(error)) {
    if (error) return -1;
    ++count;
  }
  return count;
}

TEST(ReadBinaryProtoTest, ClosesTheFileWhetherOrNotItParses) {
  DynamicSchema schema(kRequiredSchema);
  TempDir dir;
  const std::string good = dir.WriteFile(
      "good.binarypb", ParseText<GammaDynamicParam>("gamma_r: 1").SerializeAsString());
  const std::string garbage = dir.WriteFile("garbage.binarypb", "garbage");
  const std::string empty = dir.WriteFile("empty.binarypb", "");
  std::unique_ptr<Message> required = schema.New("tavik_test.Required");
  const int before = OpenDescriptorCount();
  if (before < 0) GTEST_SKIP() << "/proc/self/fd can't be listed to count open files";
  GammaDynamicParam read;
  EXPECT_THAT(ReadBinaryProto(good, read), IsOk());
  EXPECT_THAT(ReadBinaryProto(garbage, read), ::testing::Not(IsOk()));
  EXPECT_THAT(ReadBinaryProto(empty, *required), ::testing::Not(IsOk()));
  EXPECT_EQ(OpenDescriptorCount(), before);
}

TEST(ReadBinaryProtoTest, ProviderMemberForwardsToTheFreeFunction) {
  TempDir dir;
  const vosbrine::TuningProviderBase provider;
  const GammaDynamicParam written = ParseText<GammaDynamicParam>("gamma_b: 0.75");
  const std::string path = dir.WriteFile("gamma.binarypb", written.SerializeAsString());
  GammaDynamicParam read;
  EXPECT_THAT(provider.ReadBinaryProto(path, read), IsOk());
  EXPECT_TRUE(ProtoEquals(written, read));
  const std::string absent = dir.Path("absent.binarypb");
  EXPECT_THAT(provider.ReadBinaryProto(absent, read),
              StatusIs(absl::StatusCode::kNotFound,
                       "Failed to open file: " + absent + ", file_descriptor: -1"));
}

}  // namespace
}  // namespace tavik
