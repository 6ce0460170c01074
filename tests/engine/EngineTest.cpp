// The engine as a client drives it (the state table, the delegates, the take rule, held and lent
// frames, refused frames and single images), and its frame records.

#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <map>
#include <memory>
#include <numeric>
#include <regex>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

#include "support/DiagnosticsRecorder.h"
#include "support/Fakes.h"
#include "support/GuardedBytes.h"

namespace {

using namespace OrzaVSMobile;
using orzavs_test::waitFor;
using Tovra::FrameRecord;
using Tovra::FrameRecordManager;
using Tovra::TovraStateEngine;

constexpr int kW = 64;
constexpr int kH = 48;

// A buffer without pixels, as the client hands it in to be lent memory.
ImageBuffer geometry(ImageFormat format, int32_t width = kW, int32_t height = kH, int32_t stride = kW) {
  return ImageBuffer(0, format, width, height, stride, 1, nullptr);
}

std::vector<uint8_t> pattern(size_t n) {
  std::vector<uint8_t> bytes(n);
  std::iota(bytes.begin(), bytes.end(), static_cast<uint8_t>(1));
  return bytes;
}

std::string frameIdOf(const std::string& requestId) { return requestId.substr(requestId.rfind('-') + 1); }

// A started engine on NV21 frames whose transport answers nothing unless told to.
class EngineTest : public ::testing::Test, public orzavs_test::EngineRig {};

TEST(EngineLifecycle, FollowsTheStateTable) {
  using E = TovraStateEngine;
  enum Executor { None, First, Fresh };
  // Each operation, the state after it and the executor then: none, the first one or a new one.
  const struct { void (E::*op)(); Tovra::EngineState state; Executor executor; } steps[] = {
      {&E::pauseEngine, Tovra::STOPPED, None},  // pause, resume and stop are ignored while STOPPED
      {&E::resumeEngine, Tovra::STOPPED, None},  {&E::stopEngine, Tovra::STOPPED, None},
      {&E::startEngine, Tovra::RUNNING, First},  {&E::startEngine, Tovra::RUNNING, First},  // kept
      {&E::resumeEngine, Tovra::RUNNING, First}, {&E::pauseEngine, Tovra::PAUSED, First},   // alive
      {&E::pauseEngine, Tovra::PAUSED, First},   {&E::resumeEngine, Tovra::RUNNING, First},
      {&E::pauseEngine, Tovra::PAUSED, First},   {&E::startEngine, Tovra::RUNNING, Fresh},  // restart
      {&E::pauseEngine, Tovra::PAUSED, Fresh},   {&E::stopEngine, Tovra::STOPPED, None}};
  TovraStateEngine engine;
  ASSERT_EQ(engine.jobCount(), 1u);
  const Tovra::TovraExecutionEngine* first = nullptr;
  for (size_t i = 0; i < sizeof steps / sizeof steps[0]; ++i) {
    (engine.*steps[i].op)();
    if (first == nullptr && engine.executor() != nullptr) {
      first = engine.executor();
      EXPECT_EQ(first->threadCount(), 1u);
    }
    EXPECT_EQ(engine.getState(), steps[i].state) << "step " << i;
    EXPECT_EQ(engine.executor() == nullptr, steps[i].executor == None) << "step " << i;
    if (steps[i].executor != None) {
      EXPECT_EQ(engine.executor() == first, steps[i].executor == First) << "step " << i;
    }
  }
}

TEST(EngineLifecycle, DelegatesAreStoredOnlyAsDefined) {
  orzavs_test::RecordingEvents events;
  orzavs_test::FakeTransport transport;
  TovraStateEngine engine;
  engine.setEventDelegate(&events);
  engine.setEventDelegate(nullptr);  // a null never replaces a set delegate
  EXPECT_EQ(engine.eventDelegate(), &events);
  for (int id : {0, 2, 3, 4, 5, 6, 7, -1}) {
    engine.addObjectModule(static_cast<Tovra::ObjectModuleID>(id), &transport);
    EXPECT_EQ(engine.serverDelegate(), nullptr) << id;
  }
  engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  EXPECT_EQ(engine.serverDelegate(), &transport);
  engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, nullptr);  // a null is stored
  EXPECT_EQ(engine.serverDelegate(), nullptr);
}

