// The server's reply text, exactly as a transport would push it: any bytes. The parser must
// never throw, crash or recurse without bound, and whatever it returns must be well formed.

#include <cstdint>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "FuzzSupport.h"
#include "vsearch/VisualSearchResponseParser.h"

using Tovra::ObjectInfo;
using Tovra::ResultMetadata;

namespace {

// Every result read from a reply: a known content type, the default module (the job sets it),
// either no outline or the four corners of a bounding box, and properties that are the compact
// text of a JSON value.
void checkResults(const std::vector<ObjectInfo>& results, int depth) {
  FUZZ_CHECK(depth <= static_cast<int>(Tovra::kMaxVisualSearchReplyDepth));
  for (const ObjectInfo& info : results) {
    const int type = info.contentType;
    FUZZ_CHECK(type >= Tovra::PIDN && type <= Tovra::UNSPECIFIED_CONTENT_TYPE);
    FUZZ_CHECK(info.srcObjectModule == Tovra::UNSPECIFIED_OBJECT_MOD);
    FUZZ_CHECK(info.location.empty() || info.location.size() == 4);
    const nlohmann::json props = nlohmann::json::parse(info.properties, nullptr, false);
    FUZZ_CHECK(!props.is_discarded());
    FUZZ_CHECK(props.dump() == info.properties);
    if (!info.location.empty()) FUZZ_CHECK(props.is_object() && props.contains("boundingBox"));
    checkResults(info.subContents, depth + 1);
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);

  // A list and metadata that already hold something, as the job's would from an earlier reply.
  std::vector<ObjectInfo> results(1, ObjectInfo(Tovra::PIDN));
  results[0].content = "sentinel";
  ResultMetadata metadata;
  metadata.queryID = "previous";

  const bool ok = Tovra::parseVisualSearchResponse(text, results, metadata);

  if (ok) {
    FUZZ_CHECK(metadata.mobileDecorator == "TeskarMobileDecorator");
    FUZZ_CHECK(nlohmann::json::accept(text));
    checkResults(results, 0);
  } else {
    FUZZ_CHECK(metadata.mobileDecorator.empty());
  }
  // Text that is not JSON is refused before anything is written.
  if (!nlohmann::json::accept(text)) {
    FUZZ_CHECK(!ok);
    FUZZ_CHECK(results.size() == 1 && results[0].content == "sentinel");
    FUZZ_CHECK(metadata.queryID == "previous");
  }
  return 0;
}
