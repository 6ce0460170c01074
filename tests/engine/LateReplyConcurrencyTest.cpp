// Replies that arrive after pause, stop or deletion, or while the engine is torn down on
// another thread. Run under AddressSanitizer and ThreadSanitizer.

#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <atomic>
#include <memory>
#include <string>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"
#include "support/RecordingTransport.h"

namespace {

using orzavs_test::Ms;
using orzavs_test::waitFor;

Tovra::Server::ServerResponse okReply(const std::string& id) {
  return orzavs_test::makeResponse(id, orzavs_test::replyBody(id));
}

class LateReplyTest : public ::testing::Test {
 protected:
  LateReplyTest() : pixels(orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY)) {
    engine = std::make_unique<Tovra::TovraStateEngine>();
    engine->setEventDelegate(&events);
    engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    engine->startEngine();
  }
  // Sends one frame; returns once the worker has left the job awaiting its reply.
  std::string sendFrame(double t) {
    // The worker settles the job just after the send returns; a frame arriving before that
    // would only be held.
    EXPECT_TRUE(waitFor([&] { return !engine->job(0).isBusy(); }));
    const size_t before = transport.sentCount();
    OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
    OrzaVSMobile::ExtraFrameData extra;
    extra.timeStamp = t;
    engine->process("", image, extra);
    EXPECT_TRUE(waitFor([&] { return transport.sentCount() == before + 1; }));
    EXPECT_TRUE(waitFor([&] { return engine->job(0).state() == Tovra::AwaitingReply; }));
    return transport.sent().back().id;
  }
  orzavs_test::RecordingEvents events;
  orzavs_test::FakeTransport transport;
  std::vector<uint8_t> pixels;
  std::unique_ptr<Tovra::TovraStateEngine> engine;
};

TEST_F(LateReplyTest, RepliesAfterPauseStopOrDeletionAreIgnored) {
  std::string stale = sendFrame(0.0);
  engine->pauseEngine();
  transport.pushServerResponse(okReply(stale));
  EXPECT_EQ(events.replyCallbacks(), 0u);
  engine->resumeEngine();
  const std::string fresh = sendFrame(1.0);
  transport.pushServerResponse(okReply(fresh));
  ASSERT_EQ(events.metadata().size(), 1u);
  EXPECT_EQ(events.metadata()[0].queryID, fresh);
  stale = sendFrame(2.0);
  engine->stopEngine();
  transport.pushServerResponse(okReply(stale));
  EXPECT_EQ(events.replyCallbacks(), 1u);

  engine->startEngine();
  const std::string first = sendFrame(0.0);
  engine->pauseEngine();
  engine->resumeEngine();
  // Numbering restarted with the reset: within the same second both ids are equal.
  const std::string second = sendFrame(1.0);
  EXPECT_EQ(transport.pendingCount(), first == second ? 1u : 2u);
  engine.reset();
  EXPECT_EQ(transport.pendingCount(), 0u);
  transport.pushServerResponse(okReply(first));
  transport.pushServerResponse(okReply(second));
  EXPECT_EQ(events.replyCallbacks(), 1u);
}

TEST_F(LateReplyTest, DeletionWaitsOutADeliveryButPauseDoesNot) {
  std::atomic<bool> inCallback{false}, release{false}, done{false};
  events.decodeHook = [&] {
    inCallback = true;
    while (!release) std::this_thread::sleep_for(Ms(1));
    done = true;
  };
  transport.pushLater(okReply(sendFrame(0.0)));  // delivered on the transport's thread
  ASSERT_TRUE(waitFor([&] { return inCallback.load(); }));
  engine->pauseEngine();  // returns while the delivery is still blocked
  EXPECT_FALSE(done.load());
  release = true;
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_TRUE(done.load());
  engine->resumeEngine();

  inCallback = false;
  release = false;
  done = false;
  transport.pushLater(okReply(sendFrame(1.0)));
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

TEST(LateReplyFacade, DeletingARunningFacadeWithARequestInFlightIsSafe) {
  orzavs_test::RecordingEvents events;
  orzavs_test::FakeTransport transport;
  {
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.startEngine();
    std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::NV21);
    OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::NV21, 64, 48, 64, 1, pixels.data());
    OrzaVSMobile::ExtraFrameData extra;
    facade.process(image, extra);
    ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
  }
  transport.pushLater(okReply(transport.sent()[0].id), Ms(1));
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(transport.pushedCount(), 1u);
  EXPECT_EQ(events.replyCallbacks(), 0u);
}

}  // namespace
