#ifndef ORZAVS_TESTS_SUPPORT_RECORDINGEVENTDELEGATE_H
#define ORZAVS_TESTS_SUPPORT_RECORDINGEVENTDELEGATE_H

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "types/EventDelegateBase.h"

namespace orzavs_test {

// One call received by a RecordingEventDelegate, with copies of its arguments.
struct EventCall {
  std::string name;             // the operation, e.g. "didDecode"
  std::thread::id thread;       // the thread that made the call
  std::vector<int64_t> ints;    // enumerations and integers, in argument order
  double real = 0.0;            // the double of didProcessFrameDecision
  std::string message;          // showMessage's text
  std::vector<Tovra::ObjectInfo> objects;          // didDetect / didDecode
  Tovra::ResultMetadata metadata;                  // didDecode
  std::vector<OrzaVSMobile::Point2f> points;       // didDetectInterestPoints
};

// An event delegate that records every one of the eleven calls, from any thread, and lets a
// test wait for calls to arrive.
class RecordingEventDelegate : public Tovra::EventDelegateBase {
 public:
  void didReceiveEvent(Tovra::ObjectModuleID module, Tovra::ContentType contentType,
                       Tovra::ActionID action, Tovra::StatusID status) override;
  void didProcessFrame(Tovra::ObjectModuleID module, Tovra::StatusID status, int64_t value64,
                       int32_t value32) override;
  void didDetect(const std::vector<Tovra::ObjectInfo>& objects) override;
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                 const Tovra::ResultMetadata& metadata) override;
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override;
  void didReceiveServerError(Tovra::ObjectModuleID module, Tovra::Server::ResponseStatus status,
                             int32_t responseCode) override;
  void suggestDarkScene() override;
  void suggestBoringEvent() override;
  void showMessage(const std::string& message) override;
  void didProcessFrameDecision(Tovra::CameraStabilityIssue issue, double value) override;
  void didProcessModuleDecision(Tovra::ObjectModuleID module,
                                Tovra::JudgeVerdictOnModule verdict) override;

  // Copies of all calls so far, in arrival order.
  std::vector<EventCall> calls() const;
  // Calls of one operation so far, in arrival order.
  std::vector<EventCall> calls(const std::string& name) const;
  size_t count(const std::string& name) const;
  size_t total() const;
  // Waits until at least `n` calls of `name` arrived; false after the timeout.
  bool waitFor(const std::string& name, size_t n,
               std::chrono::milliseconds timeout = std::chrono::seconds(10)) const;
  void reset();

 private:
  void record(EventCall call);

  mutable std::mutex mutex_;
  mutable std::condition_variable arrived_;
  std::vector<EventCall> calls_;
};

}  // namespace orzavs_test

#endif
