#ifndef ORZAVS_VSEARCH_VISUALSEARCHSERVICEJOB_H
#define ORZAVS_VSEARCH_VISUALSEARCHSERVICEJOB_H

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "engine/FrameRecord.h"
#include "exec/Job.h"
#include "server/ServerDelegate.h"
#include "server/ServerRequest.h"
#include "server/ServerResponse.h"
#include "types/EventDelegateBase.h"
#include "types/Mutex.h"

namespace Tovra {

// Sends one frame to the visual search server and reports the reply to the event delegate.
//
// Life of one frame: the owner gives the job a frame record (setFrameRecord) and either queues
// it on the execution engine or calls run() itself. run() encodes the frame as JPEG (quality
// 50), builds the request, registers itself as its response handler, hands it to the server
// delegate and leaves the job AwaitingReply. The reply arrives through handleServerResponse()
// on the client's thread; the job reports didDecode or didReceiveServerError and is Finished,
// ready for the next frame. The job carries the previous reply's query id and round-trip time
// into its next request.
//
// Threads: run() on an execution engine worker or on the owner's thread; the reply on whatever
// thread the client pushes it from; the owner reads the state from its own threads. The state
// word is the only field those threads share, apart from the previous reply's query id and
// round-trip time (guarded by a small lock of their own).
class VisualSearchServiceJob : public Server::ServerResponseHandler, public Job {
 public:
  VisualSearchServiceJob();
  // Waits while the job is Queued or Running, sets it Finished, and withdraws it from every
  // server delegate it has sent through (waiting out a reply being delivered to it on another
  // thread), so no reply can reach the destroyed job.
  ~VisualSearchServiceJob() override;
  VisualSearchServiceJob(const VisualSearchServiceJob&) = delete;
  VisualSearchServiceJob& operator=(const VisualSearchServiceJob&) = delete;

  void setFrameRecord(const std::shared_ptr<FrameRecord>& record) { frameRecord_ = record; }
  void setEventDelegate(EventDelegateBase* delegate) { eventDelegate_ = delegate; }
  void setServerDelegate(Server::ServerDelegate* delegate) { serverDelegate_ = delegate; }

  // Job operations called by the execution engine.
  void markQueued() override;
  void run() override;
  void finishUnlessAwaiting() override;

  // Busy: neither Idle nor Finished, or still in the execution engine's hands (queued, running,
  // or not yet settled after run() returned).
  bool isBusy() const;
  JobState state() const { return static_cast<JobState>(state_.load()); }
  // Polls every 50 ms while Queued, Running or AwaitingReply.
  void waitUntilDone() const;
  // Polls every 50 ms while Queued or Running (or not yet settled by the execution engine).
  void waitUntilSettled() const;
  // state := Finished; a reply that arrives afterwards is ignored.
  void cancel();

  void handleServerResponse(const Server::ServerResponse& response) override;

  // The previous reply's query id and round-trip time, sent with the next request.
  std::string lastQueryId() const;
  double lastQueryRoundTripTime() const;

 private:
  // Whether the record holds enough bytes for everything the encoder will read.
  static bool recordCoversImage(const FrameRecord& record);

  std::atomic<int32_t> state_{Idle};
  // Set by markQueued(), cleared by finishUnlessAwaiting(): the execution engine calls the two
  // in pairs, so this is true exactly while the engine may still touch the job.
  std::atomic<bool> withExecutor_{false};
  // Claimed by the reply being handled, so two replies pushed at once on different threads
  // cannot both report for this job.
  std::atomic<bool> handlingReply_{false};

  std::shared_ptr<FrameRecord> frameRecord_;
  std::vector<uint8_t> jpegWork_;
  std::vector<uint8_t> jpegOutput_;
  Server::ServerRequest request_;

  mutable Mutex lastQueryMutex_;
  std::string lastQueryId_ ORZAVS_GUARDED_BY(lastQueryMutex_);
  double lastQueryRoundTripTime_ ORZAVS_GUARDED_BY(lastQueryMutex_) = -1.0;

  EventDelegateBase* eventDelegate_ = nullptr;        // not owned
  Server::ServerDelegate* serverDelegate_ = nullptr;  // not owned
  // Every distinct delegate a request went through; each may hold this job as the handler of
  // a pending id until the job withdraws in its destructor. Written by run() only.
  std::vector<Server::ServerDelegate*> delegatesUsed_;
};

}  // namespace Tovra

#endif
