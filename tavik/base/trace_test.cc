#include "tavik/base/trace.h"

#include <mutex>
#include <string>
#include <vector>

#include "gtest/gtest.h"

namespace tavik {
namespace {

class RecordingSink : public TraceSink {
 public:
  struct Span {
    int category;
    std::string name;
    int64_t duration;
  };
  void OnSpan(const TraceSpan& span) override {
    std::lock_guard<std::mutex> lock(mutex_);
    spans_.push_back({span.category, std::string(span.name),
                      span.end_nanoseconds - span.start_nanoseconds});
  }
  std::vector<Span> spans() {
    std::lock_guard<std::mutex> lock(mutex_);
    return spans_;
  }

 private:
  std::mutex mutex_;
  std::vector<Span> spans_;
};

TEST(TraceTest, NothingIsRecordedWithoutASink) {
  SetTraceSink(nullptr);
  EXPECT_FALSE(IsTracing());
  PerfTrace trace(kTranslatorTraceCategory, "TranslateBlc");
}

TEST(TraceTest, SpansReachTheSinkWhenTheyEndInnerFirst) {
  RecordingSink sink;
  SetTraceSink(&sink);
  {
    PerfTrace outer(kTranslatorTraceCategory, "TranslateGamma");
    { ScopedTrace inner("VorelControllerImpl::Context::Process"); }
  }
  SetTraceSink(nullptr);
  const auto spans = sink.spans();
  ASSERT_EQ(spans.size(), 2u);
  EXPECT_EQ(spans[0].name, "VorelControllerImpl::Context::Process");
  EXPECT_EQ(spans[0].category, kDefaultTraceCategory);
  EXPECT_EQ(spans[1].name, "TranslateGamma");
  EXPECT_EQ(spans[1].category, 5);
  EXPECT_GE(spans[1].duration, spans[0].duration);
}

TEST(TraceTest, TemporaryNamesAreCopied) {
  RecordingSink sink;
  SetTraceSink(&sink);
  { PerfTrace trace(0, std::string("built") + " name"); }
  SetTraceSink(nullptr);
  ASSERT_EQ(sink.spans().size(), 1u);
  EXPECT_EQ(sink.spans()[0].name, "built name");
}

}  // namespace
}  // namespace tavik
