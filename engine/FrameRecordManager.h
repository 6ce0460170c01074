#ifndef ORZAVS_ENGINE_FRAMERECORDMANAGER_H
#define ORZAVS_ENGINE_FRAMERECORDMANAGER_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <vector>

#include "engine/FrameRecord.h"

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

  size_t size() const { return slots_.size(); }

 private:
  std::mutex mutex_;
  uint64_t nextFrameId_ = 0;
  std::vector<std::shared_ptr<FrameRecord>> slots_;
};

}  // namespace Tovra

#endif
