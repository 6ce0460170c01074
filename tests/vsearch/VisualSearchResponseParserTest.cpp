#include "vsearch/VisualSearchResponseParser.h"

#include <cmath>
#include <string>
#include <vector>

#include <gtest/gtest.h>

namespace {

using Tovra::ObjectInfo;
using Tovra::ResultMetadata;

struct Parsed {
  bool ok = false;
  std::vector<ObjectInfo> results;
  ResultMetadata metadata;
};

Parsed parse(const std::string& text) {
  Parsed p;
  p.ok = Tovra::parseVisualSearchResponse(text, p.results, p.metadata);
  return p;
}

const char* const kMeta = "\"resultMetadata\":{\"finalAccumulation\":false,\"accumulatedQueries\":[]}";

std::string withResults(const std::string& searchResult) {
  return std::string("{\"queryId\":\"q\",\"quillmark\":{\"searchResult\":") + searchResult + "," + kMeta + "}}";
}

TEST(VisualSearchResponseParser, ReadsACompleteReply) {
  const Parsed p = parse(R"({"queryId":"Q-1","quillmark":{"searchResult":[
      {"content":"B00X","contentType":"PIDN","properties":{"score":1}},
      {"content":"red shoes","contentType":"SearchTerms","properties":"plain"}],
    "resultMetadata":{"finalAccumulation":true,"accumulatedQueries":["Q-0","Q-00"]}},
    "ignored":[1,2,3]})");
  ASSERT_TRUE(p.ok);
  EXPECT_EQ(p.metadata.queryID, "Q-1");
  EXPECT_TRUE(p.metadata.isFinalAccumulation);
  EXPECT_EQ(p.metadata.accumulatedQueries, (std::vector<std::string>{"Q-0", "Q-00"}));
  EXPECT_EQ(p.metadata.mobileDecorator, "TeskarMobileDecorator");
  ASSERT_EQ(p.results.size(), 2u);
  EXPECT_EQ(p.results[0].content, "B00X");
  EXPECT_EQ(p.results[0].contentType, Tovra::PIDN);
  EXPECT_EQ(p.results[0].properties, "{\"score\":1}");
  EXPECT_EQ(p.results[0].srcObjectModule, Tovra::UNSPECIFIED_OBJECT_MOD);
  EXPECT_TRUE(p.results[0].location.empty());
  EXPECT_EQ(p.results[1].contentType, Tovra::SEARCH_TERMS);
  EXPECT_EQ(p.results[1].properties, "\"plain\"");
}

TEST(VisualSearchResponseParser, MapsContentTypeTextsExactly) {
  EXPECT_EQ(Tovra::visualSearchContentType("PIDN"), Tovra::PIDN);
  EXPECT_EQ(Tovra::visualSearchContentType("SearchTerms"), Tovra::SEARCH_TERMS);
  EXPECT_EQ(Tovra::visualSearchContentType("DirectedResult"), Tovra::DIRECTED_RESULT);
  EXPECT_EQ(Tovra::visualSearchContentType("ExternalResult"), Tovra::EXTERNAL_RESULT);
  EXPECT_EQ(static_cast<int>(Tovra::visualSearchContentType("BoundingBox")), 10);
  EXPECT_EQ(Tovra::visualSearchContentType("pidn"), Tovra::UNSPECIFIED_CONTENT_TYPE);
  EXPECT_EQ(Tovra::visualSearchContentType("PIDN "), Tovra::UNSPECIFIED_CONTENT_TYPE);
  EXPECT_EQ(Tovra::visualSearchContentType(""), Tovra::UNSPECIFIED_CONTENT_TYPE);
}

TEST(VisualSearchResponseParser, BoundingBoxBecomesFourCornersAndStaysInProperties) {
  const Parsed p = parse(withResults(R"([{"content":"","contentType":"BoundingBox","properties":
      {"boundingBox":{"tlx":1,"tly":2,"trx":3.5,"try":4,"brx":5,"bry":6,"blx":7,"bly":8.25}}}])"));
  ASSERT_TRUE(p.ok);
  ASSERT_EQ(p.results.size(), 1u);
  const ObjectInfo& box = p.results[0];
  EXPECT_EQ(static_cast<int>(box.contentType), 10);
  ASSERT_EQ(box.location.size(), 4u);
  EXPECT_FLOAT_EQ(box.location[0].x, 1);  // top-left
  EXPECT_FLOAT_EQ(box.location[0].y, 2);
  EXPECT_FLOAT_EQ(box.location[1].x, 3.5f);  // top-right
  EXPECT_FLOAT_EQ(box.location[1].y, 4);
  EXPECT_FLOAT_EQ(box.location[2].x, 5);  // bottom-right
  EXPECT_FLOAT_EQ(box.location[2].y, 6);
  EXPECT_FLOAT_EQ(box.location[3].x, 7);  // bottom-left
  EXPECT_FLOAT_EQ(box.location[3].y, 8.25f);
  EXPECT_EQ(box.properties.rfind("{\"boundingBox\":{\"blx\":", 0), 0u) << box.properties;
  EXPECT_EQ(box.properties,
            "{\"boundingBox\":{\"blx\":7,\"bly\":8.25,\"brx\":5,\"bry\":6,\"tlx\":1,\"tly\":2,"
            "\"trx\":3.5,\"try\":4}}");
}

