#include "support/RecordingTransport.h"

namespace orzavs_test {

bool RecordingTransport::sendServerRequestImpl(const Tovra::Server::ServerRequest& request) {
  RecordedRequest copy;
  copy.id = request.id;
  copy.params = request.params;
  copy.metadata = request.metadata;
  if (request.data.getData() != nullptr && request.data.getLength() > 0) {
    copy.body.assign(request.data.getData(), request.data.getData() + request.data.getLength());
  }
  copy.handler = request.responseHandler;
  {
    std::lock_guard<std::mutex> lock(mutex_);
    sent_.push_back(std::move(copy));
  }
  arrived_.notify_all();
  if (onSend) onSend(request);
  return result;
}

std::vector<RecordedRequest> RecordingTransport::sent() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return sent_;
}

size_t RecordingTransport::sentCount() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return sent_.size();
}

bool RecordingTransport::waitForSent(size_t n, std::chrono::milliseconds timeout) const {
  std::unique_lock<std::mutex> lock(mutex_);
  return arrived_.wait_for(lock, timeout, [&] { return sent_.size() >= n; });
}

void RecordingHandler::handleServerResponse(const Tovra::Server::ServerResponse& response) {
  {
    std::lock_guard<std::mutex> lock(mutex_);
    responses_.push_back(response);
  }
  if (onResponse) onResponse(response);
}

std::vector<Tovra::Server::ServerResponse> RecordingHandler::responses() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return responses_;
}

size_t RecordingHandler::count() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return responses_.size();
}

Tovra::Server::ServerResponse makeResponse(const std::string& id, const std::string& body,
                                           int32_t code) {
  Tovra::Server::ServerResponse response;
  response.id = id;
  response.responseStr = body;
  response.responseCode = code;
  return response;
}

}  // namespace orzavs_test
