#ifndef ORZAVS_TESTS_SUPPORT_FAKES_H
#define ORZAVS_TESTS_SUPPORT_FAKES_H

// Test doubles for driving the engine as a client would: recording delegates and handlers, a
// transport answering from its own thread, frames, and an engine wired to them.

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "engine/TovraStateEngine.h"
#include "support/Threads.h"
#include "server/ServerDelegate.h"
#include "types/EventDelegateBase.h"
#include "types/ImageFormat.h"

namespace orzavs_test {

struct ErrorCall { Tovra::ObjectModuleID module; Tovra::Server::ResponseStatus status; int32_t code; };

// Records callbacks from any thread; `decodeHook` runs first in didDecode.
class RecordingEvents : public Tovra::EventDelegateBase {
 public:
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects, const Tovra::ResultMetadata& metadata) override {
    if (decodeHook) decodeHook();
    std::lock_guard<std::mutex> lock(mutex_);
    decoded_.push_back(objects);
    metadata_.push_back(metadata);
  }
  void didReceiveServerError(Tovra::ObjectModuleID module, Tovra::Server::ResponseStatus status,
                             int32_t code) override {
    std::lock_guard<std::mutex> lock(mutex_);
    errors_.push_back(ErrorCall{module, status, code});
  }
  void didDetectInterestPoints(const std::vector<OrzaVSMobile::Point2f>& points) override {
    std::lock_guard<std::mutex> lock(mutex_);
    pointCounts_.push_back(points.size());
  }

  std::vector<std::vector<Tovra::ObjectInfo>> decoded() const { return locked(decoded_); }
  std::vector<Tovra::ResultMetadata> metadata() const { return locked(metadata_); }
  std::vector<ErrorCall> errors() const { return locked(errors_); }
  std::vector<size_t> pointCounts() const { return locked(pointCounts_); }
  size_t replyCallbacks() const { return decoded().size() + errors().size(); }

  std::function<void()> decodeHook;

 private:
  template <typename T>
  T locked(const T& value) const {
    std::lock_guard<std::mutex> lock(mutex_);
    return value;
  }
  mutable std::mutex mutex_;
  std::vector<std::vector<Tovra::ObjectInfo>> decoded_;
  std::vector<Tovra::ResultMetadata> metadata_;
  std::vector<ErrorCall> errors_;
  std::vector<size_t> pointCounts_;
};

// A reply body with one result per content type text.
inline std::string replyBody(const std::string& queryId, const std::vector<std::string>& types = {"PIDN"}) {
  std::string results;
  for (size_t i = 0; i < types.size(); ++i) {
    results += (i ? "," : "") + std::string("{\"content\":\"c") + std::to_string(i) +
               "\",\"contentType\":\"" + types[i] + "\",\"properties\":{}}";
  }
  return "{\"queryId\":\"" + queryId + "\",\"quillmark\":{\"searchResult\":[" + results +
         "],\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[]}}}";
}

// What the transport kept of one request.
struct SentRequest {
  std::string id;
  Tovra::Server::ServerRequest::ParamMap params, metadata;
  std::vector<uint8_t> body;
};

// Records requests; with a responder, answers each from its own thread after the chosen delay
// (or never, when the responder returns false). sendServerRequestImpl returns `result`.
class FakeTransport : public Tovra::Server::ServerDelegate {
 public:
  using Responder = std::function<bool(const SentRequest&, Tovra::Server::ServerResponse&, Ms& delay)>;

  FakeTransport() : thread_([this] { loop(); }) {}
  ~FakeTransport() override {
    locked([this] { stopping_ = true; });
    wake_.notify_all();
    thread_.join();
  }

  void setResponder(Responder responder) { locked([&] { responder_ = std::move(responder); }); }
  // Answers every request with a reply whose query id is the request id.
  void answerEverything(Ms delay = Ms(0)) {
    setResponder([delay](const SentRequest& sent, Tovra::Server::ServerResponse& reply, Ms& d) {
      reply.responseStr = replyBody(sent.id);
      d = delay;
      return true;
    });
  }