TEST(VisualSearchResponseParser, CornerValuesBeyondFloatRangeBecomeInfinite) {
  const Parsed p = parse(withResults(R"([{"content":"","contentType":"BoundingBox","properties":
      {"boundingBox":{"tlx":1e300,"tly":-1e300,"trx":0,"try":0,"brx":0,"bry":0,"blx":0,"bly":0}}}])"));
  ASSERT_TRUE(p.ok);
  EXPECT_TRUE(std::isinf(p.results[0].location[0].x) && p.results[0].location[0].x > 0);
  EXPECT_TRUE(std::isinf(p.results[0].location[0].y) && p.results[0].location[0].y < 0);
}

TEST(VisualSearchResponseParser, MalformedBoundingBoxesFailTheRead) {
  // A missing corner, a corner that is not a number, a box that is not an object.
  EXPECT_FALSE(parse(withResults(R"([{"content":"","contentType":"PIDN","properties":
      {"boundingBox":{"tlx":1,"tly":2,"trx":3,"try":4,"brx":5,"bry":6,"blx":7}}}])")).ok);
  EXPECT_FALSE(parse(withResults(R"([{"content":"","contentType":"PIDN","properties":
      {"boundingBox":{"tlx":"1","tly":2,"trx":3,"try":4,"brx":5,"bry":6,"blx":7,"bly":8}}}])")).ok);
  EXPECT_FALSE(parse(withResults(R"([{"content":"","contentType":"PIDN","properties":{"boundingBox":[1,2]}}])")).ok);
}

TEST(VisualSearchResponseParser, SubContentNestsToAnyDepthWithDefaults) {
  const Parsed p = parse(withResults(R"([{"content":"top","contentType":"PIDN","properties":{},
      "subContent":[{"content":"mid","contentType":"SearchTerms","properties":{},
        "subContent":[{"content":"deep","contentType":"Whatever","properties":null}]}]}])"));
  ASSERT_TRUE(p.ok);
  ASSERT_EQ(p.results.size(), 1u);
  ASSERT_EQ(p.results[0].subContents.size(), 1u);
  const ObjectInfo& mid = p.results[0].subContents[0];
  EXPECT_EQ(mid.content, "mid");
  ASSERT_EQ(mid.subContents.size(), 1u);
  EXPECT_EQ(mid.subContents[0].content, "deep");
  EXPECT_EQ(mid.subContents[0].contentType, Tovra::UNSPECIFIED_CONTENT_TYPE);
  EXPECT_EQ(mid.subContents[0].properties, "null");
  EXPECT_EQ(mid.subContents[0].srcObjectModule, Tovra::UNSPECIFIED_OBJECT_MOD);
}

TEST(VisualSearchResponseParser, ListsMayBeEmptyObjectsOrAbsent) {
  Parsed p = parse(withResults("[]"));
  EXPECT_TRUE(p.ok);
  EXPECT_TRUE(p.results.empty());

  // An object is read as its member values in key order.
  p = parse(withResults(R"({"b":{"content":"second","contentType":"PIDN","properties":{}},
                            "a":{"content":"first","contentType":"PIDN","properties":{}}})"));
  ASSERT_TRUE(p.ok);
  ASSERT_EQ(p.results.size(), 2u);
  EXPECT_EQ(p.results[0].content, "first");
  EXPECT_EQ(p.results[1].content, "second");

  // Missing "searchResult": empty list, the read goes on. Missing "accumulatedQueries": fine.
  p = parse(R"({"queryId":"q","quillmark":{"resultMetadata":{"finalAccumulation":false}}})");
  EXPECT_TRUE(p.ok);
  EXPECT_TRUE(p.results.empty());
  EXPECT_TRUE(p.metadata.accumulatedQueries.empty());
}

