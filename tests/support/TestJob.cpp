#include "support/TestJob.h"

#include <thread>

namespace orzavs_test {

void RunLog::add(int id) {
  std::lock_guard<std::mutex> lock(mutex_);
  ids_.push_back(id);
}

std::vector<int> RunLog::ids() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return ids_;
}

void Gate::open() {
  {
    std::lock_guard<std::mutex> lock(mutex_);
    open_ = true;
  }
  cv_.notify_all();
}

bool Gate::wait(std::chrono::milliseconds timeout) {
  std::unique_lock<std::mutex> lock(mutex_);
  return cv_.wait_for(lock, timeout, [this] { return open_; });
}

bool Gate::isOpen() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return open_;
}

TestJob::TestJob(int id, RunLog* log) : id_(id), log_(log) {}

void TestJob::markQueued() {
  state_.store(Tovra::Queued);
  if (onMarkQueued) onMarkQueued(*this);
}

void TestJob::run() {
  state_.store(Tovra::Running);
  runs_.fetch_add(1);
  if (log_ != nullptr) log_->add(id_);
  if (work) work(*this);
  if (endAwaitingReply) state_.store(Tovra::AwaitingReply);
}

void TestJob::finishUnlessAwaiting() {
  if (state_.load() != Tovra::AwaitingReply) state_.store(Tovra::Finished);
}


bool TestJob::waitForState(int32_t wanted, std::chrono::milliseconds timeout) {
  const auto deadline = std::chrono::steady_clock::now() + timeout;
  while (state_.load() != wanted) {
    if (std::chrono::steady_clock::now() >= deadline) return false;
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
  return true;
}

}  // namespace orzavs_test
