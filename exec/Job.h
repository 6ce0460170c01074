#ifndef ORZAVS_EXEC_JOB_H
#define ORZAVS_EXEC_JOB_H

#include <cstdint>

namespace Tovra {

// A job's life as the execution engine and the job's owner see it. Stored in one atomic
// 32-bit word with sequentially consistent reads and writes. A job is busy when it is neither
// Idle nor Finished.
enum JobState : int32_t {
  Idle = 0,           // set by the job's constructor
  Queued = 1,         // accepted by the execution engine
  Running = 2,        // the job's work has begun
  AwaitingReply = 3,  // the job handed its request to the server and waits for the answer
  Finished = 4,       // done, dropped or cancelled; free for the next frame
};

inline bool isBusyState(int32_t state) { return state != Idle && state != Finished; }

// What the execution engine needs of a job: exactly these three operations. The job's owner
// keeps it alive until it has left the queue and been settled.
class Job {
 public:
  virtual ~Job() = default;
  // state := Queued
  virtual void markQueued() = 0;
  // The job's work, on a worker thread.
  virtual void run() = 0;
  // state := Finished unless the job is AwaitingReply.
  virtual void finishUnlessAwaiting() = 0;
};

}  // namespace Tovra

#endif
