#ifndef ORZAVS_TESTS_SUPPORT_ENGINEFAKES_H
#define ORZAVS_TESTS_SUPPORT_ENGINEFAKES_H

// Test doubles for driving the engine as a client would: an event delegate that records every
// callback, a transport that records every request and can answer from its own thread, frame
// generators, and a JPEG header reader. Header-only.

#include <csetjmp>
#include <cstdint>
#include <cstdio>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include <jpeglib.h>

#include "server/ServerDelegate.h"
#include "server/ServerRequest.h"
#include "server/ServerResponse.h"
#include "types/EventDelegateBase.h"
#include "types/ImageBuffer.h"

namespace orzavs_test {

using Clock = std::chrono::steady_clock;
using Ms = std::chrono::milliseconds;

// Polls `done` every millisecond until it holds or `timeout` passes.
inline bool waitFor(const std::function<bool()>& done, Ms timeout = Ms(5000)) {
  const auto end = Clock::now() + timeout;
  while (!done()) {
    if (Clock::now() > end) return false;
    std::this_thread::sleep_for(Ms(1));
  }
  return true;
}

struct DecodeCall {
  std::vector<Tovra::ObjectInfo> objects;
  Tovra::ResultMetadata metadata;
};

struct ErrorCall {
  Tovra::ObjectModuleID module;
  Tovra::Server::ResponseStatus status;
  int32_t code;
};

// Records every callback it gets, from any thread.
class RecordingEvents : public Tovra::EventDelegateBase {
 public:
  void didDecode(const std::vector<Tovra::ObjectInfo>& objects,
                 const Tovra::ResultMetadata& metadata) override {
    if (decodeHook) decodeHook();
    std::lock_guard<std::mutex> lock(mutex_);
    decodes_.push_back(DecodeCall{objects, metadata});
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

  std::vector<DecodeCall> decodes() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return decodes_;
  }
  std::vector<ErrorCall> errors() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return errors_;
  }
  std::vector<size_t> pointCounts() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return pointCounts_;
  }
  size_t replyCallbacks() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return decodes_.size() + errors_.size();
  }

  // Runs at the start of didDecode, before anything is recorded (for delaying a delivery).
  std::function<void()> decodeHook;

 private:
  mutable std::mutex mutex_;
  std::vector<DecodeCall> decodes_;
  std::vector<ErrorCall> errors_;
  std::vector<size_t> pointCounts_;
};

// What the transport kept of one request (the request itself belongs to the sender).
struct SentRequest {
  std::string id;
  Tovra::Server::ServerRequest::ParamMap params;
  Tovra::Server::ServerRequest::ParamMap metadata;
  std::vector<uint8_t> body;
  bool hasHandler = false;
};

// A transport that records requests and, when given a responder, answers each one from its own
// thread after the delay the responder chooses (or never, if it says so).
class FakeTransport : public Tovra::Server::ServerDelegate {
 public:
  // Fills `reply` and `delay` for a request; false means the request is never answered.
  using Responder = std::function<bool(const SentRequest&, Tovra::Server::ServerResponse& reply, Ms& delay)>;

  FakeTransport() : thread_([this] { loop(); }) {}
  ~FakeTransport() override {
    {
      std::lock_guard<std::mutex> lock(mutex_);
      stopping_ = true;
    }
    wake_.notify_all();
    thread_.join();
  }

  void setResponder(Responder responder) {
    std::lock_guard<std::mutex> lock(mutex_);
    responder_ = std::move(responder);
  }

