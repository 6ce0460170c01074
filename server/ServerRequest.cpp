#include "server/ServerRequest.h"

namespace Tovra {
namespace Server {

ServerRequest::ServerRequest(const OrzaVSMobile::ByteArray& body, const std::string& requestId,
                             const ParamMap& requestParams, const ParamMap& requestMetadata)
    : id(requestId), data(body) {
  params.insert(requestParams.begin(), requestParams.end());
  metadata.insert(requestMetadata.begin(), requestMetadata.end());
}

void ServerRequest::clear() {
  id.clear();
  params.clear();
  metadata.clear();
  data.clear();
  responseHandler = nullptr;
}

}  // namespace Server
}  // namespace Tovra
