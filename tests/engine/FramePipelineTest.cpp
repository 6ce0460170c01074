#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <regex>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"

namespace {

using orzavs_test::FakeTransport;
using orzavs_test::RecordingEvents;
using orzavs_test::waitFor;
using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using Tovra::TovraStateEngine;

constexpr int kW = 64;
constexpr int kH = 48;

// An engine wired to a recording delegate and a transport, started.
class PipelineTest : public ::testing::Test {
 protected:
  PipelineTest() {
    engine.setEventDelegate(&events);
    engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    engine.startEngine();
    textured = orzavs_test::makeFrame(kW, kH, kW, OrzaVSMobile::NV21);
    flat = orzavs_test::makeFrame(kW, kH, kW, OrzaVSMobile::NV21, true);
  }
  ~PipelineTest() override { engine.stopEngine(); }

  void answerEverything() {
    transport.setResponder([](const orzavs_test::SentRequest& sent, Tovra::Server::ServerResponse& r,
                              orzavs_test::Ms&) {
      r.responseStr = orzavs_test::replyBody(sent.id);
      return true;
    });
  }

  void frame(double t, bool isFlat = false) {
    ImageBuffer image(0, OrzaVSMobile::NV21, kW, kH, kW, 1, isFlat ? flat.data() : textured.data());
    ExtraFrameData extra;
    extra.timeStamp = t;
    engine.process("", image, extra);
  }

  bool jobIdle() { return waitFor([&] { return !engine.job(0).isBusy(); }); }

  // Frame id at the end of a request id.
  static std::string frameIdOf(const std::string& requestId) {
    return requestId.substr(requestId.rfind('-') + 1);
  }

  RecordingEvents events;
  FakeTransport transport;
  TovraStateEngine engine;  // after the delegates: destroyed first
  std::vector<uint8_t> textured;
  std::vector<uint8_t> flat;
};

TEST_F(PipelineTest, TimeRuleComparesDoubleDifferencesStrictly) {
  answerEverything();
  const struct {
    double last, next;
    bool taken;
  } cases[] = {{0.0, 0.1, false}, {0.5, 0.6, false}, {1.0, 1.1, true}, {3.0, 3.0, false}};
  for (const auto& c : cases) {
    engine.pauseEngine();  // lastTakenTime back to "none"
    engine.resumeEngine();
    frame(c.last);  // the first frame after a reset is always taken
    EXPECT_EQ(engine.lastTakenTime(), c.last);
    ASSERT_TRUE(jobIdle());
    const size_t sent = transport.sentCount();
    frame(c.next);
    EXPECT_EQ(engine.lastTakenTime(), c.taken ? c.next : c.last) << c.last << " -> " << c.next;
    ASSERT_TRUE(jobIdle());
    EXPECT_EQ(transport.sentCount(), sent + (c.taken ? 1 : 0));
  }
}

TEST_F(PipelineTest, HeldFrameIsReplacedBySharpnessOrAgeAndSentWhenTheJobFrees) {
  frame(0.0);  // frame id 0: sent, the job now awaits its reply
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
  frame(0.2, true);  // id 1: taken, held (flat)
  EXPECT_TRUE(engine.hasHeldRecord());
  frame(0.3, true);  // flat and only 0.1 older: not taken
  frame(0.6, true);  // 0.4 - 0.2 is not more than 0.4: not taken
  EXPECT_EQ(engine.lastTakenTime(), 0.2);
  frame(0.7, true);  // 0.5 older: replaces the held frame (id 2)
  EXPECT_EQ(engine.lastTakenTime(), 0.7);
  frame(0.75);       // textured, sharper than the held record's 0: replaces it (id 3)
  EXPECT_EQ(engine.lastTakenTime(), 0.75);
  EXPECT_EQ(transport.sentCount(), 1u);

  transport.pushServerResponse([&] {
    Tovra::Server::ServerResponse r;
    r.id = transport.sent()[0].id;
    r.responseStr = orzavs_test::replyBody("Q0");
    return r;
  }());
  ASSERT_TRUE(jobIdle());
  frame(0.76, true);  // not taken itself; dispatches the held frame
  EXPECT_FALSE(engine.hasHeldRecord());
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 2; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id), "0");
  EXPECT_EQ(frameIdOf(transport.sent()[1].id), "3");
  EXPECT_EQ(transport.sent()[1].metadata.at("lastQueryId"), "Q0");
}

