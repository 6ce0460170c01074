#ifndef ORZAVS_ENGINE_TOVRASTATEENGINE_H
#define ORZAVS_ENGINE_TOVRASTATEENGINE_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "engine/EngineState.h"
#include "engine/FrameRecord.h"
#include "engine/FrameRecordManager.h"
#include "exec/TovraExecutionEngine.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/FrameData.h"
#include "types/Identifiers.h"
#include "types/ImageBuffer.h"
#include "types/Mutex.h"
#include "types/Point.h"
#include "vsearch/VisualSearchServiceJob.h"

namespace Tovra {

// The engine behind the facade: run state, the client's delegates, the visual search job, the
// execution engine (only while started), the pool of frame records and the frame pipeline's
// bookkeeping.
//
// Locking: every operation that touches state holds `mutex_` for its whole duration. Lock
// order: engine mutex, then the pool's mutex, then the execution engine's mutex; never the
// reverse. Replies from the server reach the job directly on the client's thread and take none
// of these locks.
class TovraStateEngine {
 public:
  static constexpr size_t kFrameRecordCount = 5;
  static constexpr int kInterestPointThreshold = 50;

  TovraStateEngine();
  // Resets (waiting for a queued or running job if the engine was started), then destroys the
  // held frame, the lent frames, the pool, the execution engine (joining its worker) and the
  // job. Must not be called while another thread is inside an engine operation.
  ~TovraStateEngine();
  TovraStateEngine(const TovraStateEngine&) = delete;
  TovraStateEngine& operator=(const TovraStateEngine&) = delete;

  // Not locked: call before startEngine(). A null delegate never replaces a set one.
  void setEventDelegate(EventDelegateBase* delegate);
  // Not locked: call before startEngine(). Only VISUAL_SEARCH_SERVICE_MOD is acted on (a null
  // delegate is stored too); other ids are ignored.
  void addObjectModule(ObjectModuleID id, Server::ServerDelegate* delegate);

  void getCameraResRequirement(CameraResRequirement& out) const;

  // STOPPED/PAUSED -> RUNNING with a reset and a new execution engine; RUNNING: nothing.
  void startEngine();
  // RUNNING/PAUSED -> STOPPED with a reset; the execution engine is destroyed.
  void stopEngine();
  // RUNNING -> PAUSED with a reset; the execution engine stays, cancelled.
  void pauseEngine();
  // PAUSED -> RUNNING: the execution engine accepts jobs again; no reset.
  void resumeEngine();

  void requestImageBuffer(OrzaVSMobile::ImageBuffer& buffer, std::string& frameKey);
  void process(const std::string& frameKey, OrzaVSMobile::ImageBuffer& image,
               OrzaVSMobile::ExtraFrameData& extra);
  void processSingleImage(OrzaVSMobile::ImageBuffer& image, OrzaVSMobile::ExtraFrameData& extra);

  // Sharpness measure of the take rule: a sparse sum of absolute 3x3 Laplacian responses on
  // the first plane (wrapping modulo 2^32).
  static int32_t sharpness(const OrzaVSMobile::ImageBuffer& image);

  // Observers, for diagnostics and tests.
  EngineState getState() const;
  const TovraExecutionEngine* executor() const;
  EventDelegateBase* eventDelegate() const { return eventDelegate_; }
  Server::ServerDelegate* serverDelegate() const { return serverDelegate_; }
  size_t jobCount() const { return jobs_.size(); }
  const VisualSearchServiceJob& job(size_t index) const { return *jobs_.at(index); }
  size_t pendingBufferCount() const;
  bool hasHeldRecord() const;
  double lastTakenTime() const;

 private:
  // Shared by start, stop, pause and the destructor (which needs no lock: nobody else is inside).
  void reset() ORZAVS_REQUIRES(mutex_);
  // First job that is not busy, or null.
  VisualSearchServiceJob* idleJob() const;
  // Removes `frameKey` from the lent frames and returns its record (null if unknown).
  std::shared_ptr<FrameRecord> takeLent(const std::string& frameKey) ORZAVS_REQUIRES(mutex_);
  // Removes `frameKey` from the lent frames and detaches `image` from its memory.
  void dropLent(const std::string& frameKey, OrzaVSMobile::ImageBuffer& image)
      ORZAVS_REQUIRES(mutex_);
  // Whether `image` describes a frame whose first plane (and, for memory whose size is known,
  // everything the record copies) can be read; prints a line and returns false otherwise.
  bool acceptsGeometry(const OrzaVSMobile::ImageBuffer& image, bool packedAllowed) const;

  mutable Mutex mutex_;
  EngineState state_ ORZAVS_GUARDED_BY(mutex_) = STOPPED;
  // Set before the engine starts (not locked); the job list is fixed at construction.
  EventDelegateBase* eventDelegate_ = nullptr;        // not owned
  Server::ServerDelegate* serverDelegate_ = nullptr;  // not owned
  std::vector<std::unique_ptr<VisualSearchServiceJob>> jobs_;
  std::unique_ptr<TovraExecutionEngine> executor_ ORZAVS_GUARDED_BY(mutex_);
  FrameRecordManager frameRecords_;  // has its own lock, taken after mutex_
  std::map<std::string, std::shared_ptr<FrameRecord>> pendingBuffers_ ORZAVS_GUARDED_BY(mutex_);
  double lastTakenTime_ ORZAVS_GUARDED_BY(mutex_) = -1.0;
  std::shared_ptr<FrameRecord> heldRecord_ ORZAVS_GUARDED_BY(mutex_);

  // Reused for every frame so that steady-state frames allocate nothing here.
  std::vector<OrzaVSMobile::Point2f> points_ ORZAVS_GUARDED_BY(mutex_);
  // Pixel storage of frames that were lent to the client but dropped by a reset before the
  // client handed them back. The client may still be writing into that memory (a camera thread
  // between requestImageBuffer and process while another thread pauses), so the bytes are kept
  // alive here for a while instead of being freed with the renewed records.
  std::deque<std::vector<uint8_t>> retiredLentPixels_ ORZAVS_GUARDED_BY(mutex_);
};

}  // namespace Tovra

#endif
