#include "engine/TovraStateEngine.h"

#include <algorithm>
#include <cstring>
#include <regex>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"
#include "support/GuardedBytes.h"
#include "support/StdoutCapture.h"
#include "vsearch/VisualSearchRequest.h"

namespace {

using orzavs_test::waitFor;
using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using Tovra::TovraStateEngine;

constexpr int kW = 64;
constexpr int kH = 48;

ImageBuffer lendable(int format, int height = kH) {
  ImageBuffer b;
  b.format = static_cast<OrzaVSMobile::ImageFormat>(format);
  b.width = kW;
  b.height = height;
  b.widthStep = kW;
  return b;
}

class PipelineTest : public ::testing::Test {
 protected:
  PipelineTest()
      : textured(orzavs_test::makeFrame(kW, kH, kW, OrzaVSMobile::NV21)),
        flat(orzavs_test::makeFrame(kW, kH, kW, OrzaVSMobile::NV21, true)) {
    engine.setEventDelegate(&events);
    engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    engine.startEngine();
  }
  void frame(double t, bool isFlat = false) {
    ImageBuffer image(0, OrzaVSMobile::NV21, kW, kH, kW, 1, isFlat ? flat.data() : textured.data());
    ExtraFrameData extra;
    extra.timeStamp = t;
    engine.process("", image, extra);
  }
  bool jobIdle() { return waitFor([&] { return !engine.job(0).isBusy(); }); }
  static std::string frameIdOf(const std::string& requestId) { return requestId.substr(requestId.rfind('-') + 1); }

  orzavs_test::RecordingEvents events;
  orzavs_test::FakeTransport transport;
  TovraStateEngine engine;  // after the delegates, so destroyed first
  std::vector<uint8_t> textured, flat;
};

TEST_F(PipelineTest, TimeRuleComparesDoubleDifferencesStrictly) {
  transport.answerEverything();
  const struct { double last, next; bool taken; } cases[] = {
      {0.0, 0.1, false}, {0.5, 0.6, false}, {1.0, 1.1, true}, {3.0, 3.0, false}};
  for (const auto& c : cases) {
    engine.pauseEngine();  // back to "nothing taken yet": the next frame is always taken
    engine.resumeEngine();
    frame(c.last);
    ASSERT_TRUE(jobIdle());
    const size_t sent = transport.sentCount();
    frame(c.next);
    EXPECT_EQ(engine.lastTakenTime(), c.taken ? c.next : c.last) << c.last << " -> " << c.next;
    ASSERT_TRUE(jobIdle());
    EXPECT_EQ(transport.sentCount(), sent + (c.taken ? 1 : 0));
  }
  EXPECT_EQ(events.pointCounts().size(), 8u);  // every accepted frame, taken or not
  EXPECT_GT(events.pointCounts()[0], 0u);
  EXPECT_LE(events.pointCounts()[0], 50u);
}

TEST_F(PipelineTest, HeldFrameIsReplacedBySharpnessOrAgeAndSentWhenTheJobFrees) {
  frame(0.0);  // frame 0: sent; the job awaits its reply
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
  frame(0.2, true);  // frame 1: held
  frame(0.3, true);  // flat, 0.1 younger: not taken
  frame(0.6, true);  // 0.4 older is not more than 0.4: not taken
  EXPECT_EQ(engine.lastTakenTime(), 0.2);
  frame(0.7, true);  // 0.5 older: replaces the held frame (frame 2)
  frame(0.75);       // sharper than the held record's 0: replaces it (frame 3)
  EXPECT_EQ(engine.lastTakenTime(), 0.75);
  EXPECT_EQ(events.pointCounts().back(), events.pointCounts().front());
  EXPECT_EQ(events.pointCounts()[1], 0u);  // a uniform frame has no corners
  Tovra::Server::ServerResponse r;
  r.id = transport.sent()[0].id;
  r.responseStr = orzavs_test::replyBody("Q0");
  transport.pushServerResponse(r);
  ASSERT_TRUE(jobIdle());
  frame(0.76, true);  // not taken itself, but dispatches the held frame
  EXPECT_FALSE(engine.hasHeldRecord());
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 2; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id), "0");
  EXPECT_EQ(frameIdOf(transport.sent()[1].id), "3");
  EXPECT_EQ(transport.sent()[1].metadata.at("lastQueryId"), "Q0");
}