TEST_F(PipelineTest, InterestPointsAreReportedForEveryAcceptedFrame) {
  frame(0.0);
  frame(0.01);
  frame(0.02, true);
  const std::vector<size_t> counts = events.pointCounts();
  ASSERT_EQ(counts.size(), 3u);
  EXPECT_GT(counts[0], 0u);
  EXPECT_LE(counts[0], 50u);
  EXPECT_EQ(counts[1], counts[0]);
  EXPECT_EQ(counts[2], 0u);  // a uniform frame has no corners
}

TEST(Sharpness, UsesTheCrossedMarginsAndTheConstantBelowOneTenth) {
  // width 15 -> top margin round(1.4999999999999998) = 1, not 2; height 25 -> left margin 2.
  // A single bright pixel at a sampled position contributes 8 * 255 to the sum.
  const int w = 15, h = 25;
  std::vector<uint8_t> plane(static_cast<size_t>(w) * h, 0);
  ImageBuffer image(0, OrzaVSMobile::GRAY, w, h, w, 1, plane.data());
  // Examined rows are consecutive (2, 3, 4, 5, 6: the counter runs 1, 6, 11, 16, 21 < 24), so a
  // bright pixel on a sampled row also shows as a neighbour of the samples above and below.
  // Were the margins not crossed, or the constant exactly 0.1, the first examined row would be
  // 3 and the sampled columns 3, 8, 13, and every sum below would differ.
  auto sumWithPixelAt = [&](int x, int y) {
    std::fill(plane.begin(), plane.end(), 0);
    plane[static_cast<size_t>(y) * w + x] = 255;
    return TovraStateEngine::sharpness(image);
  };
  EXPECT_EQ(sumWithPixelAt(2, 2), 8 * 255 + 255);        // sample (2,2), neighbour of (2,3)
  EXPECT_EQ(sumWithPixelAt(2, 3), 8 * 255 + 2 * 255);    // sample, neighbour above and below
  EXPECT_EQ(sumWithPixelAt(2, 6), 8 * 255 + 255);        // last examined row
  EXPECT_EQ(sumWithPixelAt(2, 7), 255);                  // only a neighbour of row 6
  EXPECT_EQ(sumWithPixelAt(2, 8), 0);
  EXPECT_EQ(sumWithPixelAt(3, 2), 2 * 255);              // column 3 is not sampled
  EXPECT_EQ(sumWithPixelAt(7, 4), 8 * 255 + 2 * 255);    // columns step by 5
  EXPECT_EQ(sumWithPixelAt(12, 4), 8 * 255 + 2 * 255);   // 12 < 15 - 2
  EXPECT_EQ(sumWithPixelAt(2, 1), 255);                  // row 1 only as a neighbour

  // A flat plane is 0; tiny planes never read outside themselves (checked under ASan).
  std::vector<uint8_t> grey(16, 77);
  for (int size = 1; size <= 4; ++size) {
    std::vector<uint8_t> tiny(static_cast<size_t>(size) * size, 200);
    ImageBuffer small(0, OrzaVSMobile::GRAY, size, size, size, 1, tiny.data());
    EXPECT_EQ(TovraStateEngine::sharpness(small), 0);
  }
  ImageBuffer uniform(0, OrzaVSMobile::GRAY, 4, 4, 4, 1, grey.data());
  EXPECT_EQ(TovraStateEngine::sharpness(uniform), 0);
  uint64_t bits;
  const double k = 0.09999999999999998;
  std::memcpy(&bits, &k, sizeof bits);
  EXPECT_EQ(bits, 0x3FB9999999999998ull);
}

