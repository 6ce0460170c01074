#include "engine/FrameRecordManager.h"

#include "types/DiagnosticOutput.h"

namespace Tovra {

using OrzaVSMobile::reportLine;

FrameRecordManager::FrameRecordManager(size_t count) {
  slots_.reserve(count);
  for (size_t i = 0; i < count; ++i) slots_.push_back(std::make_shared<FrameRecord>());
}

std::shared_ptr<FrameRecord> FrameRecordManager::getNewSlot() {
  MutexLock lock(mutex_);
  for (auto& slot : slots_) {
    if (slot && slot.use_count() == 1) {
      // Take the new reference before touching the record. use_count() is a relaxed read;
      // the increment of the copy is an acquire-release operation on the same counter, so it
      // orders these writes after everything the thread that dropped the record last did
      // with it (a job still reading frameId or the pixels just before letting go).
      std::shared_ptr<FrameRecord> record = slot;
      record->frameId = nextFrameId_++;
      record->timeStamp = -1.0;
      return record;
    }
  }
  return nullptr;
}

bool FrameRecordManager::restart() {
  MutexLock lock(mutex_);
  for (auto& slot : slots_) {
    if (slot && slot.use_count() != 1) {
      reportLine("Unable to restart frame record manager () as some frame(s) are still outstanding");
      return false;
    }
    slot = std::make_shared<FrameRecord>();
  }
  nextFrameId_ = 0;
  return true;
}

}  // namespace Tovra