TEST(Sharpness, UsesCrossedMarginsConsecutiveRowsAndTheConstantBelowOneTenth) {
  // width 15: top margin round(15 * k) = 1 (with 0.1 it would be 2); height 25: left margin 2
  // (with 0.1, 3). Rows examined: 2..6 (counter 1, 6, 11, 16, 21 < 24); columns 2, 7, 12.
  const int w = 15, h = 25;
  std::vector<uint8_t> plane(static_cast<size_t>(w) * h);
  ImageBuffer image(0, OrzaVSMobile::GRAY, w, h, w, 1, plane.data());
  auto sumWithPixelAt = [&](int x, int y) {
    std::fill(plane.begin(), plane.end(), 0);
    plane[static_cast<size_t>(y) * w + x] = 255;
    return TovraStateEngine::sharpness(image);
  };
  EXPECT_EQ(sumWithPixelAt(2, 2), 9 * 255);   // sample, and neighbour of the sample below
  EXPECT_EQ(sumWithPixelAt(2, 3), 10 * 255);  // neighbour above and below too
  EXPECT_EQ(sumWithPixelAt(2, 6), 9 * 255);   // last examined row
  EXPECT_EQ(sumWithPixelAt(2, 7), 255);
  EXPECT_EQ(sumWithPixelAt(2, 8), 0);
  EXPECT_EQ(sumWithPixelAt(2, 1), 255);
  EXPECT_EQ(sumWithPixelAt(3, 2), 2 * 255);   // column 3 is not sampled
  EXPECT_EQ(sumWithPixelAt(12, 4), 10 * 255);
  // Tiny planes, in guarded memory: samples without their whole neighbourhood are skipped.
  for (const auto& size : {std::make_pair(1, 1), std::make_pair(4, 4), std::make_pair(15, 3), std::make_pair(2, 8)}) {
    orzavs_test::GuardedBytes tiny(std::vector<uint8_t>(static_cast<size_t>(size.first) * size.second, 200));
    ImageBuffer guarded(0, OrzaVSMobile::GRAY, size.first, size.second, size.first, 1, const_cast<uint8_t*>(tiny.data()));
    EXPECT_EQ(TovraStateEngine::sharpness(guarded), 0);
  }
}

TEST_F(PipelineTest, LentBuffersAreFilledInPlaceAndAlwaysComeBack) {
  transport.answerEverything();
  ImageBuffer lent = lendable(OrzaVSMobile::NV21);
  std::string key;
  engine.requestImageBuffer(lent, key);
  ASSERT_EQ(lent.allocLen, kW * kH * 3 / 2);
  EXPECT_TRUE(std::regex_match(key, std::regex("[0-9]+-0"))) << key;
  ASSERT_EQ(lent.fillBuffer(textured.data(), static_cast<int32_t>(textured.size())), lent.allocLen);
  ExtraFrameData extra;
  extra.timeStamp = 0.0;
  engine.process(key, lent, extra);
  EXPECT_EQ(lent.data, nullptr);  // detached from the record it handed back
  EXPECT_EQ(lent.allocLen, 0);
  ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id), "0");  // the lent record itself was sent
  ASSERT_TRUE(jobIdle());

  orzavs_test::StdoutCapture printed;
  ImageBuffer image(0, OrzaVSMobile::NV21, kW, kH, kW, 1, textured.data());
  engine.process("no-such-key", image, extra);  // like an empty key: no line
  std::vector<ImageBuffer> buffers(5);
  std::vector<std::string> keys(5);
  for (int i = 0; i < 5; ++i) {
    buffers[i] = lendable(OrzaVSMobile::GRAY);
    engine.requestImageBuffer(buffers[i], keys[i]);
    ASSERT_NE(buffers[i].data, nullptr) << i;
  }
  ImageBuffer sixth = lendable(OrzaVSMobile::GRAY);
  std::string sixthKey = "unchanged";
  engine.requestImageBuffer(sixth, sixthKey);
  EXPECT_EQ(sixthKey, "unchanged");
  buffers[1].format = OrzaVSMobile::RGB;  // refused format
  buffers[2].widthStep = kW - 1;          // refused stride
  buffers[3].height = kH + 1;             // more than the lent memory holds
  for (int i = 0; i < 5; ++i) {
    extra.timeStamp = 10.0 + i;
    engine.process(keys[i], buffers[i], extra);
    EXPECT_EQ(buffers[i].data, nullptr) << i;
  }
  EXPECT_EQ(printed.text(),
            "Failed to get a new frame record slot in getRequestImageBuffers\n"
            "Failed to process non-GRAY/YUV format in continuous scanning mode\n"
            "Skipped input frame: row stride 63 is smaller than a row of 64 bytes\n"
            "Skipped input frame: image buffer holds 3072 bytes, a 64x49 image needs 3136\n");
  ASSERT_TRUE(jobIdle());
  engine.pauseEngine();  // drops a held frame, if any
  engine.resumeEngine();
  for (int i = 0; i < 5; ++i) {
    ImageBuffer again = lendable(OrzaVSMobile::GRAY);
    engine.requestImageBuffer(again, key);
    EXPECT_NE(again.data, nullptr) << "record " << i << " was lost";
  }
}