TEST_F(PipelineTest, LentBuffersAreFilledInPlaceAndReturnedToThePool) {
  answerEverything();
  ImageBuffer lent;
  lent.format = OrzaVSMobile::NV21;
  lent.width = kW;
  lent.height = kH;
  lent.widthStep = kW;
  lent.numChannels = 1;
  std::string key;
  engine.requestImageBuffer(lent, key);
  ASSERT_NE(lent.data, nullptr);
  ASSERT_EQ(lent.allocLen, kW * kH * 3 / 2);
  EXPECT_TRUE(std::regex_match(key, std::regex("[0-9]+-0"))) << key;
  ASSERT_EQ(lent.fillBuffer(textured.data(), static_cast<int32_t>(textured.size())), lent.allocLen);
  ExtraFrameData extra;
  extra.timeStamp = 0.0;
  engine.process(key, lent, extra);
  // The buffer no longer points into the record it handed back.
  EXPECT_EQ(lent.data, nullptr);
  EXPECT_EQ(lent.allocLen, 0);
  EXPECT_EQ(lent.fillBuffer(textured.data(), 10), 0);
  EXPECT_EQ(engine.pendingBufferCount(), 0u);
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id), "0");  // the lent record itself was sent
  orzavs_test::JpegInfo info;
  ASSERT_TRUE(orzavs_test::decodeJpeg(transport.sent()[0].body, info));
  EXPECT_EQ(info.width, kW);
  EXPECT_EQ(info.height, kH);
  ASSERT_TRUE(jobIdle());

  // A key never issued behaves like no key; a lent frame not taken goes back to the pool.
  testing::internal::CaptureStdout();
  ImageBuffer image(0, OrzaVSMobile::NV21, kW, kH, kW, 1, textured.data());
  engine.process("no-such-key", image, extra);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
  EXPECT_EQ(events.pointCounts().size(), 2u);

  // Five lent buffers exhaust the pool; handing them back through process (taken or not,
  // accepted or refused) returns all of them.
  std::vector<ImageBuffer> buffers(5, lent);
  std::vector<std::string> keys(5);
  for (int i = 0; i < 5; ++i) {
    buffers[i] = ImageBuffer();
    buffers[i].format = OrzaVSMobile::GRAY;
    buffers[i].height = kH;
    buffers[i].width = kW;
    buffers[i].widthStep = kW;
    engine.requestImageBuffer(buffers[i], keys[i]);
    ASSERT_NE(buffers[i].data, nullptr) << i;
  }
  ImageBuffer sixth = buffers[0];
  std::string sixthKey = "unchanged";
  testing::internal::CaptureStdout();
  engine.requestImageBuffer(sixth, sixthKey);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Failed to get a new frame record slot in getRequestImageBuffers\n");
  EXPECT_EQ(sixthKey, "unchanged");
  testing::internal::CaptureStdout();
  buffers[1].format = OrzaVSMobile::RGB;  // refused format
  buffers[2].widthStep = kW - 1;          // refused stride
  buffers[3].height = kH + 1;             // geometry beyond the lent memory
  for (int i = 0; i < 5; ++i) {
    extra.timeStamp = 10.0 + i;
    engine.process(keys[i], buffers[i], extra);
    EXPECT_EQ(buffers[i].data, nullptr) << i;
  }
  const std::string out = testing::internal::GetCapturedStdout();
  EXPECT_NE(out.find("Failed to process non-GRAY/YUV format in continuous scanning mode\n"), std::string::npos);
  EXPECT_NE(out.find("Skipped input frame: row stride 63 is smaller than a row of 64 bytes\n"), std::string::npos);
  EXPECT_NE(out.find("Skipped input frame: image buffer holds 3072 bytes, a 64x49 image needs 3136\n"),
            std::string::npos)
      << out;
  ASSERT_TRUE(jobIdle());
  engine.pauseEngine();  // drops the held frame, if any
  engine.resumeEngine();
  for (int i = 0; i < 5; ++i) {
    ImageBuffer again;
    again.format = OrzaVSMobile::GRAY;
    again.height = kH;
    again.widthStep = kW;
    std::string k;
    engine.requestImageBuffer(again, k);
    EXPECT_NE(again.data, nullptr) << "record " << i << " was lost";
  }
}

