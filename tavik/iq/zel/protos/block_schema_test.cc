// The controller carries all 25 blocks through one mechanism: it finds a block's tree in
// TuningTreeSet by field name and the block's parts by the names static_param, dynamic_param and
// enable. These tests pin that common shape for every block.
#include <cctype>
#include <string>
#include <vector>

#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/blc_param.pb.h"
#include "tavik/iq/zel/protos/ccm_param.pb.h"
#include "tavik/iq/zel/protos/clut_param.pb.h"
#include "tavik/iq/zel/protos/disparity_param.pb.h"
#include "tavik/iq/zel/protos/dmsc_param.pb.h"
#include "tavik/iq/zel/protos/dpc_param.pb.h"
#include "tavik/iq/zel/protos/edgedet_param.pb.h"
#include "tavik/iq/zel/protos/gamma_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_param.pb.h"
#include "tavik/iq/zel/protos/gtnr_sharpener_param.pb.h"
#include "tavik/iq/zel/protos/hqdns_param.pb.h"
#include "tavik/iq/zel/protos/lsc_param.pb.h"
#include "tavik/iq/zel/protos/lsc_stats_param.pb.h"
#include "tavik/iq/zel/protos/ltm_delta_y_param.pb.h"
#include "tavik/iq/zel/protos/ltm_param.pb.h"
#include "tavik/iq/zel/protos/nfltr_param.pb.h"
#include "tavik/iq/zel/protos/nsmix_param.pb.h"
#include "tavik/iq/zel/protos/prc_param.pb.h"
#include "tavik/iq/zel/protos/rgb_yuv_conversion_param.pb.h"
#include "tavik/iq/zel/protos/sensor_gamma_param.pb.h"
#include "tavik/iq/zel/protos/sharp_param.pb.h"
#include "tavik/iq/zel/protos/skind_param.pb.h"
#include "tavik/iq/zel/protos/snadd_param.pb.h"
#include "tavik/iq/zel/protos/stk_param.pb.h"
#include "tavik/iq/zel/protos/tuning_tree_set.pb.h"
#include "tavik/iq/zel/protos/wb_param.pb.h"

