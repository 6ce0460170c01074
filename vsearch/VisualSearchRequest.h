#ifndef ORZAVS_VSEARCH_VISUALSEARCHREQUEST_H
#define ORZAVS_VSEARCH_VISUALSEARCHREQUEST_H

#include <cstdint>
#include <ctime>
#include <string>

#include "server/ServerRequest.h"
#include "types/ByteArray.h"

namespace Tovra {

// What one visual search request is built from.
struct VisualSearchRequestInfo {
  bool extraFlag = false;      // sent as metadata "extra"
  int32_t rotation = 0;        // degrees, see visualSearchRotation()
  int32_t height = 0;          // frame height in pixels
  int32_t width = 0;           // frame width in pixels
  OrzaVSMobile::ByteArray jpegData;  // the encoded frame; the caller keeps the bytes alive
  int32_t intentId = 0;
  double intentScore = 0.0;
};

// (orientation + 90) remainder 360, with the sign of the dividend: -90 gives 0, -180 gives -90.
int32_t visualSearchRotation(int32_t screenOrient);

// "TovraStateEngine-<seconds>-<frameId>", both numbers in plain decimal.
std::string visualSearchRequestId(std::time_t seconds, uint64_t frameId);

// The compact JSON parameter document carried in the form field "vsearch_params_json":
// {"quillmark":{"file_list":{"p_img_1":"file"},"params":{"rotation":"<rotation>"}}}
std::string visualSearchParamsJson(int32_t rotation);

// Fills `request` for one frame. The request is meant to be reused for every frame of a job and
// is never cleared: the id and the metadata entries are overwritten, "vsearch_params_json" is
// only inserted when absent (so it keeps the rotation of the first frame built into it), and
// "lastQueryId"/"lastQueryRoundTripTime" are written only when lastQueryId is not empty (and
// are then kept for later frames). The body is a view of info.jpegData. The response handler is
// left as it is; the caller sets it.
void buildVisualSearchRequest(Server::ServerRequest& request, const VisualSearchRequestInfo& info,
                              uint64_t frameId, const std::string& lastQueryId,
                              double lastQueryRoundTripTime);

}  // namespace Tovra

#endif
