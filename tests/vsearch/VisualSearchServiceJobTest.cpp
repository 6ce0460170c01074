#include "vsearch/VisualSearchServiceJob.h"

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "support/EngineFakes.h"

namespace {

using orzavs_test::FakeTransport;
using orzavs_test::RecordingEvents;
using Tovra::FrameRecord;
using Tovra::VisualSearchServiceJob;
using Tovra::Server::ServerResponse;

std::shared_ptr<FrameRecord> makeRecord(int width, int height, int format, int orient = 0,
                                        uint64_t frameId = 7) {
  auto record = std::make_shared<FrameRecord>();
  record->frameId = frameId;
  record->width = width;
  record->height = height;
  record->widthStep = width;
  record->numChannels = OrzaVSMobile::isYUVFormat(format) || format == OrzaVSMobile::GRAY ? 1 : 3;
  record->widthStep = width * record->numChannels;
  record->format = format;
  record->screenOrient = orient;
  record->pixels = orzavs_test::makeFrame(width, height, record->widthStep, format);
  return record;
}

ServerResponse reply(const std::string& id, int code, const std::string& body, double rtt = -1.0) {
  ServerResponse r;
  r.id = id;
  r.responseCode = code;
  r.responseStr = body;
  r.roundtripTime = rtt;
  return r;
}

class VisualSearchServiceJobTest : public ::testing::Test {
 protected:
  VisualSearchServiceJobTest() {
    job = std::make_unique<VisualSearchServiceJob>();
    job->setEventDelegate(&events);
    job->setServerDelegate(&transport);
  }

  // Runs the job on one frame and returns the id of the request it sent.
  std::string send(const std::shared_ptr<FrameRecord>& record) {
    const size_t before = transport.sentCount();
    job->setFrameRecord(record);
    job->run();
    EXPECT_EQ(transport.sentCount(), before + 1);
    EXPECT_EQ(job->state(), Tovra::AwaitingReply);
    return transport.sent().back().id;
  }

