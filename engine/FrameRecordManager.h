#ifndef ORZAVS_ENGINE_FRAMERECORDMANAGER_H
#define ORZAVS_ENGINE_FRAMERECORDMANAGER_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "engine/FrameRecord.h"
#include "types/Mutex.h"

namespace Tovra {

// A fixed pool of frame records. It bounds the engine's memory and the frames in flight, and
// numbers every frame it hands out.
class FrameRecordManager {
 public:
  explicit FrameRecordManager(size_t count);
  FrameRecordManager(const FrameRecordManager&) = delete;
  FrameRecordManager& operator=(const FrameRecordManager&) = delete;

  // The first record nobody else holds, with the next frame id and timeStamp -1.0; null when
  // every record is out.
  std::shared_ptr<FrameRecord> getNewSlot();
  // Renews the records in slot order; stops at the first one still held elsewhere (printing a
  // line and returning false, with the earlier slots renewed and numbering kept). When all were
  // renewed, numbering restarts at 0.
  bool restart();

  // The number of slots never changes after construction.
  size_t size() const ORZAVS_NO_THREAD_SAFETY_ANALYSIS { return slots_.size(); }

 private:
  Mutex mutex_;
  uint64_t nextFrameId_ ORZAVS_GUARDED_BY(mutex_) = 0;
  // The vector's length is fixed at construction; the slots themselves change under the lock.
  std::vector<std::shared_ptr<FrameRecord>> slots_ ORZAVS_GUARDED_BY(mutex_);
};

}  // namespace Tovra

#endif
