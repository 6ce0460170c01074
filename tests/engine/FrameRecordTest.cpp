#include "engine/FrameRecord.h"

#include <gtest/gtest.h>

#include <memory>
#include <numeric>
#include <vector>

#include "engine/FrameRecordManager.h"
#include "support/StdoutCapture.h"

using OrzaVSMobile::ExtraFrameData;
using OrzaVSMobile::ImageBuffer;
using Tovra::FrameRecord;
using Tovra::FrameRecordManager;

namespace {

const char kOutstanding[] =
    "Unable to restart frame record manager () as some frame(s) are still outstanding";

ImageBuffer geometry(OrzaVSMobile::ImageFormat format, int32_t width, int32_t height,
                     int32_t widthStep) {
  return ImageBuffer(0, format, width, height, widthStep, 1, nullptr);
}

std::vector<uint8_t> pattern(size_t n) {
  std::vector<uint8_t> bytes(n);
  std::iota(bytes.begin(), bytes.end(), static_cast<uint8_t>(1));
  return bytes;
}

}  // namespace

TEST(FrameRecordManagerTest, HandsOutFreeRecordsWithIncreasingIds) {
  FrameRecordManager pool(5);
  std::vector<std::shared_ptr<FrameRecord>> held;
  for (uint64_t i = 0; i < 5; ++i) {
    held.push_back(pool.getNewSlot());
    ASSERT_NE(nullptr, held.back());
    EXPECT_EQ(i, held.back()->frameId);
    EXPECT_EQ(-1.0, held.back()->timeStamp);
  }
  EXPECT_EQ(nullptr, pool.getNewSlot());  // the sixth finds nothing free
  for (size_t i = 0; i < 5; ++i) {
    for (size_t j = i + 1; j < 5; ++j) EXPECT_NE(held[i].get(), held[j].get());
  }

  // The third comes back as the same record with the next id; its other fields are kept.
  held[2]->timeStamp = 12.5;
  held[2]->width = 321;
  held[2]->pixels.assign(10, 7);
  FrameRecord* third = held[2].get();
  held[2].reset();
  std::shared_ptr<FrameRecord> again = pool.getNewSlot();
  ASSERT_EQ(third, again.get());
  EXPECT_EQ(5u, again->frameId);
  EXPECT_EQ(-1.0, again->timeStamp);
  EXPECT_EQ(321, again->width);
  EXPECT_EQ(std::vector<uint8_t>(10, 7), again->pixels);
  EXPECT_EQ(nullptr, pool.getNewSlot());
}

TEST(FrameRecordManagerTest, RestartStopsAtTheFirstOutstandingRecord) {
  FrameRecordManager pool(5);
  std::vector<std::shared_ptr<FrameRecord>> held;
  for (int i = 0; i < 5; ++i) {
    held.push_back(pool.getNewSlot());
    held.back()->width = 100 + i;
  }
  std::weak_ptr<FrameRecord> firstOld = held[0];
  std::weak_ptr<FrameRecord> thirdOld = held[2];
  std::shared_ptr<FrameRecord> second = held[1];
  held.clear();

  {
    orzavs_test::StdoutCapture out;
    EXPECT_FALSE(pool.restart());
    EXPECT_EQ(std::string(kOutstanding) + "\n", out.text());
  }
  EXPECT_TRUE(firstOld.expired());    // slot 1 renewed: the pool let the old record go
  EXPECT_FALSE(thirdOld.expired());   // slots after the held one kept their records

  std::shared_ptr<FrameRecord> renewed = pool.getNewSlot();
  EXPECT_EQ(5u, renewed->frameId);  // numbering not reset
  EXPECT_EQ(0, renewed->width);     // a fresh record
  std::shared_ptr<FrameRecord> kept = pool.getNewSlot();
  EXPECT_EQ(thirdOld.lock(), kept);
  EXPECT_EQ(6u, kept->frameId);
  EXPECT_EQ(102, kept->width);
}

TEST(FrameRecordManagerTest, RestartWithEverythingFreeRenewsAndRenumbers) {
  FrameRecordManager pool(3);
  {
    std::shared_ptr<FrameRecord> a = pool.getNewSlot();
    std::shared_ptr<FrameRecord> b = pool.getNewSlot();
    a->pixels.assign(100, 1);
    b->height = 9;
  }
  orzavs_test::StdoutCapture out;
  EXPECT_TRUE(pool.restart());
  EXPECT_EQ("", out.text());
  for (uint64_t i = 0; i < 3; ++i) {
    std::shared_ptr<FrameRecord> record = pool.getNewSlot();
    EXPECT_EQ(i, record->frameId);
    EXPECT_TRUE(record->pixels.empty());
    EXPECT_EQ(0, record->height);
  }
}

