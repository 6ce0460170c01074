// Client threads feed frames (copied and lent) while another thread starts, pauses, resumes
// and stops the engine, and the transport answers from its own thread after random delays,
// with errors, or never. Checks: no crash, race or deadlock; at most one callback per reply;
// once things calm down every request gets exactly one callback; deleting the engine with
// replies in flight is safe.

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

#include "support/EngineFakes.h"
#include "support/StdoutCapture.h"

namespace {

using orzavs_test::Ms;
using orzavs_test::waitFor;
using OrzaVSMobile::ImageBuffer;

// Counts callbacks; each 200 reply carries a unique token as its query id.
struct CountingEvents : Tovra::EventDelegateBase {
  void didDecode(const std::vector<Tovra::ObjectInfo>&, const Tovra::ResultMetadata& m) override {
    std::lock_guard<std::mutex> lock(mutex);
    duplicates += tokens.insert(m.queryID).second ? 0 : 1;
    ++decodes;
  }
  void didReceiveServerError(Tovra::ObjectModuleID, Tovra::Server::ResponseStatus status, int32_t code) override {
    std::lock_guard<std::mutex> lock(mutex);
    unexpected += status == Tovra::Server::RESPONSE_SERVER_ERROR && code == 503 ? 0 : 1;
    ++errors;
  }
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    if (points.size() > 50) ++tooManyPoints;
    ++frames;
  }
  size_t callbacks() {
    std::lock_guard<std::mutex> lock(mutex);
    return decodes + errors;
  }
  std::mutex mutex;
  std::set<std::string> tokens;
  size_t decodes = 0, errors = 0, duplicates = 0, unexpected = 0;
  std::atomic<size_t> frames{0}, tooManyPoints{0};
};

TEST(EngineStress, ClientsLifecycleAndTransportRaceWithoutLosingOrDuplicatingCallbacks) {
  CountingEvents events;
  orzavs_test::FakeTransport transport;
  std::mutex responderMutex;
  std::mt19937 responderRandom(12345);
  int answered200 = 0, answered503 = 0;
  bool alwaysAnswer = false;
  transport.setResponder([&](const orzavs_test::SentRequest&, Tovra::Server::ServerResponse& reply, Ms& delay) {
    std::lock_guard<std::mutex> lock(responderMutex);
    const unsigned roll = responderRandom() % 10;
    delay = Ms(responderRandom() % 4);
    if (!alwaysAnswer && roll == 0) return false;  // never answered
    if (!alwaysAnswer && roll == 1) {
      reply.responseCode = 503;
      ++answered503;
      return true;
    }
    reply.responseStr = orzavs_test::replyBody("T" + std::to_string(answered200++), {"PIDN", "Other"});
    return true;
  });
  auto engine = std::make_unique<Tovra::TovraStateEngine>();
  engine->setEventDelegate(&events);
  engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  engine->startEngine();

  const auto start = orzavs_test::Clock::now();
  auto now = [start] { return std::chrono::duration<double>(orzavs_test::Clock::now() - start).count(); };
  std::atomic<bool> stop{false};
  orzavs_test::StdoutCapture printed;  // lines about frames skipped while not running
  std::vector<std::thread> threads;
  for (int c = 0; c < 3; ++c) {
    threads.emplace_back([&, c] {
      std::mt19937 random(static_cast<unsigned>(c + 1));
      const auto format = static_cast<OrzaVSMobile::ImageFormat>(c == 0 ? OrzaVSMobile::GRAY : OrzaVSMobile::NV21);
      std::vector<uint8_t> textured = orzavs_test::makeFrame(48, 32, 48, format, false, c + 7);
      std::vector<uint8_t> flat = orzavs_test::makeFrame(48, 32, 48, format, true);
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
      switch (random() % 6) {
        case 0: engine->pauseEngine(); break;
        case 1: case 2: engine->resumeEngine(); break;
        case 3: engine->stopEngine(); break;
        default: engine->startEngine(); break;
      }
      std::this_thread::sleep_for(Ms(2 + random() % 15));
    }
  });
  std::this_thread::sleep_for(Ms(1500));
  stop = true;
  for (auto& t : threads) t.join();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));

  const size_t chaosSent = transport.sentCount();
  EXPECT_GT(chaosSent, 0u);
  EXPECT_GT(events.frames.load(), 0u);
  EXPECT_EQ(transport.pushedCount() + transport.droppedCount(), chaosSent);
  {
    std::lock_guard<std::mutex> lock(responderMutex);
    std::lock_guard<std::mutex> lock2(events.mutex);
    EXPECT_LE(events.decodes, static_cast<size_t>(answered200));
    EXPECT_LE(events.errors, static_cast<size_t>(answered503));
    EXPECT_EQ(events.duplicates, 0u);
    EXPECT_EQ(events.unexpected, 0u);
    EXPECT_EQ(events.tooManyPoints.load(), 0u);
    alwaysAnswer = true;
  }

  // Calm: a fresh start and a transport that always answers. Every request now gets exactly
  // one callback.
  engine->stopEngine();
  engine->startEngine();
  const size_t sentBefore = transport.sentCount();
  const size_t callbacksBefore = events.callbacks();
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(48, 32, 48, OrzaVSMobile::GRAY);
  ImageBuffer image(0, OrzaVSMobile::GRAY, 48, 32, 48, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  extra.timeStamp = 100.0;
  for (size_t round = 1; round <= 5; ++round) {
    ASSERT_TRUE(waitFor([&] {
      extra.timeStamp += 1.0;
      engine->process("", image, extra);
      return events.callbacks() >= callbacksBefore + round;
    }, Ms(10000)));
  }
  // The last frame may have dispatched one more request: wait until the job is idle again.
  ASSERT_TRUE(waitFor([&] { return !engine->job(0).isBusy() && transport.idle(); }, Ms(10000)));
  EXPECT_EQ(transport.sentCount() - sentBefore, events.callbacks() - callbacksBefore);

  // Gone while a reply may still be on its way.
  extra.timeStamp += 1.0;
  engine->process("", image, extra);
  engine.reset();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(transport.pendingCount(), 0u);
  printed.text();
  std::printf("stress: %zu frames, %zu requests, %zu decodes, %zu errors, %zu never answered\n",
              events.frames.load(), transport.sentCount(), events.decodes, events.errors, transport.droppedCount());
}

}  // namespace
