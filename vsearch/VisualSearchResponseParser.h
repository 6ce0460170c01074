#ifndef ORZAVS_VSEARCH_VISUALSEARCHRESPONSEPARSER_H
#define ORZAVS_VSEARCH_VISUALSEARCHRESPONSEPARSER_H

#include <cstddef>
#include <string>
#include <vector>

#include "types/ObjectInfo.h"
#include "types/ResultMetadata.h"

namespace Tovra {

// Deepest nesting of arrays and objects a reply may have. Deeper documents are refused before
// they are parsed (the serialiser and the reading of nested "subContent" recurse once per level).
constexpr size_t kMaxVisualSearchReplyDepth = 256;

// Reads a visual search reply:
//   {"queryId": "...",
//    "quillmark": {"searchResult": [ {"content": "...", "contentType": "PIDN",
//                                     "properties": {..., "boundingBox": {"tlx": ..., ...}},
//                                     "subContent": [ ...same shape... ]}, ... ],
//                  "resultMetadata": {"finalAccumulation": bool,
//                                     "accumulatedQueries": ["...", ...]}}}
// Returns true when the whole document was read. On false, whatever was read before the
// failing member stays written (queryID first, then the result list). Never throws for any
// input text; only running out of memory propagates.
bool parseVisualSearchResponse(const std::string& text, std::vector<ObjectInfo>& results,
                               ResultMetadata& metadata);

// The content type a reply's "contentType" text stands for: "PIDN", "SearchTerms",
// "DirectedResult", "ExternalResult", "BoundingBox" (the unnamed value 10); anything else is
// UNSPECIFIED_CONTENT_TYPE.
ContentType visualSearchContentType(const std::string& name);

}  // namespace Tovra

#endif