  // Called synchronously inside sendServerRequestImpl, on the sender's thread.
  std::function<void(const Tovra::Server::ServerRequest&)> onSend;

  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    SentRequest copy;
    copy.id = request.id;
    copy.params = request.params;
    copy.metadata = request.metadata;
    if (request.data.data != nullptr && request.data.length > 0) {
      copy.body.assign(request.data.data, request.data.data + request.data.length);
    }
    copy.hasHandler = request.responseHandler != nullptr;
    {
      std::lock_guard<std::mutex> lock(mutex_);
      sent_.push_back(copy);
      if (responder_) {
        Tovra::Server::ServerResponse reply;
        reply.id = copy.id;
        Ms delay(0);
        if (responder_(copy, reply, delay)) {
          queue_.push_back(Scheduled{reply, Clock::now() + delay});
        } else {
          ++dropped_;
        }
      }
    }
    wake_.notify_all();
    if (onSend) onSend(request);
    return true;
  }

  // Queues a reply for the transport thread.
  void pushLater(const Tovra::Server::ServerResponse& reply, Ms delay = Ms(0)) {
    {
      std::lock_guard<std::mutex> lock(mutex_);
      queue_.push_back(Scheduled{reply, Clock::now() + delay});
    }
    wake_.notify_all();
  }

  std::vector<SentRequest> sent() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return sent_;
  }
  size_t sentCount() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return sent_.size();
  }
  size_t pushedCount() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return pushed_;
  }
  size_t droppedCount() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return dropped_;
  }
  // True once every queued reply has been pushed.
  bool idle() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return queue_.empty() && !pushing_;
  }

 private:
  struct Scheduled {
    Tovra::Server::ServerResponse reply;
    Clock::time_point due;
  };

  void loop() {
    std::unique_lock<std::mutex> lock(mutex_);
    for (;;) {
      if (stopping_) return;
      if (queue_.empty()) {
        wake_.wait(lock);
        continue;
      }
      if (Clock::now() < queue_.front().due) {
        wake_.wait_until(lock, queue_.front().due);
        continue;
      }
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

  mutable std::mutex mutex_;
  std::condition_variable wake_;
  bool stopping_ = false;
  bool pushing_ = false;
  Responder responder_;
  std::vector<SentRequest> sent_;
  std::deque<Scheduled> queue_;
  size_t pushed_ = 0;
  size_t dropped_ = 0;
  std::thread thread_;  // last: starts after every other member exists
};

// A reply body the parser accepts, with one result of each given content type text.
inline std::string replyBody(const std::string& queryId,
                             const std::vector<std::string>& contentTypes = {"PIDN"}) {
  std::string results;
  for (size_t i = 0; i < contentTypes.size(); ++i) {
    if (i > 0) results += ",";
    results += "{\"content\":\"c" + std::to_string(i) + "\",\"contentType\":\"" + contentTypes[i] +
               "\",\"properties\":{}}";
  }
  return "{\"queryId\":\"" + queryId + "\",\"quillmark\":{\"searchResult\":[" + results +
         "],\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[]}}}";
}

// Deterministic pseudo-random bytes.
inline uint32_t nextRandom(uint32_t& state) {
  state = state * 1664525u + 1013904223u;
  return state >> 8;
}

// A frame in the given layout whose first plane is sprinkled with isolated bright dots on a
// dark background (plenty of corners, high sharpness) or, with `flat`, uniform grey (no corners,
// sharpness 0). YUV frames get (stride * height * 3) / 2 bytes, others stride * height.
inline std::vector<uint8_t> makeFrame(int width, int height, int stride, int format,
                                      bool flat = false, uint32_t seed = 1) {
  const bool yuv = OrzaVSMobile::isYUVFormat(format);
  size_t size = static_cast<size_t>(stride) * height;
  if (yuv) size = size * 3 / 2;
  std::vector<uint8_t> bytes(size, flat ? 128 : 20);
  if (!flat) {
    uint32_t state = seed;
    for (int y = 0; y < height; ++y) {
      for (int x = 0; x < width; ++x) {
        if (nextRandom(state) % 23 == 0) bytes[static_cast<size_t>(y) * stride + x] = 240;
      }
    }
  }
  if (yuv) {
    for (size_t i = static_cast<size_t>(stride) * height; i < size; ++i) bytes[i] = 128;
  }
  return bytes;
}

// Reads the size of a JPEG stream by decoding its header and all scan lines; false if the
// stream is not a complete, decodable JPEG.
struct JpegInfo {
  int width = 0;
  int height = 0;
  int components = 0;
};

namespace detail {
struct JpegError {
  jpeg_error_mgr mgr;
  std::jmp_buf jump;
};
inline void jpegErrorExit(j_common_ptr cinfo) {
  std::longjmp(reinterpret_cast<JpegError*>(cinfo->err)->jump, 1);
}
inline void jpegSilence(j_common_ptr, int) {}
}  // namespace detail

// No object with a destructor lives in this frame: longjmp would skip it.
inline bool decodeJpeg(const uint8_t* bytes, size_t length, JpegInfo* info, uint8_t* rowScratch,
                       size_t scratchLen) {
  jpeg_decompress_struct cinfo;
  detail::JpegError error;
  cinfo.err = jpeg_std_error(&error.mgr);
  error.mgr.error_exit = detail::jpegErrorExit;
  error.mgr.emit_message = detail::jpegSilence;
  if (setjmp(error.jump)) {
    jpeg_destroy_decompress(&cinfo);
    return false;
  }
  jpeg_create_decompress(&cinfo);
  jpeg_mem_src(&cinfo, const_cast<unsigned char*>(bytes), static_cast<unsigned long>(length));
  if (jpeg_read_header(&cinfo, TRUE) != JPEG_HEADER_OK) {
    jpeg_destroy_decompress(&cinfo);
    return false;
  }
  jpeg_start_decompress(&cinfo);
  const size_t rowLen = static_cast<size_t>(cinfo.output_width) * cinfo.output_components;
  if (rowLen > scratchLen) {
    jpeg_destroy_decompress(&cinfo);
    return false;
  }
  while (cinfo.output_scanline < cinfo.output_height) {
    JSAMPROW row = rowScratch;
    jpeg_read_scanlines(&cinfo, &row, 1);
  }
  info->width = static_cast<int>(cinfo.image_width);
  info->height = static_cast<int>(cinfo.image_height);
  info->components = cinfo.num_components;
  jpeg_finish_decompress(&cinfo);
  jpeg_destroy_decompress(&cinfo);
  return true;
}

inline bool decodeJpeg(const std::vector<uint8_t>& bytes, JpegInfo& info) {
  if (bytes.empty()) return false;
  std::vector<uint8_t> scratch(1 << 16);
  return decodeJpeg(bytes.data(), bytes.size(), &info, scratch.data(), scratch.size());
}

}  // namespace orzavs_test

#endif
