// The engine under threads: clients, lifecycle calls and the transport racing; replies that
// arrive after pause, stop or deletion; the record pool shared between takers and jobs. Run
// under AddressSanitizer and ThreadSanitizer.

#include "engine/TovraStateEngine.h"

#include <atomic>
#include <memory>
#include <mutex>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "engine/FrameRecordManager.h"
#include "support/DiagnosticsRecorder.h"
#include "support/Fakes.h"

namespace {

using namespace orzavs_test;
using OrzaVSMobile::ImageBuffer;

// Records replies; interest points are only counted, without a lock, so that the delegate orders
// nothing between the engine's threads.
struct CountingEvents : RecordingEvents {
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    tooManyPoints += points.size() > 50 ? 1 : 0;
    ++frames;
  }
  std::atomic<size_t> frames{0}, tooManyPoints{0};
};

// Clients feed copied and lent frames, a thread drives the lifecycle, the transport answers late,
// wrongly or never: at most one callback per reply, exactly one once calm; deletion stays safe.
TEST(EngineStress, ClientsLifecycleAndTransportRaceWithoutLosingOrDuplicatingCallbacks) {
  CountingEvents events;
  FakeTransport transport;
  std::mutex responderMutex;
  std::mt19937 responderRandom(12345);
  int answered200 = 0, answered503 = 0;
  bool alwaysAnswer = false;
  transport.setResponder([&](const SentRequest&, Tovra::Server::ServerResponse& reply, Ms& delay) {
    std::lock_guard<std::mutex> lock(responderMutex);
    const unsigned roll = alwaysAnswer ? 9 : responderRandom() % 10;
    delay = Ms(responderRandom() % 4);
    if (roll == 0) return false;  // never answered
    answered503 += roll == 1 ? 1 : 0;
    if (roll == 1) reply.responseCode = 503;
    else reply.responseStr = replyBody("T" + std::to_string(answered200++), {"PIDN", "Other"});
    return true;
  });
  auto engine = std::make_unique<Tovra::TovraStateEngine>();
  engine->setEventDelegate(&events);
  engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  engine->startEngine();

  const auto start = Clock::now();
  auto now = [start] { return std::chrono::duration<double>(Clock::now() - start).count(); };
  std::atomic<bool> stop{false};
  DiagnosticsRecorder diagnostics;  // lines about frames skipped while not running
  std::vector<std::thread> threads;
  for (int c = 0; c < 3; ++c) {
    threads.emplace_back([&, c] {
      std::mt19937 random(static_cast<unsigned>(c + 1));
      const auto format = c == 0 ? OrzaVSMobile::GRAY : OrzaVSMobile::NV21;
      std::vector<uint8_t> textured = makeFrame(48, 32, 48, format, false, c + 7);
      std::vector<uint8_t> flat = makeFrame(48, 32, 48, format, true);
      while (!stop) {
        OrzaVSMobile::ExtraFrameData extra;
        extra.timeStamp = now();
        std::string key;
        ImageBuffer image(0, format, 48, 32, 48, 1, random() % 2 ? textured.data() : flat.data());
        if (random() % 3 == 0) {  // through a lent buffer, when one is available
          ImageBuffer lent = image;
          lent.data = nullptr;
          engine->requestImageBuffer(lent, key);
          if (lent.data != nullptr) {
            lent.fillBuffer(textured.data(), static_cast<int32_t>(textured.size()));
            image = lent;
          }
        }
        engine->process(key, image, extra);
        std::this_thread::sleep_for(Ms(random() % 3));
      }
    });
  }
  threads.emplace_back([&] {
    std::mt19937 random(99);
    while (!stop) {
      using E = Tovra::TovraStateEngine;
      void (E::*const ops[])() = {&E::pauseEngine, &E::resumeEngine, &E::resumeEngine,
                                  &E::stopEngine,  &E::startEngine,  &E::startEngine};
      ((*engine).*ops[random() % 6])();
      std::this_thread::sleep_for(Ms(2 + random() % 15));
    }
  });
  std::this_thread::sleep_for(Ms(1500));
  stop = true;
  for (auto& t : threads) t.join();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));

  EXPECT_TRUE(transport.sent().size() > 0 && events.frames.load() > 0);
  // Each 200 reply carried a unique token as its query id, every other reply was a 503.
  const std::vector<Tovra::ResultMetadata> decoded = events.metadata();
  const std::vector<ErrorCall> errors = events.errors();
  std::set<std::string> tokens;
  for (const Tovra::ResultMetadata& m : decoded) tokens.insert(m.queryID);
  EXPECT_EQ(tokens.size(), decoded.size()) << "a reply was reported twice";
  for (const ErrorCall& e : errors) {
    EXPECT_TRUE(e.status == Tovra::Server::RESPONSE_SERVER_ERROR && e.code == 503) << e.status << " " << e.code;
  }
  EXPECT_EQ(events.tooManyPoints.load(), 0u);
  {
    std::lock_guard<std::mutex> lock(responderMutex);
    EXPECT_LE(decoded.size(), static_cast<size_t>(answered200));
    EXPECT_LE(errors.size(), static_cast<size_t>(answered503));
    alwaysAnswer = true;
  }

  // Calm: a fresh start and a transport that always answers.
  engine->stopEngine();
  engine->startEngine();
  const size_t sentBefore = transport.sent().size();
  const size_t callbacksBefore = events.replyCallbacks();
  std::vector<uint8_t> pixels = makeFrame(48, 32, 48, OrzaVSMobile::GRAY);
  ImageBuffer image(0, OrzaVSMobile::GRAY, 48, 32, 48, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  extra.timeStamp = 100.0;
  for (size_t round = 1; round <= 5; ++round) {
    ASSERT_TRUE(waitFor([&] {
      extra.timeStamp += 1.0;
      engine->process("", image, extra);
      return events.replyCallbacks() >= callbacksBefore + round;
    }, Ms(10000)));
  }
  // The last frame may have dispatched one more request: wait until the job is idle again.
  ASSERT_TRUE(waitFor([&] { return !engine->job(0).isBusy() && transport.idle(); }, Ms(10000)));
  EXPECT_EQ(transport.sent().size() - sentBefore, events.replyCallbacks() - callbacksBefore);

  // Gone while a reply may still be on its way.
  extra.timeStamp += 1.0;
  engine->process("", image, extra);
  engine.reset();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(transport.pendingCount(), 0u);
}