TEST_F(PipelineTest, BadFramesPrintOneLineAndLeaveTheEngineWorking) {
  answerEverything();
  ExtraFrameData extra;
  extra.timeStamp = 0.0;
  struct Case {
    const char* line;
    ImageBuffer image;
  };
  std::vector<Case> cases;
  cases.push_back({"Skipped input frame: image has no pixel data\n",
                   ImageBuffer(0, OrzaVSMobile::GRAY, kW, kH, kW, 1, nullptr)});
  cases.push_back({"Skipped input frame: invalid image size 0x48\n",
                   ImageBuffer(0, OrzaVSMobile::GRAY, 0, kH, kW, 1, textured.data())});
  cases.push_back({"Skipped input frame: invalid image size 64x-1\n",
                   ImageBuffer(0, OrzaVSMobile::NV12, kW, -1, kW, 1, textured.data())});
  cases.push_back({"Skipped input frame: row stride -64 is smaller than a row of 64 bytes\n",
                   ImageBuffer(0, OrzaVSMobile::I420, kW, kH, -kW, 1, textured.data())});
  cases.push_back({"Failed to process non-GRAY/YUV format in continuous scanning mode\n",
                   ImageBuffer(0, static_cast<OrzaVSMobile::ImageFormat>(-1), kW, kH, kW, 1, textured.data())});
  cases.push_back({"Failed to process non-GRAY/YUV format in continuous scanning mode\n",
                   ImageBuffer(0, static_cast<OrzaVSMobile::ImageFormat>(8), kW, kH, kW, 1, textured.data())});
  for (Case& c : cases) {
    testing::internal::CaptureStdout();
    engine.process("", c.image, extra);
    EXPECT_EQ(testing::internal::GetCapturedStdout(), c.line);
  }
  EXPECT_TRUE(events.pointCounts().empty());
  EXPECT_EQ(engine.lastTakenTime(), -1.0);
  frame(0.0);  // the engine still works
  ASSERT_TRUE(waitFor([&] { return transport.pushedCount() == 1; }));
  EXPECT_EQ(events.decodes().size(), 1u);
}

TEST_F(PipelineTest, FramesOutsideRunningArePrintedAndDropped) {
  ImageBuffer lent;
  lent.format = OrzaVSMobile::GRAY;
  lent.height = kH;
  lent.widthStep = kW;
  lent.width = kW;
  std::string key;
  engine.requestImageBuffer(lent, key);
  engine.pauseEngine();
  testing::internal::CaptureStdout();
  ImageBuffer other;
  std::string otherKey = "kept";
  engine.requestImageBuffer(other, otherKey);
  ImageBuffer image(0, OrzaVSMobile::GRAY, kW, kH, kW, 1, textured.data());
  ExtraFrameData extra;
  engine.process(key, image, extra);
  engine.processSingleImage(image, extra);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Failed to request image buffer: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n");
  EXPECT_EQ(other.data, nullptr);
  EXPECT_EQ(otherKey, "kept");
  EXPECT_TRUE(events.pointCounts().empty());
  // The lent buffer outlived the reset that dropped its record: writing through it is harmless.
  EXPECT_EQ(lent.fillBuffer(textured.data(), kW * kH), kW * kH);
}

