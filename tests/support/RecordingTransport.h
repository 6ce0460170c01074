#ifndef ORZAVS_TESTS_SUPPORT_RECORDINGTRANSPORT_H
#define ORZAVS_TESTS_SUPPORT_RECORDINGTRANSPORT_H

#include <cstdint>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "server/ServerDelegate.h"

namespace orzavs_test {

// A server delegate whose transfer only counts the request and runs `onSend` (e.g. to answer
// from another thread); sendServerRequestImpl returns `result`.
class RecordingTransport : public Tovra::Server::ServerDelegate {
 public:
  bool sendServerRequestImpl(const Tovra::Server::ServerRequest& request) override {
    {
      std::lock_guard<std::mutex> lock(mutex_);
      ++sent_;
    }
    if (onSend) onSend(request);
    return result;
  }
  size_t sentCount() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return sent_;
  }
  std::function<void(const Tovra::Server::ServerRequest&)> onSend;
  bool result = true;

 private:
  mutable std::mutex mutex_;
  size_t sent_ = 0;
};

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
  size_t count() const { return responses().size(); }
  std::function<void(const Tovra::Server::ServerResponse&)> onResponse;

 private:
  mutable std::mutex mutex_;
  std::vector<Tovra::Server::ServerResponse> responses_;
};

inline Tovra::Server::ServerRequest makeRequest(const std::string& id, Tovra::Server::ServerResponseHandler* handler) {
  Tovra::Server::ServerRequest request;
  request.id = id;
  request.responseHandler = handler;
  return request;
}

inline Tovra::Server::ServerResponse makeResponse(const std::string& id, const std::string& body = "",
                                                  int32_t code = 200) {
  Tovra::Server::ServerResponse response;
  response.id = id;
  response.responseStr = body;
  response.responseCode = code;
  return response;
}

}  // namespace orzavs_test

#endif
