// Several client threads feed frames while another one starts, pauses, resumes and stops the
// engine, and the transport answers from its own thread after random delays, with errors, or
// never. Checks: no crash, race or deadlock; each reply yields at most one callback; once the
// chaos stops, every request gets exactly one callback; deleting the engine with replies in
// flight is safe.

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

namespace {

using orzavs_test::FakeTransport;
using orzavs_test::Ms;
using orzavs_test::waitFor;
using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;

// Counts callbacks and remembers every reply token seen in didDecode.
class CountingEvents : public Tovra::EventDelegateBase {
 public:
  void didDecode(const std::vector<Tovra::ObjectInfo>&, const Tovra::ResultMetadata& metadata) override {
    std::lock_guard<std::mutex> lock(mutex_);
    if (!tokens_.insert(metadata.queryID).second) ++duplicates_;
    ++decodes_;
  }
  void didReceiveServerError(Tovra::ObjectModuleID, Tovra::Server::ResponseStatus status,
                             int32_t code) override {
    std::lock_guard<std::mutex> lock(mutex_);
    if (status != Tovra::Server::RESPONSE_SERVER_ERROR || code != 503) ++unexpected_;
    ++errors_;
  }
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    if (points.size() > 50) unexpected_points_ = true;
    frames_.fetch_add(1);
  }

  size_t callbacks() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return decodes_ + errors_;
  }
  size_t decodes() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return decodes_;
  }
  size_t errors() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return errors_;
  }
  size_t duplicates() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return duplicates_;
  }
  size_t unexpected() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return unexpected_ + (unexpected_points_ ? 1 : 0);
  }
  size_t frames() const { return frames_.load(); }

 private:
  mutable std::mutex mutex_;
  std::set<std::string> tokens_;
  size_t decodes_ = 0;
  size_t errors_ = 0;
  size_t duplicates_ = 0;
  size_t unexpected_ = 0;
  std::atomic<bool> unexpected_points_{false};
  std::atomic<size_t> frames_{0};
};

// Answers 200 (with a unique token as query id), 503, or never, after 0-3 ms.
struct ChaoticResponder {
  std::mutex mutex;
  std::mt19937 random{12345};
  std::atomic<int> answered200{0};
  std::atomic<int> answered503{0};
  std::atomic<int> token{0};
  bool alwaysAnswer = false;

  bool operator()(const orzavs_test::SentRequest&, Tovra::Server::ServerResponse& reply, Ms& delay) {
    std::lock_guard<std::mutex> lock(mutex);
    const unsigned roll = random() % 10;
    delay = Ms(random() % 4);
    if (!alwaysAnswer && roll == 0) return false;
    if (!alwaysAnswer && roll == 1) {
      reply.responseCode = 503;
      reply.responseStr = "unavailable";
      ++answered503;
      return true;
    }
    reply.responseStr = orzavs_test::replyBody("T" + std::to_string(token++), {"PIDN", "Other"});
    ++answered200;
    return true;
  }
};

