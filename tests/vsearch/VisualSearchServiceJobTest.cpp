#include "vsearch/VisualSearchServiceJob.h"

#include <memory>
#include <regex>
#include <string>

#include <gtest/gtest.h>

#include "support/Fakes.h"
#include "support/StdoutCapture.h"
#include "vsearch/JpegEncoder.h"
#include "vsearch/JpegTestSupport.h"

namespace {

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
    const size_t before = transport.sentCount();
    job->setFrameRecord(record);
    job->run();
    EXPECT_EQ(transport.sentCount(), before + 1);
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
    EXPECT_TRUE(decoded.ok && decoded.width == 40 && decoded.height == 24) << format;
    EXPECT_EQ(decoded.components, format == OrzaVSMobile::GRAY ? 1 : 3);
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
  StdoutCapture printed;
  for (const auto& bad : {shortYuv, shortPacked}) {
    job->setFrameRecord(bad);
    job->run();
    EXPECT_EQ(job->state(), Tovra::Finished);
  }
  EXPECT_EQ(printed.text(),
            "Skipped frame 7: its pixels do not cover a 32x32 image\n"
            "Skipped frame 7: its pixels do not cover a 32x32 image\n");
  EXPECT_EQ(transport.sentCount(), 0u);
}

TEST_F(JobTest, ReportsErrorsAndFilteredResultsAndCarriesTheQueryOn) {
  const struct { int code; const char* body; Tovra::Server::ResponseStatus status; } failures[] = {
      {404, "not found", Tovra::Server::RESPONSE_SERVER_ERROR},
      {200, "{\"queryId\":", Tovra::Server::RESPONSE_PARSE_ERROR},
      {201, "{}", Tovra::Server::RESPONSE_SERVER_ERROR}};  // only 200 is success
  StdoutCapture printed;
  std::string lines;
  for (const auto& f : failures) {
    transport.pushServerResponse(makeResponse(sendGray(), f.body, f.code));
    lines += std::string("VSS SERVER ERROR: response: ") + f.body + "\n";
  }
  EXPECT_EQ(printed.text(), lines);
  ASSERT_EQ(events.errors().size(), 3u);
  for (size_t i = 0; i < 3; ++i) {
    EXPECT_EQ(events.errors()[i].module, Tovra::VISUAL_SEARCH_SERVICE_MOD);
    EXPECT_EQ(events.errors()[i].status, failures[i].status);
    EXPECT_EQ(events.errors()[i].code, failures[i].code);
  }

  const std::string id = sendGray();
  std::string body = replyBody("Q7", {"PIDN", "Nope", "BoundingBox"});
  body.replace(body.find("\"properties\":{}}"), 16, "\"properties\":{},\"subContent\":[{\"content\":\"s\","
                                                     "\"contentType\":\"PIDN\",\"properties\":{}}]}");
  transport.pushServerResponse(makeResponse(id, body, 200, 1234.5678));
  ASSERT_EQ(events.decoded().size(), 1u);
  const auto objects = events.decoded()[0];
  ASSERT_EQ(objects.size(), 2u);  // 11 dropped, 6 and 10 kept in order
  EXPECT_EQ(objects[0].contentType, Tovra::PIDN);
  EXPECT_EQ(static_cast<int>(objects[1].contentType), 10);
  for (const auto& object : objects) EXPECT_EQ(object.srcObjectModule, Tovra::VISUAL_SEARCH_SERVICE_MOD);
  EXPECT_EQ(objects[0].subContents.at(0).srcObjectModule, Tovra::UNSPECIFIED_OBJECT_MOD);
  EXPECT_EQ(job->state(), Tovra::Finished);

  sendGray(90);
  const auto sent = transport.sent().back();
  EXPECT_EQ(sent.metadata.at("lastQueryId"), "Q7");
  EXPECT_EQ(sent.metadata.at("lastQueryRoundTripTime"), "1234.57");
  EXPECT_EQ(sent.metadata.at("orientation"), "180");
  EXPECT_NE(sent.params.at("vsearch_params_json").find("\"rotation\":\"90\""), std::string::npos);
  transport.pushServerResponse(makeResponse(sent.id, replyBody("Q8", {"Other"})));
  ASSERT_EQ(events.decoded().size(), 2u);
  EXPECT_TRUE(events.decoded()[1].empty());  // reported even when nothing is left
}

TEST_F(JobTest, OnlyAnAwaitingLiveJobTakesAReplyAndOnlyOnce) {
  std::string id = sendGray();
  job->cancel();
  transport.pushServerResponse(makeResponse(id, replyBody("late")));
  EXPECT_EQ(events.replyCallbacks(), 0u);
  EXPECT_EQ(job->lastQueryId(), "");
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
  EXPECT_EQ(events.decoded().size(), 1u);
  EXPECT_EQ(job->state(), Tovra::Finished);
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
