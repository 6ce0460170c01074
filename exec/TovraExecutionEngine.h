#ifndef ORZAVS_EXEC_TOVRAEXECUTIONENGINE_H
#define ORZAVS_EXEC_TOVRAEXECUTIONENGINE_H

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <thread>
#include <vector>

#include "exec/Job.h"
#include "types/Mutex.h"

namespace Tovra {

// A first-in-first-out queue of jobs served by a fixed set of worker threads. Holds plain job
// pointers and owns none of them.
class TovraExecutionEngine {
 public:
  // Starts threadCount workers; with 0 it prints a line and starts none (nothing ever runs).
  explicit TovraExecutionEngine(uint32_t threadCount);
  // Sets stopping, wakes and joins every worker (they settle what is still queued as Finished
  // without running it), then forgets whatever is left.
  ~TovraExecutionEngine();
  TovraExecutionEngine(const TovraExecutionEngine&) = delete;
  TovraExecutionEngine& operator=(const TovraExecutionEngine&) = delete;

  // Queues `job` (marking it Queued) unless the engine is stopping or cancelled.
  void addJob(Job* job);
  // While cancelled no job is accepted and queued jobs are settled without running.
  void cancelJobs();
  void resumeJobs();

  uint32_t threadCount() const { return threadCount_; }

 private:
  void workerLoop();

  // Written under `lock_`; also read without it as advisory checks, hence atomic.
  std::atomic<bool> stopping_{false};
  std::atomic<bool> canceled_{false};
  uint32_t threadCount_;
  std::vector<std::thread> workers_;
  std::condition_variable wakeup_;
  Mutex lock_;
  std::deque<Job*> queue_ ORZAVS_GUARDED_BY(lock_);
};

}  // namespace Tovra

#endif