  // Runs synchronously inside sendServerRequestImpl, on the sender's thread.
  std::function<void(const Tovra::Server::ServerRequest&)> onSend;

  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    SentRequest copy{request.id, request.params, request.metadata, {}};
    if (request.data.data != nullptr) copy.body.assign(request.data.data, request.data.data + request.data.length);
    {
      std::lock_guard<std::mutex> lock(mutex_);
      sent_.push_back(copy);
      Tovra::Server::ServerResponse reply;
      reply.id = copy.id;
      Ms delay(0);
      if (responder_ && responder_(copy, reply, delay)) queue_.push_back({reply, Clock::now() + delay});
    }
    wake_.notify_all();
    if (onSend) onSend(request);
    return result;
  }
  bool result = true;

  void pushLater(const Tovra::Server::ServerResponse& reply, Ms delay = Ms(0)) {
    locked([&] { queue_.push_back({reply, Clock::now() + delay}); });
    wake_.notify_all();
  }

  std::vector<SentRequest> sent() const { return locked([this] { return sent_; }); }
  size_t pushedCount() const { return locked([this] { return pushed_; }); }
  bool idle() const { return locked([this] { return queue_.empty() && !pushing_; }); }  // all pushed

 private:
  struct Scheduled { Tovra::Server::ServerResponse reply; Clock::time_point due; };
  template <typename F>
  auto locked(F read) const -> decltype(read()) {
    std::lock_guard<std::mutex> lock(mutex_);
    return read();
  }

  void loop() {
    std::unique_lock<std::mutex> lock(mutex_);
    while (!stopping_) {
      if (queue_.empty()) {
        wake_.wait(lock);
      } else if (Clock::now() < queue_.front().due) {
        wake_.wait_until(lock, queue_.front().due);
      } else {
        Scheduled next = queue_.front();
        queue_.pop_front();
        pushing_ = true;
        lock.unlock();
        pushServerResponse(next.reply);
        lock.lock();
        pushing_ = false;
        ++pushed_;
      }
    }
  }

  mutable std::mutex mutex_;
  std::condition_variable wake_;
  bool stopping_ = false, pushing_ = false;
  Responder responder_;
  std::vector<SentRequest> sent_;
  std::deque<Scheduled> queue_;
  size_t pushed_ = 0;
  std::thread thread_;  // last: starts once every other member exists
};


// A frame whose first plane has bright dots on dark (many corners, sharpness > 0) or, `flat`, is
// uniform (no corners, sharpness 0); YUV frames get stride * height * 3 / 2 bytes.
inline std::vector<uint8_t> makeFrame(int width, int height, int stride, int format, bool flat = false,
                                      uint32_t seed = 1) {
  const size_t plane = static_cast<size_t>(stride) * height;
  std::vector<uint8_t> bytes(OrzaVSMobile::isYUVFormat(format) ? plane * 3 / 2 : plane, 128);
  if (!flat) {
    for (int y = 0; y < height; ++y) {
      for (int x = 0; x < width; ++x) {
        seed = seed * 1664525u + 1013904223u;
        bytes[static_cast<size_t>(y) * stride + x] = (seed >> 8) % 23 == 0 ? 240 : 20;
      }
    }
  }
  return bytes;
}

// A response handler that keeps copies of the responses it receives, then runs `onResponse`.
class RecordingHandler : public Tovra::Server::ServerResponseHandler {
 public:
  void handleServerResponse(const Tovra::Server::ServerResponse& response) override {
    {
      std::lock_guard<std::mutex> lock(mutex_);
      responses_.push_back(response);
    }
    if (onResponse) onResponse(response);
  }
  std::vector<Tovra::Server::ServerResponse> responses() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return responses_;
  }
  std::function<void(const Tovra::Server::ServerResponse&)> onResponse;

 private:
  mutable std::mutex mutex_;
  std::vector<Tovra::Server::ServerResponse> responses_;
};

inline Tovra::Server::ServerRequest makeRequest(const std::string& id, Tovra::Server::ServerResponseHandler* handler) {
  Tovra::Server::ServerRequest request(OrzaVSMobile::ByteArray(), id);
  request.responseHandler = handler;
  return request;
}

inline Tovra::Server::ServerResponse makeResponse(const std::string& id, const std::string& body = "",
                                                  int32_t code = 200, double roundtripTime = -1.0) {
  return Tovra::Server::ServerResponse{false, code, id, body, roundtripTime};
}

// A started engine wired to a recording delegate and transport, fed 64x48 NV21 frames: textured,
// or uniform with `isFlat`.
struct EngineRig {
  EngineRig() {
    engine->setEventDelegate(&events);
    engine->addObjectModule(Tovra::VISUAL_SEARCH_SERVICE_MOD, &transport);
    engine->startEngine();
  }
  OrzaVSMobile::ImageBuffer image(bool isFlat = false) {
    return OrzaVSMobile::ImageBuffer(0, OrzaVSMobile::NV21, 64, 48, 64, 1, (isFlat ? flat : textured).data());
  }
  void frame(double t, bool isFlat = false) {
    OrzaVSMobile::ImageBuffer pixels = image(isFlat);
    OrzaVSMobile::ExtraFrameData extra;
    extra.timeStamp = t;
    engine->process("", pixels, extra);
  }
  bool jobIdle() { return waitFor([&] { return !engine->job(0).isBusy(); }); }
  // Feeds a frame that the idle job sends; returns the request's id once the job awaits the reply
  // (for a transport that does not answer at once).
  std::string send(double t) {
    EXPECT_TRUE(jobIdle());
    const size_t before = transport.sent().size();
    frame(t);
    EXPECT_TRUE(waitFor([&] {
      return transport.sent().size() == before + 1 && engine->job(0).state() == Tovra::AwaitingReply;
    }));
    return transport.sent().back().id;
  }

  RecordingEvents events;
  FakeTransport transport;
  std::vector<uint8_t> textured = makeFrame(64, 48, 64, OrzaVSMobile::NV21);
  std::vector<uint8_t> flat = makeFrame(64, 48, 64, OrzaVSMobile::NV21, true);
  std::unique_ptr<Tovra::TovraStateEngine> engine{new Tovra::TovraStateEngine};  // last: destroyed before its delegates
};

}  // namespace orzavs_test

#endif
