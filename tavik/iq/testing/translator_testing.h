// What translator tests share: a block of no translator's type, records filled with a pattern and
// compared byte for byte, a trace sink that records spans, and the leaves of the sample tuning
// set as typed blocks.
#ifndef TAVIK_IQ_TESTING_TRANSLATOR_TESTING_H_
#define TAVIK_IQ_TESTING_TRANSLATOR_TESTING_H_

#include <cstdint>
#include <cstring>
#include <filesystem>
#include <mutex>
#include <string>
#include <type_traits>
#include <utility>
#include <vector>

#include "google/protobuf/any.pb.h"
#include "google/protobuf/descriptor.h"
#include "google/protobuf/message.h"
#include "gtest/gtest.h"
#include "tavik/base/trace.h"
#include "tavik/base/tuning_block.h"
#include "tavik/iq/protos/tuning_tree.pb.h"
#include "tavik/iq/protos/tuning_usecase.pb.h"
#include "tavik/iq/read_binary_proto.h"
#include "tavik/iq/tuning_provider_base.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/zel_tuning_block.h"

namespace tavik::test {

// A tuning block of a type that no translator reads.
class ForeignBlock : public TuningBlock {
 public:
  ForeignBlock() = default;
  explicit ForeignBlock(std::string name) : name_(std::move(name)) {}
  std::string GetName() const override { return name_; }

 private:
  std::string name_ = "Foreign";
};

// Sets every float of `message` to `value`: its singular float fields, every element of its
// repeated float fields (their lengths stay), and likewise in every sub-message that is set. For
// tests of extreme values (infinities, NaN, huge magnitudes) in every field of a tuning.
inline void SetEveryFloat(google::protobuf::Message& message, float value) {
  const google::protobuf::Descriptor& descriptor = *message.GetDescriptor();
  const google::protobuf::Reflection& reflection = *message.GetReflection();
  for (int i = 0; i < descriptor.field_count(); ++i) {
    const google::protobuf::FieldDescriptor* field = descriptor.field(i);
    if (field->cpp_type() == google::protobuf::FieldDescriptor::CPPTYPE_FLOAT) {
      if (!field->is_repeated()) {
        reflection.SetFloat(&message, field, value);
      } else {
        for (int k = 0; k < reflection.FieldSize(message, field); ++k) {
          reflection.SetRepeatedFloat(&message, field, k, value);
        }
      }
    } else if (field->cpp_type() == google::protobuf::FieldDescriptor::CPPTYPE_MESSAGE &&
               !field->is_repeated() && reflection.HasField(message, field)) {
      SetEveryFloat(*reflection.MutableMessage(&message, field), value);
    }
  }
}

// A record whose every byte is `byte`, so that a test sees which bits a translator wrote.
template <typename Record>
Record PatternFilled(uint8_t byte = 0xA5) {
  static_assert(std::is_trivially_copyable_v<Record>);
  Record record;
  std::memset(&record, byte, sizeof(record));
  return record;
}

template <typename Record>
bool SameBytes(const Record& a, const Record& b) {
  static_assert(std::is_trivially_copyable_v<Record>);
  return std::memcmp(&a, &b, sizeof(Record)) == 0;
}

// Records every span that ends while it is installed: installed on construction, removed on
// destruction.
class RecordingTraceSink : public TraceSink {
 public:
  using Span = std::pair<int, std::string>;  // Category and name.

  RecordingTraceSink() { SetTraceSink(this); }
  ~RecordingTraceSink() override { SetTraceSink(nullptr); }
  RecordingTraceSink(const RecordingTraceSink&) = delete;
  RecordingTraceSink& operator=(const RecordingTraceSink&) = delete;

  void OnSpan(const TraceSpan& span) override {
    std::lock_guard<std::mutex> lock(mutex_);
    spans_.emplace_back(span.category, std::string(span.name));
  }

  // The spans in the order they ended: an enclosing span after those it encloses.
  std::vector<Span> spans() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return spans_;
  }

 private:
  mutable std::mutex mutex_;
  std::vector<Span> spans_;
};

// The sample tuning set's directory, or empty where the test was built without it.
inline std::filesystem::path SampleTuningDir() {
#ifdef TAVIK_SAMPLE_TUNING_DIR
  return TAVIK_SAMPLE_TUNING_DIR;
#else
  return {};
#endif
}

