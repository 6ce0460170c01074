#include "engine/FrameRecord.h"

#include <gtest/gtest.h>

#include <memory>
#include <numeric>
#include <tuple>
#include <vector>

#include "engine/FrameRecordManager.h"
#include "support/StdoutCapture.h"

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using Tovra::FrameRecord;
using Tovra::FrameRecordManager;

namespace {

ImageBuffer geometry(OrzaVSMobile::ImageFormat format, int32_t width, int32_t height, int32_t widthStep) {
  return ImageBuffer(0, format, width, height, widthStep, 1, nullptr);
}

std::vector<uint8_t> pattern(size_t n) {
  std::vector<uint8_t> bytes(n);
  std::iota(bytes.begin(), bytes.end(), static_cast<uint8_t>(1));
  return bytes;
}

}  // namespace

// Takes all five records of `pool`, expecting ids 0..4, and marks each with its `width`.
void takeAll(FrameRecordManager& pool, std::vector<std::shared_ptr<FrameRecord>>& held, int expectedWidth) {
  for (uint64_t i = 0; i < 5; ++i) {
    held.push_back(pool.getNewSlot());
    ASSERT_NE(nullptr, held.back());
    EXPECT_EQ(i, held.back()->frameId);
    EXPECT_EQ(expectedWidth, held.back()->width);  // a renewed record
    held.back()->width = 100 + static_cast<int>(i);
  }
  EXPECT_EQ(nullptr, pool.getNewSlot());  // the sixth finds nothing free
}

TEST(FrameRecordManagerTest, HandsOutFreeRecordsWithIncreasingIdsAndRestartsUpToAHeldOne) {
  FrameRecordManager pool(5);
  std::vector<std::shared_ptr<FrameRecord>> held;
  ASSERT_NO_FATAL_FAILURE(takeAll(pool, held, 0));
  held[2]->timeStamp = 12.5;
  FrameRecord* third = held[2].get();
  held[2].reset();
  std::shared_ptr<FrameRecord> again = pool.getNewSlot();  // the same record, the next id
  ASSERT_EQ(third, again.get());
  EXPECT_EQ(5u, again->frameId);
  EXPECT_EQ(-1.0, again->timeStamp);
  EXPECT_EQ(102, again->width);  // other fields are kept

  std::weak_ptr<FrameRecord> firstOld = held[0];
  std::shared_ptr<FrameRecord> second = held[1];
  held.clear();
  again.reset();
  {
    orzavs_test::StdoutCapture out;
    EXPECT_FALSE(pool.restart());
    EXPECT_EQ("Unable to restart frame record manager () as some frame(s) are still outstanding\n", out.text());
  }
  EXPECT_TRUE(firstOld.expired());  // slot 1 renewed; the slots after the held one are kept
  std::shared_ptr<FrameRecord> renewed = pool.getNewSlot();
  EXPECT_EQ(6u, renewed->frameId);  // numbering not reset
  EXPECT_EQ(0, renewed->width);
  EXPECT_EQ(102, pool.getNewSlot()->width);

  second.reset();
  renewed.reset();
  orzavs_test::StdoutCapture out;
  EXPECT_TRUE(pool.restart());  // everything free: renewed and renumbered
  EXPECT_EQ("", out.text());
  takeAll(pool, held, 0);
}

TEST(FrameRecordTest, LentBuffersRoundRowsFirstAndAreTakenWithoutACopy) {
  FrameRecord record;
  ImageBuffer odd = geometry(OrzaVSMobile::NV21, 640, 481, 640);
  ASSERT_TRUE(record.lendBuffer(odd));
  EXPECT_EQ(461440, odd.allocLen);  // (481*3)/2 = 721 rows of 640 bytes
  ExtraFrameData extra;
  extra.timeStamp = 3.25;
  extra.screenOrient = 90;
  EXPECT_FALSE(record.setSourceImage(odd, extra));  // expects 640*481*3/2 = 461760 bytes
  EXPECT_EQ(3.25, record.timeStamp);  // time and geometry are taken before the check
  EXPECT_EQ(481, record.height);
  EXPECT_EQ(0, record.screenOrient);  // the rest is not

  ImageBuffer even = geometry(OrzaVSMobile::I420, 64, 48, 80);
  ASSERT_TRUE(record.lendBuffer(even));
  ASSERT_EQ(80 * 72, even.allocLen);
  const std::vector<uint8_t> frame = pattern(80 * 72);
  ASSERT_EQ(80 * 72, even.fillBuffer(frame.data(), 80 * 72));
  const uint8_t* storage = record.pixels.data();
  extra.flat = true;
  ASSERT_TRUE(record.setSourceImage(even, extra));
  EXPECT_EQ(storage, record.pixels.data());
  EXPECT_EQ(frame, record.pixels);
  EXPECT_EQ(std::make_tuple(80, int{OrzaVSMobile::I420}, 90, 1),
            std::make_tuple(record.widthStep, record.format, record.screenOrient, record.flat));

  ImageBuffer grey = geometry(OrzaVSMobile::GRAY, 10, 7, 12);
  ASSERT_EQ(50, grey.allocateBuffer(50));  // its own block is freed normally (LeakSanitizer)
  ASSERT_TRUE(record.lendBuffer(grey));
  EXPECT_EQ(84, grey.allocLen);
  EXPECT_TRUE(record.setSourceImage(grey, ExtraFrameData()));
}

