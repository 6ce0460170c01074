#ifndef ORZAVS_SERVER_SERVERDELEGATE_H
#define ORZAVS_SERVER_SERVERDELEGATE_H

#include <condition_variable>
#include <map>
#include <string>
#include <thread>

#include "server/ServerRequest.h"
#include "server/ServerResponse.h"
#include "types/Mutex.h"

namespace Tovra {
namespace Server {

class ServerDelegateInterface {
 public:
  virtual ~ServerDelegateInterface() = default;
  virtual bool sendServerRequest(const ServerRequest& request) = 0;
};

// The client's transport. Derive from it and implement sendServerRequestImpl(); push every
// answer back with pushServerResponse(), from any thread. Each request id is answered at most
// once: the response goes to the handler registered when the request was sent.
class ServerDelegate : public ServerDelegateInterface {
 public:
  ServerDelegate() = default;
  ~ServerDelegate() override = default;
  ServerDelegate(const ServerDelegate&) = delete;
  ServerDelegate& operator=(const ServerDelegate&) = delete;

  // Registers (request.id -> request.responseHandler) unless the id is already pending, then
  // hands the request to sendServerRequestImpl() and returns its result.
  bool sendServerRequest(const ServerRequest& request) override;
  // The client's transfer. Copy what you need from `request` before returning.
  virtual bool sendServerRequestImpl(const ServerRequest& request) = 0;

  // Routes `response` to the handler pending under its id and forgets the id; unknown or
  // repeated ids are ignored. The handler runs on the calling thread with no lock held.
  void pushServerResponse(const ServerResponse& response);

  // Forgets every pending entry of `handler` and waits until no delivery to it is in progress
  // on another thread, so that the handler can be destroyed safely afterwards.
  void forgetHandler(const ServerResponseHandler* handler);

  // Number of requests still waiting for their response.
  size_t pendingCount() const;

 private:
  mutable Mutex mutex_;
  std::map<std::string, ServerResponseHandler*> pending_ ORZAVS_GUARDED_BY(mutex_);
  // Deliveries in progress (handler -> delivering threads), so forgetHandler can wait them out.
  std::multimap<const ServerResponseHandler*, std::thread::id> delivering_ ORZAVS_GUARDED_BY(mutex_);
  // Whether a thread other than the caller is delivering to `handler`.
  bool deliveringElsewhere(const ServerResponseHandler* handler) const ORZAVS_REQUIRES(mutex_);
  std::condition_variable delivered_;
};

}  // namespace Server
}  // namespace Tovra

#endif