TEST(FrameRecordTest, OddHeightYuvLentBufferDoesNotMatchTheSourceSize) {
  FrameRecord record;
  ImageBuffer buffer = geometry(OrzaVSMobile::NV21, 640, 481, 640);
  ASSERT_TRUE(record.lendBuffer(buffer));
  EXPECT_EQ(461440, buffer.allocLen);  // (481*3)/2 = 721 rows of 640 bytes
  EXPECT_EQ(record.pixels.data(), buffer.data);
  EXPECT_EQ(461440u, record.pixels.size());

  ExtraFrameData extra;
  extra.timeStamp = 3.25;
  extra.screenOrient = 90;
  extra.flat = true;
  EXPECT_FALSE(record.setSourceImage(buffer, extra));  // expects 640*481*3/2 = 461760 bytes
  EXPECT_EQ(461440u, record.pixels.size());
  EXPECT_EQ(3.25, record.timeStamp);  // time and geometry are taken before the check
  EXPECT_EQ(481, record.height);
  EXPECT_EQ(0, record.screenOrient);  // the rest is not
  EXPECT_EQ(0, record.flat);
}

TEST(FrameRecordTest, EvenHeightLentBufferIsTakenWithoutACopy) {
  FrameRecord record;
  ImageBuffer buffer = geometry(OrzaVSMobile::I420, 64, 48, 80);
  ASSERT_TRUE(record.lendBuffer(buffer));
  ASSERT_EQ(80 * 72, buffer.allocLen);
  const std::vector<uint8_t> frame = pattern(80 * 72);
  ASSERT_EQ(80 * 72, buffer.fillBuffer(frame.data(), 80 * 72));
  const uint8_t* storage = record.pixels.data();

  ExtraFrameData extra;
  extra.timeStamp = 1.5;
  extra.screenOrient = 270;
  extra.flat = true;
  ASSERT_TRUE(record.setSourceImage(buffer, extra));
  EXPECT_EQ(storage, record.pixels.data());
  EXPECT_EQ(frame, record.pixels);
  EXPECT_EQ(1.5, record.timeStamp);
  EXPECT_EQ(48, record.height);
  EXPECT_EQ(64, record.width);
  EXPECT_EQ(80, record.widthStep);
  EXPECT_EQ(OrzaVSMobile::I420, record.format);
  EXPECT_EQ(270, record.screenOrient);
  EXPECT_EQ(1, record.flat);
}

TEST(FrameRecordTest, GreyFramesUseOneByteAPixelRow) {
  FrameRecord record;
  ImageBuffer buffer = geometry(OrzaVSMobile::GRAY, 10, 7, 12);
  ASSERT_TRUE(record.lendBuffer(buffer));
  EXPECT_EQ(84, buffer.allocLen);
  EXPECT_TRUE(record.setSourceImage(buffer, ExtraFrameData()));
}

TEST(FrameRecordTest, LendingRefusesBadGeometryAndBoundsTheFill) {
  FrameRecord record;
  uint8_t previous[8] = {0};
  for (const ImageBuffer& bad : {geometry(OrzaVSMobile::NV21, 8, -2, 8),
                                 geometry(OrzaVSMobile::GRAY, 8, 4, -8),
                                 geometry(OrzaVSMobile::NV12, 65536, 65536, 65536)}) {
    ImageBuffer buffer = bad;
    buffer.data = previous;  // whatever the buffer pointed at before is dropped
    buffer.allocLen = 5;
    EXPECT_FALSE(record.lendBuffer(buffer));
    EXPECT_EQ(nullptr, buffer.data);
    EXPECT_EQ(0, buffer.allocLen);
  }

  ImageBuffer buffer = geometry(OrzaVSMobile::GRAY, 4, 4, 4);
  ASSERT_TRUE(record.lendBuffer(buffer));
  buffer.allocLen = 1000;  // forged: the fill still stops at the record's 16 bytes
  const std::vector<uint8_t> big = pattern(1000);
  EXPECT_EQ(16, buffer.fillBuffer(big.data(), 1000));
  buffer.releaseBuffer();  // must not free the record's storage
  EXPECT_EQ(16u, record.pixels.size());
  EXPECT_EQ(1, record.pixels[0]);
}

