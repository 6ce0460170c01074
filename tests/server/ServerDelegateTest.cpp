#include "server/ServerDelegate.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>

#include "support/RecordingTransport.h"

using orzavs_test::makeResponse;
using orzavs_test::RecordingHandler;
using orzavs_test::RecordingTransport;
using Tovra::Server::ServerRequest;
using Tovra::Server::ServerResponse;

namespace {

ServerRequest makeRequest(const std::string& id, Tovra::Server::ServerResponseHandler* handler) {
  ServerRequest request;
  request.id = id;
  request.responseHandler = handler;
  return request;
}

}  // namespace

TEST(ServerRecordsTest, ResponseDefaults) {
  const ServerResponse response;
  EXPECT_FALSE(response.compressed);
  EXPECT_EQ(200, response.responseCode);
  EXPECT_TRUE(response.id.empty());
  EXPECT_TRUE(response.responseStr.empty());
  EXPECT_EQ(-1.0, response.roundtripTime);
}

TEST(ServerRecordsTest, RequestConstructionAndClear) {
  const ServerRequest empty;
  EXPECT_TRUE(empty.id.empty());
  EXPECT_TRUE(empty.params.empty());
  EXPECT_TRUE(empty.metadata.empty());
  EXPECT_EQ(nullptr, empty.data.getData());
  EXPECT_EQ(nullptr, empty.responseHandler);

  uint8_t body[3] = {1, 2, 3};
  const ServerRequest::ParamMap params = {{"vsearch_params_json", "{}"}, {"a", "b"}};
  const ServerRequest::ParamMap metadata = {{"m", "n"}};
  ServerRequest request(OrzaVSMobile::ByteArray(body, 3), "id-1", params, metadata);
  EXPECT_EQ("id-1", request.id);
  EXPECT_EQ(params, request.params);
  EXPECT_EQ(metadata, request.metadata);
  EXPECT_EQ(body, request.data.getData());  // the bytes are shared, not copied
  EXPECT_EQ(3, request.data.getLength());
  EXPECT_EQ(nullptr, request.responseHandler);

  const ServerRequest bodyOnly(OrzaVSMobile::ByteArray(body, 3), "id-2");
  EXPECT_TRUE(bodyOnly.params.empty());
  EXPECT_TRUE(bodyOnly.metadata.empty());

  RecordingHandler handler;
  request.responseHandler = &handler;
  request.clear();
  EXPECT_TRUE(request.id.empty());
  EXPECT_TRUE(request.params.empty());
  EXPECT_TRUE(request.metadata.empty());
  EXPECT_EQ(nullptr, request.data.getData());
  EXPECT_EQ(0, request.data.getLength());
  EXPECT_EQ(nullptr, request.responseHandler);
  EXPECT_EQ(1, body[0]);
}

TEST(ServerDelegateTest, ResponseReachesItsHandlerOnceAndUnknownIdsAreIgnored) {
  RecordingTransport transport;
  RecordingHandler handler;
  EXPECT_TRUE(transport.sendServerRequest(makeRequest("req-1", &handler)));
  ASSERT_EQ(1u, transport.sentCount());
  EXPECT_EQ("req-1", transport.sent()[0].id);
  EXPECT_EQ(&handler, transport.sent()[0].handler);
  EXPECT_EQ(1u, transport.pendingCount());

  transport.pushServerResponse(makeResponse("never-sent", "x"));
  transport.pushServerResponse(makeResponse("req-1 ", "x"));  // ids compare exactly
  transport.pushServerResponse(makeResponse("REQ-1", "x"));
  EXPECT_EQ(0u, handler.count());
  EXPECT_EQ(1u, transport.pendingCount());

  transport.pushServerResponse(makeResponse("req-1", "first", 503));
  transport.pushServerResponse(makeResponse("req-1", "second"));
  ASSERT_EQ(1u, handler.count());
  EXPECT_EQ("first", handler.responses()[0].responseStr);
  EXPECT_EQ(503, handler.responses()[0].responseCode);
  EXPECT_EQ(0u, transport.pendingCount());
}

TEST(ServerDelegateTest, DuplicatePendingIdKeepsTheFirstHandler) {
  RecordingTransport transport;
  RecordingHandler first;
  RecordingHandler second;
  transport.sendServerRequest(makeRequest("dup", &first));
  transport.sendServerRequest(makeRequest("dup", &second));
  EXPECT_EQ(2u, transport.sentCount());  // both still go to the transport
  EXPECT_EQ(1u, transport.pendingCount());
  transport.pushServerResponse(makeResponse("dup"));
  EXPECT_EQ(1u, first.count());
  EXPECT_EQ(0u, second.count());

  // Once answered, the id may be used again with another handler.
  transport.sendServerRequest(makeRequest("dup", &second));
  transport.pushServerResponse(makeResponse("dup"));
  EXPECT_EQ(1u, first.count());
  EXPECT_EQ(1u, second.count());
}

