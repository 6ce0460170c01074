#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <map>
#include <memory>
#include <string>
#include <thread>

#include "support/Fakes.h"

using namespace orzavs_test;
using Tovra::Server::ServerResponse;

// Requests are sent on one thread while two others push every reply, as a job on the worker
// thread and the client's network threads do: each id reaches its handler exactly once, however
// the pushes interleave. The threads keep in step through relaxed counters, which order nothing:
// only the delegate's own lock may order its table.
TEST(ServerDelegateConcurrencyTest, SendsAndRacingPushesOnOtherThreadsDeliverEachIdOnce) {
  constexpr size_t kIds = 600;
  FakeTransport transport;
  RecordingHandler handler;
  std::atomic<size_t> sent{0}, pushed[2]{};
  std::thread sender([&] {
    for (size_t i = 0; i < kIds; ++i) {
      while (i > std::min(pushed[0].load(std::memory_order_relaxed), pushed[1].load(std::memory_order_relaxed)) + 4) {
        std::this_thread::yield();
      }
      transport.sendServerRequest(makeRequest("r" + std::to_string(i), &handler));
      sent.store(i + 1, std::memory_order_relaxed);
    }
  });
  auto pusher = [&](std::atomic<size_t>& mine) {
    for (size_t next = 0; next < kIds; std::this_thread::yield()) {
      for (const size_t available = sent.load(std::memory_order_relaxed); next < available; ++next) {
        transport.pushServerResponse(makeResponse("r" + std::to_string(next)));
        mine.store(next + 1, std::memory_order_relaxed);
      }
    }
  };
  std::thread first(pusher, std::ref(pushed[0])), second(pusher, std::ref(pushed[1]));
  for (std::thread* t : {&sender, &first, &second}) t->join();
  std::map<std::string, int> deliveries;
  for (const ServerResponse& response : handler.responses()) ++deliveries[response.id];
  EXPECT_EQ(kIds, deliveries.size());
  for (const auto& d : deliveries) ASSERT_EQ(1, d.second) << d.first;
  EXPECT_EQ(0u, transport.pendingCount());
}

// forgetHandler must not return while a delivery to that handler is still running on another
// thread: only then may the handler be destroyed.
TEST(ServerDelegateConcurrencyTest, ForgetHandlerWaitsForAnInFlightDelivery) {
  FakeTransport transport;
  Gate entered, release;
  std::atomic<bool> deliveryDone{false}, forgotten{false};
  RecordingHandler handler;
  handler.onResponse = [&](const ServerResponse&) {
    entered.open();
    release.wait();
    deliveryDone.store(true);
  };
  transport.sendServerRequest(makeRequest("slow", &handler));
  std::thread pusher([&] { transport.pushServerResponse(makeResponse("slow")); });
  ASSERT_TRUE(entered.wait());
  bool doneWhenForgotten = false;
  std::thread forgetter([&] {
    transport.forgetHandler(&handler);
    doneWhenForgotten = deliveryDone.load();
    forgotten.store(true);
  });
  std::this_thread::sleep_for(std::chrono::milliseconds(50));  // room for an early return
  EXPECT_FALSE(forgotten.load());
  release.open();
  forgetter.join();
  pusher.join();
  EXPECT_TRUE(doneWhenForgotten);
}

// The pattern a job uses on destruction: forget the handler, then free it, while a late reply
// for it is being pushed on another thread. ASan/TSan catch a delivery into freed memory.
TEST(ServerDelegateConcurrencyTest, HandlerDestroyedAfterForgetWhileRepliesRace) {
  FakeTransport transport;
  for (int round = 0; round < 300; ++round) {
    auto handler = std::make_unique<RecordingHandler>();
    std::atomic<int> touched{0};
    handler->onResponse = [&touched](const ServerResponse&) { touched.fetch_add(1); };
    const std::string id = "late-" + std::to_string(round);
    transport.sendServerRequest(makeRequest(id, handler.get()));
    std::thread pusher([&transport, id] { transport.pushServerResponse(makeResponse(id)); });
    if (round % 3 == 0) std::this_thread::yield();
    transport.forgetHandler(handler.get());
    handler.reset();
    pusher.join();
    EXPECT_LE(touched.load(), 1);
  }
  EXPECT_EQ(0u, transport.pendingCount());
}
