#include "exec/TovraExecutionEngine.h"

#include <gtest/gtest.h>

#include <memory>
#include <numeric>
#include <thread>
#include <vector>

#include "support/DiagnosticsRecorder.h"
#include "support/TestJob.h"

using namespace orzavs_test;
using Tovra::TovraExecutionEngine;

TEST(TovraExecutionEngineTest, OneWorkerRunsJobsInTheOrderAddedAndSettlesAllButAwaitingOnes) {
  std::vector<int> log;  // read once the worker was joined
  Gate gate;
  std::vector<std::unique_ptr<TestJob>> jobs = makeJobs(0, 19, &log);
  TestJob added(20, &log);
  // The first job holds the worker until all others are queued, so they really wait in line.
  jobs[0]->work = [&](TestJob&) { gate.wait(); };
  jobs[5]->work = [](TestJob& job) { job.awaitReply(); };
  {
    DiagnosticsRecorder diagnostics;
    TovraExecutionEngine engine(1);
    jobs[19]->work = [&](TestJob&) { engine.addJob(&added); };  // a job adding a job
    engine.addJob(nullptr);  // ignored silently
    for (auto& job : jobs) engine.addJob(job.get());
    EXPECT_EQ(Tovra::Queued, jobs[1]->state());
    gate.open();
    ASSERT_TRUE(added.waitForState(Tovra::Finished));
    EXPECT_EQ("", diagnostics.text());
  }
  std::vector<int> expected(21);
  std::iota(expected.begin(), expected.end(), 0);
  EXPECT_EQ(expected, log);
  for (auto& job : jobs) EXPECT_EQ(outcome(job == jobs[5] ? Tovra::AwaitingReply : Tovra::Finished, 1), job->outcome());
  for (int32_t busy : {Tovra::Queued, Tovra::Running, Tovra::AwaitingReply}) EXPECT_TRUE(Tovra::isBusyState(busy));
  for (int32_t idle : {Tovra::Idle, Tovra::Finished}) EXPECT_FALSE(Tovra::isBusyState(idle));
}

TEST(TovraExecutionEngineTest, ZeroThreadsPrintsTheMessageAndNeverRuns) {
  TestJob job(1);
  {
    DiagnosticsRecorder diagnostics;
    TovraExecutionEngine engine(0);
    EXPECT_EQ("Initialized TovraExecutionEngine with invalid number of threads\n", diagnostics.text());
    engine.addJob(&job);
    std::this_thread::sleep_for(Ms(20));
  }
  EXPECT_EQ(outcome(Tovra::Queued, 0), job.outcome());  // destruction discards the queue without settling it
}

TEST(TovraExecutionEngineTest, CancelRefusesNewJobsAndSettlesQueuedOnesUntilResumed) {
  Gate release;
  TestJob blocker(0);
  blocker.work = [&](TestJob&) { release.wait(); };
  std::vector<std::unique_ptr<TestJob>> waiting = makeJobs(1, 3);
  TovraExecutionEngine engine(1);
  engine.addJob(&blocker);
  ASSERT_TRUE(blocker.waitForState(Tovra::Running));
  for (auto& job : waiting) engine.addJob(job.get());
  engine.cancelJobs();
  TestJob refused(4);
  DiagnosticsRecorder diagnostics;  // the only line comes from the race at the end
  engine.addJob(&refused);
  EXPECT_EQ(Tovra::Idle, refused.state());  // refused before it was marked: no message, still Idle
  release.open();
  for (auto& job : waiting) ASSERT_TRUE(job->waitForState(Tovra::Finished));
  for (auto& job : waiting) EXPECT_EQ(0, job->runs());  // taken after the cancel: not run
  EXPECT_EQ(1, blocker.runs());

  engine.resumeJobs();
  TestJob later(5);
  engine.addJob(&later);
  ASSERT_TRUE(later.waitForState(Tovra::Finished));
  EXPECT_EQ(1, later.runs());
  EXPECT_EQ(0, refused.runs());

  // A cancel between the unlocked check and the lock (markQueued runs in between) prints the
  // refusal and settles the job.
  TestJob racing(6);
  racing.onMarkQueued = [&](TestJob&) { engine.cancelJobs(); };
  engine.addJob(&racing);
  EXPECT_EQ("Error: Adding job to stopped/canceled execution engine\n", diagnostics.text());
  EXPECT_EQ(outcome(Tovra::Finished, 0), racing.outcome());
}

TEST(TovraExecutionEngineTest, DestructionSettlesQueuedJobsAndJoins) {
  Gate release;
  TestJob running(0);
  running.work = [&](TestJob&) { release.wait(); };
  std::vector<std::unique_ptr<TestJob>> queued = makeJobs(1, 4);
  auto engine = std::make_unique<TovraExecutionEngine>(1);
  engine->addJob(&running);
  ASSERT_TRUE(running.waitForState(Tovra::Running));
  for (auto& job : queued) engine->addJob(job.get());
  std::thread releaser([&] {
    std::this_thread::sleep_for(Ms(30));
    release.open();
  });
  engine.reset();  // returns only once the worker drained the queue and was joined
  EXPECT_EQ(Tovra::Finished, running.state());  // it could not finish before the release
  // Taken after stopping was set: settled, not run.
  for (auto& job : queued) EXPECT_EQ(outcome(Tovra::Finished, 0), job->outcome());
  releaser.join();
}