TEST(FrameRecordTest, LendingRefusesBadGeometryAndBoundsTheFill) {
  FrameRecord record;
  uint8_t previous[8] = {0};
  for (const ImageBuffer& bad : {geometry(OrzaVSMobile::NV21, 8, -2, 8), geometry(OrzaVSMobile::GRAY, 8, 4, -8),
                                 geometry(OrzaVSMobile::NV12, 65536, 65536, 65536)}) {
    ImageBuffer buffer = bad;
    buffer.data = previous;  // whatever the buffer pointed at before is dropped
    buffer.allocLen = 5;
    EXPECT_FALSE(record.lendBuffer(buffer));
    EXPECT_TRUE(buffer.data == nullptr && buffer.allocLen == 0);
  }
  ImageBuffer buffer = geometry(OrzaVSMobile::GRAY, 4, 4, 4);
  ASSERT_TRUE(record.lendBuffer(buffer));
  buffer.allocLen = 1000;  // forged: the fill still stops at the record's 16 bytes
  EXPECT_EQ(16, buffer.fillBuffer(pattern(1000).data(), 1000));
  buffer.releaseBuffer();  // must not free the record's storage
  EXPECT_EQ(16u, record.pixels.size());
}

TEST(FrameRecordTest, CopiesSourcesThatHoldTheirGeometryAndRefusesTheRest) {
  FrameRecord record;
  const ExtraFrameData extra;
  struct Case { OrzaVSMobile::ImageFormat format; int width, height, stride; size_t bytes; };
  // YUV frames take widthStep * height * 3 / 2 bytes, every other layout widthStep * height.
  for (const Case& c : {Case{OrzaVSMobile::NV21, 16, 12, 16, 288}, Case{OrzaVSMobile::GRAY, 10, 5, 10, 50},
                        Case{OrzaVSMobile::RGB, 10, 4, 30, 120}}) {
    std::vector<uint8_t> pixels = pattern(c.bytes);
    ImageBuffer image(0, c.format, c.width, c.height, c.stride, 3, pixels.data());
    ASSERT_TRUE(record.setSourceImage(image, extra));
    EXPECT_EQ(pixels, record.pixels);
  }
  std::vector<uint8_t> pixels(64, 1);
  EXPECT_FALSE(record.setSourceImage(ImageBuffer(0, OrzaVSMobile::GRAY, 8, 8, 8, 1, nullptr), extra));
  EXPECT_FALSE(record.setSourceImage(ImageBuffer(0, OrzaVSMobile::GRAY, 8, -8, 8, 1, pixels.data()), extra));
  // An own block shorter than the geometry says would be overrun.
  ImageBuffer owned(0, OrzaVSMobile::NV21, 8, 8, 8, 1, nullptr);
  ASSERT_EQ(95, owned.allocateBuffer(95));  // NV21 8x8 needs 96 bytes
  EXPECT_FALSE(record.setSourceImage(owned, extra));
  ASSERT_EQ(96, owned.allocateBuffer(96));
  EXPECT_TRUE(record.setSourceImage(owned, extra));
  owned.releaseBuffer();  // a released buffer's stale pointer is never read
  EXPECT_FALSE(record.setSourceImage(owned, extra));
  EXPECT_TRUE(record.setSourceImage(ImageBuffer(0, OrzaVSMobile::GRAY, 0, 0, 0, 1, nullptr), extra));
  EXPECT_TRUE(record.pixels.empty());
}
