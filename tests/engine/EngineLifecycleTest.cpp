#include "engine/TovraStateEngine.h"
#include "engine/TovraStateEngineFacade.h"

#include <map>
#include <string>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"
#include "support/StdoutCapture.h"

namespace {

using Tovra::TovraStateEngine;

TEST(EngineLifecycle, FollowsTheStateTable) {
  TovraStateEngine engine;
  ASSERT_EQ(engine.jobCount(), 1u);
  engine.pauseEngine();  // ignored while STOPPED, like resume and stop
  engine.resumeEngine();
  engine.stopEngine();
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  EXPECT_EQ(engine.executor(), nullptr);

  engine.startEngine();
  const Tovra::TovraExecutionEngine* first = engine.executor();
  ASSERT_NE(first, nullptr);
  EXPECT_EQ(first->threadCount(), 1u);
  engine.startEngine();  // RUNNING: keeps the executor; resume is ignored
  engine.resumeEngine();
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  EXPECT_EQ(engine.executor(), first);

  engine.pauseEngine();
  engine.pauseEngine();
  EXPECT_EQ(engine.getState(), Tovra::PAUSED);
  EXPECT_EQ(engine.executor(), first);  // cancelled, alive
  engine.resumeEngine();
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  EXPECT_EQ(engine.executor(), first);

  engine.pauseEngine();
  engine.startEngine();  // from PAUSED: a fresh start, a new executor
  EXPECT_EQ(engine.getState(), Tovra::RUNNING);
  EXPECT_NE(engine.executor(), first);
  EXPECT_NE(engine.executor(), nullptr);

  engine.pauseEngine();
  engine.stopEngine();  // from PAUSED
  EXPECT_EQ(engine.getState(), Tovra::STOPPED);
  EXPECT_EQ(engine.executor(), nullptr);
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

TEST(EngineLifecycle, PauseClearsTheFrameBookkeeping) {
  orzavs_test::FakeTransport transport;  // never answers: the job stays busy
  TovraStateEngine engine;
  engine.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  engine.startEngine();
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY);
  OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  extra.timeStamp = 1.0;
  engine.process("", image, extra);  // sent
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.sentCount() == 1; }));
  extra.timeStamp = 2.0;
  engine.process("", image, extra);  // held while the job awaits its reply
  OrzaVSMobile::ImageBuffer lent;
  lent.format = OrzaVSMobile::GRAY;
  lent.height = 48;
  lent.widthStep = 64;
  std::string key;
  engine.requestImageBuffer(lent, key);
  EXPECT_TRUE(engine.hasHeldRecord());
  EXPECT_EQ(engine.pendingBufferCount(), 1u);

  engine.pauseEngine();
  EXPECT_FALSE(engine.hasHeldRecord());
  EXPECT_EQ(engine.pendingBufferCount(), 0u);
  EXPECT_EQ(engine.lastTakenTime(), -1.0);
  EXPECT_EQ(engine.job(0).state(), Tovra::Finished);
  // The lent buffer outlived the reset that dropped its record: a late fill is harmless.
  EXPECT_EQ(lent.fillBuffer(pixels.data(), 64 * 48), 64 * 48);

  engine.resumeEngine();
  engine.process("", image, extra);  // the same time stamp is taken again after the reset
  EXPECT_EQ(engine.lastTakenTime(), 2.0);
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.sentCount() == 2; }));
}

TEST(EngineFacade, DoNothingOperationsAreAcceptedSilentlyInEveryState) {
  orzavs_test::FakeTransport transport;
  Tovra::TovraStateEngineFacade facade(nullptr);
  std::map<std::string, uint32_t> counts = {{"frames", 3}};
  std::map<std::string, double> values = {{"fps", 29.5}};
  const std::map<std::string, std::string> props = {{"k", "v"}};
  orzavs_test::StdoutCapture printed;
  for (int step = 0; step < 4; ++step) {
    if (step == 1) facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport, "props are ignored");
    if (step == 1) facade.startEngine();
    if (step == 2) facade.pauseEngine();
    if (step == 3) facade.stopEngine();
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
    Tovra::CameraResRequirement requirement;
    facade.getCameraResRequirement(requirement);
    EXPECT_EQ(requirement.minHeight, 320);
    EXPECT_EQ(requirement.maxHeight, 720);
  }
  EXPECT_EQ(printed.text(), "");
  EXPECT_EQ(counts, (std::map<std::string, uint32_t>{{"frames", 3}}));
  EXPECT_EQ(values, (std::map<std::string, double>{{"fps", 29.5}}));
}

TEST(EngineFacade, ANullEventDelegateMeansNoCallbacks) {
  orzavs_test::FakeTransport transport;
  transport.answerEverything();
  Tovra::TovraStateEngineFacade facade(nullptr);
  facade.addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
  facade.startEngine();
  std::vector<uint8_t> pixels = orzavs_test::makeFrame(64, 48, 64, OrzaVSMobile::GRAY);
  OrzaVSMobile::ImageBuffer image(0, OrzaVSMobile::GRAY, 64, 48, 64, 1, pixels.data());
  OrzaVSMobile::ExtraFrameData extra;
  orzavs_test::StdoutCapture printed;
  facade.processSingleImage(image, extra);
  // The transport counts a reply once pushServerResponse has returned on its own thread, which
  // can be just after processSingleImage saw the reply handled.
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.pushedCount() == 1; }));
  facade.process(image, extra);
  ASSERT_TRUE(orzavs_test::waitFor([&] { return transport.pushedCount() == 2; }));
  facade.stopEngine();
  EXPECT_EQ(printed.text(), "");
}

}  // namespace
