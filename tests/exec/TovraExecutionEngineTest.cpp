#include "exec/TovraExecutionEngine.h"

#include <gtest/gtest.h>

#include <chrono>
#include <memory>
#include <thread>
#include <type_traits>
#include <vector>

#include "support/StdoutCapture.h"
#include "support/TestJob.h"

using orzavs_test::Gate;
using orzavs_test::RunLog;
using orzavs_test::StdoutCapture;
using orzavs_test::TestJob;
using Tovra::TovraExecutionEngine;

static_assert(std::is_same<std::underlying_type<Tovra::JobState>::type, int32_t>::value,
              "the job state is one 32-bit word");

namespace {

const char kRefused[] = "Error: Adding job to stopped/canceled execution engine";

// With one worker the queue is strictly FIFO: once `marker` has finished, every job added
// before it has been fully settled.
void drain(TovraExecutionEngine& engine) {
  TestJob marker(-1);
  engine.addJob(&marker);
  ASSERT_TRUE(marker.waitForState(Tovra::Finished));
}

}  // namespace

TEST(TovraExecutionEngineTest, OneWorkerRunsJobsInTheOrderAdded) {
  RunLog log;
  Gate gate;
  std::vector<std::unique_ptr<TestJob>> jobs;
  for (int i = 0; i < 20; ++i) jobs.emplace_back(new TestJob(i, &log));
  // The first job holds the worker until all others are queued, so they really wait in line.
  jobs[0]->work = [&](TestJob&) { gate.wait(); };
  {
    TovraExecutionEngine engine(1);
    EXPECT_EQ(1u, engine.threadCount());
    for (auto& job : jobs) {
      engine.addJob(job.get());
      if (job->id() > 0) {
        EXPECT_EQ(Tovra::Queued, job->state());
      }
    }
    gate.open();
    drain(engine);
  }
  std::vector<int> expected(20);
  for (int i = 0; i < 20; ++i) expected[i] = i;
  EXPECT_EQ(expected, log.ids());
  for (auto& job : jobs) {
    EXPECT_EQ(1, job->runs());
    EXPECT_EQ(Tovra::Finished, job->state());
  }
}

TEST(TovraExecutionEngineTest, NullJobIsIgnoredSilently) {
  TovraExecutionEngine engine(1);
  StdoutCapture out;
  engine.addJob(nullptr);
  drain(engine);
  EXPECT_EQ("", out.text());
}

TEST(TovraExecutionEngineTest, ZeroThreadsPrintsTheMessageAndNeverRuns) {
  TestJob job(1);
  {
    StdoutCapture out;
    TovraExecutionEngine engine(0);
    EXPECT_EQ("Initialized TovraExecutionEngine with invalid number of threads\n", out.text());
    engine.addJob(&job);
    EXPECT_EQ(Tovra::Queued, job.state());
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_EQ(0, job.runs());
  }
  // Destruction discards the queue without settling it.
  EXPECT_EQ(Tovra::Queued, job.state());
  EXPECT_EQ(0, job.runs());
}

TEST(TovraExecutionEngineTest, CancelRefusesNewJobsUntilResumed) {
  TovraExecutionEngine engine(1);
  engine.cancelJobs();
  TestJob refused(1);
  {
    StdoutCapture out;
    engine.addJob(&refused);
    EXPECT_EQ("", out.text());  // refused before it was marked: no message
  }
  EXPECT_EQ(Tovra::Idle, refused.state());

  engine.resumeJobs();
  TestJob accepted(2);
  engine.addJob(&accepted);
  ASSERT_TRUE(accepted.waitForState(Tovra::Finished));
  EXPECT_EQ(1, accepted.runs());
  EXPECT_EQ(0, refused.runs());
  EXPECT_EQ(Tovra::Idle, refused.state());
}

