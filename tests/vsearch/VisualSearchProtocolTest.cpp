// The visual search protocol: the request built for a frame and the reply parser.

#include "vsearch/VisualSearchRequest.h"
#include "vsearch/VisualSearchResponseParser.h"

#include <climits>
#include <cmath>
#include <ctime>
#include <regex>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Tovra::Server::ServerRequest;

TEST(VisualSearchRequest, FixedPartsAreExact) {
  EXPECT_EQ(Tovra::visualSearchParamsJson(90),
            "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
  EXPECT_EQ(Tovra::visualSearchParamsJson(90).size(), 73u);
  EXPECT_EQ(Tovra::visualSearchRequestId(1700000000, 17), "TovraStateEngine-1700000000-17");
  EXPECT_EQ(Tovra::visualSearchRequestId(0, UINT64_MAX), "TovraStateEngine-0-18446744073709551615");
  // (orientation + 90) % 360 with the sign of the dividend, without overflow.
  const int32_t orientations[] = {0, 90, 270, -90, -180, INT32_MAX, INT32_MIN};
  const int32_t rotations[] = {90, 180, 0, 0, -90, static_cast<int32_t>((int64_t{INT32_MAX} + 90) % 360),
                               static_cast<int32_t>((int64_t{INT32_MIN} + 90) % 360)};
  for (size_t i = 0; i < 7; ++i) EXPECT_EQ(Tovra::visualSearchRotation(orientations[i]), rotations[i]);
}

TEST(VisualSearchRequest, ReusedRequestKeepsFirstParamsAndLastQueryEntries) {
  std::vector<uint8_t> jpeg = {0xFF, 0xD8, 1, 2};
  Tovra::VisualSearchRequestInfo info;
  info.rotation = Tovra::visualSearchRotation(0);
  info.width = 640;
  info.height = 480;
  info.jpegData = OrzaVSMobile::ByteArray(jpeg.data(), 4);
  ServerRequest request;
  const std::time_t before = std::time(nullptr);
  Tovra::buildVisualSearchRequest(request, info, 42, "", -1.0);
  std::smatch m;
  ASSERT_TRUE(std::regex_match(request.id, m, std::regex("TovraStateEngine-([0-9]+)-42")));
  EXPECT_GE(std::stoll(m[1]), static_cast<long long>(before));
  EXPECT_LE(std::stoll(m[1]), static_cast<long long>(std::time(nullptr)));
  EXPECT_EQ(request.data.data, jpeg.data());
  EXPECT_EQ(request.data.length, 4);
  EXPECT_EQ(request.params, (ServerRequest::ParamMap{{"vsearch_params_json", Tovra::visualSearchParamsJson(90)}}));
  EXPECT_EQ(request.metadata, (ServerRequest::ParamMap{{"version", "0.6"}, {"intentId", "0"}, {"intentScore", "0"},
                                                       {"orientation", "90"}, {"height", "480"},
                                                       {"width", "640"}, {"extra", "0"}}));

  info.rotation = Tovra::visualSearchRotation(90);
  info.extraFlag = true;
  info.intentScore = 0.25;
  Tovra::buildVisualSearchRequest(request, info, 2, "query-1", 1234.5678);
  EXPECT_EQ(request.params.at("vsearch_params_json"), Tovra::visualSearchParamsJson(90));  // first frame's
  EXPECT_EQ(request.metadata, (ServerRequest::ParamMap{{"version", "0.6"}, {"intentId", "0"}, {"intentScore", "0.25"},
                                                       {"orientation", "180"}, {"height", "480"}, {"width", "640"},
                                                       {"extra", "1"}, {"lastQueryId", "query-1"},
                                                       {"lastQueryRoundTripTime", "1234.57"}}));
  // An empty last query id leaves the entries written before; -1 and 0 print plainly.
  for (const auto& c : {std::make_tuple("", 5.0, "1234.57"), {"query-2", -1.0, "-1"}, {"query-3", 0.0, "0"}}) {
    Tovra::buildVisualSearchRequest(request, info, 3, std::get<0>(c), std::get<1>(c));
    EXPECT_EQ(request.metadata.at("lastQueryRoundTripTime"), std::get<2>(c));
  }
  EXPECT_EQ(request.metadata.size(), 9u);
}

using Tovra::ObjectInfo;

struct Parsed {
  bool ok = false;
  std::vector<ObjectInfo> results;
  Tovra::ResultMetadata metadata;
};

Parsed parse(const std::string& text) {
  Parsed p;
  p.ok = Tovra::parseVisualSearchResponse(text, p.results, p.metadata);
  return p;
}

std::string withResults(const std::string& list) {
  return "{\"queryId\":\"q\",\"quillmark\":{\"searchResult\":" + list +
         ",\"resultMetadata\":{\"finalAccumulation\":false,\"accumulatedQueries\":[]}}}";
}

std::string result(const std::string& type, const std::string& properties, const std::string& extra = "") {
  return "{\"content\":\"x\",\"contentType\":\"" + type + "\",\"properties\":" + properties + extra + "}";
}

const char* const kBox = R"({"boundingBox":{"tlx":1,"tly":2,"trx":3.5,"try":4,"brx":5,"bry":6,"blx":7,"bly":8.25}})";

TEST(VisualSearchResponseParser, ReadsResultsMetadataBoxesAndNesting) {
  const Parsed p = parse(R"({"queryId":"Q-1","ignored":[1],"quillmark":{"searchResult":[)" +
                         result("PIDN", "{\"score\":1}") + "," + result("BoundingBox", kBox) + "," +
                         result("SearchTerms", "\"plain\"", ",\"subContent\":[" +
                                result("DirectedResult", "{}", ",\"subContent\":[" + result("Nope", "null") + "]") + "]") +
                         R"(],"resultMetadata":{"finalAccumulation":true,"accumulatedQueries":["Q-0","Q-00"]}}})");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(std::make_tuple(std::string("Q-1"), true, std::string("TeskarMobileDecorator")),
            std::make_tuple(p.metadata.queryID, p.metadata.isFinalAccumulation, p.metadata.mobileDecorator));
  EXPECT_EQ(p.metadata.accumulatedQueries, (std::vector<std::string>{"Q-0", "Q-00"}));
  ASSERT_EQ(p.results.size(), 3u);
  EXPECT_EQ(p.results[0].contentType, Tovra::PIDN);
  EXPECT_EQ(p.results[0].properties, "{\"score\":1}");
  EXPECT_TRUE(p.results[0].location.empty());
  // The box: four corners top-left, top-right, bottom-right, bottom-left; properties keep it.
  const ObjectInfo& box = p.results[1];
  EXPECT_EQ(static_cast<int>(box.contentType), 10);
  std::vector<float> corners;
  for (const auto& corner : box.location) corners.insert(corners.end(), {corner.x, corner.y});
  EXPECT_EQ(corners, (std::vector<float>{1, 2, 3.5f, 4, 5, 6, 7, 8.25f}));
  EXPECT_EQ(box.properties,
            "{\"boundingBox\":{\"blx\":7,\"bly\":8.25,\"brx\":5,\"bry\":6,\"tlx\":1,\"tly\":2,\"trx\":3.5,\"try\":4}}");
  EXPECT_EQ(p.results[2].properties, "\"plain\"");
  ASSERT_EQ(p.results[2].subContents.size(), 1u);
  const ObjectInfo& mid = p.results[2].subContents[0];
  EXPECT_EQ(mid.contentType, Tovra::DIRECTED_RESULT);
  ASSERT_EQ(mid.subContents.size(), 1u);
  const ObjectInfo& leaf = mid.subContents[0];
  EXPECT_EQ(std::make_tuple(Tovra::UNSPECIFIED_CONTENT_TYPE, std::string("null"), Tovra::UNSPECIFIED_OBJECT_MOD),
            std::make_tuple(leaf.contentType, leaf.properties, leaf.srcObjectModule));
}

TEST(VisualSearchResponseParser, TypeTextsAreMatchedWholeAndListsMayBeEmptyObjectsOrAbsent) {
  EXPECT_EQ(Tovra::visualSearchContentType("ExternalResult"), Tovra::EXTERNAL_RESULT);
  for (const char* other : {"pidn", "PIDN ", "", "BOUNDING_BOX"}) {
    EXPECT_EQ(Tovra::visualSearchContentType(other), Tovra::UNSPECIFIED_CONTENT_TYPE) << other;
  }
  Parsed p = parse(withResults("[]"));
  EXPECT_TRUE(p.ok && p.results.empty());
  p = parse(withResults("{\"b\":" + result("PIDN", "{}") + ",\"a\":" + result("SearchTerms", "{}") + "}"));
  ASSERT_TRUE(p.ok);  // an object is read as its values in key order
  ASSERT_EQ(p.results.size(), 2u);
  EXPECT_EQ(p.results[0].contentType, Tovra::SEARCH_TERMS);
  p = parse(R"({"queryId":"q","quillmark":{"resultMetadata":{"finalAccumulation":false}}})");
  EXPECT_TRUE(p.ok && p.results.empty() && p.metadata.accumulatedQueries.empty());
}

TEST(VisualSearchResponseParser, MissingOrMistypedMembersFailAtTheirStep) {
  Parsed p = parse(R"({"quillmark":{}})");  // no queryId: fails first
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.metadata.queryID, "");
  p = parse(R"({"queryId":"kept"})");  // no quillmark: fails at finalAccumulation
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.metadata.queryID, "kept");
  EXPECT_EQ(p.metadata.mobileDecorator, "");
  for (const std::string& text : std::vector<std::string>{
           R"({"queryId":"q","quillmark":{"searchResult":[]}})",
           R"({"queryId":"q","quillmark":{"resultMetadata":{}}})",
           R"({"queryId":"q","quillmark":{"resultMetadata":{"finalAccumulation":"true"}}})",
           R"({"queryId":"q","quillmark":{"resultMetadata":{"finalAccumulation":true,"accumulatedQueries":[1]}}})",
           R"({"queryId":7,"quillmark":{}})", R"({"queryId":"q","quillmark":"text"})", R"(["queryId"])", "42",
           withResults("[{\"content\":\"x\",\"contentType\":\"PIDN\"}]"),
           withResults("[{\"content\":1,\"contentType\":\"PIDN\",\"properties\":{}}]"),
           withResults("[7]"), withResults("\"not a list\""),
           withResults("[" + result("PIDN", R"({"boundingBox":{"tlx":1,"tly":2,"trx":3,"try":4,"brx":5,"bry":6,"blx":7}})") + "]"),
           withResults("[" + result("PIDN", R"({"boundingBox":{"tlx":"1","tly":2,"trx":3,"try":4,"brx":5,"bry":6,"blx":7,"bly":8}})") + "]"),
           withResults("[" + result("PIDN", R"({"boundingBox":[1,2]})") + "]")}) {
    EXPECT_FALSE(parse(text).ok) << text;
  }
}

