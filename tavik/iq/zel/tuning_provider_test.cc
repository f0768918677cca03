#include "tavik/iq/zel/tuning_provider.h"

#include <cctype>
#include <memory>
#include <string>
#include <vector>

#include "gmock/gmock.h"
#include "gtest/gtest.h"
#include "tavik/base/testing/log_capture.h"
#include "tavik/base/testing/status_matchers.h"
#include "tavik/base/testing/temp_dir.h"
#include "tavik/iq/testing/tuning_builders.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"

namespace vosbrine::zelmondrake {
namespace {

using ::google::protobuf::Descriptor;
using ::google::protobuf::FieldDescriptor;
using ::google::protobuf::Message;
using ::google::protobuf::MessageFactory;
using ::tavik::test::LeafNode;
using ::tavik::test::MakeLevel;
using ::tavik::test::MakeTree;
using ::tavik::test::MakeUsecase;
using ::tavik::test::MakeUsecaseData;
using ::tavik::test::ParseText;
using ::tavik::test::ProtoEquals;
using ::tavik::test::ScopedLogCapture;
using ::tavik::test::StateWith;
using ::tavik::test::StatusIs;
using ::tavik::test::TempDir;
using ::tavik::test::WriteBinarypb;
using ::testing::ElementsAre;

constexpr absl::StatusCode kInvalidArgument = absl::StatusCode::kInvalidArgument;

TuningUsecase Gn1Viewfinder() {
  return MakeUsecase(BRIMAL_REAR_GN1_NORMAL, FULL_4_3_FULL_15_30FPS, VIEWFINDER);
}

GammaDynamicParam GammaR(float value) {
  GammaDynamicParam param;
  param.add_gamma_r(value);
  return param;
}

TuningTreeSet GammaTreeSet() {
  TuningTreeSet tree_set;
  *tree_set.mutable_gamma() =
      MakeTree(true, ParseText<GammaStaticParam>("gamma_x: [0, 1]"),
               MakeLevel(Level::CCT, {LeafNode(0, 10, GammaR(2)), LeafNode(20, 30, GammaR(6))}));
  return tree_set;
}

// "gtnr_sharpener" gives "GtnrSharpener".
std::string UpperCamel(const std::string& snake) {
  std::string camel;
  bool capital = true;
  for (const char c : snake) {
    if (c == '_') {
      capital = true;
      continue;
    }
    camel.push_back(capital ? static_cast<char>(std::toupper(static_cast<unsigned char>(c))) : c);
    capital = false;
  }
  return camel;
}

const Descriptor* ZelMessage(const std::string& name) {
  return google::protobuf::DescriptorPool::generated_pool()->FindMessageTypeByName(
      "vosbrine.zelmondrake." + name);
}

TEST(ZelTuningProviderTest, EmptyPathListFails) {
  EXPECT_THAT(TuningProvider::Create({}, nullptr),
              StatusIs(kInvalidArgument, "Empty input paths."));
}

TEST(ZelTuningProviderTest, PathsWithoutTuningFilesFail) {
  TempDir dir;
  const std::string text = dir.WriteFile("notes.txt", "x");
  EXPECT_THAT(TuningProvider::Create({text, dir.path()}, nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb path."));
}

TEST(ZelTuningProviderTest, NoFileThatLoadsFails) {
  TempDir dir;
  const std::string garbage = dir.WriteFile("garbage.binarypb", "garbage");
  EXPECT_THAT(TuningProvider::Create({garbage}, nullptr),
              StatusIs(kInvalidArgument, "No valid tuning binarypb."));
}

TEST(ZelTuningProviderTest, LoadsTreeSetsOfThisGenerationsType) {
  TempDir dir;
  WriteBinarypb(dir, "gn1.binarypb", MakeUsecaseData(Gn1Viewfinder(), GammaTreeSet(), "1.0"));
  ScopedLogCapture capture;
  TAVIK_ASSERT_OK_AND_ASSIGN(const std::unique_ptr<TuningProvider> provider,
                             TuningProvider::Create({dir.path()}, nullptr));
  ASSERT_NE(provider, nullptr);
  const Message* tree_set = provider->GetTuningTreeSet(Gn1Viewfinder(), false);
  ASSERT_NE(tree_set, nullptr);
  EXPECT_EQ(tree_set->GetDescriptor(), TuningTreeSet::descriptor());
  ASSERT_NE(dynamic_cast<const TuningTreeSet*>(tree_set), nullptr);
  EXPECT_TRUE(ProtoEquals(GammaTreeSet(), *tree_set));
  EXPECT_THAT(capture.messages(android::base::INFO),
              ElementsAre("Tuning binarypb found: 1 Tuning binarypb parsed: 1 Golden data "
                          "binarypb found: 0 Golden data binarypb parsed: 0 Calibration "
                          "applied: 0"));
}

TEST(ZelTuningProviderTest, FillsABlockAtTheCameraState) {
  TempDir dir;
  const std::string path =
      WriteBinarypb(dir, "gn1.binarypb", MakeUsecaseData(Gn1Viewfinder(), GammaTreeSet()));
  TAVIK_ASSERT_OK_AND_ASSIGN(const std::unique_ptr<TuningProvider> provider,
                             TuningProvider::Create({path}, nullptr));
  EXPECT_TRUE(provider->IsSubBlockEnabled(Gn1Viewfinder(), "GammaTuning", false));
  GammaTuning tuning;
  TAVIK_ASSERT_OK(
      provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 15), &tuning, false, false));
  EXPECT_TRUE(ProtoEquals(ParseText<GammaTuning>(R"pb(
                            enable: true
                            static_param { gamma_x: [ 0, 1 ] }
                            dynamic_param { gamma_r: 4 }
                          )pb"),
                          tuning));
}

TEST(ZelTuningProviderTest, EveryBlockOfTheTreeSetIsFoundByItsMessageName) {
  // Each tree of the set holds the block's own static parameters and one leaf of its dynamic
  // parameters, both empty.
  const Descriptor* tree_set_type = TuningTreeSet::descriptor();
  ASSERT_EQ(tree_set_type->field_count(), 25);
  MessageFactory* factory = MessageFactory::generated_factory();
  TuningTreeSet tree_set;
  std::vector<std::string> blocks;
  for (int i = 0; i < tree_set_type->field_count(); ++i) {
    const FieldDescriptor* field = tree_set_type->field(i);
    const std::string block = UpperCamel(field->name());
    const Descriptor* static_type = ZelMessage(block + "StaticParam");
    const Descriptor* dynamic_type = ZelMessage(block + "DynamicParam");
    ASSERT_NE(ZelMessage(block + "Tuning"), nullptr) << block;
    ASSERT_NE(static_type, nullptr) << block;
    ASSERT_NE(dynamic_type, nullptr) << block;
    auto* tree =
        dynamic_cast<TuningTree*>(tree_set.GetReflection()->MutableMessage(&tree_set, field));
    ASSERT_NE(tree, nullptr);
    *tree =
        MakeTree(true, *factory->GetPrototype(static_type),
                 MakeLevel(Level::CCT, {LeafNode(0, 10, *factory->GetPrototype(dynamic_type))}));
    blocks.push_back(block);
  }
  TempDir dir;
  const std::string path =
      WriteBinarypb(dir, "all.binarypb", MakeUsecaseData(Gn1Viewfinder(), tree_set));
  TAVIK_ASSERT_OK_AND_ASSIGN(const std::unique_ptr<TuningProvider> provider,
                             TuningProvider::Create({path}, nullptr));

  for (const std::string& block : blocks) {
    SCOPED_TRACE(block);
    EXPECT_TRUE(provider->IsSubBlockEnabled(Gn1Viewfinder(), block + "Tuning", false));
    std::unique_ptr<Message> tuning(factory->GetPrototype(ZelMessage(block + "Tuning"))->New());
    TAVIK_EXPECT_OK(provider->FillSubBlockTuning(Gn1Viewfinder(), StateWith("cct", 5), tuning.get(),
                                                 false, false));
    const FieldDescriptor* enable = tuning->GetDescriptor()->FindFieldByName("enable");
    ASSERT_NE(enable, nullptr);
    EXPECT_TRUE(tuning->GetReflection()->GetBool(*tuning, enable));
  }
}

}  // namespace
}  // namespace vosbrine::zelmondrake
