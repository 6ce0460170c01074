#ifndef ORZAVS_TYPES_EVENTDELEGATEBASE_H
#define ORZAVS_TYPES_EVENTDELEGATEBASE_H

#include <cstdint>
#include <string>
#include <vector>

#include "types/Identifiers.h"
#include "types/ObjectInfo.h"
#include "types/Point.h"
#include "types/ResultMetadata.h"

namespace Tovra {

// How the engine tells its client what happened. Override what you care about; every base
// implementation does nothing. Calls may arrive on any thread (the caller's frame thread, the
// engine's worker, the thread that pushes server replies); references are valid only for the
// duration of a call, so copy what you want to keep. The order of the operations is part of
// the Java binding's contract: do not reorder.
class EventDelegateBase {
 public:
  EventDelegateBase() = default;
  virtual ~EventDelegateBase() = default;

  virtual void didReceiveEvent(ObjectModuleID module, ContentType contentType, ActionID action,
                               StatusID status) {
    (void)module, (void)contentType, (void)action, (void)status;
  }
  virtual void didProcessFrame(ObjectModuleID module, StatusID status, int64_t value64,
                               int32_t value32) {
    (void)module, (void)status, (void)value64, (void)value32;
  }
  virtual void didDetect(const std::vector<ObjectInfo>& objects) { (void)objects; }
  virtual void didDecode(const std::vector<ObjectInfo>& objects, const ResultMetadata& metadata) {
    (void)objects, (void)metadata;
  }
  virtual void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) {
    (void)points;
  }
  virtual void didReceiveServerError(ObjectModuleID module, Server::ResponseStatus status,
                                     int32_t responseCode) {
    (void)module, (void)status, (void)responseCode;
  }
  virtual void suggestDarkScene() {}
  virtual void suggestBoringEvent() {}
  virtual void showMessage(const std::string& message) { (void)message; }
  virtual void didProcessFrameDecision(CameraStabilityIssue issue, double value) {
    (void)issue, (void)value;
  }
  virtual void didProcessModuleDecision(ObjectModuleID module, JudgeVerdictOnModule verdict) {
    (void)module, (void)verdict;
  }
};

}  // namespace Tovra

#endif