TEST_F(PipelineTest, BadFramesPrintOneLineAndLeaveTheEngineWorking) {
  transport.answerEverything();
  struct { const char* line; ImageBuffer image; } cases[] = {
      {"Skipped input frame: image has no pixel data\n", ImageBuffer(0, OrzaVSMobile::GRAY, kW, kH, kW, 1, nullptr)},
      {"Skipped input frame: invalid image size 0x48\n", ImageBuffer(0, OrzaVSMobile::GRAY, 0, kH, kW, 1, textured.data())},
      {"Skipped input frame: invalid image size 64x-1\n", ImageBuffer(0, OrzaVSMobile::NV12, kW, -1, kW, 1, textured.data())},
      {"Skipped input frame: row stride -64 is smaller than a row of 64 bytes\n",
       ImageBuffer(0, OrzaVSMobile::I420, kW, kH, -kW, 1, textured.data())},
      {"Failed to process non-GRAY/YUV format in continuous scanning mode\n",
       ImageBuffer(0, static_cast<OrzaVSMobile::ImageFormat>(-1), kW, kH, kW, 1, textured.data())},
      {"Failed to process non-GRAY/YUV format in continuous scanning mode\n",
       ImageBuffer(0, static_cast<OrzaVSMobile::ImageFormat>(8), kW, kH, kW, 1, textured.data())}};
  ExtraFrameData extra;
  for (auto c : cases) {
    orzavs_test::StdoutCapture printed;
    engine.process("", c.image, extra);
    EXPECT_EQ(printed.text(), c.line);
  }
  EXPECT_TRUE(events.pointCounts().empty());
  EXPECT_EQ(engine.lastTakenTime(), -1.0);
  // Outside RUNNING: the defined lines, nothing lent, nothing processed.
  engine.pauseEngine();
  orzavs_test::StdoutCapture printed;
  ImageBuffer other = lendable(OrzaVSMobile::GRAY);
  std::string key = "kept";
  engine.requestImageBuffer(other, key);
  engine.process(key, cases[1].image, extra);
  engine.processSingleImage(cases[1].image, extra);
  EXPECT_EQ(printed.text(),
            "Failed to request image buffer: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n");
  EXPECT_EQ(other.data, nullptr);
  EXPECT_EQ(key, "kept");
  engine.resumeEngine();
  frame(0.0);  // still works
  ASSERT_TRUE(waitFor([&] { return events.decoded().size() == 1; }));
}

TEST_F(PipelineTest, SingleImageReturnsOnlyAfterTheReplyWasHandled) {
  transport.answerEverything(orzavs_test::Ms(30));
  const int stride = kW * 3 + 8;  // any layout is accepted here: padded BGR
  std::vector<uint8_t> bgr = orzavs_test::makeFrame(kW * 3, kH, stride, OrzaVSMobile::BGR);
  ImageBuffer image(0, OrzaVSMobile::BGR, kW, kH, stride, 3, bgr.data());
  ExtraFrameData extra;
  extra.screenOrient = 270;
  engine.processSingleImage(image, extra);
  ASSERT_EQ(events.decoded().size(), 1u);  // already there
  EXPECT_EQ(events.metadata()[0].queryID, transport.sent()[0].id);
  EXPECT_TRUE(events.pointCounts().empty());
  EXPECT_EQ(transport.sent()[0].metadata.at("orientation"), "0");
  EXPECT_EQ(transport.sent()[0].body.at(0), 0xFF);
  transport.setResponder([](const orzavs_test::SentRequest&, Tovra::Server::ServerResponse& r, orzavs_test::Ms&) {
    r.responseCode = 500;
    return true;
  });
  orzavs_test::StdoutCapture printed;
  engine.processSingleImage(image, extra);
  ImageBuffer narrow(0, OrzaVSMobile::BGR, kW, kH, kW * 2, 3, bgr.data());
  engine.processSingleImage(narrow, extra);
  EXPECT_EQ(printed.text(),
            "VSS SERVER ERROR: response: \n"
            "Skipped input frame: row stride 128 is smaller than a row of 192 bytes\n");
  ASSERT_EQ(events.errors().size(), 1u);
  EXPECT_EQ(events.errors()[0].code, 500);
}

}  // namespace
