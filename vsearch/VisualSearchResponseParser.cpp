#include "vsearch/VisualSearchResponseParser.h"

#include <algorithm>
#include <cfloat>
#include <limits>

#include <nlohmann/json.hpp>

namespace Tovra {

namespace {

using nlohmann::json;

// Capacity reserved up front for a result list. The list is reserved for its element count,
// but an element costs the reply a few bytes and an ObjectInfo far more, so a huge reply of
// tiny elements would otherwise ask for a disproportionate block before the first element is
// even read. Beyond this the vector simply grows.
constexpr size_t kMaxReservedResults = 1024;

// Nesting depth of a JSON text, counting '[' and '{' outside strings; stops counting once
// `limit` is exceeded. Malformed text gives some number; the parser judges the syntax.
size_t nestingDepth(const std::string& text, size_t limit) {
  size_t depth = 0;
  size_t deepest = 0;
  bool inString = false;
  for (size_t i = 0; i < text.size(); ++i) {
    const char c = text[i];
    if (inString) {
      if (c == '\\') {
        ++i;  // the escaped character cannot end the string
      } else if (c == '"') {
        inString = false;
      }
    } else if (c == '"') {
      inString = true;
    } else if (c == '[' || c == '{') {
      if (++depth > deepest) {
        deepest = depth;
        if (deepest > limit) break;
      }
    } else if ((c == ']' || c == '}') && depth > 0) {
      --depth;
    }
  }
  return deepest;
}

// A corner coordinate as a single-precision float. Doubles beyond the float range become
// infinities (what the hardware conversion gives) instead of relying on an out-of-range
// conversion, which the language leaves undefined.
float cornerValue(const json& value) {
  if (value.is_number_float()) {
    const double d = value.get<double>();
    if (d > static_cast<double>(FLT_MAX)) return std::numeric_limits<float>::infinity();
    if (d < -static_cast<double>(FLT_MAX)) return -std::numeric_limits<float>::infinity();
    return static_cast<float>(d);
  }
  return value.get<float>();  // integers (and booleans) convert; other kinds throw type_error
}

void readResultList(json& list, std::vector<ObjectInfo>& out);

// One result object. "content", "contentType", "properties" and the eight corners must be
// present (at() throws out_of_range otherwise); "boundingBox" and "subContent" are optional.
void readResult(json& item, ObjectInfo& info) {
  info.content = item.at("content").get<std::string>();
  info.contentType = visualSearchContentType(item.at("contentType").get<std::string>());
  const json& properties = item.at("properties");
  if (properties.is_object()) {
    const auto box = properties.find("boundingBox");
    if (box != properties.end()) {
      const json& b = *box;
      info.location.emplace_back(cornerValue(b.at("tlx")), cornerValue(b.at("tly")));
      info.location.emplace_back(cornerValue(b.at("trx")), cornerValue(b.at("try")));
      info.location.emplace_back(cornerValue(b.at("brx")), cornerValue(b.at("bry")));
      info.location.emplace_back(cornerValue(b.at("blx")), cornerValue(b.at("bly")));
    }
  }
  info.properties = properties.dump();
  const auto sub = item.find("subContent");
  if (sub != item.end()) readResultList(*sub, info.subContents);
}

// A list of results: an array, an object (its member values in key order), null (nothing) or
// a single value (read as one element, which then fails unless it is an object). Recursion
// through "subContent" is bounded by the nesting check done before parsing.
void readResultList(json& list, std::vector<ObjectInfo>& out) {
  out.clear();
  out.reserve(std::min(list.size(), kMaxReservedResults));
  for (json& item : list) {
    ObjectInfo info(UNSPECIFIED_CONTENT_TYPE);
    readResult(item, info);
    out.push_back(std::move(info));
  }
}

}  // namespace

ContentType visualSearchContentType(const std::string& name) {
  if (name == "PIDN") return PIDN;
  if (name == "SearchTerms") return SEARCH_TERMS;
  if (name == "DirectedResult") return DIRECTED_RESULT;
  if (name == "ExternalResult") return EXTERNAL_RESULT;
  if (name == "BoundingBox") return BOUNDING_BOX_CONTENT_TYPE;
  return UNSPECIFIED_CONTENT_TYPE;
}

bool parseVisualSearchResponse(const std::string& text, std::vector<ObjectInfo>& results,
                               ResultMetadata& metadata) {
  // The parser itself is iterative, but serialising "properties" and reading "subContent"
  // recurse once per level: a reply nested thousands deep would exhaust the stack of the
  // thread that pushes it. Such replies are refused like malformed text.
  if (nestingDepth(text, kMaxVisualSearchReplyDepth) > kMaxVisualSearchReplyDepth) return false;
  try {
    json doc = json::parse(text);
    // Member access on the document, "quillmark" and "resultMetadata" is the inserting
    // operator[] of a non-const value: a missing member reads as null (and a null container
    // becomes an empty object), a non-object container throws type_error. Never the const
    // operator[], whose missing-key behaviour is undefined.
    metadata.queryID = doc["queryId"].get<std::string>();
    json& quillmark = doc["quillmark"];
    readResultList(quillmark["searchResult"], results);
    json& resultMetadata = quillmark["resultMetadata"];
    metadata.isFinalAccumulation = resultMetadata["finalAccumulation"].get<bool>();
    json& queries = resultMetadata["accumulatedQueries"];
    metadata.accumulatedQueries.clear();
    metadata.accumulatedQueries.reserve(std::min(queries.size(), kMaxReservedResults));
    for (const json& query : queries) metadata.accumulatedQueries.push_back(query.get<std::string>());
    metadata.mobileDecorator = "TeskarMobileDecorator";
    return true;
  } catch (const json::parse_error&) {
    return false;  // not JSON
  } catch (const json::out_of_range&) {
    return false;  // a required member is missing
  } catch (const json::type_error&) {
    return false;  // a member of the wrong kind
  } catch (const json::exception&) {
    // invalid_iterator and other_error cannot arise from the reads above; caught anyway so
    // that no library exception ever leaves the parser.
    return false;
  }
}

}  // namespace Tovra
