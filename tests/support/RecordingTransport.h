#ifndef ORZAVS_TESTS_SUPPORT_RECORDINGTRANSPORT_H
#define ORZAVS_TESTS_SUPPORT_RECORDINGTRANSPORT_H

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "server/ServerDelegate.h"

namespace orzavs_test {

// What a transport saw of one request: copies, since the request belongs to the caller.
struct RecordedRequest {
  std::string id;
  Tovra::Server::ServerRequest::ParamMap params;
  Tovra::Server::ServerRequest::ParamMap metadata;
  std::vector<uint8_t> body;
  Tovra::Server::ServerResponseHandler* handler = nullptr;
};

// A server delegate whose transfer only records the request (and optionally runs a hook, e.g.
// to answer from another thread). sendServerRequestImpl returns `result`.
class RecordingTransport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override;

  std::vector<RecordedRequest> sent() const;
  size_t sentCount() const;
  // Waits until at least `n` requests were sent; false after the timeout.
  bool waitForSent(size_t n, std::chrono::milliseconds timeout = std::chrono::seconds(10)) const;

  // Runs inside sendServerRequestImpl after the request was recorded.
  std::function<void(const Tovra::Server::ServerRequest&)> onSend;
  bool result = true;

 private:
  mutable std::mutex mutex_;
  mutable std::condition_variable arrived_;
  std::vector<RecordedRequest> sent_;
};

// A response handler that counts and keeps copies of the responses it receives.
class RecordingHandler : public Tovra::Server::ServerResponseHandler {
 public:
  void handleServerResponse(const Tovra::Server::ServerResponse& response) override;

  std::vector<Tovra::Server::ServerResponse> responses() const;
  size_t count() const;

  // Runs inside handleServerResponse after the response was recorded.
  std::function<void(const Tovra::Server::ServerResponse&)> onResponse;

 private:
  mutable std::mutex mutex_;
  std::vector<Tovra::Server::ServerResponse> responses_;
};

// A response with the given id and body (code 200 unless given).
Tovra::Server::ServerResponse makeResponse(const std::string& id, const std::string& body = "",
                                           int32_t code = 200);

}  // namespace orzavs_test

#endif