namespace {

using google::protobuf::Descriptor;
using namespace tavik::test;  // NOLINT: the field-type constants.
namespace zel = vosbrine::zelmondrake;

// The 25 block messages in the controller's position order.
std::vector<const Descriptor*> AllBlockMessages() {
  return {zel::BlcTuning::descriptor(),           zel::CcmTuning::descriptor(),
          zel::ClutTuning::descriptor(),          zel::DisparityTuning::descriptor(),
          zel::DmscTuning::descriptor(),          zel::DpcTuning::descriptor(),
          zel::EdgedetTuning::descriptor(),       zel::GammaTuning::descriptor(),
          zel::GtnrSharpenerTuning::descriptor(), zel::GtnrTuning::descriptor(),
          zel::HqdnsTuning::descriptor(),         zel::LscStatsTuning::descriptor(),
          zel::LscTuning::descriptor(),           zel::LtmTuning::descriptor(),
          zel::LtmDeltaYTuning::descriptor(),     zel::NfltrTuning::descriptor(),
          zel::NsmixTuning::descriptor(),         zel::PrcTuning::descriptor(),
          zel::RgbYuvConversionTuning::descriptor(), zel::SensorGammaTuning::descriptor(),
          zel::SharpTuning::descriptor(),         zel::SkindTuning::descriptor(),
          zel::SnaddTuning::descriptor(),         zel::StkTuning::descriptor(),
          zel::WbTuning::descriptor()};
}

// "GtnrSharpenerTuning" -> "GtnrSharpener".
std::string BlockStem(const Descriptor* message) {
  const std::string& name = message->name();
  return name.substr(0, name.size() - std::string("Tuning").size());
}

TEST(BlockSchemaTest, ThereAreTwentyFiveBlocksInPackageZelmondrake) {
  const std::vector<const Descriptor*> blocks = AllBlockMessages();
  ASSERT_EQ(blocks.size(), 25u);
  for (const Descriptor* block : blocks) {
    EXPECT_EQ(block->file()->package(), "vosbrine.zelmondrake") << block->name();
  }
}

TEST(BlockSchemaTest, EveryBlockHasStaticDynamicAndEnableAtOneTwoThree) {
  for (const Descriptor* block : AllBlockMessages()) {
    const std::string stem = BlockStem(block);
    ExpectFields(block,
                 {{"static_param", 1, kMessage, kSingular,
                   "vosbrine.zelmondrake." + stem + "StaticParam"},
                  {"dynamic_param", 2, kMessage, kSingular,
                   "vosbrine.zelmondrake." + stem + "DynamicParam"},
                  {"enable", 3, kBool}});
  }
}

TEST(BlockSchemaTest, EveryStaticParamHasADeprecatedEnableAtOneOrNoEnable) {
  for (const Descriptor* block : AllBlockMessages()) {
    const Descriptor* static_param = block->FindFieldByName("static_param")->message_type();
    const auto* enable = static_param->FindFieldByName("enable");
    if (enable == nullptr) continue;
    EXPECT_EQ(enable->number(), 1) << static_param->full_name();
    EXPECT_EQ(enable->type(), kBool) << static_param->full_name();
    EXPECT_TRUE(enable->options().deprecated()) << static_param->full_name();
  }
}

TEST(BlockSchemaTest, TreeSetFieldsByNameAndNumberInDeclarationOrder) {
  const std::string tree = "vosbrine.TuningTree";
  ExpectFields(zel::TuningTreeSet::descriptor(),
               {{"blc", 1, kMessage, kSingular, tree},
                {"ccm", 2, kMessage, kSingular, tree},
                {"clut", 3, kMessage, kSingular, tree},
                {"rgb_yuv_conversion", 21, kMessage, kSingular, tree},
                {"disparity", 4, kMessage, kSingular, tree},
                {"dmsc", 5, kMessage, kSingular, tree},
                {"dpc", 6, kMessage, kSingular, tree},
                {"edgedet", 7, kMessage, kSingular, tree},
                {"gamma", 8, kMessage, kSingular, tree},
                {"hqdns", 10, kMessage, kSingular, tree},
                {"ltm", 20, kMessage, kSingular, tree},
                {"ltm_delta_y", 24, kMessage, kSingular, tree},
                {"lsc", 11, kMessage, kSingular, tree},
                {"lsc_stats", 23, kMessage, kSingular, tree},
                {"nfltr", 12, kMessage, kSingular, tree},
                {"nsmix", 13, kMessage, kSingular, tree},
                {"prc", 14, kMessage, kSingular, tree},
                {"gtnr", 9, kMessage, kSingular, tree},
                {"sensor_gamma", 25, kMessage, kSingular, tree},
                {"snadd", 15, kMessage, kSingular, tree},
                {"sharp", 16, kMessage, kSingular, tree},
                {"gtnr_sharpener", 17, kMessage, kSingular, tree},
                {"skind", 18, kMessage, kSingular, tree},
                {"stk", 22, kMessage, kSingular, tree},
                {"wb", 19, kMessage, kSingular, tree}});
}

TEST(BlockSchemaTest, EveryBlockHasATreeFieldNamedAfterItsMessage) {
  const Descriptor* tree_set = zel::TuningTreeSet::descriptor();
  for (const Descriptor* block : AllBlockMessages()) {
    // Snake case of the message name without "Tuning": "RgbYuvConversion" -> "rgb_yuv_conversion".
    std::string field_name;
    for (char c : BlockStem(block)) {
      if (std::isupper(static_cast<unsigned char>(c))) {
        if (!field_name.empty()) field_name.push_back('_');
        field_name.push_back(static_cast<char>(std::tolower(static_cast<unsigned char>(c))));
      } else {
        field_name.push_back(c);
      }
    }
    EXPECT_NE(tree_set->FindFieldByName(field_name), nullptr) << block->name();
  }
}

TEST(BlockSchemaTest, CcmAndWbCarryOneGainList) {
  ExpectFields(zel::CcmStaticParam::descriptor(), {{"enable", 1, kBool, kSingular, "", true}});
  ExpectFields(zel::CcmDynamicParam::descriptor(), {{"ccm_gains", 1, kFloat, kRepeated}});
  ExpectFields(zel::WbStaticParam::descriptor(), {{"enable", 1, kBool, kSingular, "", true}});
  ExpectFields(zel::WbDynamicParam::descriptor(), {{"wb_gains", 1, kFloat, kRepeated}});
}

}  // namespace