TEST_F(EngineTest, PauseClearsTheFrameBookkeeping) {
  send(1.0);  // never answered: the job stays busy
  frame(2.0);  // held while the job awaits its reply
  ImageBuffer lent = geometry(GRAY);
  std::string key;
  engine->requestImageBuffer(lent, key);
  // Whether a frame is held, how many buffers are lent, the last time stamp taken.
  EXPECT_EQ(std::make_tuple(engine->hasHeldRecord(), engine->pendingBufferCount(), engine->lastTakenTime()),
            std::make_tuple(true, size_t{1}, 2.0));
  engine->pauseEngine();
  EXPECT_EQ(std::make_tuple(engine->hasHeldRecord(), engine->pendingBufferCount(), engine->lastTakenTime()),
            std::make_tuple(false, size_t{0}, -1.0));
  EXPECT_EQ(engine->job(0).state(), Tovra::Finished);
  // The lent buffer outlived the reset that dropped its record: a late fill is harmless.
  EXPECT_EQ(lent.fillBuffer(textured.data(), kW * kH), kW * kH);
  // Paused: the defined lines, nothing lent, nothing processed.
  orzavs_test::DiagnosticsRecorder diagnostics;
  ImageBuffer refused = geometry(GRAY), plain = image();
  std::string refusedKey = "kept";
  engine->requestImageBuffer(refused, refusedKey);
  ExtraFrameData extra;
  engine->process(refusedKey, plain, extra);
  engine->processSingleImage(plain, extra);
  EXPECT_EQ(diagnostics.text(),
            "Failed to request image buffer: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n"
            "Skipped input frame: TSE not in RUNNING state\n");
  EXPECT_TRUE(refused.data == nullptr && refusedKey == "kept" && events.pointCounts().size() == 2);
  engine->resumeEngine();
  frame(2.0);  // the same time stamp is taken again after the reset
  EXPECT_EQ(engine->lastTakenTime(), 2.0);
  ASSERT_TRUE(waitFor([&] { return transport.sent().size() == 2; }));
}

// Without an event delegate replies are still handled, silently; the metrics this build does not
// keep leave the caller's maps alone.
TEST(EngineFacade, ANullEventDelegateMeansNoCallbacks) {
  orzavs_test::FakeTransport transport;
  transport.answerEverything();
  Tovra::TovraStateEngineFacade facade(nullptr);
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(kW, kH, kW, GRAY);
  ImageBuffer image(0, GRAY, kW, kH, kW, 1, pixels.data());
  ExtraFrameData extra;
  orzavs_test::DiagnosticsRecorder diagnostics;
  facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport, "props are ignored");
  facade.startEngine();
  facade.processSingleImage(image, extra);
  // The transport counts a reply once pushServerResponse has returned on its own thread, which
  // can be just after processSingleImage saw the reply handled.
  ASSERT_TRUE(waitFor([&] { return transport.pushedCount() == 1; }));
  facade.process(image, extra);
  ASSERT_TRUE(waitFor([&] { return transport.pushedCount() == 2; }));
  std::map<std::string, uint32_t> counts = {{"frames", 3}};
  std::map<std::string, double> values = {{"fps", 29.5}};
  facade.getAndClearMetrics(counts, values);
  EXPECT_EQ(counts, (std::map<std::string, uint32_t>{{"frames", 3}}));
  EXPECT_EQ(values, (std::map<std::string, double>{{"fps", 29.5}}));
  Tovra::CameraResRequirement requirement;
  facade.getCameraResRequirement(requirement);
  EXPECT_EQ(std::make_pair(requirement.minHeight, requirement.maxHeight), std::make_pair(320, 720));
  EXPECT_EQ(diagnostics.text(), "");
}

TEST_F(EngineTest, TimeRuleComparesDoubleDifferencesStrictly) {
  transport.answerEverything();
  const struct { double last, next; bool taken; } cases[] = {
      {0.0, 0.1, false}, {0.5, 0.6, false}, {1.0, 1.1, true}, {3.0, 3.0, false}};
  for (const auto& c : cases) {
    engine->pauseEngine();  // back to "nothing taken yet": the next frame is always taken
    engine->resumeEngine();
    frame(c.last);
    ASSERT_TRUE(jobIdle());
    const size_t sent = transport.sent().size();
    frame(c.next);
    EXPECT_EQ(engine->lastTakenTime(), c.taken ? c.next : c.last) << c.last << " -> " << c.next;
    ASSERT_TRUE(jobIdle());
    EXPECT_EQ(transport.sent().size(), sent + (c.taken ? 1 : 0));
  }
  EXPECT_EQ(events.pointCounts().size(), 8u);  // every accepted frame, taken or not
  EXPECT_TRUE(events.pointCounts()[0] > 0 && events.pointCounts()[0] <= 50) << events.pointCounts()[0];
}

