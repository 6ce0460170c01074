#ifndef ORZAVS_TESTS_SUPPORT_TESTJOB_H
#define ORZAVS_TESTS_SUPPORT_TESTJOB_H

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "exec/Job.h"

namespace orzavs_test {

// Records, in order, the ids of the jobs that ran. Safe from any thread.
class RunLog {
 public:
  void add(int id);
  std::vector<int> ids() const;

 private:
  mutable std::mutex mutex_;
  std::vector<int> ids_;
};

// A one-shot gate: wait() blocks until open() (or until the timeout; returns whether it opened).
class Gate {
 public:
  void open();
  bool wait(std::chrono::milliseconds timeout = std::chrono::seconds(10));
  bool isOpen() const;

 private:
  mutable std::mutex mutex_;
  std::condition_variable cv_;
  bool open_ = false;
};

// A job that follows the job state contract with one atomic state word, counts its runs and
// optionally does some work (which may block, add jobs, or end AwaitingReply).
class TestJob : public Tovra::Job {
 public:
  explicit TestJob(int id = 0, RunLog* log = nullptr);

  void markQueued() override;
  void run() override;
  void finishUnlessAwaiting() override;

  // Polls every millisecond until the state is `wanted`; false after the timeout.
  bool waitForState(int32_t wanted, std::chrono::milliseconds timeout = std::chrono::seconds(10));

  int id() const { return id_; }
  int32_t state() const { return state_.load(); }
  int runs() const { return runs_.load(); }

  // Work done inside run(), after the state became Running.
  std::function<void(TestJob&)> work;
  // Called inside markQueued(), after the state became Queued.
  std::function<void(TestJob&)> onMarkQueued;
  // When set, run() ends in AwaitingReply instead of leaving the state to the executor.
  bool endAwaitingReply = false;

 private:
  const int id_;
  RunLog* log_;
  std::atomic<int32_t> state_{Tovra::Idle};
  std::atomic<int> runs_{0};
};

}  // namespace orzavs_test

#endif
