#include "server/ServerDelegate.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>
#include <tuple>

#include "support/Fakes.h"

using namespace orzavs_test;
using Tovra::Server::ServerRequest;
using Tovra::Server::ServerResponse;

TEST(ServerRecordsTest, DefaultsConstructionAndClear) {
  const ServerResponse response;  // code 200, round trip unknown, not compressed
  EXPECT_EQ(std::make_tuple(200, -1.0, false),
            std::make_tuple(response.responseCode, response.roundtripTime, response.compressed));

  uint8_t body[3] = {1, 2, 3};
  const ServerRequest::ParamMap params = {{"a", "b"}};
  ServerRequest request(OrzaVSMobile::ByteArray(body, 3), "id-1", params, params);
  // The bytes are shared, not copied.
  EXPECT_TRUE(request.id == "id-1" && request.metadata == params && request.data.getData() == body);
  RecordingHandler handler;
  request.responseHandler = &handler;
  request.clear();
  EXPECT_TRUE(request.id.empty() && request.params.empty() && request.metadata.empty() &&
              request.data.getData() == nullptr && request.responseHandler == nullptr);
}

TEST(ServerDelegateTest, EachPendingIdIsAnsweredOnceToItsFirstHandler) {
  FakeTransport transport;
  RecordingHandler first, second;
  EXPECT_TRUE(transport.sendServerRequest(makeRequest("dup", &first)));
  transport.sendServerRequest(makeRequest("dup", &second));
  EXPECT_EQ(2u, transport.sent().size());  // both still go to the transport
  EXPECT_EQ(1u, transport.pendingCount());
  for (const char* stray : {"never-sent", "dup ", "DUP"}) transport.pushServerResponse(makeResponse(stray, "x"));
  EXPECT_EQ(0u, first.responses().size());

  transport.pushServerResponse(makeResponse("dup", "first", 503));
  transport.pushServerResponse(makeResponse("dup", "second"));
  ASSERT_EQ(1u, first.responses().size());
  EXPECT_EQ(std::make_pair(std::string("first"), 503),
            std::make_pair(first.responses()[0].responseStr, first.responses()[0].responseCode));
  EXPECT_EQ(std::make_pair(size_t{0}, size_t{0}), std::make_pair(second.responses().size(), transport.pendingCount()));

  // Once answered, the id is free again; a null handler is registered and its reply consumed.
  transport.sendServerRequest(makeRequest("dup", nullptr));
  EXPECT_EQ(1u, transport.pendingCount());
  transport.pushServerResponse(makeResponse("dup"));
  transport.sendServerRequest(makeRequest("dup", &second));
  transport.pushServerResponse(makeResponse("dup"));
  EXPECT_EQ(1u, second.responses().size());

  // A reply pushed by another thread while the transfer is still running is routed.
  transport.onSend = [&](const ServerRequest& request) {
    std::thread([&transport, id = request.id] { transport.pushServerResponse(makeResponse(id, "early")); }).join();
  };
  transport.sendServerRequest(makeRequest("early", &second));
  ASSERT_EQ(2u, second.responses().size());
  EXPECT_EQ("early", second.responses()[1].responseStr);
  transport.onSend = nullptr;
  transport.result = false;  // a failed transfer keeps its registration
  EXPECT_FALSE(transport.sendServerRequest(makeRequest("failing", &second)));
  transport.pushServerResponse(makeResponse("failing", "", 0));
  EXPECT_EQ(3u, second.responses().size());
}

TEST(ServerDelegateTest, ForgetDropsOnlyThatHandlerAndWorksFromItsOwnCallback) {
  FakeTransport transport;
  RecordingHandler gone, kept;
  transport.sendServerRequest(makeRequest("a", &gone));
  transport.sendServerRequest(makeRequest("b", &kept));
  transport.forgetHandler(&gone);
  for (const char* id : {"a", "b"}) transport.pushServerResponse(makeResponse(id));
  EXPECT_EQ(std::make_pair(size_t{0}, size_t{1}), std::make_pair(gone.responses().size(), kept.responses().size()));

  RecordingHandler handler;
  handler.onResponse = [&](const ServerResponse& response) {
    if (response.id == "step-1") transport.sendServerRequest(makeRequest("step-2", &handler));
    transport.forgetHandler(&handler);  // from its own delivery: must not wait for itself
  };
  transport.sendServerRequest(makeRequest("step-1", &handler));
  transport.pushServerResponse(makeResponse("step-1"));
  EXPECT_EQ(0u, transport.pendingCount());  // step-2 was forgotten inside the callback
  transport.pushServerResponse(makeResponse("step-2"));
  EXPECT_EQ(1u, handler.responses().size());

  // A throwing handler leaves no delivery mark behind: forgetting it does not wait forever.
  handler.onResponse = [](const ServerResponse&) { throw std::runtime_error("handler failed"); };
  transport.sendServerRequest(makeRequest("t", &handler));
  EXPECT_THROW(transport.pushServerResponse(makeResponse("t")), std::runtime_error);
  transport.forgetHandler(&handler);
}
