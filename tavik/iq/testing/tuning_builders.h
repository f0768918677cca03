// Small builders for tuning data in tests: trees of levels and leaves, use cases, tuning files
// written into a temporary directory, camera states, and message types made at run time for
// shapes that no block schema has.
#ifndef TAVIK_IQ_TESTING_TUNING_BUILDERS_H_
#define TAVIK_IQ_TESTING_TUNING_BUILDERS_H_

#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "google/protobuf/descriptor.h"
#include "google/protobuf/descriptor.pb.h"
#include "google/protobuf/descriptor_database.h"
#include "google/protobuf/dynamic_message.h"
#include "google/protobuf/message.h"
#include "google/protobuf/text_format.h"
#include "google/protobuf/util/message_differencer.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/protos/camera_state.pb.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"

namespace tavik::test {

// A region [lower, upper] whose value is `param`.
inline vosbrine::Node LeafNode(float lower, float upper, const google::protobuf::Message& param) {
  vosbrine::Node node;
  node.set_lower(lower);
  node.set_upper(upper);
  node.mutable_dynamic_param()->PackFrom(param);
  return node;
}

// A region [lower, upper] that splits further by `child`.
inline vosbrine::Node ChildNode(float lower, float upper, vosbrine::Level child) {
  vosbrine::Node node;
  node.set_lower(lower);
  node.set_upper(upper);
  *node.mutable_child_level() = std::move(child);
  return node;
}

// A region with neither a leaf nor a child level.
inline vosbrine::Node EmptyNode(float lower, float upper) {
  vosbrine::Node node;
  node.set_lower(lower);
  node.set_upper(upper);
  return node;
}

inline vosbrine::Level MakeLevel(vosbrine::Level::Type type, std::vector<vosbrine::Node> nodes) {
  vosbrine::Level level;
  level.set_type(type);
  for (vosbrine::Node& node : nodes) *level.add_nodes() = std::move(node);
  return level;
}

inline vosbrine::TuningTree MakeTree(bool enable, const google::protobuf::Message& static_param,
                                     vosbrine::Level top_level) {
  vosbrine::TuningTree tree;
  tree.set_enable(enable);
  tree.mutable_static_param()->PackFrom(static_param);
  *tree.mutable_dynamic_top_level() = std::move(top_level);
  return tree;
}

inline vosbrine::TuningUsecase MakeUsecase(vosbrine::CameraSensor sensor, vosbrine::SensorMode mode,
                                           vosbrine::CameraUsecase usecase) {
  vosbrine::TuningUsecase result;
  result.set_camera_sensor(sensor);
  result.set_sensor_mode(mode);
  result.set_camera_usecase(usecase);
  return result;
}

// The content of one tuning file: `tree_set` packed under `usecase`.
inline vosbrine::TuningUsecaseData MakeUsecaseData(const vosbrine::TuningUsecase& usecase,
                                                   const google::protobuf::Message& tree_set,
                                                   std::string_view version = "") {
  vosbrine::TuningUsecaseData data;
  *data.mutable_tuning_usecase() = usecase;
  data.mutable_tuning_tree_set()->PackFrom(tree_set);
  data.set_version(std::string(version));
  return data;
}

// Writes `message` in wire format to `relative` under `dir`; returns the full path.
inline std::string WriteBinarypb(const TempDir& dir, std::string_view relative,
                                 const google::protobuf::Message& message) {
  return dir.WriteFile(relative, message.SerializeAsString());
}

// `text` in protobuf text format, parsed into `message`.
inline void ParseTextInto(std::string_view text, google::protobuf::Message* message) {
  EXPECT_TRUE(google::protobuf::TextFormat::ParseFromString(std::string(text), message)) << text;
}

template <typename T>
T ParseText(std::string_view text) {
  T message;
  ParseTextInto(text, &message);
  return message;
}

// Exact equality of two messages, floats compared bit for bit; shows both on failure.
inline ::testing::AssertionResult ProtoEquals(const google::protobuf::Message& expected,
                                              const google::protobuf::Message& actual) {
  if (google::protobuf::util::MessageDifferencer::Equals(expected, actual)) {
    return ::testing::AssertionSuccess();
  }
  return ::testing::AssertionFailure() << "expected:\n"
                                       << expected.DebugString() << "actual:\n"
                                       << actual.DebugString();
}

// A camera state with one coordinate set, named as in LevelCoordinates ("cct", "bv", ...).
inline vosbrine::CameraState StateWith(std::string_view coordinate, float value) {
  vosbrine::CameraState state;
  vosbrine::LevelCoordinates* coordinates = state.mutable_level_coordinates();
  const google::protobuf::FieldDescriptor* field =
      coordinates->GetDescriptor()->FindFieldByName(std::string(coordinate));
  EXPECT_NE(field, nullptr) << coordinate;
  if (field != nullptr) coordinates->GetReflection()->SetFloat(coordinates, field, value);
  return state;
}

// Message types made at run time from a FileDescriptorProto in text format, for shapes that no
// schema of the library has. The file may import any schema of the library. Messages made here
// must not outlive the schema.
class DynamicSchema {
 public:
  explicit DynamicSchema(std::string_view file_descriptor_text) {
    google::protobuf::FileDescriptorProto file;
    if (!google::protobuf::TextFormat::ParseFromString(std::string(file_descriptor_text), &file)) {
      ADD_FAILURE() << "bad FileDescriptorProto text";
      return;
    }
    EXPECT_TRUE(own_files_.Add(file)) << file.name();
    EXPECT_NE(pool_.FindFileByName(file.name()), nullptr) << "could not build " << file.name();
  }

  DynamicSchema(const DynamicSchema&) = delete;
  DynamicSchema& operator=(const DynamicSchema&) = delete;

  const google::protobuf::Descriptor* FindMessage(std::string_view full_name) const {
    return pool_.FindMessageTypeByName(std::string(full_name));
  }

  const google::protobuf::FieldDescriptor* FindExtension(std::string_view full_name) const {
    return pool_.FindExtensionByName(std::string(full_name));
  }

  // A new, empty message of type `full_name`.
  std::unique_ptr<google::protobuf::Message> New(std::string_view full_name) {
    const google::protobuf::Descriptor* descriptor = FindMessage(full_name);
    EXPECT_NE(descriptor, nullptr) << full_name;
    if (descriptor == nullptr) return nullptr;
    return std::unique_ptr<google::protobuf::Message>(factory_.GetPrototype(descriptor)->New());
  }

 private:
  // The library's schemas, then the file of the test.
  google::protobuf::DescriptorPoolDatabase library_files_{
      *google::protobuf::DescriptorPool::generated_pool()};
  google::protobuf::SimpleDescriptorDatabase own_files_;
  google::protobuf::MergedDescriptorDatabase files_{&library_files_, &own_files_};
  google::protobuf::DescriptorPool pool_{&files_};
  google::protobuf::DynamicMessageFactory factory_{&pool_};
};

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_TUNING_BUILDERS_H_
