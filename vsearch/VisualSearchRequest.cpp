#include "vsearch/VisualSearchRequest.h"

#include <locale>
#include <sstream>

#include <nlohmann/json.hpp>

namespace Tovra {

namespace {

// Keys and fixed values of the request, built once when the library is loaded.
const std::string kQuillmark = "quillmark";
const std::string kVersion = "version";
const std::string kVersionValue = "0.6";
const std::string kOrientation = "orientation";
const std::string kHeight = "height";
const std::string kWidth = "width";
const std::string kIntentId = "intentId";
const std::string kIntentScore = "intentScore";
const std::string kLastQueryId = "lastQueryId";
const std::string kLastQueryRoundTripTime = "lastQueryRoundTripTime";
const std::string kExtra = "extra";
const std::string kParamsJsonField = "vsearch_params_json";
const std::string kRequestIdPrefix = "TovraStateEngine-";

// Numbers become text the way a default text stream writes them in the classic locale:
// integers in plain decimal, doubles in the general format with precision 6 (0 -> "0",
// -1 -> "-1", 1234.5678 -> "1234.57"), bools as 0 or 1. The classic locale is imbued
// explicitly so that a global locale set by the application cannot change the wire format.
template <typename T>
std::string toText(const T& value) {
  std::ostringstream out;
  out.imbue(std::locale::classic());
  out << value;
  return out.str();
}

}  // namespace

int32_t visualSearchRotation(int32_t screenOrient) {
  // Computed in 64 bits: the orientation comes from the client and orientation + 90 would
  // overflow for values near INT32_MAX. The result always fits (|result| < 360).
  return static_cast<int32_t>((static_cast<int64_t>(screenOrient) + 90) % 360);
}

std::string visualSearchRequestId(std::time_t seconds, uint64_t frameId) {
  std::ostringstream out;
  out.imbue(std::locale::classic());
  out << kRequestIdPrefix << seconds << '-' << frameId;
  return out.str();
}

std::string visualSearchParamsJson(int32_t rotation) {
  nlohmann::json doc;
  nlohmann::json& quillmark = doc[kQuillmark];
  quillmark["file_list"] = {{"p_img_1", "file"}};
  quillmark["params"] = {{"rotation", toText(rotation)}};
  return doc.dump();
}

void buildVisualSearchRequest(Server::ServerRequest& request, const VisualSearchRequestInfo& info,
                              uint64_t frameId, const std::string& lastQueryId,
                              double lastQueryRoundTripTime) {
  request.data = info.jpegData;
  request.id = visualSearchRequestId(std::time(nullptr), frameId);
  // Inserted only once per request object: later frames keep the first frame's document.
  if (request.params.find(kParamsJsonField) == request.params.end()) {
    request.params.emplace(kParamsJsonField, visualSearchParamsJson(info.rotation));
  }
  Server::ServerRequest::ParamMap& metadata = request.metadata;
  metadata[kVersion] = kVersionValue;
  metadata[kIntentId] = toText(info.intentId);
  metadata[kIntentScore] = toText(info.intentScore);
  if (!lastQueryId.empty()) {
    metadata[kLastQueryId] = lastQueryId;
    metadata[kLastQueryRoundTripTime] = toText(lastQueryRoundTripTime);
  }
  metadata[kOrientation] = toText(info.rotation);
  metadata[kHeight] = toText(info.height);
  metadata[kWidth] = toText(info.width);
  metadata[kExtra] = toText(info.extraFlag);
}

}  // namespace Tovra