  RecordingEvents events;
  FakeTransport transport;
  std::unique_ptr<VisualSearchServiceJob> job;  // destroyed before the transport
};

TEST_F(VisualSearchServiceJobTest, SendsADecodableJpegAndReleasesTheRecord) {
  auto record = makeRecord(64, 48, OrzaVSMobile::NV21, 0, 7);
  const std::string id = send(record);
  EXPECT_EQ(record.use_count(), 1);  // the job let go of the frame once it was encoded
  EXPECT_TRUE(job->isBusy());
  const orzavs_test::SentRequest sent = transport.sent().back();
  EXPECT_EQ(id.rfind("TovraStateEngine-", 0), 0u);
  EXPECT_EQ(id.substr(id.size() - 2), "-7");
  EXPECT_TRUE(sent.hasHandler);
  EXPECT_EQ(sent.metadata.at("width"), "64");
  EXPECT_EQ(sent.metadata.at("height"), "48");
  EXPECT_EQ(sent.metadata.at("orientation"), "90");
  EXPECT_EQ(sent.metadata.count("lastQueryId"), 0u);
  orzavs_test::JpegInfo info;
  ASSERT_TRUE(orzavs_test::decodeJpeg(sent.body, info));
  EXPECT_EQ(info.width, 64);
  EXPECT_EQ(info.height, 48);
  EXPECT_EQ(info.components, 3);

  // A packed frame goes through the other encoder.
  transport.pushServerResponse(reply(id, 500, "x"));
  send(makeRecord(30, 20, OrzaVSMobile::RGB));
  ASSERT_TRUE(orzavs_test::decodeJpeg(transport.sent().back().body, info));
  EXPECT_EQ(info.width, 30);
  EXPECT_EQ(info.height, 20);
}

TEST_F(VisualSearchServiceJobTest, WithoutDelegateOrRecordOrCoverageNothingIsSent) {
  job->run();  // no record
  EXPECT_EQ(job->state(), Tovra::Finished);

  auto record = makeRecord(32, 32, OrzaVSMobile::GRAY);
  job->setServerDelegate(nullptr);
  job->setFrameRecord(record);
  job->run();
  EXPECT_EQ(job->state(), Tovra::Finished);
  EXPECT_EQ(record.use_count(), 2);  // kept until the next setFrameRecord

  // Geometry the pixels do not cover: a YUV record holding only its luminance, and a packed
  // record whose stride would run past the storage.
  job->setServerDelegate(&transport);
  auto shortYuv = makeRecord(32, 32, OrzaVSMobile::NV12);
  shortYuv->pixels.resize(32 * 32);
  auto shortPacked = makeRecord(32, 32, OrzaVSMobile::BGRA);
  shortPacked->numChannels = 4;
  testing::internal::CaptureStdout();
  job->setFrameRecord(shortYuv);
  job->run();
  EXPECT_EQ(job->state(), Tovra::Finished);
  job->setFrameRecord(shortPacked);
  job->run();
  EXPECT_EQ(job->state(), Tovra::Finished);
  const std::string out = testing::internal::GetCapturedStdout();
  EXPECT_NE(out.find("do not cover a 32x32 image"), std::string::npos) << out;
  EXPECT_EQ(transport.sentCount(), 0u);
}

TEST_F(VisualSearchServiceJobTest, ServerErrorsAreReportedWithTheirStatus) {
  std::string id = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  testing::internal::CaptureStdout();
  transport.pushServerResponse(reply(id, 404, "not found"));
  std::string out = testing::internal::GetCapturedStdout();
  EXPECT_EQ(out, "VSS SERVER ERROR: response: not found\n");
  ASSERT_EQ(events.errors().size(), 1u);
  EXPECT_EQ(events.errors()[0].module, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(events.errors()[0].status, Tovra::Server::RESPONSE_SERVER_ERROR);
  EXPECT_EQ(events.errors()[0].code, 404);
  EXPECT_EQ(job->state(), Tovra::Finished);

  id = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  testing::internal::CaptureStdout();
  transport.pushServerResponse(reply(id, 200, "{\"queryId\":"));
  out = testing::internal::GetCapturedStdout();
  EXPECT_EQ(out, "VSS SERVER ERROR: response: {\"queryId\":\n");
  ASSERT_EQ(events.errors().size(), 2u);
  EXPECT_EQ(events.errors()[1].status, Tovra::Server::RESPONSE_PARSE_ERROR);
  EXPECT_EQ(events.errors()[1].code, 200);
  EXPECT_TRUE(events.decodes().empty());
}

TEST_F(VisualSearchServiceJobTest, DropsUnspecifiedResultsAndMarksTopLevelModule) {
  const std::string id = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  const std::string body = R"({"queryId":"Q7","quillmark":{"searchResult":[
      {"content":"a","contentType":"PIDN","properties":{},
       "subContent":[{"content":"s","contentType":"PIDN","properties":{}}]},
      {"content":"b","contentType":"Nope","properties":{}},
      {"content":"c","contentType":"BoundingBox","properties":{}}],
    "resultMetadata":{"finalAccumulation":false}}})";
  transport.pushServerResponse(reply(id, 200, body, 12.5));
  ASSERT_EQ(events.decodes().size(), 1u);
  const std::vector<Tovra::ObjectInfo> objects = events.decodes()[0].objects;
  ASSERT_EQ(objects.size(), 2u);
  EXPECT_EQ(objects[0].content, "a");
  EXPECT_EQ(objects[0].contentType, Tovra::PIDN);
  EXPECT_EQ(objects[1].content, "c");
  EXPECT_EQ(static_cast<int>(objects[1].contentType), 10);
  EXPECT_EQ(objects[0].srcObjectModule, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(objects[1].srcObjectModule, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(objects[0].subContents.at(0).srcObjectModule, Tovra::UNSPECIFIED_OBJECT_MOD);
  EXPECT_EQ(events.decodes()[0].metadata.queryID, "Q7");
  EXPECT_EQ(job->lastQueryId(), "Q7");
  EXPECT_EQ(job->lastQueryRoundTripTime(), 12.5);
  EXPECT_EQ(job->state(), Tovra::Finished);

  // An all-unspecified list still reaches didDecode, empty.
  const std::string id2 = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  transport.pushServerResponse(reply(id2, 200, orzavs_test::replyBody("Q8", {"Other"})));
  ASSERT_EQ(events.decodes().size(), 2u);
  EXPECT_TRUE(events.decodes()[1].objects.empty());
}

TEST_F(VisualSearchServiceJobTest, CarriesTheLastQueryIntoTheNextRequest) {
  std::string id = send(makeRecord(32, 32, OrzaVSMobile::GRAY, 0));
  transport.pushServerResponse(reply(id, 200, orzavs_test::replyBody("Q-first"), 1234.5678));
  id = send(makeRecord(32, 32, OrzaVSMobile::GRAY, 90));
  auto sent = transport.sent().back();
  EXPECT_EQ(sent.metadata.at("lastQueryId"), "Q-first");
  EXPECT_EQ(sent.metadata.at("lastQueryRoundTripTime"), "1234.57");
  EXPECT_EQ(sent.metadata.at("orientation"), "180");
  // The parameter document keeps the first frame's rotation.
  EXPECT_NE(sent.params.at("vsearch_params_json").find("\"rotation\":\"90\""), std::string::npos);

  // An error reply empties lastQueryId; the request keeps the entries written before.
  transport.pushServerResponse(reply(id, 503, ""));
  EXPECT_EQ(job->lastQueryId(), "");
  send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  sent = transport.sent().back();
  EXPECT_EQ(sent.metadata.at("lastQueryId"), "Q-first");
}

TEST_F(VisualSearchServiceJobTest, RepliesToAJobNotAwaitingAreIgnored) {
  const std::string id = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->cancel();
  transport.pushServerResponse(reply(id, 200, orzavs_test::replyBody("late")));
  EXPECT_EQ(events.replyCallbacks(), 0u);
  EXPECT_EQ(job->lastQueryId(), "");
  EXPECT_EQ(job->state(), Tovra::Finished);

  // The handler answers only once even when called directly twice.
  send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->handleServerResponse(reply("any", 200, orzavs_test::replyBody("first")));
  job->handleServerResponse(reply("any", 200, orzavs_test::replyBody("second")));
  ASSERT_EQ(events.decodes().size(), 1u);
  EXPECT_EQ(events.decodes()[0].metadata.queryID, "first");
}

TEST_F(VisualSearchServiceJobTest, AReplyPushedWhileTheRequestIsStillBeingSentIsHandled) {
  // A transport that answers before sendServerRequest returns, on the sending thread itself.
  transport.onSend = [this](const Tovra::Server::ServerRequest& request) {
    transport.pushServerResponse(reply(request.id, 200, orzavs_test::replyBody("sync")));
  };
  job->setFrameRecord(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->run();
  ASSERT_EQ(events.decodes().size(), 1u);
  EXPECT_EQ(job->state(), Tovra::Finished);
  job->finishUnlessAwaiting();
  EXPECT_FALSE(job->isBusy());
}

TEST_F(VisualSearchServiceJobTest, ExecutorHandshakeKeepsTheJobBusyUntilSettled) {
  job->markQueued();
  EXPECT_EQ(job->state(), Tovra::Queued);
  EXPECT_TRUE(job->isBusy());
  job->setFrameRecord(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->run();
  EXPECT_EQ(job->state(), Tovra::AwaitingReply);
  // The reply is handled before the executor settles the job: Finished, yet still busy until
  // finishUnlessAwaiting, so nobody hands it a new frame while the worker still holds it.
  transport.pushServerResponse(reply(transport.sent().back().id, 200, orzavs_test::replyBody("q")));
  EXPECT_EQ(job->state(), Tovra::Finished);
  EXPECT_TRUE(job->isBusy());
  job->finishUnlessAwaiting();
  EXPECT_FALSE(job->isBusy());

  // A job awaiting its reply keeps that state through finishUnlessAwaiting.
  job->markQueued();
  job->setFrameRecord(makeRecord(32, 32, OrzaVSMobile::GRAY));
  job->run();
  job->finishUnlessAwaiting();
  EXPECT_EQ(job->state(), Tovra::AwaitingReply);
  EXPECT_TRUE(job->isBusy());
}

TEST_F(VisualSearchServiceJobTest, DestroyedJobIsWithdrawnFromTheDelegate) {
  const std::string id = send(makeRecord(32, 32, OrzaVSMobile::GRAY));
  EXPECT_EQ(transport.pendingCount(), 1u);
  job.reset();
  EXPECT_EQ(transport.pendingCount(), 0u);
  transport.pushServerResponse(reply(id, 200, orzavs_test::replyBody("late")));  // no handler left
  EXPECT_EQ(events.replyCallbacks(), 0u);
}

}  // namespace
