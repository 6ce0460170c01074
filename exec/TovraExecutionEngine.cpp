#include "exec/TovraExecutionEngine.h"

#include "types/DiagnosticOutput.h"

namespace Tovra {

using OrzaVSMobile::reportLine;

TovraExecutionEngine::TovraExecutionEngine(uint32_t threadCount) : threadCount_(threadCount) {
  if (threadCount == 0) {
    reportLine("Initialized TovraExecutionEngine with invalid number of threads");
    return;
  }
  workers_.reserve(threadCount);
  try {
    for (uint32_t i = 0; i < threadCount; ++i) workers_.emplace_back(&TovraExecutionEngine::workerLoop, this);
  } catch (...) {
    // Threads already started must be stopped and joined before the members go away.
    {
      MutexLock guard(lock_);
      stopping_ = true;
    }
    wakeup_.notify_all();
    for (auto& worker : workers_) worker.join();
    throw;
  }
}

TovraExecutionEngine::~TovraExecutionEngine() {
  {
    MutexLock guard(lock_);
    stopping_ = true;
  }
  wakeup_.notify_all();
  for (auto& worker : workers_) worker.join();
  queue_.clear();
}

void TovraExecutionEngine::addJob(Job* job) {
  if (stopping_ || job == nullptr || canceled_) return;
  job->markQueued();
  UniqueLock guard(lock_);
  if (stopping_ || canceled_) {
    reportLine("Error: Adding job to stopped/canceled execution engine");
    job->finishUnlessAwaiting();
    return;
  }
  queue_.push_back(job);
  guard.unlock();
  wakeup_.notify_one();
}

void TovraExecutionEngine::cancelJobs() {
  MutexLock guard(lock_);
  canceled_ = true;
}

void TovraExecutionEngine::resumeJobs() {
  MutexLock guard(lock_);
  canceled_ = false;
}

void TovraExecutionEngine::workerLoop() {
  for (;;) {
    UniqueLock guard(lock_);
    while (!stopping_ && queue_.empty()) wakeup_.wait(guard.native());
    if (queue_.empty()) return;  // stopping and drained
    Job* job = queue_.front();
    queue_.pop_front();
    guard.unlock();
    if (job == nullptr) {
      reportLine("Next Job is NULL");
      continue;
    }
    if (!stopping_ && !canceled_) job->run();
    job->finishUnlessAwaiting();
  }
}

}  // namespace Tovra
