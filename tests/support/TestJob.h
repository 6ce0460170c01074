#ifndef ORZAVS_TESTS_SUPPORT_TESTJOB_H
#define ORZAVS_TESTS_SUPPORT_TESTJOB_H

#include <atomic>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

#include "exec/Job.h"
#include "support/Threads.h"

namespace orzavs_test {

// A job that follows the job state contract with one atomic state word, counts its runs,
// appends its id to `log` when it runs (read the log only once the workers were joined) and
// optionally does some work (which may block, add jobs, or end AwaitingReply).
class TestJob : public Tovra::Job {
 public:
  explicit TestJob(int id = 0, std::vector<int>* log = nullptr) : id_(id), log_(log) {}

  void markQueued() override {
    state_.store(Tovra::Queued);
    if (onMarkQueued) onMarkQueued(*this);
  }
  void run() override {
    state_.store(Tovra::Running);
    runs_.fetch_add(1);
    if (log_ != nullptr) log_->push_back(id_);
    if (work) work(*this);
  }
  void finishUnlessAwaiting() override {
    if (state_.load() != Tovra::AwaitingReply) state_.store(Tovra::Finished);
  }

  bool waitForState(int32_t wanted) { return waitFor([&] { return state_.load() == wanted; }, Ms(10000)); }
  // From `work`: run() ends in AwaitingReply instead of leaving the state to the executor.
  void awaitReply() { state_.store(Tovra::AwaitingReply); }
  int32_t state() const { return state_.load(); }
  int runs() const { return runs_.load(); }
  std::pair<int32_t, int> outcome() const { return {state(), runs()}; }

  // Run inside run() and markQueued(), after the state became Running or Queued.
  std::function<void(TestJob&)> work, onMarkQueued;

 private:
  const int id_;
  std::vector<int>* log_;
  std::atomic<int32_t> state_{Tovra::Idle};
  std::atomic<int> runs_{0};
};

inline std::pair<int32_t, int> outcome(int32_t state, int runs) { return {state, runs}; }

// Jobs numbered from..to (inclusive), logging into `log`.
inline std::vector<std::unique_ptr<TestJob>> makeJobs(int from, int to, std::vector<int>* log = nullptr) {
  std::vector<std::unique_ptr<TestJob>> jobs;
  for (int i = from; i <= to; ++i) jobs.emplace_back(new TestJob(i, log));
  return jobs;
}

}  // namespace orzavs_test

#endif