// The tree sets of the sample tuning set's files, in directory order, with their file names.
// Golden module calibrations lie beside the tunings and hold no tree set; they are left out.
// Records a failure for a file that does not read; an empty result where the set is missing.
inline std::vector<std::pair<std::string, vosbrine::zelmondrake::TuningTreeSet>> SampleTreeSets() {
  namespace fs = std::filesystem;
  std::vector<std::pair<std::string, vosbrine::zelmondrake::TuningTreeSet>> tree_sets;
  const fs::path dir = SampleTuningDir();
  if (dir.empty() || !fs::is_directory(dir)) return tree_sets;
  for (const fs::directory_entry& entry : fs::directory_iterator(dir)) {
    const std::string path = entry.path().string();
    if (entry.path().extension() != ".binarypb" ||
        path.find("golden_sensor_factory_calibration_data") != std::string::npos) {
      continue;
    }
    vosbrine::TuningUsecaseData data;
    const Status read = ReadBinaryProto(path, data);
    EXPECT_TRUE(read.ok()) << path << ": " << read;
    vosbrine::zelmondrake::TuningTreeSet tree_set;
    EXPECT_TRUE(data.tuning_tree_set().UnpackTo(&tree_set)) << path;
    tree_sets.emplace_back(entry.path().filename().string(), std::move(tree_set));
  }
  return tree_sets;
}

// The tree of block type T in `tree_set`, or null where the set has none.
template <typename T>
const vosbrine::TuningTree* TreeOf(const vosbrine::zelmondrake::TuningTreeSet& tree_set) {
  const google::protobuf::FieldDescriptor* field = tree_set.GetDescriptor()->FindFieldByName(
      vosbrine::FieldNameFromMessageName(T::descriptor()->name()));
  if (field == nullptr || !tree_set.GetReflection()->HasField(tree_set, field)) return nullptr;
  return static_cast<const vosbrine::TuningTree*>(
      &tree_set.GetReflection()->GetMessage(tree_set, field));
}

// Every leaf of the tree of block type T in `tree` as the block the controller makes of it: the
// tree's switch and static part with the leaf's dynamic part.
template <typename T>
std::vector<ZelTuningBlock<T>> LeafBlocks(const vosbrine::TuningTree& tree) {
  std::vector<ZelTuningBlock<T>> blocks;
  vosbrine::Level level = tree.dynamic_top_level();
  std::vector<google::protobuf::Any*> leaves;
  const Status found = vosbrine::TuningProviderBase::FindMutableDynamicParams(&level, &leaves);
  EXPECT_TRUE(found.ok()) << found;
  for (const google::protobuf::Any* leaf : leaves) {
    ZelTuningBlock<T>& block = blocks.emplace_back();
    block.message.set_enable(tree.enable());
    EXPECT_TRUE(tree.static_param().UnpackTo(block.message.mutable_static_param()));
    EXPECT_TRUE(leaf->UnpackTo(block.message.mutable_dynamic_param()));
  }
  return blocks;
}

// Calls `visit(block, file)` for every leaf of every tree of block type T in the sample tuning set
// and returns the number of leaves. Where the set is missing, marks the test skipped, with the
// reason, and returns 0: a caller tests `IsSkipped()` before asserting on the count.
template <typename T, typename Visit>
int ForEachSampleLeaf(Visit&& visit) {
  const std::filesystem::path dir = SampleTuningDir();
  if (dir.empty() || !std::filesystem::is_directory(dir)) {
    [&dir] { GTEST_SKIP() << "The sample tuning set is not built: " << dir; }();
    return 0;
  }
  int leaves = 0;
  for (const auto& [file, tree_set] : SampleTreeSets()) {
    const vosbrine::TuningTree* tree = TreeOf<T>(tree_set);
    if (tree == nullptr) continue;
    for (const ZelTuningBlock<T>& block : LeafBlocks<T>(*tree)) {
      SCOPED_TRACE(file + ", leaf " + std::to_string(leaves));
      visit(block, file);
      ++leaves;
    }
  }
  return leaves;
}

}  // namespace tavik::test

#endif  // TAVIK_IQ_TESTING_TRANSLATOR_TESTING_H_
