#include "support/RecordingEventDelegate.h"

#include <algorithm>
#include <utility>

namespace orzavs_test {

namespace {

EventCall makeCall(const char* name, std::vector<int64_t> ints = {}) {
  EventCall call;
  call.name = name;
  call.thread = std::this_thread::get_id();
  call.ints = std::move(ints);
  return call;
}

}  // namespace

void RecordingEventDelegate::didReceiveEvent(Tovra::ObjectModuleID module,
                                             Tovra::ContentType contentType,
                                             Tovra::ActionID action, Tovra::StatusID status) {
  record(makeCall("didReceiveEvent", {module, contentType, action, status}));
}

void RecordingEventDelegate::didProcessFrame(Tovra::ObjectModuleID module, Tovra::StatusID status,
                                             int64_t value64, int32_t value32) {
  record(makeCall("didProcessFrame", {module, status, value64, value32}));
}

void RecordingEventDelegate::didDetect(const std::vector<Tovra::ObjectInfo>& objects) {
  EventCall call = makeCall("didDetect");
  call.objects = objects;
  record(std::move(call));
}

void RecordingEventDelegate::didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                                       const Tovra::ResultMetadata& metadata) {
  EventCall call = makeCall("didDecode");
  call.objects = objects;
  call.metadata = metadata;
  record(std::move(call));
}

void RecordingEventDelegate::didDetectInterestPoints(
    const std::vector<OrzaVSMobile::Point2f>& points) {
  EventCall call = makeCall("didDetectInterestPoints");
  call.points = points;
  record(std::move(call));
}

void RecordingEventDelegate::didReceiveServerError(Tovra::ObjectModuleID module,
                                                   Tovra::Server::ResponseStatus status,
                                                   int32_t responseCode) {
  record(makeCall("didReceiveServerError", {module, status, responseCode}));
}

void RecordingEventDelegate::suggestDarkScene() { record(makeCall("suggestDarkScene")); }

void RecordingEventDelegate::suggestBoringEvent() { record(makeCall("suggestBoringEvent")); }

void RecordingEventDelegate::showMessage(const std::string& message) {
  EventCall call = makeCall("showMessage");
  call.message = message;
  record(std::move(call));
}

void RecordingEventDelegate::didProcessFrameDecision(Tovra::CameraStabilityIssue issue,
                                                     double value) {
  EventCall call = makeCall("didProcessFrameDecision", {issue});
  call.real = value;
  record(std::move(call));
}

void RecordingEventDelegate::didProcessModuleDecision(Tovra::ObjectModuleID module,
                                                      Tovra::JudgeVerdictOnModule verdict) {
  record(makeCall("didProcessModuleDecision", {module, verdict}));
}

void RecordingEventDelegate::record(EventCall call) {
  {
    std::lock_guard<std::mutex> lock(mutex_);
    calls_.push_back(std::move(call));
  }
  arrived_.notify_all();
}

std::vector<EventCall> RecordingEventDelegate::calls() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return calls_;
}

std::vector<EventCall> RecordingEventDelegate::calls(const std::string& name) const {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<EventCall> result;
  for (const EventCall& call : calls_) {
    if (call.name == name) result.push_back(call);
  }
  return result;
}

size_t RecordingEventDelegate::count(const std::string& name) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<size_t>(std::count_if(calls_.begin(), calls_.end(),
                                            [&](const EventCall& c) { return c.name == name; }));
}

size_t RecordingEventDelegate::total() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return calls_.size();
}

bool RecordingEventDelegate::waitFor(const std::string& name, size_t n,
                                     std::chrono::milliseconds timeout) const {
  std::unique_lock<std::mutex> lock(mutex_);
  return arrived_.wait_for(lock, timeout, [&] {
    return static_cast<size_t>(std::count_if(calls_.begin(), calls_.end(), [&](const EventCall& c) {
             return c.name == name;
           })) >= n;
  });
}

void RecordingEventDelegate::reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  calls_.clear();
}

}  // namespace orzavs_test
