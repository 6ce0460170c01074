#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <map>
#include <string>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"

namespace {

using orzavs_test::FakeTransport;
using orzavs_test::RecordingEvents;
using Tovra::TovraStateEngine;

TEST(EngineLifecycle, FollowsTheStateTable) {
  TovraStateEngine engine;
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  EXPECT_EQ(engine.executor(), nullptr);
  ASSERT_EQ(engine.jobCount(), 1u);

  engine.pauseEngine();  // STOPPED: ignored
  engine.resumeEngine();
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  engine.stopEngine();
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);

  engine.startEngine();
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  const Tovra::TovraExecutionEngine* first = engine.executor();
  ASSERT_NE(first, nullptr);
  EXPECT_EQ(first->threadCount(), 1u);
  engine.startEngine();  // RUNNING: keeps the executor
  EXPECT_EQ(engine.executor(), first);
  engine.resumeEngine();  // RUNNING: ignored
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);

  engine.pauseEngine();
  EXPECT_EQ(engine.getState(), Tovra::PAUSED);
  EXPECT_EQ(engine.executor(), first);  // cancelled but alive
  engine.pauseEngine();
  EXPECT_EQ(engine.getState(), Tovra::PAUSED);
  engine.resumeEngine();
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  EXPECT_EQ(engine.executor(), first);

  engine.pauseEngine();
  engine.startEngine();  // from PAUSED: a fresh start with a new executor
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  EXPECT_NE(engine.executor(), nullptr);
  EXPECT_NE(engine.executor(), first);

  engine.stopEngine();
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  EXPECT_EQ(engine.executor(), nullptr);
  engine.pauseEngine();
  engine.stopEngine();
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  engine.startEngine();
  engine.pauseEngine();
  engine.stopEngine();  // from PAUSED
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  EXPECT_EQ(engine.executor(), nullptr);
}

TEST(EngineLifecycle, DelegatesAreSetOnlyAsDefined) {
  RecordingEvents events;
  FakeTransport transport;
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

TEST(EngineLifecycle, ResetClearsFrameBookkeepingButResumeKeepsIt) {
  FakeTransport transport;  // never answers: the job stays busy, so a taken frame is held
  TovraStateEngine engine;
  engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  engine.startEngine();

  std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY);
  OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  extra.timeStamp = 1.0;
  engine.process("", image, extra);  // taken and sent
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.sentCount() == 1; }));
  extra.timeStamp = 2.0;
  engine.process("", image, extra);  // taken and held: the job awaits its reply
  EXPECT_TRUE(engine.hasHeldRecord());
  OrzaVSMobile::ImageBuffer lent;
  lent.format = OrzaVSMobile::GRAY;
  lent.height = 48;
  lent.widthStep = 64;
  std::string key;
  engine.requestImageBuffer(lent, key);
  EXPECT_EQ(engine.pendingBufferCount(), 1u);

  engine.pauseEngine();
  EXPECT_FALSE(engine.hasHeldRecord());
  EXPECT_EQ(engine.pendingBufferCount(), 0u);
  EXPECT_EQ(engine.lastTakenTime(), -1.0);
  EXPECT_EQ(engine.job(0).state(), Tovra::Finished);

  engine.resumeEngine();
  extra.timeStamp = 2.0;  // lastTakenTime was reset, so even the same time stamp is taken
  engine.process("", image, extra);
  EXPECT_EQ(engine.lastTakenTime(), 2.0);
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.sentCount() == 2; }));
  // Resume keeps the executor and the time rule runs on: a frame 0.1 later is not taken.
  extra.timeStamp = 2.05;
  engine.process("", image, extra);
  EXPECT_FALSE(engine.hasHeldRecord());
}

TEST(EngineFacade, AcceptsEveryDoNothingOperationInEveryState) {
  RecordingEvents events;
  FakeTransport transport;
  Tovra::TovraStateEngineFacade facade(&events);
  Tovra::CameraResRequirement requirement;
  facade.getCameraResRequirement(requirement);
  EXPECT_EQ(requirement.minHeight, 320);
  EXPECT_EQ(requirement.maxHeight, 720);

  std::map<std::string, uint32_t> counts = {{"frames", 3}};
  std::map<std::string, double> values = {{"fps", 29.5}};
  const std::map<std::string, std::string> props = {{"k", "v"}};
  auto doNothing = [&] {
    facade.readProps("{}");
    facade.enableSingleImageMode();
    facade.disableSingleImageMode();
    facade.readObjectModuleProps(Tovra::VISUAL_SEARCH_SERVICE_MOD, "x");
    facade.readObjectModuleProps(props);
    facade.removeObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD);
    facade.removeAllObjectModules();
    facade.getAndClearMetrics(counts, values);
    facade.enableEventLogging();
    facade.saveEventLog("/nonexistent/path");
    facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, props);
  };
  testing::internal::CaptureStdout();
  doNothing();
  facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport, "props are ignored");
  facade.startEngine();
  doNothing();
  facade.pauseEngine();
  doNothing();
  facade.stopEngine();
  doNothing();
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
  EXPECT_EQ(counts, (std::map<std::string, uint32_t>{{"frames", 3}}));
  EXPECT_EQ(values, (std::map<std::string, double>{{"fps", 29.5}}));
  facade.getCameraResRequirement(requirement);
  EXPECT_EQ(requirement.minHeight, 320);
  EXPECT_EQ(requirement.maxHeight, 720);
}

TEST(EngineFacade, NullEventDelegateMakesNoCallbacks) {
  FakeTransport transport;
  transport.setResponder([](const orzavs_test::SentRequest& sent, Tovra::Server::ServerResponse& r,
                            orzavs_test::Ms&) {
    r.responseStr = orzavs_test::replyBody(sent.id);
    return true;
  });
  Tovra::TovraStateEngineFacade facade(nullptr);
  facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  facade.startEngine();
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY);
  OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  extra.timeStamp = 0.0;
  testing::internal::CaptureStdout();
  facade.processSingleImage(image, extra);  // answered by the transport thread
  EXPECT_EQ(transport.pushedCount(), 1u);
  facade.process(image, extra);
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.pushedCount() == 2; }));
  facade.stopEngine();
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

}  // namespace
