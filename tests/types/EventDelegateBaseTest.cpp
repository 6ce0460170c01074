#include "types/EventDelegateBase.h"

#include <gtest/gtest.h>

#include <memory>
#include <thread>
#include <vector>

#include "support/RecordingEventDelegate.h"

namespace {

// Makes every one of the eleven calls through a base reference.
void callAll(Tovra::EventDelegateBase& delegate) {
  const std::vector<Tovra::ObjectInfo> objects(2, Tovra::ObjectInfo(Tovra::PIDN));
  Tovra::ResultMetadata metadata;
  metadata.queryID = "q";
  const std::vector<OrzaVSMobile::Point2f> points = {{1.0f, 2.0f}};
  delegate.didReceiveEvent(Tovra::BARCODE_MOD, Tovra::QR_CODE, static_cast<Tovra::ActionID>(3),
                           static_cast<Tovra::StatusID>(4));
  delegate.didProcessFrame(Tovra::VISUAL_SEARCH_SERVICE_MOD, Tovra::FAILURE_STATUS,
                           INT64_C(1) << 40, -7);
  delegate.didDetect(objects);
  delegate.didDecode({}, metadata);
  delegate.didDetectInterestPoints(points);
  delegate.didReceiveServerError(Tovra::VISUAL_SEARCH_SERVICE_MOD,
                                 Tovra::Server::RESPONSE_PARSE_ERROR, 200);
  delegate.suggestDarkScene();
  delegate.suggestBoringEvent();
  delegate.showMessage("hello");
  delegate.didProcessFrameDecision(static_cast<Tovra::CameraStabilityIssue>(2), 0.25);
  delegate.didProcessModuleDecision(Tovra::GIFTCARD_MOD,
                                    static_cast<Tovra::JudgeVerdictOnModule>(-3));
}

class DecodeOnly : public Tovra::EventDelegateBase {
 public:
  explicit DecodeOnly(bool* destroyed = nullptr) : destroyed_(destroyed) {}
  ~DecodeOnly() override {
    if (destroyed_ != nullptr) *destroyed_ = true;
  }
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                 const Tovra::ResultMetadata& metadata) override {
    ++decodes;
    lastCount = objects.size();
    lastQuery = metadata.queryID;
  }
  int decodes = 0;
  size_t lastCount = 99;
  std::string lastQuery;

 private:
  bool* destroyed_;
};

}  // namespace

TEST(EventDelegateBaseTest, BaseAbsorbsEveryCallAndAnOverrideSeesOnlyItsOwn) {
  Tovra::EventDelegateBase plain;
  callAll(plain);  // each base operation returns at once

  DecodeOnly decodeOnly;
  callAll(decodeOnly);
  EXPECT_EQ(1, decodeOnly.decodes);
  EXPECT_EQ(0u, decodeOnly.lastCount);  // an empty vector still carries its metadata
  EXPECT_EQ("q", decodeOnly.lastQuery);
}

TEST(EventDelegateBaseTest, DestroyingThroughTheBaseRunsTheDerivedDestructor) {
  bool destroyed = false;
  std::unique_ptr<Tovra::EventDelegateBase> delegate(new DecodeOnly(&destroyed));
  delegate.reset();
  EXPECT_TRUE(destroyed);
}

TEST(EventDelegateBaseTest, RecordingDelegateKeepsEveryArgument) {
  orzavs_test::RecordingEventDelegate recorder;
  callAll(recorder);
  const std::vector<orzavs_test::EventCall> calls = recorder.calls();
  const std::vector<std::string> names = {
      "didReceiveEvent",    "didProcessFrame",       "didDetect",
      "didDecode",          "didDetectInterestPoints", "didReceiveServerError",
      "suggestDarkScene",   "suggestBoringEvent",    "showMessage",
      "didProcessFrameDecision", "didProcessModuleDecision"};
  ASSERT_EQ(names.size(), calls.size());
  for (size_t i = 0; i < names.size(); ++i) EXPECT_EQ(names[i], calls[i].name);
  EXPECT_EQ((std::vector<int64_t>{0, 2, 3, 4}), calls[0].ints);
  EXPECT_EQ((std::vector<int64_t>{1, 1, INT64_C(1) << 40, -7}), calls[1].ints);
  EXPECT_EQ(2u, calls[2].objects.size());
  EXPECT_TRUE(calls[3].objects.empty());
  EXPECT_EQ("q", calls[3].metadata.queryID);
  ASSERT_EQ(1u, calls[4].points.size());
  EXPECT_EQ(2.0f, calls[4].points[0].y);
  EXPECT_EQ((std::vector<int64_t>{1, 2, 200}), calls[5].ints);
  EXPECT_EQ("hello", calls[8].message);
  EXPECT_EQ((std::vector<int64_t>{2}), calls[9].ints);
  EXPECT_EQ(0.25, calls[9].real);
  EXPECT_EQ((std::vector<int64_t>{4, -3}), calls[10].ints);

  // Calls from another thread are recorded with that thread, and waitFor sees them.
  std::thread::id other;
  std::thread worker([&] {
    other = std::this_thread::get_id();
    recorder.showMessage("from a worker");
  });
  EXPECT_TRUE(recorder.waitFor("showMessage", 2));
  worker.join();
  EXPECT_EQ(other, recorder.calls("showMessage").back().thread);
  EXPECT_EQ(2u, recorder.count("showMessage"));
}
