// Visual search: the request built for a frame, the reply parser, and the job that sends frames
// and hands the replies on.

#include "vsearch/VisualSearchRequest.h"
#include "vsearch/VisualSearchResponseParser.h"
#include "vsearch/VisualSearchServiceJob.h"

#include <climits>
#include <cmath>
#include <ctime>
#include <memory>
#include <regex>
#include <string>
#include <tuple>
#include <vector>

#include <gtest/gtest.h>

#include "support/DiagnosticsRecorder.h"
#include "support/Fakes.h"
#include "vsearch/JpegEncoder.h"
#include "vsearch/JpegTestSupport.h"

namespace {

using Tovra::Server::ServerRequest;

TEST(VisualSearchRequest, FixedPartsAreExact) {
  EXPECT_EQ(Tovra::visualSearchParamsJson(90),
            "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
  EXPECT_EQ(Tovra::visualSearchRequestId(1700000000, 17), "TovraStateEngine-1700000000-17");
  EXPECT_EQ(Tovra::visualSearchRequestId(0, UINT64_MAX), "TovraStateEngine-0-18446744073709551615");
  // (orientation + 90) % 360 with the sign of the dividend, without overflow (2^31 + 89 leaves 217).
  const int32_t cases[][2] = {{0, 90}, {90, 180}, {270, 0}, {-90, 0}, {-180, -90}, {INT32_MAX, 217}, {INT32_MIN, -38}};
  for (const auto& c : cases) EXPECT_EQ(Tovra::visualSearchRotation(c[0]), c[1]) << c[0];
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
  const long long seconds = std::stoll(m[1]);
  EXPECT_TRUE(seconds >= before && seconds <= std::time(nullptr)) << seconds;
  EXPECT_TRUE(request.data.data == jpeg.data() && request.data.length == 4);
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

struct Parsed { bool ok = false; std::vector<ObjectInfo> results; Tovra::ResultMetadata metadata; };

Parsed parse(const std::string& text, size_t staleResults = 0) {
  Parsed p;
  p.results.resize(staleResults);
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
  EXPECT_EQ(std::make_tuple(Tovra::PIDN, std::string("{\"score\":1}"), true),
            std::make_tuple(p.results[0].contentType, p.results[0].properties, p.results[0].location.empty()));
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
  ASSERT_TRUE(p.ok && p.results.size() == 2u);  // an object is read as its values in key order
  EXPECT_EQ(p.results[0].contentType, Tovra::SEARCH_TERMS);
  p = parse(R"({"queryId":"q","quillmark":{"resultMetadata":{"finalAccumulation":false}}})");
  EXPECT_TRUE(p.ok && p.results.empty() && p.metadata.accumulatedQueries.empty());
}

TEST(VisualSearchResponseParser, MissingOrMistypedMembersFailAtTheirStep) {
  // No queryId fails first; no quillmark fails at finalAccumulation, once the id was read.
  for (const auto& c : {std::make_pair(R"({"quillmark":{}})", ""), std::make_pair(R"({"queryId":"kept"})", "kept")}) {
    const Parsed p = parse(c.first);
    EXPECT_EQ(std::make_tuple(false, std::string(c.second), std::string()),
              std::make_tuple(p.ok, p.metadata.queryID, p.metadata.mobileDecorator));
  }
  for (const std::string& text : std::vector<std::string>{
           R"({"queryId":"q","quillmark":{"searchResult":[]}})", R"({"queryId":"q","quillmark":{"resultMetadata":{}}})",
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
    const Parsed p = parse(text, 3);
    EXPECT_TRUE(!p.ok && p.results.size() == 3u) << text;  // the results are left untouched
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
  EXPECT_EQ(std::make_pair(inf.results[0].location[0].x, inf.results[0].location[0].y), std::make_pair(INFINITY, -INFINITY));
}

using namespace orzavs_test;
using Tovra::FrameRecord;

// Frame 7: textured pixels of `format`, packed ones with 3 bytes a pixel.
std::shared_ptr<FrameRecord> makeRecord(int w, int h, int format, int orient = 0) {
  auto r = std::make_shared<FrameRecord>();
  r->frameId = 7;
  r->width = w;
  r->height = h;
  r->numChannels = OrzaVSMobile::isYUVFormat(format) || format == OrzaVSMobile::GRAY ? 0 : 3;
  r->widthStep = r->numChannels ? w * 3 : w;
  r->format = format;
  r->screenOrient = orient;
  r->pixels = makeFrame(r->widthStep, h, r->widthStep, format);
  return r;
}

class JobTest : public ::testing::Test {
 protected:
  JobTest() : job(std::make_unique<Tovra::VisualSearchServiceJob>()) {
    job->setEventDelegate(&events);
    job->setServerDelegate(&transport);
  }
  // Runs the job on one frame; returns the id of the request it sent.
  std::string send(const std::shared_ptr<FrameRecord>& record) {
    const size_t before = transport.sent().size();
    job->setFrameRecord(record);
    job->run();
    EXPECT_EQ(transport.sent().size(), before + 1);
    EXPECT_EQ(job->state(), Tovra::AwaitingReply);
    return transport.sent().back().id;
  }
  std::string sendGray(int orient = 0) { return send(makeRecord(32, 32, OrzaVSMobile::GRAY, orient)); }
  RecordingEvents events;
  FakeTransport transport;
  std::unique_ptr<Tovra::VisualSearchServiceJob> job;  // destroyed before the transport
};

TEST_F(JobTest, SendsADecodableJpegAndLetsGoOfTheFrame) {
  for (int format : {OrzaVSMobile::NV21, OrzaVSMobile::GRAY, OrzaVSMobile::RGB}) {
    auto record = makeRecord(40, 24, format);
    const std::string id = send(record);
    EXPECT_EQ(record.use_count(), 1);
    EXPECT_TRUE(std::regex_match(id, std::regex("TovraStateEngine-[0-9]+-7")));
    const SentRequest sent = transport.sent().back();
    EXPECT_EQ(sent.metadata.at("width") + "x" + sent.metadata.at("height"), "40x24");
    const jpeg_test::Decoded decoded = jpeg_test::decodeJpeg(sent.body);
    EXPECT_TRUE(decoded.ok && decoded.width == 40 && decoded.height == 24 &&
                decoded.components == (format == OrzaVSMobile::GRAY ? 1 : 3)) << format;
    if (format == OrzaVSMobile::NV21) {  // encoded at quality 50
      std::vector<uint8_t> expected, work;
      ASSERT_TRUE(Tovra::encodeYUVToJpeg(record->pixels.data(), 24, 40, 40, OrzaVSMobile::NV21, expected, 50, work));
      EXPECT_EQ(sent.body, expected);
    }
    transport.pushServerResponse(makeResponse(id, replyBody("Q")));
  }
}

TEST_F(JobTest, EndsWithoutSendingWhenThereIsNothingSafeToSend) {
  job->run();  // no record
  EXPECT_EQ(job->state(), Tovra::Finished);
  auto record = makeRecord(32, 32, OrzaVSMobile::GRAY);
  job->setServerDelegate(nullptr);
  job->setFrameRecord(record);
  job->run();
  EXPECT_EQ(job->state(), Tovra::Finished);
  EXPECT_EQ(record.use_count(), 2);  // kept until the next frame
  // Geometry the pixels do not cover: YUV without its chroma, packed rows past the storage.
  job->setServerDelegate(&transport);
  auto shortYuv = makeRecord(32, 32, OrzaVSMobile::NV12);
  shortYuv->pixels.resize(32 * 32);
  auto shortPacked = makeRecord(32, 32, OrzaVSMobile::BGRA);
  shortPacked->numChannels = 4;
  DiagnosticsRecorder diagnostics;
  for (const auto& bad : {shortYuv, shortPacked}) {
    job->setFrameRecord(bad);
    job->run();
    EXPECT_EQ(job->state(), Tovra::Finished);
  }
  EXPECT_EQ(diagnostics.text(),
            "Skipped frame 7: its pixels do not cover a 32x32 image\n"
            "Skipped frame 7: its pixels do not cover a 32x32 image\n");
  EXPECT_EQ(transport.sent().size(), 0u);
}

TEST_F(JobTest, ReportsErrorsAndFilteredResultsAndCarriesTheQueryOn) {
  const struct { int code; const char* body; Tovra::Server::ResponseStatus status; } failures[] = {
      {404, "not found", Tovra::Server::RESPONSE_SERVER_ERROR},
      {200, "{\"queryId\":", Tovra::Server::RESPONSE_PARSE_ERROR},
      {201, "{}", Tovra::Server::RESPONSE_SERVER_ERROR}};  // only 200 is success
  DiagnosticsRecorder diagnostics;
  std::string lines;
  for (const auto& f : failures) {
    transport.pushServerResponse(makeResponse(sendGray(), f.body, f.code));
    lines += std::string("VSS SERVER ERROR: response: ") + f.body + "\n";
  }
  EXPECT_EQ(diagnostics.text(), lines);
  const std::vector<ErrorCall> errors = events.errors();
  ASSERT_EQ(errors.size(), 3u);
  for (size_t i = 0; i < 3; ++i) {
    EXPECT_EQ(std::make_tuple(Tovra::VISUAL_SEARCH_SERVICE_MOD, failures[i].status, failures[i].code),
              std::make_tuple(errors[i].module, errors[i].status, errors[i].code));
  }

  const std::string id = sendGray();
  std::string body = replyBody("Q7", {"PIDN", "Nope", "BoundingBox"});
  body.replace(body.find("\"properties\":{}}"), 16, "\"properties\":{},\"subContent\":[{\"content\":\"s\","
                                                     "\"contentType\":\"PIDN\",\"properties\":{}}]}");
  transport.pushServerResponse(makeResponse(id, body, 200, 1234.5678));
  ASSERT_EQ(events.decoded().size(), 1u);
  const auto objects = events.decoded()[0];
  ASSERT_EQ(objects.size(), 2u);  // 11 dropped, 6 and 10 kept in order
  EXPECT_EQ(std::make_pair(6, 10), std::make_pair(+objects[0].contentType, +objects[1].contentType));
  for (const auto& object : objects) EXPECT_EQ(object.srcObjectModule, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(objects[0].subContents.at(0).srcObjectModule, Tovra::UNSPECIFIED_OBJECT_MOD);
  EXPECT_EQ(job->state(), Tovra::Finished);

  sendGray(90);
  const auto sent = transport.sent().back();
  EXPECT_EQ(sent.metadata.at("lastQueryId") + " " + sent.metadata.at("lastQueryRoundTripTime") + " " +
                sent.metadata.at("orientation"), "Q7 1234.57 180");
  EXPECT_NE(sent.params.at("vsearch_params_json").find("\"rotation\":\"90\""), std::string::npos);
  transport.pushServerResponse(makeResponse(sent.id, replyBody("Q8", {"Other"})));
  ASSERT_EQ(events.decoded().size(), 2u);
  EXPECT_TRUE(events.decoded()[1].empty());  // reported even when nothing is left
}

TEST_F(JobTest, OnlyAnAwaitingLiveJobTakesAReplyAndOnlyOnce) {
  std::string id = sendGray();
  job->cancel();
  transport.pushServerResponse(makeResponse(id, replyBody("late")));
  EXPECT_TRUE(events.replyCallbacks() == 0 && job->lastQueryId().empty());
  sendGray();
  job->handleServerResponse(makeResponse("any", replyBody("first")));
  job->handleServerResponse(makeResponse("any", replyBody("second")));
  ASSERT_EQ(events.metadata().size(), 1u);
  EXPECT_EQ(events.metadata()[0].queryID, "first");
  // A destroyed job is withdrawn from the delegate.
  id = sendGray();
  EXPECT_GT(transport.pendingCount(), 0u);
  job.reset();
  EXPECT_EQ(transport.pendingCount(), 0u);
  transport.pushServerResponse(makeResponse(id, replyBody("late")));
  EXPECT_EQ(events.replyCallbacks(), 1u);
}

TEST_F(JobTest, AReplyPushedBeforeTheSendReturnsIsHandled) {
  transport.onSend = [this](const Tovra::Server::ServerRequest& request) {
    transport.pushServerResponse(makeResponse(request.id, replyBody("sync")));
  };
  job->markQueued();
  job->setFrameRecord(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->run();
  EXPECT_TRUE(events.decoded().size() == 1 && job->state() == Tovra::Finished);
  // Finished, but the executor has not settled it yet: nobody may hand it a frame meanwhile.
  EXPECT_TRUE(job->isBusy());
  job->finishUnlessAwaiting();
  EXPECT_FALSE(job->isBusy());
  transport.onSend = nullptr;
  job->markQueued();
  sendGray();
  job->finishUnlessAwaiting();  // an awaiting job keeps its state
  EXPECT_EQ(job->state(), Tovra::AwaitingReply);
}

}  // namespace