TEST(VisualSearchResponseParser, HostileTextNeverThrowsOrOverflows) {
  static const char kNul[] = "{\"queryId\":\"a\0b\"}";
  for (const std::string& text : {std::string(""), std::string("not json"), std::string("{\"queryId\":\"q\""),
                                 std::string("{}garbage"), std::string("\xff\xfe"), std::string(kNul, sizeof kNul - 1)}) {
    std::vector<ObjectInfo> results(3);
    Tovra::ResultMetadata metadata;
    EXPECT_FALSE(Tovra::parseVisualSearchResponse(text, results, metadata)) << text;
    EXPECT_EQ(results.size(), 3u);  // untouched
  }
  // Nesting beyond the limit is refused (properties are serialised recursively, subContent is
  // read recursively); up to the limit it is read, and brackets inside strings do not count.
  const size_t limit = Tovra::kMaxVisualSearchReplyDepth;
  EXPECT_FALSE(parse(withResults("[" + result("PIDN", std::string(100000, '[') + std::string(100000, ']')) + "]")).ok);
  std::string deep;
  for (int i = 0; i < 20000; ++i) deep += "[{\"content\":\"\",\"contentType\":\"PIDN\",\"properties\":{},\"subContent\":";
  deep += "[]";
  for (int i = 0; i < 20000; ++i) deep += "}]";
  EXPECT_FALSE(parse(withResults(deep)).ok);
  const Parsed ok = parse(withResults("[{\"content\":\"[[{{\\\"[\",\"contentType\":\"PIDN\",\"properties\":" +
                                      std::string(limit - 4, '[') + std::string(limit - 4, ']') + "}]"));
  ASSERT_TRUE(ok.ok);
  EXPECT_EQ(ok.results[0].content, "[[{{\"[");
  // Corners beyond the float range become infinities instead of an undefined conversion.
  const Parsed inf = parse(withResults("[" + result("PIDN", R"({"boundingBox":{"tlx":1e300,"tly":-1e300,
      "trx":0,"try":0,"brx":0,"bry":0,"blx":0,"bly":0}})") + "]"));
  ASSERT_TRUE(inf.ok);
  EXPECT_TRUE(std::isinf(inf.results[0].location[0].x) && inf.results[0].location[0].x > 0);
  EXPECT_TRUE(std::isinf(inf.results[0].location[0].y) && inf.results[0].location[0].y < 0);
}

}  // namespace
