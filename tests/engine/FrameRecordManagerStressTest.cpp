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

// Two threads take records from the pool and fill them, two others (jobs) read them and drop
// their reference when done. A record must never be handed out while someone else still holds
// it, every handed-out id is unique, and each hand-out must be ordered after the previous
// holder's last use and after the other taker's hand-outs (ThreadSanitizer checks that part).
TEST(FrameRecordManagerStressTest, RecordsReleasedOnOtherThreadsAreReusedSafely) {
  constexpr int kFramesEach = 2000;
  FrameRecordManager pool(5);
  std::mutex queueMutex;
  std::vector<std::shared_ptr<FrameRecord>> handedOver;
  std::atomic<int> producing{2}, consumed{0}, mismatches{0};

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
        if (producing.load() == 0) return;
        std::this_thread::yield();
        continue;
      }
      // The pixels carry the frame id in every byte.
      for (uint8_t byte : record->pixels) mismatches += byte != static_cast<uint8_t>(record->frameId);
      if (record->width != static_cast<int32_t>(record->frameId % 1000)) ++mismatches;
      record.reset();  // the job lets go; the pool may hand it out again at once
      ++consumed;
    }
  };
  std::vector<uint64_t> ids[2];
  auto producer = [&](std::vector<uint64_t>& mine) {
    while (mine.size() < kFramesEach) {
      std::shared_ptr<FrameRecord> record = pool.getNewSlot();
      if (!record) {
        std::this_thread::yield();
        continue;
      }
      mine.push_back(record->frameId);
      record->width = static_cast<int32_t>(record->frameId % 1000);
      record->pixels.assign(64 + mine.size() % 64, static_cast<uint8_t>(record->frameId));
      std::lock_guard<std::mutex> lock(queueMutex);
      handedOver.push_back(std::move(record));
    }
    --producing;
  };
  std::thread threads[] = {std::thread(consumer), std::thread(consumer), std::thread(producer, std::ref(ids[0])),
                           std::thread(producer, std::ref(ids[1]))};
  for (std::thread& t : threads) t.join();

  std::set<uint64_t> all(ids[0].begin(), ids[0].end());
  all.insert(ids[1].begin(), ids[1].end());
  EXPECT_EQ(2u * kFramesEach, all.size()) << "a frame id was handed out twice";
  EXPECT_EQ(2u * kFramesEach - 1, *all.rbegin());
  EXPECT_EQ(2 * kFramesEach, consumed.load());
  EXPECT_EQ(0, mismatches.load());
  EXPECT_TRUE(pool.restart());
}