TEST(EngineStress, ClientsLifecycleAndTransportRaceWithoutLosingOrDuplicatingCallbacks) {
  CountingEvents events;
  FakeTransport transport;
  auto responder = std::make_shared<ChaoticResponder>();
  transport.setResponder([responder](const orzavs_test::SentRequest& sent,
                                     Tovra::Server::ServerResponse& reply,
                                     Ms& delay) { return (*responder)(sent, reply, delay); });
  auto engine = std::make_unique<Tovra::TovraStateEngine>();
  engine->setEventDelegate(&events);
  engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  engine->startEngine();

  const auto start = orzavs_test::Clock::now();
  auto seconds = [start] {
    return std::chrono::duration<double>(orzavs_test::Clock::now() - start).count();
  };
  std::atomic<bool> stop{false};
  testing::internal::CaptureStdout();  // the engine's lines about skipped frames

  std::vector<std::thread> clients;
  for (int c = 0; c < 3; ++c) {
    clients.emplace_back([&, c] {
      std::mt19937 random(static_cast<unsigned>(c + 1));
      const int format = c == 0 ? OrzaVSMobile::GRAY : OrzaVSMobile::NV21;
      std::vector<uint8_t> own = orzavs_test::makeFrame(48, 32, 48, format, false, c + 7);
      std::vector<uint8_t> flat = orzavs_test::makeFrame(48, 32, 48, format, true);
      while (!stop) {
        ExtraFrameData extra;
        extra.timeStamp = seconds();
        if (random() % 3 == 0) {
          // Through a lent buffer.
          ImageBuffer lent;
          lent.format = static_cast<OrzaVSMobile::ImageFormat>(format);
          lent.width = 48;
          lent.height = 32;
          lent.widthStep = 48;
          std::string key;
          engine->requestImageBuffer(lent, key);
          if (lent.data != nullptr) lent.fillBuffer(own.data(), static_cast<int32_t>(own.size()));
          if (random() % 4 == 0) std::this_thread::sleep_for(Ms(1));
          if (lent.data == nullptr) {  // not lent (not running, or the pool was empty)
            lent = ImageBuffer(0, static_cast<OrzaVSMobile::ImageFormat>(format), 48, 32, 48, 1,
                               own.data());
          }
          engine->process(key, lent, extra);
        } else {
          ImageBuffer image(0, static_cast<OrzaVSMobile::ImageFormat>(format), 48, 32, 48, 1,
                            random() % 2 ? own.data() : flat.data());
          engine->process("", image, extra);
        }
        std::this_thread::sleep_for(Ms(random() % 3));
      }
    });
  }
  std::thread lifecycle([&] {
    std::mt19937 random(99);
    while (!stop) {
      switch (random() % 6) {
        case 0: engine->pauseEngine(); break;
        case 1: case 2: engine->resumeEngine(); break;
        case 3: engine->startEngine(); break;
        case 4: engine->stopEngine(); break;
        default: engine->startEngine(); break;
      }
      std::this_thread::sleep_for(Ms(2 + random() % 15));
    }
  });

  std::this_thread::sleep_for(Ms(1500));
  stop = true;
  for (auto& t : clients) t.join();
  lifecycle.join();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));

  // During the chaos: at most one callback per reply, never two for the same reply.
  const size_t chaosSent = transport.sentCount();
  EXPECT_GT(chaosSent, 0u);
  EXPECT_GT(events.frames(), 0u);
  EXPECT_LE(events.decodes(), static_cast<size_t>(responder->answered200.load()));
  EXPECT_LE(events.errors(), static_cast<size_t>(responder->answered503.load()));
  EXPECT_EQ(events.duplicates(), 0u);
  EXPECT_EQ(events.unexpected(), 0u);
  EXPECT_EQ(transport.pushedCount() + transport.droppedCount(), chaosSent);

  // Calm: a fresh start, a transport that always answers. Every request now gets exactly one
  // callback.
  {
    std::lock_guard<std::mutex> lock(responder->mutex);
    responder->alwaysAnswer = true;
  }
  engine->stopEngine();
  engine->startEngine();
  const size_t sentBefore = transport.sentCount();
  const size_t callbacksBefore = events.callbacks();
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(48, 32, 48, OrzaVSMobile::GRAY);
  double t = 100.0;
  for (size_t round = 1; round <= 5; ++round) {
    ASSERT_TRUE(waitFor([&] {
      ImageBuffer image(0, OrzaVSMobile::GRAY, 48, 32, 48, 1, pixels.data());
      ExtraFrameData extra;
      extra.timeStamp = (t += 1.0);
      engine->process("", image, extra);
      return events.callbacks() >= callbacksBefore + round;
    }, Ms(10000)));
  }
  // The last frame may have dispatched one more request: wait until the job is idle again.
  ASSERT_TRUE(waitFor([&] { return !engine->job(0).isBusy() && transport.idle(); }, Ms(10000)));
  EXPECT_EQ(transport.sentCount() - sentBefore, events.callbacks() - callbacksBefore);

  // Gone while replies are still on their way.
  {
    std::lock_guard<std::mutex> lock(responder->mutex);
    responder->alwaysAnswer = false;
  }
  ImageBuffer image(0, OrzaVSMobile::GRAY, 48, 32, 48, 1, pixels.data());
  ExtraFrameData extra;
  extra.timeStamp = (t += 1.0);
  engine->process("", image, extra);
  engine.reset();
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(transport.pendingCount(), 0u);
  const std::string out = testing::internal::GetCapturedStdout();
  std::printf("stress: %zu frames, %zu requests, %zu decodes, %zu errors, %zu replies never sent\n",
              events.frames(), transport.sentCount(), events.decodes(), events.errors(),
              transport.droppedCount());
  EXPECT_EQ(out.find("Next Job is NULL"), std::string::npos);
}

}  // namespace
