#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "exec/TovraExecutionEngine.h"
#include "support/DiagnosticsRecorder.h"
#include "support/TestJob.h"

using namespace orzavs_test;
using std::chrono::microseconds;
using Tovra::TovraExecutionEngine;

// Several producers add jobs to a two-worker engine while another thread keeps cancelling
// and resuming. Every job must end either refused before marking (Idle, never run) or settled
// Finished, and no job may ever run twice or be left Queued.
TEST(TovraExecutionEngineStressTest, ProducersWorkersAndCancelTogglingAgree) {
  constexpr int kProducers = 4, kJobsEach = 300;
  std::vector<std::unique_ptr<TestJob>> jobs = makeJobs(0, kProducers * kJobsEach - 1);
  for (auto& job : jobs) job->work = [](TestJob&) { std::this_thread::sleep_for(microseconds(100)); };

  DiagnosticsRecorder diagnostics;  // the refusal line may be printed any number of times
  {
    TovraExecutionEngine engine(2);
    std::atomic<bool> producing{true};
    std::thread toggler([&] {
      while (producing.load()) {
        engine.cancelJobs();
        std::this_thread::sleep_for(microseconds(50));
        engine.resumeJobs();
        std::this_thread::sleep_for(microseconds(50));
      }
    });
    std::vector<std::thread> producers;
    for (int p = 0; p < kProducers; ++p) {
      producers.emplace_back([&, p] {
        for (int i = 0; i < kJobsEach; ++i) {
          engine.addJob(jobs[p * kJobsEach + i].get());
          std::this_thread::sleep_for(microseconds(100));
        }
      });
    }
    for (auto& t : producers) t.join();
    producing.store(false);
    toggler.join();
  }  // destruction drains and joins

  int ran = 0, settledUnrun = 0;
  for (auto& job : jobs) {
    ASSERT_LE(job->runs(), 1);
    if (job->state() == Tovra::Idle) {
      EXPECT_EQ(0, job->runs());  // refused before it was marked
    } else {
      EXPECT_EQ(Tovra::Finished, job->state());
      if (job->runs() == 1) ++ran; else ++settledUnrun;
    }
  }
  EXPECT_GT(ran, 0);
  // Each refusal line belongs to a job that was marked and then finished without running.
  const std::string text = diagnostics.text(), refusal = "Error: Adding job to stopped/canceled execution engine\n";
  int refusals = 0;
  for (size_t at = text.find(refusal); at != std::string::npos; at = text.find(refusal, at + 1)) ++refusals;
  EXPECT_LE(refusals, settledUnrun);
}

// Engines are created and destroyed while jobs are in flight, as the state engine does on
// every start/stop: destruction must always return with every accepted job settled.
TEST(TovraExecutionEngineStressTest, RepeatedCreateAndDestroyWithQueuedJobs) {
  for (int round = 0; round < 50; ++round) {
    std::vector<std::unique_ptr<TestJob>> jobs = makeJobs(0, 7);
    {
      TovraExecutionEngine engine(1);
      for (auto& job : jobs) engine.addJob(job.get());
    }
    for (auto& job : jobs) EXPECT_TRUE(job->state() == Tovra::Finished && job->runs() <= 1) << job->runs();
  }
}