TEST(FrameRecordTest, ABufferThatOwnsMemoryCanStillBeLentTo) {
  FrameRecord record;
  ImageBuffer buffer = geometry(OrzaVSMobile::GRAY, 4, 2, 4);
  ASSERT_EQ(50, buffer.allocateBuffer(50));
  ASSERT_TRUE(record.lendBuffer(buffer));
  EXPECT_EQ(record.pixels.data(), buffer.data);
  EXPECT_EQ(8, buffer.allocLen);
  // Destroying the buffer frees its own 50 bytes (LeakSanitizer) and not the record's.
}

TEST(FrameRecordTest, CopiesFromTheClientsMemory) {
  FrameRecord record;
  record.pixels.reserve(4096);
  std::vector<uint8_t> yuv = pattern(16 * 12 * 3 / 2);
  ImageBuffer image(0, OrzaVSMobile::NV21, 16, 12, 16, 1, yuv.data());
  ExtraFrameData extra;
  extra.timeStamp = 9.0;
  ASSERT_TRUE(record.setSourceImage(image, extra));
  EXPECT_EQ(yuv, record.pixels);
  EXPECT_EQ(9.0, record.timeStamp);

  // A smaller grey frame shrinks the contents and keeps the capacity.
  std::vector<uint8_t> grey = pattern(10 * 5);
  ImageBuffer greyImage(0, OrzaVSMobile::GRAY, 10, 5, 10, 1, grey.data());
  ASSERT_TRUE(record.setSourceImage(greyImage, ExtraFrameData()));
  EXPECT_EQ(grey, record.pixels);
  EXPECT_GE(record.pixels.capacity(), 4096u);

  // A packed colour frame: widthStep * height bytes, whatever numChannels says.
  std::vector<uint8_t> rgb = pattern(30 * 4);
  ImageBuffer rgbImage(0, OrzaVSMobile::RGB, 10, 4, 30, 3, rgb.data());
  ASSERT_TRUE(record.setSourceImage(rgbImage, ExtraFrameData()));
  EXPECT_EQ(rgb, record.pixels);

  // Another record's lent memory is copied like any other source.
  FrameRecord other;
  ImageBuffer lent = geometry(OrzaVSMobile::GRAY, 10, 5, 10);
  ASSERT_TRUE(other.lendBuffer(lent));
  ASSERT_EQ(50, lent.fillBuffer(grey.data(), 50));
  ASSERT_TRUE(record.setSourceImage(lent, ExtraFrameData()));
  EXPECT_EQ(grey, record.pixels);
}

TEST(FrameRecordTest, RefusesSourcesThatCannotHoldTheGeometry) {
  FrameRecord record;
  const ExtraFrameData extra;

  ImageBuffer nullData(0, OrzaVSMobile::GRAY, 8, 8, 8, 1, nullptr);
  EXPECT_FALSE(record.setSourceImage(nullData, extra));

  std::vector<uint8_t> pixels(64, 1);
  ImageBuffer negative(0, OrzaVSMobile::GRAY, 8, -8, 8, 1, pixels.data());
  EXPECT_FALSE(record.setSourceImage(negative, extra));

  // An own block shorter than the geometry says: reading it all would overrun the block.
  ImageBuffer shortOwned(0, OrzaVSMobile::NV21, 8, 8, 8, 1, nullptr);
  ASSERT_EQ(64, shortOwned.allocateBuffer(64));  // NV21 8x8 needs 96 bytes
  EXPECT_FALSE(record.setSourceImage(shortOwned, extra));
  ASSERT_EQ(96, shortOwned.allocateBuffer(96));
  EXPECT_TRUE(record.setSourceImage(shortOwned, extra));

  // A released buffer's stale pointer is never read.
  shortOwned.releaseBuffer();
  EXPECT_FALSE(record.setSourceImage(shortOwned, extra));

  // An empty frame is accepted and leaves an empty record.
  ImageBuffer empty(0, OrzaVSMobile::GRAY, 0, 0, 0, 1, nullptr);
  EXPECT_TRUE(record.setSourceImage(empty, extra));
  EXPECT_TRUE(record.pixels.empty());
}
