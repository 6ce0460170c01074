#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <atomic>
#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"

namespace {

using orzavs_test::FakeTransport;
using orzavs_test::Ms;
using orzavs_test::RecordingEvents;
using orzavs_test::waitFor;
using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;

Tovra::Server::ServerResponse okReply(const std::string& id) {
  Tovra::Server::ServerResponse r;
  r.id = id;
  r.responseStr = orzavs_test::replyBody(id);
  return r;
}

class LateReplyTest : public ::testing::Test {
 protected:
  LateReplyTest() : pixels(orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY)) {
    engine = std::make_unique<Tovra::TovraStateEngine>();
    engine->setEventDelegate(&events);
    engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    engine->startEngine();
  }

  // Sends one frame and waits until the job awaits its reply, settled by the worker.
  std::string sendFrame(double t) {
    const size_t before = transport.sentCount();
    ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
    ExtraFrameData extra;
    extra.timeStamp = t;
    engine->process("", image, extra);
    EXPECT_TRUE(waitFor([&] { return transport.sentCount() == before + 1; }));
    EXPECT_TRUE(waitFor([&] {
      return engine->job(0).state() == Tovra::AwaitingReply && engine->job(0).isBusy();
    }));
    return transport.sent().back().id;
  }

  RecordingEvents events;
  FakeTransport transport;
  std::vector<uint8_t> pixels;
  std::unique_ptr<Tovra::TovraStateEngine> engine;
};

TEST_F(LateReplyTest, ReplyAfterPauseIsIgnoredAndTheNextFrameWorks) {
  const std::string stale = sendFrame(0.0);
  engine->pauseEngine();
  transport.pushServerResponse(okReply(stale));
  EXPECT_EQ(events.replyCallbacks(), 0u);
  engine->resumeEngine();
  const std::string fresh = sendFrame(1.0);
  transport.pushServerResponse(okReply(fresh));
  ASSERT_EQ(events.decodes().size(), 1u);
  EXPECT_EQ(events.decodes()[0].metadata.queryID, fresh);
}

TEST_F(LateReplyTest, ReplyAfterStopIsIgnored) {
  const std::string stale = sendFrame(0.0);
  engine->stopEngine();
  transport.pushServerResponse(okReply(stale));
  transport.pushServerResponse(okReply(stale));
  EXPECT_EQ(events.replyCallbacks(), 0u);
  EXPECT_EQ(engine->job(0).state(), Tovra::Finished);
}

TEST_F(LateReplyTest, ReplyAfterTheEngineIsDeletedFindsNoHandler) {
  const std::string first = sendFrame(0.0);
  engine->pauseEngine();
  engine->resumeEngine();
  // Two requests pending for the same job (the reset restarted the frame numbering, so within
  // the same second both ids are equal and the delegate keeps one entry).
  const std::string second = sendFrame(1.0);
  EXPECT_EQ(transport.pendingCount(), first == second ? 1u : 2u);
  engine.reset();
  EXPECT_EQ(transport.pendingCount(), 0u);
  transport.pushServerResponse(okReply(first));
  transport.pushServerResponse(okReply(second));
  EXPECT_EQ(events.replyCallbacks(), 0u);
}

TEST_F(LateReplyTest, DeletionWaitsOutAReplyBeingDeliveredOnAnotherThread) {
  const std::string id = sendFrame(0.0);
  std::atomic<bool> inCallback{false};
  std::atomic<bool> callbackDone{false};
  events.decodeHook = [&] {
    inCallback = true;
    std::this_thread::sleep_for(Ms(150));
    callbackDone = true;
  };
  transport.pushLater(okReply(id));  // delivered on the transport's thread
  ASSERT_TRUE(waitFor([&] { return inCallback.load(); }));
  engine.reset();  // must not free the job while its reply handler still runs
  EXPECT_TRUE(callbackDone.load());
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(events.decodes().size(), 1u);
}

TEST_F(LateReplyTest, PauseDoesNotWaitForAReplyBeingDelivered) {
  const std::string id = sendFrame(0.0);
  std::atomic<bool> inCallback{false};
  std::atomic<bool> release{false};
  events.decodeHook = [&] {
    inCallback = true;
    while (!release) std::this_thread::sleep_for(Ms(1));
  };
  transport.pushLater(okReply(id));
  ASSERT_TRUE(waitFor([&] { return inCallback.load(); }));
  engine->pauseEngine();  // returns while the delivery is still blocked
  EXPECT_EQ(engine->getState(), Tovra::PAUSED);
  release = true;
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(events.decodes().size(), 1u);
  EXPECT_FALSE(engine->job(0).isBusy());
}

TEST(LateReplyFacade, DeletingTheFacadeWithRequestsInFlightIsSafe) {
  RecordingEvents events;
  FakeTransport transport;
  std::vector<std::string> ids;
  {
    Tovra::TovraStateEngineFacade facade(&events);
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    facade.startEngine();
    std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::NV21);
    ImageBuffer image(0, OrzaVSMobile::NV21, 64, 48, 64, 1, pixels.data());
    ExtraFrameData extra;
    extra.timeStamp = 0.0;
    facade.process(image, extra);
    ASSERT_TRUE(waitFor([&] { return transport.sentCount() == 1; }));
    // Leave it running: the destructor resets, joins the worker and withdraws the job.
  }
  for (const auto& sent : transport.sent()) transport.pushLater(okReply(sent.id), Ms(1));
  ASSERT_TRUE(waitFor([&] { return transport.idle(); }));
  EXPECT_EQ(transport.pushedCount(), 1u);
  EXPECT_EQ(events.replyCallbacks(), 0u);
}

}  // namespace