TEST_F(EngineTest, HeldFrameIsReplacedBySharpnessOrAgeAndSentWhenTheJobFrees) {
  send(0.0);  // frame 0: the job awaits its reply
  frame(0.2, true);  // frame 1: held
  frame(0.3, true);  // flat, 0.1 younger: not taken
  frame(0.6, true);  // 0.4 older is not more than 0.4: not taken
  EXPECT_EQ(engine->lastTakenTime(), 0.2);
  frame(0.7, true);  // 0.5 older: replaces the held frame (frame 2)
  frame(0.75);       // sharper than the held record's 0: replaces it (frame 3)
  EXPECT_EQ(engine->lastTakenTime(), 0.75);
  EXPECT_EQ(events.pointCounts().back(), events.pointCounts().front());
  EXPECT_EQ(events.pointCounts()[1], 0u);  // a uniform frame has no corners
  transport.pushServerResponse(orzavs_test::makeResponse(transport.sent()[0].id, orzavs_test::replyBody("Q0")));
  ASSERT_TRUE(jobIdle());
  frame(0.76, true);  // not taken itself, but dispatches the held frame
  EXPECT_FALSE(engine->hasHeldRecord());
  ASSERT_TRUE(waitFor([&] { return transport.sent().size() == 2; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id) + "," + frameIdOf(transport.sent()[1].id), "0,3");
  EXPECT_EQ(transport.sent()[1].metadata.at("lastQueryId"), "Q0");
}

TEST(Sharpness, UsesCrossedMarginsConsecutiveRowsAndTheConstantBelowOneTenth) {
  // width 15: top margin round(15 * k) = 1 (with 0.1 it would be 2); height 25: left margin 2
  // (with 0.1, 3). Rows examined: 2..6 (counter 1, 6, 11, 16, 21 < 24); columns 2, 7, 12.
  const int w = 15, h = 25;
  std::vector<uint8_t> plane(static_cast<size_t>(w) * h);
  ImageBuffer image(0, GRAY, w, h, w, 1, plane.data());
  // One bright pixel at (x, y) and the sum it gives: a sample, a neighbour of samples, or neither.
  const int cases[][3] = {{2, 2, 9}, {2, 3, 10}, {2, 6, 9}, {2, 7, 1}, {2, 8, 0}, {2, 1, 1}, {3, 2, 2}, {12, 4, 10}};
  for (const auto& c : cases) {
    std::fill(plane.begin(), plane.end(), 0);
    plane[static_cast<size_t>(c[1]) * w + c[0]] = 255;
    EXPECT_EQ(TovraStateEngine::sharpness(image), c[2] * 255) << c[0] << "," << c[1];
  }
  // Tiny planes, in guarded memory: samples without their whole neighbourhood are skipped.
  for (const auto& size : {std::make_pair(1, 1), std::make_pair(4, 4), std::make_pair(15, 3), std::make_pair(2, 8)}) {
    orzavs_test::GuardedBytes tiny(std::vector<uint8_t>(static_cast<size_t>(size.first) * size.second, 200));
    ImageBuffer guarded(0, GRAY, size.first, size.second, size.first, 1, const_cast<uint8_t*>(tiny.data()));
    EXPECT_EQ(TovraStateEngine::sharpness(guarded), 0);
  }
}

TEST_F(EngineTest, LentBuffersAreFilledInPlaceAndAlwaysComeBack) {
  transport.answerEverything();
  ImageBuffer lent = geometry(NV21);
  std::string key;
  engine->requestImageBuffer(lent, key);
  ASSERT_EQ(lent.allocLen, kW * kH * 3 / 2);
  EXPECT_TRUE(std::regex_match(key, std::regex("[0-9]+-0"))) << key;
  ASSERT_EQ(lent.fillBuffer(textured.data(), static_cast<int32_t>(textured.size())), lent.allocLen);
  ExtraFrameData extra;
  extra.timeStamp = 0.0;
  engine->process(key, lent, extra);
  EXPECT_TRUE(lent.data == nullptr && lent.allocLen == 0);  // detached from the record it handed back
  ASSERT_TRUE(waitFor([&] { return transport.sent().size() == 1; }));
  EXPECT_EQ(frameIdOf(transport.sent()[0].id), "0");  // the lent record itself was sent
  ASSERT_TRUE(jobIdle());

  orzavs_test::DiagnosticsRecorder diagnostics;
  ImageBuffer plain = image();
  engine->process("no-such-key", plain, extra);  // like an empty key: no line
  std::vector<ImageBuffer> buffers(6, geometry(GRAY));
  std::vector<std::string> keys(6, "unchanged");
  for (int i = 0; i < 6; ++i) {
    engine->requestImageBuffer(buffers[i], keys[i]);
    ASSERT_EQ(buffers[i].data != nullptr, i < 5) << i;  // a sixth finds no free record
  }
  EXPECT_EQ(keys[5], "unchanged");
  buffers[1].format = RGB;  // refused format
  buffers[2].widthStep = kW - 1;          // refused stride
  buffers[3].height = kH + 1;             // more than the lent memory holds
  for (int i = 0; i < 5; ++i) {
    extra.timeStamp = 10.0 + i;
    engine->process(keys[i], buffers[i], extra);
    EXPECT_EQ(buffers[i].data, nullptr) << i;
  }
  EXPECT_EQ(diagnostics.text(),
            "Failed to get a new frame record slot in getRequestImageBuffers\n"
            "Failed to process non-GRAY/YUV format in continuous scanning mode\n"
            "Skipped input frame: row stride 63 is smaller than a row of 64 bytes\n"
            "Skipped input frame: image buffer holds 3072 bytes, a 64x49 image needs 3136\n");
  ASSERT_TRUE(jobIdle());
  engine->pauseEngine();  // drops a held frame, if any
  engine->resumeEngine();
  for (int i = 0; i < 5; ++i) {
    ImageBuffer again = geometry(GRAY);
    engine->requestImageBuffer(again, key);
    EXPECT_NE(again.data, nullptr) << "record " << i << " was lost";
  }
}

TEST_F(EngineTest, BadFramesPrintOneLineAndLeaveTheEngineWorking) {
  transport.answerEverything();
  const auto bad = [&](int badFormat, int w, int h, int stride, bool pixels = true) {
    return ImageBuffer(0, static_cast<ImageFormat>(badFormat), w, h, stride, 1, pixels ? textured.data() : nullptr);
  };
  const char* const unsupported = "Failed to process non-GRAY/YUV format in continuous scanning mode\n";
  struct { const char* line; ImageBuffer image; } cases[] = {
      {"Skipped input frame: image has no pixel data\n", bad(GRAY, kW, kH, kW, false)},
      {"Skipped input frame: invalid image size 0x48\n", bad(GRAY, 0, kH, kW)},
      {"Skipped input frame: invalid image size 64x-1\n", bad(NV12, kW, -1, kW)},
      {"Skipped input frame: row stride -64 is smaller than a row of 64 bytes\n", bad(I420, kW, kH, -kW)},
      {unsupported, bad(-1, kW, kH, kW)}, {unsupported, bad(8, kW, kH, kW)}};
  ExtraFrameData extra;
  for (auto c : cases) {
    orzavs_test::DiagnosticsRecorder diagnostics;
    engine->process("", c.image, extra);
    EXPECT_EQ(diagnostics.text(), c.line);
  }
  EXPECT_TRUE(events.pointCounts().empty());
  EXPECT_EQ(engine->lastTakenTime(), -1.0);
  frame(0.0);  // still works
  ASSERT_TRUE(waitFor([&] { return events.decoded().size() == 1; }));
}

TEST_F(EngineTest, SingleImageReturnsOnlyAfterTheReplyWasHandled) {
  transport.answerEverything(orzavs_test::Ms(30));
  const int stride = kW * 3 + 8;  // any layout is accepted here: padded BGR
  std::vector<uint8_t> bgr = orzavs_test::makeFrame(kW * 3, kH, stride, BGR);
  ImageBuffer image(0, BGR, kW, kH, stride, 3, bgr.data());
  ExtraFrameData extra;
  extra.screenOrient = 270;
  engine->processSingleImage(image, extra);
  ASSERT_EQ(events.decoded().size(), 1u);  // already there
  EXPECT_EQ(events.metadata()[0].queryID, transport.sent()[0].id);
  EXPECT_TRUE(events.pointCounts().empty());
  EXPECT_TRUE(transport.sent()[0].metadata.at("orientation") == "0" && transport.sent()[0].body.at(0) == 0xFF);
  transport.setResponder([](const orzavs_test::SentRequest&, Tovra::Server::ServerResponse& r, orzavs_test::Ms&) {
    r.responseCode = 500;
    return true;
  });
  orzavs_test::DiagnosticsRecorder diagnostics;
  engine->processSingleImage(image, extra);
  ImageBuffer narrow(0, BGR, kW, kH, kW * 2, 3, bgr.data());
  engine->processSingleImage(narrow, extra);
  EXPECT_EQ(diagnostics.text(),
            "VSS SERVER ERROR: response: \n"
            "Skipped input frame: row stride 128 is smaller than a row of 192 bytes\n");
  ASSERT_EQ(events.errors().size(), 1u);
  EXPECT_EQ(events.errors()[0].code, 500);
}

// Takes all five records of `pool`, expecting renewed ones with ids 0..4, and marks each with its `width`.
void takeAll(FrameRecordManager& pool, std::vector<std::shared_ptr<FrameRecord>>& held) {
  for (uint64_t i = 0; i < 5; ++i) {
    held.push_back(pool.getNewSlot());
    ASSERT_NE(nullptr, held.back());
    EXPECT_EQ(i, held.back()->frameId);
    EXPECT_EQ(0, held.back()->width);
    held.back()->width = 100 + static_cast<int>(i);
  }
  EXPECT_EQ(nullptr, pool.getNewSlot());  // the sixth finds nothing free
}

TEST(FrameRecordManagerTest, HandsOutFreeRecordsWithIncreasingIdsAndRestartsUpToAHeldOne) {
  FrameRecordManager pool(5);
  std::vector<std::shared_ptr<FrameRecord>> held;
  ASSERT_NO_FATAL_FAILURE(takeAll(pool, held));
  held[2]->timeStamp = 12.5;
  FrameRecord* third = held[2].get();
  held[2].reset();
  std::shared_ptr<FrameRecord> again = pool.getNewSlot();  // the same record, the next id
  ASSERT_EQ(third, again.get());
  EXPECT_EQ(std::make_tuple(uint64_t{5}, -1.0, 102), std::make_tuple(again->frameId, again->timeStamp, again->width));

  std::weak_ptr<FrameRecord> firstOld = held[0];
  std::shared_ptr<FrameRecord> second = held[1];
  held.clear();
  again.reset();
  orzavs_test::DiagnosticsRecorder diagnostics;
  EXPECT_FALSE(pool.restart());
  EXPECT_TRUE(firstOld.expired());  // slot 1 renewed; the slots after the held one are kept
  std::shared_ptr<FrameRecord> renewed = pool.getNewSlot();
  EXPECT_EQ(std::make_tuple(uint64_t{6}, 0), std::make_tuple(renewed->frameId, renewed->width));  // numbering kept
  EXPECT_EQ(102, pool.getNewSlot()->width);

  second.reset();
  renewed.reset();
  EXPECT_TRUE(pool.restart());  // everything free: renewed and renumbered
  EXPECT_EQ("Unable to restart frame record manager () as some frame(s) are still outstanding\n", diagnostics.text());
  takeAll(pool, held);
}

TEST(FrameRecordTest, LentBuffersRoundRowsFirstAndAreTakenWithoutACopy) {
  FrameRecord record;
  ImageBuffer odd = geometry(NV21, 640, 481, 640);
  ASSERT_TRUE(record.lendBuffer(odd));
  EXPECT_EQ(461440, odd.allocLen);  // (481*3)/2 = 721 rows of 640 bytes
  ExtraFrameData extra;
  extra.timeStamp = 3.25;
  extra.screenOrient = 90;
  EXPECT_FALSE(record.setSourceImage(odd, extra));  // expects 640*481*3/2 = 461760 bytes
  // Time and geometry are taken before the check, the rest is not.
  EXPECT_EQ(std::make_tuple(3.25, 481, 0), std::make_tuple(record.timeStamp, record.height, record.screenOrient));

  ImageBuffer even = geometry(I420, 64, 48, 80);
  ASSERT_TRUE(record.lendBuffer(even));
  ASSERT_EQ(80 * 72, even.allocLen);
  const std::vector<uint8_t> frame = pattern(80 * 72);
  ASSERT_EQ(80 * 72, even.fillBuffer(frame.data(), 80 * 72));
  const uint8_t* storage = record.pixels.data();
  extra.flat = true;
  ASSERT_TRUE(record.setSourceImage(even, extra));
  EXPECT_TRUE(record.pixels.data() == storage && record.pixels == frame);
  EXPECT_EQ(std::make_tuple(80, int{I420}, 90, 1),
            std::make_tuple(record.widthStep, record.format, record.screenOrient, record.flat));

  ImageBuffer grey = geometry(GRAY, 10, 7, 12);
  ASSERT_EQ(50, grey.allocateBuffer(50));  // its own block is freed normally (LeakSanitizer)
  ASSERT_TRUE(record.lendBuffer(grey));
  EXPECT_EQ(84, grey.allocLen);
  EXPECT_TRUE(record.setSourceImage(grey, ExtraFrameData()));
}

TEST(FrameRecordTest, LendingRefusesBadGeometryAndBoundsTheFill) {
  FrameRecord record;
  uint8_t previous[8] = {0};
  for (const ImageBuffer& bad : {geometry(NV21, 8, -2, 8), geometry(GRAY, 8, 4, -8),
                                 geometry(NV12, 65536, 65536, 65536)}) {
    ImageBuffer buffer = bad;
    buffer.data = previous;  // whatever the buffer pointed at before is dropped
    buffer.allocLen = 5;
    EXPECT_FALSE(record.lendBuffer(buffer));
    EXPECT_TRUE(buffer.data == nullptr && buffer.allocLen == 0);
  }
  ImageBuffer buffer = geometry(GRAY, 4, 4, 4);
  ASSERT_TRUE(record.lendBuffer(buffer));
  buffer.allocLen = 1000;  // forged: the fill still stops at the record's 16 bytes
  EXPECT_EQ(16, buffer.fillBuffer(pattern(1000).data(), 1000));
  buffer.releaseBuffer();  // must not free the record's storage
  EXPECT_EQ(16u, record.pixels.size());
}

TEST(FrameRecordTest, CopiesSourcesThatHoldTheirGeometryAndRefusesTheRest) {
  FrameRecord record;
  const ExtraFrameData extra;
  struct Case { ImageFormat format; int width, height, stride; size_t bytes; };
  // YUV frames take widthStep * height * 3 / 2 bytes, every other layout widthStep * height.
  for (const Case& c : {Case{NV21, 16, 12, 16, 288}, Case{GRAY, 10, 5, 10, 50}, Case{RGB, 10, 4, 30, 120}}) {
    std::vector<uint8_t> pixels = pattern(c.bytes);
    ImageBuffer image(0, c.format, c.width, c.height, c.stride, 3, pixels.data());
    ASSERT_TRUE(record.setSourceImage(image, extra));
    EXPECT_EQ(pixels, record.pixels);
  }
  std::vector<uint8_t> pixels(64, 1);
  EXPECT_FALSE(record.setSourceImage(ImageBuffer(0, GRAY, 8, 8, 8, 1, nullptr), extra));
  EXPECT_FALSE(record.setSourceImage(ImageBuffer(0, GRAY, 8, -8, 8, 1, pixels.data()), extra));
  // An own block shorter than the geometry says would be overrun.
  ImageBuffer owned(0, NV21, 8, 8, 8, 1, nullptr);
  ASSERT_EQ(95, owned.allocateBuffer(95));  // NV21 8x8 needs 96 bytes
  EXPECT_FALSE(record.setSourceImage(owned, extra));
  ASSERT_EQ(96, owned.allocateBuffer(96));
  EXPECT_TRUE(record.setSourceImage(owned, extra));
  owned.releaseBuffer();  // a released buffer's stale pointer is never read
  EXPECT_FALSE(record.setSourceImage(owned, extra));
  EXPECT_TRUE(record.setSourceImage(ImageBuffer(0, GRAY, 0, 0, 0, 1, nullptr), extra) && record.pixels.empty());
}

}  // namespace