class LateReplyTest : public ::testing::Test, public EngineRig {};

TEST_F(LateReplyTest, DeletionWaitsOutADeliveryButPauseDoesNot) {
  std::atomic<bool> inCallback{false}, release{false}, done{false};
  events.decodeHook = [&] {
    inCallback = true;
    while (!release) std::this_thread::sleep_for(Ms(1));
    done = true;
  };
  transport.pushLater(makeResponse(send(0.0), replyBody("Q")));  // delivered on the transport's thread
  ASSERT_TRUE(waitFor([&] { return inCallback.load(); }));
  engine->pauseEngine();  // returns while the delivery is still blocked
  EXPECT_FALSE(done.load());
  release = true;
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_TRUE(done.load());
  engine->resumeEngine();

  inCallback = release = done = false;
  transport.pushLater(makeResponse(send(1.0), replyBody("Q")));
  ASSERT_TRUE(waitFor([&] { return inCallback.load(); }));
  std::thread releaser([&] {
    std::this_thread::sleep_for(Ms(100));
    release = true;
  });
  engine.reset();  // must not free the job while its reply handler still runs
  EXPECT_TRUE(done.load());
  releaser.join();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
}

// Two takers fill records, two jobs read and drop them: no record is handed out while held, ids
// are unique, and each hand-out is ordered after the previous holder's last use (TSan checks).
TEST(FrameRecordManagerStress, RecordsReleasedOnOtherThreadsAreReusedSafely) {
  constexpr int kFramesEach = 2000;
  Tovra::FrameRecordManager pool(5);
  std::mutex queueMutex;
  std::vector<std::shared_ptr<Tovra::FrameRecord>> handedOver;
  std::atomic<int> consumed{0}, mismatches{0};
  auto consumer = [&] {
    while (consumed.load() < 2 * kFramesEach) {
      std::shared_ptr<Tovra::FrameRecord> record;
      {
        std::lock_guard<std::mutex> lock(queueMutex);
        if (!handedOver.empty()) {
          record = std::move(handedOver.back());
          handedOver.pop_back();
        }
      }
      if (!record) {
        std::this_thread::yield();
        continue;
      }
      // The pixels carry the frame id in every byte.
      for (uint8_t byte : record->pixels) mismatches += byte != static_cast<uint8_t>(record->frameId);
      mismatches += record->width != static_cast<int32_t>(record->frameId % 1000) ? 1 : 0;
      record.reset();  // the job lets go; the pool may hand it out again at once
      ++consumed;
    }
  };
  std::vector<uint64_t> ids[2];
  auto producer = [&](std::vector<uint64_t>& mine) {
    while (mine.size() < kFramesEach) {
      std::shared_ptr<Tovra::FrameRecord> record = pool.getNewSlot();
      if (!record) {
        std::this_thread::yield();
        continue;
      }
      mine.push_back(record->frameId);
      record->width = static_cast<int32_t>(record->frameId % 1000);
      record->pixels.assign(64 + mine.size() % 64, static_cast<uint8_t>(record->frameId));
      std::lock_guard<std::mutex> lock(queueMutex);
      handedOver.push_back(std::move(record));
    }
  };
  std::thread threads[] = {std::thread(consumer), std::thread(consumer), std::thread(producer, std::ref(ids[0])),
                           std::thread(producer, std::ref(ids[1]))};
  for (std::thread& t : threads) t.join();

  std::set<uint64_t> all(ids[0].begin(), ids[0].end());
  all.insert(ids[1].begin(), ids[1].end());
  EXPECT_EQ(2u * kFramesEach, all.size()) << "a frame id was handed out twice";
  EXPECT_EQ(2u * kFramesEach - 1, *all.rbegin());
  EXPECT_EQ(0, mismatches.load());
  EXPECT_TRUE(pool.restart());
}

}  // namespace