TEST_F(PipelineTest, SingleImageReturnsOnlyAfterTheReplyWasHandled) {
  transport.setResponder([](const orzavs_test::SentRequest& sent, Tovra::Server::ServerResponse& r,
                            orzavs_test::Ms& delay) {
    r.responseStr = orzavs_test::replyBody(sent.id, {"PIDN", "ExternalResult"});
    delay = orzavs_test::Ms(30);
    return true;
  });
  // Any layout is accepted here: a packed BGR frame with padded rows.
  const int stride = kW * 3 + 8;
  std::vector<uint8_t> bgr = orzavs_test::makeFrame(kW * 3, kH, stride, OrzaVSMobile::BGR);
  ImageBuffer image(0, OrzaVSMobile::BGR, kW, kH, stride, 3, bgr.data());
  ExtraFrameData extra;
  extra.screenOrient = 270;
  engine.processSingleImage(image, extra);
  ASSERT_EQ(events.decodes().size(), 1u);  // no waiting needed
  EXPECT_EQ(events.decodes()[0].objects.size(), 2u);
  EXPECT_EQ(events.decodes()[0].metadata.queryID, transport.sent()[0].id);
  EXPECT_TRUE(events.pointCounts().empty());  // no interest points in single-image mode
  const orzavs_test::SentRequest sent = transport.sent()[0];
  EXPECT_EQ(sent.metadata.at("orientation"), "0");
  orzavs_test::JpegInfo info;
  ASSERT_TRUE(orzavs_test::decodeJpeg(sent.body, info));
  EXPECT_EQ(info.width, kW);
  EXPECT_EQ(info.height, kH);

  // Error replies come back the same way, with status 1.
  transport.setResponder([](const orzavs_test::SentRequest&, Tovra::Server::ServerResponse& r,
                            orzavs_test::Ms&) {
    r.responseCode = 500;
    r.responseStr = "boom";
    return true;
  });
  testing::internal::CaptureStdout();
  engine.processSingleImage(image, extra);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "VSS SERVER ERROR: response: boom\n");
  ASSERT_EQ(events.errors().size(), 1u);
  EXPECT_EQ(events.errors()[0].status, Tovra::Server::RESPONSE_SERVER_ERROR);
  EXPECT_EQ(events.errors()[0].code, 500);

  // A packed row longer than the stride is refused before anything is copied.
  ImageBuffer narrow(0, OrzaVSMobile::BGR, kW, kH, kW * 2, 3, bgr.data());
  testing::internal::CaptureStdout();
  engine.processSingleImage(narrow, extra);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Skipped input frame: row stride 128 is smaller than a row of 192 bytes\n");
  EXPECT_EQ(transport.sentCount(), 2u);
}

TEST(EndToEnd, ClientDrivesTheFacadeAndGetsResultsFromTheTransportThread) {
  RecordingEvents events;
  FakeTransport transport;
  transport.setResponder([](const orzavs_test::SentRequest& sent, Tovra::Server::ServerResponse& r,
                            orzavs_test::Ms& delay) {
    r.responseStr = orzavs_test::replyBody("Q-" + sent.metadata.at("orientation"));
    r.roundtripTime = 42.0;
    delay = orzavs_test::Ms(5);
    return true;
  });
  {
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.startEngine();
    std::vector<uint8_t> nv21 = orzavs_test::makeFrame(320, 240, 320, OrzaVSMobile::NV21);
    ImageBuffer image(0, OrzaVSMobile::NV21, 320, 240, 320, 1, nv21.data());
    ExtraFrameData extra;
    for (int i = 0; i < 3; ++i) {
      extra.timeStamp = i * 1.0;
      extra.screenOrient = 90 * i;
      facade.process(image, extra);
      ASSERT_TRUE(waitFor([&] { return events.decodes().size() == static_cast<size_t>(i + 1); }));
      std::this_thread::sleep_for(orzavs_test::Ms(60));  // let the worker settle the job
    }
    facade.stopEngine();
  }
  const auto sent = transport.sent();
  ASSERT_EQ(sent.size(), 3u);
  EXPECT_EQ(sent[0].metadata.count("lastQueryId"), 0u);
  EXPECT_EQ(sent[1].metadata.at("lastQueryId"), "Q-90");
  EXPECT_EQ(sent[2].metadata.at("lastQueryId"), "Q-180");
  EXPECT_EQ(sent[2].metadata.at("lastQueryRoundTripTime"), "42");
  EXPECT_EQ(sent[2].metadata.at("orientation"), "270");
  for (const auto& s : sent) {
    EXPECT_EQ(s.params.at("vsearch_params_json"),
              "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
  }
  const auto decodes = events.decodes();
  ASSERT_EQ(decodes.size(), 3u);
  EXPECT_EQ(decodes[2].metadata.queryID, "Q-270");
  EXPECT_EQ(decodes[2].metadata.mobileDecorator, "TeskarMobileDecorator");
  ASSERT_EQ(decodes[2].objects.size(), 1u);
  EXPECT_EQ(decodes[2].objects[0].srcObjectModule, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(events.pointCounts().size(), 3u);
}

}  // namespace
