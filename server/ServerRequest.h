#ifndef ORZAVS_SERVER_SERVERREQUEST_H
#define ORZAVS_SERVER_SERVERREQUEST_H

#include <map>
#include <string>

#include "types/ByteArray.h"

namespace Tovra {
namespace Server {

class ServerResponseHandler;

// One request handed to the client's transport. `data` is a view of bytes the sender keeps
// alive until the transport returns; copy what you need before returning.
struct ServerRequest {
  typedef std::map<std::string, std::string> ParamMap;

  std::string id;              // correlation key; the response carries the same text
  ParamMap params;             // form fields
  ParamMap metadata;           // side information
  OrzaVSMobile::ByteArray data;  // request body
  ServerResponseHandler* responseHandler = nullptr;  // not owned

  ServerRequest() = default;
  ServerRequest(const OrzaVSMobile::ByteArray& body, const std::string& requestId,
                const ParamMap& requestParams = ParamMap(),
                const ParamMap& requestMetadata = ParamMap());

  void clear();
};

}  // namespace Server
}  // namespace Tovra

#endif
