#ifndef ORZAVS_SERVER_SERVERRESPONSE_H
#define ORZAVS_SERVER_SERVERRESPONSE_H

#include <cstdint>
#include <string>

namespace Tovra {
namespace Server {

// The transport's answer to one ServerRequest, pushed back through
// ServerDelegate::pushServerResponse.
struct ServerResponse {
  bool compressed = false;      // set by the client; the engine never reads it
  int32_t responseCode = 200;   // transport status; anything but 200 is a server error
  std::string id;               // the id of the request this answers
  std::string responseStr;      // the reply body
  double roundtripTime = -1.0;  // measured round trip in the client's unit; negative = unknown
};

// Receives the response to a request it registered itself for.
class ServerResponseHandler {
 public:
  virtual ~ServerResponseHandler() = default;
  virtual void handleServerResponse(const ServerResponse& response) = 0;
};

}  // namespace Server
}  // namespace Tovra

#endif
