#include "tools/tavik-sim/frame_log.h"

#include <string>

#include "gmock/gmock.h"
#include "gtest/gtest.h"

namespace tavik::sim {
namespace {

using ::testing::EndsWith;

TEST(FrameLogLineTest, WritesTheFrameWithTimingLast) {
  FrameRecord record;
  record.frame.index = 7;
  record.frame.segment_name = "a \"quoted\" name";
  record.frame.tuning_info.sensor_mode_info.sensor_name = "GN1";
  record.frame.tuning_info.image_size = {4032, 3024};
  record.frame.coordinates.cct = 2800.5f;
  record.frame.coordinates.frame_count = 7;
  record.key = "K";
  record.resolved_key = "K";
  record.refreshed_blocks = {"BlcTuning", "WbTuning"};
  record.translations.push_back({"TranslateBlc (IPP)", "BlcTuning", "{\"bypass\":0}"});
  record.failures.push_back({"GammaTuning", "bad"});
  record.fence_signalled = true;
  record.stage_nanoseconds = {1, 2, 3, 4, 5};
  EXPECT_EQ(FrameLogLine(record),
            "{\"frame\":7,\"segment\":\"a \\\"quoted\\\" name\","
            "\"use_case\":{\"type\":0,\"torch\":false,\"hdr\":false,\"night\":false,"
            "\"first_party\":true},\"sensor\":\"GN1\",\"image_size\":[4032,3024],"
            "\"state\":{\"led_influence\":0,\"cct\":2800.5,\"bv\":0,\"real_gain\":0,"
            "\"exp_ratio\":0,\"mired_cct\":0,\"scaler_ratio\":0,\"pre_scaler_ratio\":0,"
            "\"frame_count\":7,\"exposure_time_msecs\":0},\"key\":\"K\",\"resolved_key\":\"K\","
            "\"refreshed\":[\"BlcTuning\",\"WbTuning\"],"
            "\"hardware\":{\"TranslateBlc (IPP)\":{\"bypass\":0}},"
            "\"failures\":[{\"block\":\"GammaTuning\",\"message\":\"bad\"}],"
            "\"fence_signalled\":true,\"timing\":{\"create_ns\":1,\"enabled_checks_ns\":2,"
            "\"interpolate_ns\":3,\"translate_ns\":4,\"signal_wait_ns\":5}}");
}

TEST(FrameLogLineTest, TimingIsTheLastMember) {
  EXPECT_THAT(FrameLogLine(FrameRecord()), EndsWith("\"signal_wait_ns\":0}}"));
}

}  // namespace
}  // namespace tavik::sim
