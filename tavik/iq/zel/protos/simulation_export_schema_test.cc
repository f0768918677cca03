// Pins the schema of the values that a frame dump exports for the offline simulator.
#include "gtest/gtest.h"
#include "tavik/iq/testing/schema_testing.h"
#include "tavik/iq/zel/protos/simulation_export.pb.h"

namespace {

using ::tavik::test::ExpectFields;
using ::tavik::test::ExpectPresence;
using ::tavik::test::kDouble;
using ::tavik::test::kFloat;
using ::tavik::test::kInt32;
using ::tavik::test::kMessage;
using ::tavik::test::kRepeated;
using ::tavik::test::kSingular;

namespace simulation = ::vosbrine::zelmondrake::simulation;

TEST(SimulationExportSchemaTest, CameraFrameConfigDeclaresTwentyFieldsInExportOrder) {
  ExpectFields(simulation::CameraFrameConfig::descriptor(),
               {
                   {"ipp_crop_roi", 1, kMessage, kSingular, "vosbrine.Roi"},
                   {"ipp_output_size", 2, kMessage, kSingular, "vosbrine.ImageResolution"},
                   {"itp_crop_roi", 3, kMessage, kSingular, "vosbrine.Roi"},
                   {"itp_output_size", 4, kMessage, kSingular, "vosbrine.ImageResolution"},
                   {"itsc_crop_roi", 9, kMessage, kSingular, "vosbrine.Roi"},
                   {"itsc_output_size", 10, kMessage, kSingular, "vosbrine.ImageResolution"},
                   {"isp_digital_gain", 5, kFloat},
                   {"num_faces", 6, kInt32},
                   {"face_regions", 7, kMessage, kRepeated, "vosbrine.Roi"},
                   {"noise_models", 8, kDouble, kRepeated},
                   {"ltm_frame_config", 11, kMessage, kSingular,
                    "vosbrine.zelmondrake.simulation.CameraFrameConfig.LtmPipelineFrameConfig"},
                   {"bayer_crop0_roi", 12, kMessage, kSingular, "vosbrine.Roi"},
                   {"bayer_crop1_roi", 13, kMessage, kSingular, "vosbrine.Roi"},
                   {"bds_output_size", 14, kMessage, kSingular, "vosbrine.ImageResolution"},
                   {"sensor_crop", 15, kMessage, kSingular, "vosbrine.Roi"},
                   {"bayer_crop", 16, kMessage, kSingular, "vosbrine.Roi"},
                   {"bds_scale_x", 17, kInt32},
                   {"bds_scale_y", 18, kInt32},
                   {"unit_scale_value", 19, kInt32},
                   {"prev_ltm_frame_config", 20, kMessage, kSingular,
                    "vosbrine.zelmondrake.simulation.CameraFrameConfig.LtmPipelineFrameConfig"},
               });
}

TEST(SimulationExportSchemaTest, LtmPipelineFrameConfigHoldsFourExposureTimes) {
  ExpectFields(simulation::CameraFrameConfig::LtmPipelineFrameConfig::descriptor(),
               {
                   {"viewfinder_short_tet", 1, kFloat},
                   {"viewfinder_long_tet", 2, kFloat},
                   {"capture_tet", 3, kFloat},
                   {"input_tet", 4, kFloat},
               });
}

TEST(SimulationExportSchemaTest, TranslatorInputHoldsTwoGainTables) {
  ExpectFields(simulation::TranslatorInput::descriptor(),
               {
                   {"gtm_gain_lut", 1, kFloat, kRepeated},
                   {"sharpener_gtm_gain_lut", 2, kFloat, kRepeated},
               });
}

TEST(SimulationExportSchemaTest, TranslatorOutputHoldsTheInpaintingMargin) {
  ExpectFields(simulation::TranslatorOutput::descriptor(),
               {
                   {"gtnr_inpainting_boundary_margin", 1, kInt32},
               });
}

TEST(SimulationExportSchemaTest, ScalarsTrackPresenceBecauseTheFileIsProto2) {
  const auto* config = simulation::CameraFrameConfig::descriptor();
  EXPECT_EQ(config->file()->syntax(), google::protobuf::FileDescriptor::SYNTAX_PROTO2);
  ExpectPresence(config, "ipp_output_size", true);
  ExpectPresence(config, "itsc_crop_roi", true);
  ExpectPresence(config, "itsc_output_size", true);
  ExpectPresence(config, "isp_digital_gain", true);
  ExpectPresence(config, "num_faces", true);
  ExpectPresence(config, "unit_scale_value", true);
  ExpectPresence(simulation::CameraFrameConfig::LtmPipelineFrameConfig::descriptor(), "input_tet",
                 true);
  ExpectPresence(simulation::TranslatorOutput::descriptor(), "gtnr_inpainting_boundary_margin",
                 true);
}

}  // namespace