TEST(VisualSearchResponseParser, MissingOrMistypedMembersFailAtTheirStep) {
  // Missing "queryId": fails first, nothing written.
  Parsed p = parse(R"({"quillmark":{"searchResult":[],)" + std::string(kMeta) + "}}");
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.metadata.queryID, "");

  // Missing "quillmark": the query id is already written, then "finalAccumulation" fails.
  p = parse(R"({"queryId":"kept"})");
  EXPECT_FALSE(p.ok);
  EXPECT_EQ(p.metadata.queryID, "kept");
  EXPECT_EQ(p.metadata.mobileDecorator, "");

  // Missing "resultMetadata" or "finalAccumulation"; "finalAccumulation" as a string.
  EXPECT_FALSE(parse(R"({"queryId":"q","quillmark":{"searchResult":[]}})").ok);
  EXPECT_FALSE(parse(R"({"queryId":"q","quillmark":{"searchResult":[],"resultMetadata":{}}})").ok);
  EXPECT_FALSE(parse(R"({"queryId":"q","quillmark":{"searchResult":[],
      "resultMetadata":{"finalAccumulation":"true"}}})").ok);

  // Wrong kinds: a numeric query id, a non-object "quillmark", a non-object document,
  // a result lacking "properties", a numeric content, a non-string accumulated query.
  EXPECT_FALSE(parse(R"({"queryId":7,"quillmark":{}})").ok);
  EXPECT_FALSE(parse(R"({"queryId":"q","quillmark":"text"})").ok);
  EXPECT_FALSE(parse(R"(["queryId"])").ok);
  EXPECT_FALSE(parse("42").ok);
  EXPECT_FALSE(parse(withResults(R"([{"content":"x","contentType":"PIDN"}])")).ok);
  EXPECT_FALSE(parse(withResults(R"([{"content":1,"contentType":"PIDN","properties":{}}])")).ok);
  EXPECT_FALSE(parse(withResults(R"([7])")).ok);
  EXPECT_FALSE(parse(withResults(R"("not a list")")).ok);
  EXPECT_FALSE(parse(R"({"queryId":"q","quillmark":{"searchResult":[],
      "resultMetadata":{"finalAccumulation":true,"accumulatedQueries":[1]}}})").ok);
}

TEST(VisualSearchResponseParser, TextThatIsNotJsonLeavesTheListUnchanged) {
  static const char kEmbeddedNul[] = "{\"queryId\":\"a\0b\"}";
  const std::vector<std::string> texts = {"", "not json", "{", "{\"queryId\":\"q\"", "nul",
                                          "{}garbage", "\xff\xfe",
                                          std::string(kEmbeddedNul, sizeof(kEmbeddedNul) - 1)};
  for (const std::string& text : texts) {
    std::vector<ObjectInfo> results(3);
    ResultMetadata metadata;
    EXPECT_FALSE(Tovra::parseVisualSearchResponse(text, results, metadata)) << text;
    EXPECT_EQ(results.size(), 3u);
  }
}

TEST(VisualSearchResponseParser, DeepNestingIsRefusedWithoutExhaustingTheStack) {
  const size_t limit = Tovra::kMaxVisualSearchReplyDepth;
  // Deep arrays inside "properties" (serialised recursively) and deep "subContent" chains.
  std::string deepProps = std::string(100000, '[') + std::string(100000, ']');
  EXPECT_FALSE(parse(withResults("[{\"content\":\"\",\"contentType\":\"PIDN\",\"properties\":" +
                                 deepProps + "}]")).ok);
  std::string chain;
  for (int i = 0; i < 20000; ++i) chain += "[{\"content\":\"\",\"contentType\":\"PIDN\",\"properties\":{},\"subContent\":";
  chain += "[]";
  for (int i = 0; i < 20000; ++i) chain += "}]";
  EXPECT_FALSE(parse(withResults(chain)).ok);

  // Nesting up to the limit is read; brackets inside strings do not count.
  std::string nested = std::string(limit - 4, '[') + std::string(limit - 4, ']');
  const Parsed ok = parse(withResults("[{\"content\":\"[[[[{{{{\\\"[[\",\"contentType\":\"PIDN\",\"properties\":" +
                                      nested + "}]"));
  ASSERT_TRUE(ok.ok);
  EXPECT_EQ(ok.results[0].content, "[[[[{{{{\"[[");
}

}  // namespace
