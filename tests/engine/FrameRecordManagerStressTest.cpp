#include <gtest/gtest.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <set>
#include <thread>
#include <vector>

#include "engine/FrameRecordManager.h"

using Tovra::FrameRecord;
using Tovra::FrameRecordManager;

// The engine's pattern: one thread takes records from the pool and fills them, other threads
// (jobs) read them and drop their reference when done. A record must never be handed out
// while someone else still holds it, every handed-out id is unique, and the hand-out must be
// ordered after the previous holder's last use (ThreadSanitizer checks that part).
TEST(FrameRecordManagerStressTest, RecordsReleasedOnOtherThreadsAreReusedSafely) {
  constexpr int kFrames = 4000;
  FrameRecordManager pool(5);

  std::mutex queueMutex;
  std::vector<std::shared_ptr<FrameRecord>> handedOver;
  std::atomic<bool> done{false};
  std::atomic<int> consumed{0};
  std::atomic<int> mismatches{0};

  auto consumer = [&] {
    for (;;) {
      std::shared_ptr<FrameRecord> record;
      {
        std::lock_guard<std::mutex> lock(queueMutex);
        if (!handedOver.empty()) {
          record = std::move(handedOver.back());
          handedOver.pop_back();
        }
      }
      if (!record) {
        if (done.load()) return;
        std::this_thread::yield();
        continue;
      }
      // Read everything the producer wrote; the pixels carry the frame id in every byte.
      const uint8_t expected = static_cast<uint8_t>(record->frameId);
      for (uint8_t byte : record->pixels) {
        if (byte != expected) {
          mismatches.fetch_add(1);
          break;
        }
      }
      if (record->width != static_cast<int32_t>(record->frameId % 1000)) mismatches.fetch_add(1);
      record.reset();  // the job lets go; the pool may hand it out again at once
      consumed.fetch_add(1);
    }
  };
  std::thread consumerA(consumer);
  std::thread consumerB(consumer);

  std::set<uint64_t> ids;
  int produced = 0;
  while (produced < kFrames) {
    std::shared_ptr<FrameRecord> record = pool.getNewSlot();
    if (!record) {
      std::this_thread::yield();
      continue;
    }
    ASSERT_TRUE(ids.insert(record->frameId).second) << "frame id handed out twice";
    record->width = static_cast<int32_t>(record->frameId % 1000);
    record->pixels.assign(64 + produced % 64, static_cast<uint8_t>(record->frameId));
    {
      std::lock_guard<std::mutex> lock(queueMutex);
      handedOver.push_back(std::move(record));
    }
    ++produced;
  }
  done.store(true);
  consumerA.join();
  consumerB.join();

  EXPECT_EQ(kFrames, consumed.load());
  EXPECT_EQ(0, mismatches.load());
  EXPECT_EQ(static_cast<uint64_t>(kFrames - 1), *ids.rbegin());
  EXPECT_TRUE(pool.restart());
}