TEST(ServerDelegateTest, NullHandlerIsRegisteredAndItsResponseConsumed) {
  RecordingTransport transport;
  transport.sendServerRequest(makeRequest("nobody", nullptr));
  EXPECT_EQ(1u, transport.pendingCount());
  transport.pushServerResponse(makeResponse("nobody"));
  EXPECT_EQ(0u, transport.pendingCount());

  // A later request with the same id and a real handler is a fresh registration.
  RecordingHandler handler;
  transport.sendServerRequest(makeRequest("nobody", &handler));
  transport.pushServerResponse(makeResponse("nobody"));
  EXPECT_EQ(1u, handler.count());
}

TEST(ServerDelegateTest, FailedTransferKeepsTheRegistration) {
  RecordingTransport transport;
  transport.result = false;
  RecordingHandler handler;
  EXPECT_FALSE(transport.sendServerRequest(makeRequest("failing", &handler)));
  EXPECT_EQ(1u, transport.pendingCount());
  transport.pushServerResponse(makeResponse("failing", "", 0));
  ASSERT_EQ(1u, handler.count());
  EXPECT_EQ(0, handler.responses()[0].responseCode);
}

TEST(ServerDelegateTest, ReplyArrivingDuringTheTransferIsRouted) {
  RecordingTransport transport;
  RecordingHandler handler;
  // The transport answers from another thread before sendServerRequestImpl returns.
  transport.onSend = [&](const ServerRequest& request) {
    const std::string id = request.id;
    std::thread replier([&transport, id] { transport.pushServerResponse(makeResponse(id, "ok")); });
    replier.join();
  };
  transport.sendServerRequest(makeRequest("early", &handler));
  ASSERT_EQ(1u, handler.count());
  EXPECT_EQ("ok", handler.responses()[0].responseStr);
  EXPECT_EQ(0u, transport.pendingCount());
}

TEST(ServerDelegateTest, HandlerMaySendAndForgetFromItsCallback) {
  RecordingTransport transport;
  RecordingHandler handler;
  handler.onResponse = [&](const ServerResponse& response) {
    if (response.id == "step-1") transport.sendServerRequest(makeRequest("step-2", &handler));
    transport.forgetHandler(&handler);  // from its own delivery: must not wait for itself
  };
  transport.sendServerRequest(makeRequest("step-1", &handler));
  transport.pushServerResponse(makeResponse("step-1"));
  EXPECT_EQ(2u, transport.sentCount());
  EXPECT_EQ(1u, handler.count());
  EXPECT_EQ(0u, transport.pendingCount());  // step-2 was forgotten inside the callback
  transport.pushServerResponse(makeResponse("step-2"));
  EXPECT_EQ(1u, handler.count());
}

TEST(ServerDelegateTest, ForgetHandlerDropsOnlyThatHandlersEntries) {
  RecordingTransport transport;
  RecordingHandler gone;
  RecordingHandler kept;
  transport.sendServerRequest(makeRequest("a", &gone));
  transport.sendServerRequest(makeRequest("b", &kept));
  transport.sendServerRequest(makeRequest("c", &gone));
  transport.forgetHandler(&gone);
  EXPECT_EQ(1u, transport.pendingCount());
  transport.pushServerResponse(makeResponse("a"));
  transport.pushServerResponse(makeResponse("b"));
  transport.pushServerResponse(makeResponse("c"));
  EXPECT_EQ(0u, gone.count());
  EXPECT_EQ(1u, kept.count());
  transport.forgetHandler(nullptr);  // nothing pending for it: returns at once
}

TEST(ServerDelegateTest, ThrowingHandlerLeavesTheDelegateUsable) {
  RecordingTransport transport;
  RecordingHandler handler;
  handler.onResponse = [](const ServerResponse&) { throw std::runtime_error("handler failed"); };
  transport.sendServerRequest(makeRequest("t", &handler));
  EXPECT_THROW(transport.pushServerResponse(makeResponse("t")), std::runtime_error);
  // The delivery mark was removed: forgetting the handler does not wait forever.
  transport.forgetHandler(&handler);
  EXPECT_EQ(1u, handler.count());
}
