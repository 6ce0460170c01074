#include "server/ServerDelegate.h"

namespace Tovra {
namespace Server {

bool ServerDelegate::sendServerRequest(const ServerRequest& request) {
  {
    MutexLock lock(mutex_);
    // Registered before the transfer starts, so an answer that arrives while
    // sendServerRequestImpl is still running is routed correctly. An existing entry keeps its
    // first handler; a failed transfer leaves the registration in place.
    pending_.emplace(request.id, request.responseHandler);
  }
  return sendServerRequestImpl(request);
}

void ServerDelegate::pushServerResponse(const ServerResponse& response) {
  ServerResponseHandler* handler = nullptr;
  std::multimap<const ServerResponseHandler*, std::thread::id>::iterator mark;
  {
    MutexLock lock(mutex_);
    auto it = pending_.find(response.id);
    if (it == pending_.end()) return;
    handler = it->second;
    pending_.erase(it);
    if (handler == nullptr) return;
    mark = delivering_.emplace(handler, std::this_thread::get_id());
  }
  // Mark and unmark even if the handler throws, so forgetHandler never waits forever.
  struct Unmark {
    ServerDelegate* self;
    std::multimap<const ServerResponseHandler*, std::thread::id>::iterator mark;
    ~Unmark() {
      MutexLock lock(self->mutex_);
      self->delivering_.erase(mark);
      self->delivered_.notify_all();
    }
  } unmark{this, mark};
  handler->handleServerResponse(response);
}

void ServerDelegate::forgetHandler(const ServerResponseHandler* handler) {
  UniqueLock lock(mutex_);
  for (auto it = pending_.begin(); it != pending_.end();) {
    if (it->second == handler) {
      it = pending_.erase(it);
    } else {
      ++it;
    }
  }
  // Wait for deliveries on other threads only: a handler being forgotten from inside its own
  // callback would otherwise wait for itself.
  while (deliveringElsewhere(handler)) delivered_.wait(lock.native());
}

bool ServerDelegate::deliveringElsewhere(const ServerResponseHandler* handler) const {
  const std::thread::id self = std::this_thread::get_id();
  auto range = delivering_.equal_range(handler);
  for (auto it = range.first; it != range.second; ++it) {
    if (it->second != self) return true;
  }
  return false;
}

size_t ServerDelegate::pendingCount() const {
  MutexLock lock(mutex_);
  return pending_.size();
}

}  // namespace Server
}  // namespace Tovra