TEST(TovraExecutionEngineTest, CancelBetweenTheQuickCheckAndTheLockFinishesTheJob) {
  TovraExecutionEngine engine(1);
  TestJob job(1);
  // markQueued runs after the unlocked check and before the lock is taken.
  job.onMarkQueued = [&](TestJob&) { engine.cancelJobs(); };
  StdoutCapture out;
  engine.addJob(&job);
  EXPECT_EQ(std::string(kRefused) + "\n", out.text());
  EXPECT_EQ(Tovra::Finished, job.state());
  EXPECT_EQ(0, job.runs());
}

TEST(TovraExecutionEngineTest, JobsQueuedBeforeCancelAreSettledWithoutRunning) {
  Gate started;
  Gate release;
  TestJob blocker(0);
  blocker.work = [&](TestJob&) {
    started.open();
    release.wait();
  };
  std::vector<std::unique_ptr<TestJob>> waiting;
  for (int i = 1; i <= 3; ++i) waiting.emplace_back(new TestJob(i));

  TovraExecutionEngine engine(1);
  engine.addJob(&blocker);
  ASSERT_TRUE(started.wait());
  for (auto& job : waiting) engine.addJob(job.get());
  engine.cancelJobs();
  release.open();
  for (auto& job : waiting) ASSERT_TRUE(job->waitForState(Tovra::Finished));
  for (auto& job : waiting) EXPECT_EQ(0, job->runs());
  EXPECT_EQ(1, blocker.runs());
  EXPECT_EQ(Tovra::Finished, blocker.state());

  engine.resumeJobs();
  TestJob later(4);
  engine.addJob(&later);
  ASSERT_TRUE(later.waitForState(Tovra::Finished));
  EXPECT_EQ(1, later.runs());
}

TEST(TovraExecutionEngineTest, AwaitingReplySurvivesSettlingAndCancelFinishes) {
  TovraExecutionEngine engine(1);
  TestJob job(1);
  job.endAwaitingReply = true;
  engine.addJob(&job);
  drain(engine);
  EXPECT_EQ(1, job.runs());
  EXPECT_EQ(Tovra::AwaitingReply, job.state());
  EXPECT_TRUE(Tovra::isBusyState(job.state()));
  job.cancel();
  EXPECT_EQ(Tovra::Finished, job.state());
  EXPECT_FALSE(Tovra::isBusyState(job.state()));
  EXPECT_FALSE(Tovra::isBusyState(Tovra::Idle));
  EXPECT_TRUE(Tovra::isBusyState(Tovra::Queued));
  EXPECT_TRUE(Tovra::isBusyState(Tovra::Running));
}

TEST(TovraExecutionEngineTest, DestructionSettlesQueuedJobsAndJoins) {
  Gate started;
  Gate release;
  TestJob running(0);
  running.work = [&](TestJob&) {
    started.open();
    release.wait();
  };
  std::vector<std::unique_ptr<TestJob>> queued;
  for (int i = 1; i <= 4; ++i) queued.emplace_back(new TestJob(i));

  auto engine = std::make_unique<TovraExecutionEngine>(1);
  engine->addJob(&running);
  ASSERT_TRUE(started.wait());
  for (auto& job : queued) engine->addJob(job.get());
  std::thread releaser([&] {
    std::this_thread::sleep_for(std::chrono::milliseconds(30));
    release.open();
  });
  engine.reset();  // returns only once the worker drained the queue and was joined
  EXPECT_TRUE(release.isOpen());
  EXPECT_EQ(Tovra::Finished, running.state());
  EXPECT_EQ(1, running.runs());
  for (auto& job : queued) {
    EXPECT_EQ(Tovra::Finished, job->state());
    EXPECT_EQ(0, job->runs());  // taken after stopping was set: settled, not run
  }
  releaser.join();
}

TEST(TovraExecutionEngineTest, AJobMayAddJobsFromItsOwnRun) {
  RunLog log;
  TovraExecutionEngine engine(1);
  TestJob second(2, &log);
  TestJob first(1, &log);
  first.work = [&](TestJob&) { engine.addJob(&second); };
  engine.addJob(&first);
  ASSERT_TRUE(second.waitForState(Tovra::Finished));
  EXPECT_EQ((std::vector<int>{1, 2}), log.ids());
}

