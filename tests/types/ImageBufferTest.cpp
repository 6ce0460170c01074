#include "types/ImageBuffer.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <numeric>
#include <type_traits>
#include <vector>

using OrzaVSMobile::ImageBuffer;
using OrzaVSMobile::ImageFormat;

static_assert(std::is_same<std::underlying_type<ImageFormat>::type, int32_t>::value,
              "ImageFormat travels as a 32-bit signed integer");

namespace {

std::vector<uint8_t> pattern(size_t n, uint8_t start) {
  std::vector<uint8_t> bytes(n);
  std::iota(bytes.begin(), bytes.end(), start);
  return bytes;
}

// Every fill operation on `buffer` with a real source of `n` bytes.
void expectEveryFillCopiesNothing(ImageBuffer& buffer, int32_t n) {
  const std::vector<uint8_t> src = pattern(static_cast<size_t>(n), 1);
  EXPECT_EQ(0, buffer.fillBuffer(src.data(), n));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), n));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), n, src.data(), n));
}

}  // namespace

TEST(ImageBufferTest, DefaultIsNv21WithoutDataAndCannotBeFilled) {
  ImageBuffer buffer;
  EXPECT_EQ(OrzaVSMobile::NV21, buffer.format);
  EXPECT_EQ(1, static_cast<int32_t>(buffer.format));
  EXPECT_EQ(0, buffer.definition);
  EXPECT_EQ(0, buffer.width);
  EXPECT_EQ(0, buffer.height);
  EXPECT_EQ(0, buffer.widthStep);
  EXPECT_EQ(0, buffer.numChannels);
  EXPECT_EQ(nullptr, buffer.data);
  EXPECT_EQ(0, buffer.allocLen);
  expectEveryFillCopiesNothing(buffer, 16);
  // data is null: even a forged allocLen cannot make a fill write.
  buffer.allocLen = 16;
  expectEveryFillCopiesNothing(buffer, 16);
}

TEST(ImageBufferTest, FullConstructorTakesDefinitionFirstAndBorrows) {
  std::vector<uint8_t> pixels = pattern(64, 7);
  const std::vector<uint8_t> before = pixels;
  {
    ImageBuffer buffer(5, OrzaVSMobile::GRAY, 8, 6, 10, 1, pixels.data());
    EXPECT_EQ(5, buffer.definition);
    EXPECT_EQ(OrzaVSMobile::GRAY, buffer.format);
    EXPECT_EQ(8, buffer.width);
    EXPECT_EQ(6, buffer.height);
    EXPECT_EQ(10, buffer.widthStep);
    EXPECT_EQ(1, buffer.numChannels);
    EXPECT_EQ(pixels.data(), buffer.data);
    EXPECT_EQ(0, buffer.allocLen);
    EXPECT_EQ(-1, buffer.knownLength());  // the caller vouches for its own memory
    expectEveryFillCopiesNothing(buffer, 32);
    buffer.releaseBuffer();  // frees nothing (ASan would report a bad free)
    EXPECT_EQ(pixels.data(), buffer.data);
    EXPECT_EQ(0, buffer.allocLen);
  }  // destruction frees nothing either
  EXPECT_EQ(before, pixels);
}

TEST(ImageBufferTest, AllocateThenFillCopiesAtMostAllocLen) {
  ImageBuffer buffer;
  ASSERT_EQ(100, buffer.allocateBuffer(100));
  EXPECT_EQ(100, buffer.allocLen);
  ASSERT_NE(nullptr, buffer.data);
  EXPECT_EQ(100, buffer.knownLength());

  const std::vector<uint8_t> src = pattern(150, 3);
  EXPECT_EQ(100, buffer.fillBuffer(src.data(), 150));
  EXPECT_EQ(std::vector<uint8_t>(src.begin(), src.begin() + 100),
            std::vector<uint8_t>(buffer.data, buffer.data + 100));

  EXPECT_EQ(0, buffer.fillBuffer(src.data(), 0));
  const std::vector<uint8_t> other = pattern(40, 200);
  EXPECT_EQ(40, buffer.fillBufferWithByteBuffer(other.data(), 40));
  EXPECT_EQ(200, buffer.data[0]);
  EXPECT_EQ(3 + 40, buffer.data[40]);  // bytes past the fill keep their earlier contents
}

TEST(ImageBufferTest, ReallocationReplacesTheBlockAndFailuresLeaveTheBufferEmpty) {
  ImageBuffer buffer;
  ASSERT_EQ(10, buffer.allocateBuffer(10));
  ASSERT_EQ(300, buffer.allocateBuffer(300));  // the 10-byte block is freed (LeakSanitizer)
  EXPECT_EQ(300, buffer.allocLen);
  const std::vector<uint8_t> src = pattern(300, 0);
  EXPECT_EQ(300, buffer.fillBuffer(src.data(), 300));

  // A negative length fails: the previous block is released and nothing new is owned.
  uint8_t* stale = buffer.data;
  EXPECT_EQ(0, buffer.allocateBuffer(-1));
  EXPECT_EQ(0, buffer.allocLen);
  EXPECT_EQ(stale, buffer.data);
  expectEveryFillCopiesNothing(buffer, 8);

  // Zero bytes: a block is made, allocLen stays 0, nothing can be filled and nothing leaks.
  EXPECT_EQ(0, buffer.allocateBuffer(0));
  EXPECT_EQ(0, buffer.allocLen);
  EXPECT_NE(nullptr, buffer.data);
  expectEveryFillCopiesNothing(buffer, 8);
  EXPECT_EQ(16, buffer.allocateBuffer(16));
}

TEST(ImageBufferTest, ReleaseKeepsTheStalePointerAndForbidsEveryFill) {
  ImageBuffer buffer;
  ASSERT_EQ(64, buffer.allocateBuffer(64));
  uint8_t* block = buffer.data;
  buffer.releaseBuffer();
  EXPECT_EQ(block, buffer.data);
  EXPECT_EQ(0, buffer.allocLen);
  EXPECT_EQ(0, buffer.knownLength());
  expectEveryFillCopiesNothing(buffer, 64);
  buffer.releaseBuffer();  // a second release frees nothing twice

  // allocLen is a public field (and settable from Java): raising it again must not make the
  // stale pointer writable. Without this guard the fill is a use after free.
  buffer.allocLen = 64;
  expectEveryFillCopiesNothing(buffer, 64);
}

TEST(ImageBufferTest, FillsRefuseNullSourcesAndNegativeLengths) {
  ImageBuffer buffer;
  ASSERT_EQ(32, buffer.allocateBuffer(32));
  const std::vector<uint8_t> zeros(32, 0);
  ASSERT_EQ(32, buffer.fillBuffer(zeros.data(), 32));
  const std::vector<uint8_t> src = pattern(32, 1);

  EXPECT_EQ(0, buffer.fillBuffer(nullptr, 32));
  EXPECT_EQ(0, buffer.fillBuffer(src.data(), -5));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(nullptr, 10));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), INT32_MIN));
  EXPECT_EQ(zeros, std::vector<uint8_t>(buffer.data, buffer.data + 32));
}

TEST(ImageBufferTest, ForgedAllocLenNeverWritesPastTheOwnBlock) {
  ImageBuffer buffer;
  ASSERT_EQ(100, buffer.allocateBuffer(100));
  buffer.allocLen = 1 << 20;
  const std::vector<uint8_t> src = pattern(4096, 0);
  EXPECT_EQ(100, buffer.fillBuffer(src.data(), 4096));
  EXPECT_EQ(100, buffer.fillBufferWithByteBuffer(src.data(), 60, src.data(), 4000));
  buffer.allocLen = -7;
  expectEveryFillCopiesNothing(buffer, 10);
}

TEST(ImageBufferTest, TwoPlaneFillPlacesTheSecondPlaneAfterTheFirst) {
  ImageBuffer buffer;
  ASSERT_EQ(150, buffer.allocateBuffer(150));
  const std::vector<uint8_t> luma = pattern(200, 0);
  const std::vector<uint8_t> chroma = pattern(100, 100);

  // 100 + 50: the second plane is cut at the end of the buffer.
  EXPECT_EQ(150, buffer.fillBufferWithByteBuffer(luma.data(), 100, chroma.data(), 100));
  std::vector<uint8_t> expected(luma.begin(), luma.begin() + 100);
  expected.insert(expected.end(), chroma.begin(), chroma.begin() + 50);
  EXPECT_EQ(expected, std::vector<uint8_t>(buffer.data, buffer.data + 150));

  // A first plane larger than the buffer fills it alone.
  EXPECT_EQ(150, buffer.fillBufferWithByteBuffer(luma.data(), 200, chroma.data(), 100));
  EXPECT_EQ(std::vector<uint8_t>(luma.begin(), luma.begin() + 150),
            std::vector<uint8_t>(buffer.data, buffer.data + 150));

  // Both planes fit: 40 + 30.
  EXPECT_EQ(70, buffer.fillBufferWithByteBuffer(chroma.data(), 40, luma.data(), 30));
  EXPECT_EQ(chroma[39], buffer.data[39]);
  EXPECT_EQ(luma[0], buffer.data[40]);
  EXPECT_EQ(luma[29], buffer.data[69]);

  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(luma.data(), 0, chroma.data(), 0));
}

TEST(ImageBufferTest, TwoPlaneFillHardenedAgainstBadPlanes) {
  ImageBuffer buffer;
  ASSERT_EQ(50, buffer.allocateBuffer(50));
  const std::vector<uint8_t> a = pattern(50, 0);
  const std::vector<uint8_t> b = pattern(50, 100);

  // A negative first length contributes nothing; the second plane starts at the beginning and
  // is still bounded by the buffer (unguarded, min(second, allocLen - first) would exceed it).
  EXPECT_EQ(50, buffer.fillBufferWithByteBuffer(a.data(), -20, b.data(), 50));
  EXPECT_EQ(b, std::vector<uint8_t>(buffer.data, buffer.data + 50));
  EXPECT_EQ(20, buffer.fillBufferWithByteBuffer(nullptr, 10, a.data(), 20));
  EXPECT_EQ(a[0], buffer.data[0]);
  EXPECT_EQ(10, buffer.fillBufferWithByteBuffer(b.data(), 10, nullptr, 30));
  EXPECT_EQ(10, buffer.fillBufferWithByteBuffer(b.data(), 10, a.data(), -1));
}

TEST(ImageBufferTest, LentMemoryIsFilledWithinItsSizeAndNeverFreed) {
  std::vector<uint8_t> record(120, 0xEE);
  {
    ImageBuffer buffer;
    ASSERT_EQ(30, buffer.allocateBuffer(30));  // an own block as well, to be freed normally
    buffer.lend(record.data(), 100);
    EXPECT_EQ(record.data(), buffer.data);
    EXPECT_EQ(100, buffer.allocLen);
    EXPECT_EQ(100, buffer.knownLength());

    const std::vector<uint8_t> src = pattern(200, 0);
    EXPECT_EQ(100, buffer.fillBuffer(src.data(), 200));
    buffer.allocLen = 120;  // forged: still only the lent 100 bytes are writable
    EXPECT_EQ(100, buffer.fillBufferWithByteBuffer(src.data(), 90, src.data(), 90));
    EXPECT_EQ(0xEE, record[100]);

    buffer.releaseBuffer();  // frees only the own block; the lent memory stays the record's
    EXPECT_EQ(0, buffer.allocLen);
    EXPECT_EQ(record.data(), buffer.data);
    expectEveryFillCopiesNothing(buffer, 10);
  }
  EXPECT_EQ(0, record[0]);
  EXPECT_EQ(9, record[99]);  // the second plane filled bytes 90..99

  ImageBuffer none;
  none.lend(nullptr, 50);
  EXPECT_EQ(nullptr, none.data);
  EXPECT_EQ(0, none.allocLen);
}

TEST(ImageBufferTest, CopiesOfAnOwningBufferAreDeep) {
  ImageBuffer original(3, OrzaVSMobile::I420, 4, 4, 4, 1, nullptr);
  ASSERT_EQ(24, original.allocateBuffer(24));
  const std::vector<uint8_t> src = pattern(24, 10);
  ASSERT_EQ(24, original.fillBuffer(src.data(), 24));

  ImageBuffer copy(original);
  EXPECT_NE(original.data, copy.data);
  EXPECT_EQ(24, copy.allocLen);
  EXPECT_EQ(3, copy.definition);
  EXPECT_EQ(OrzaVSMobile::I420, copy.format);
  EXPECT_EQ(src, std::vector<uint8_t>(copy.data, copy.data + 24));

  const std::vector<uint8_t> ones(24, 1);
  ASSERT_EQ(24, copy.fillBuffer(ones.data(), 24));
  EXPECT_EQ(src, std::vector<uint8_t>(original.data, original.data + 24));

  ImageBuffer assigned;
  ASSERT_EQ(8, assigned.allocateBuffer(8));  // replaced (and freed) by the assignment
  assigned = original;
  EXPECT_NE(original.data, assigned.data);
  EXPECT_EQ(src, std::vector<uint8_t>(assigned.data, assigned.data + 24));

  // The copies outlive the original's block.
  original.releaseBuffer();
  EXPECT_EQ(24, copy.fillBuffer(src.data(), 24));
  EXPECT_EQ(24, assigned.fillBuffer(ones.data(), 24));

  ImageBuffer& alias = assigned;
  assigned = alias;  // self-assignment keeps the block and its contents
  EXPECT_EQ(ones, std::vector<uint8_t>(assigned.data, assigned.data + 24));
}

TEST(ImageBufferTest, CopiesOfBorrowedLentOrReleasedBuffersAreShallowAndKeepTheirBounds) {
  std::vector<uint8_t> pixels(40, 0);
  ImageBuffer borrowed(0, OrzaVSMobile::GRAY, 8, 5, 8, 1, pixels.data());
  ImageBuffer borrowedCopy(borrowed);
  EXPECT_EQ(pixels.data(), borrowedCopy.data);
  EXPECT_EQ(0, borrowedCopy.allocLen);

  ImageBuffer lent;
  lent.lend(pixels.data(), 40);
  ImageBuffer lentCopy;
  lentCopy = lent;
  EXPECT_EQ(pixels.data(), lentCopy.data);
  lentCopy.allocLen = 4000;
  const std::vector<uint8_t> src = pattern(100, 1);
  EXPECT_EQ(40, lentCopy.fillBuffer(src.data(), 100));

  ImageBuffer released;
  ASSERT_EQ(16, released.allocateBuffer(16));
  released.releaseBuffer();
  ImageBuffer releasedCopy(released);
  EXPECT_EQ(released.data, releasedCopy.data);
  releasedCopy.allocLen = 16;
  expectEveryFillCopiesNothing(releasedCopy, 16);

  // A zero-length own block (or one whose allocLen was zeroed) is still duplicated, so a later
  // forged allocLen on the copy cannot reach the original's memory.
  ImageBuffer zeroed;
  ASSERT_EQ(12, zeroed.allocateBuffer(12));
  zeroed.allocLen = 0;
  ImageBuffer zeroedCopy(zeroed);
  EXPECT_NE(zeroed.data, zeroedCopy.data);
  zeroedCopy.allocLen = 100;
  EXPECT_EQ(12, zeroedCopy.fillBuffer(src.data(), 100));
}

TEST(ImageBufferTest, YuvTestUsesTheValueAsUnsigned) {
  EXPECT_TRUE(OrzaVSMobile::isYUVFormat(0));
  EXPECT_TRUE(OrzaVSMobile::isYUVFormat(1));
  EXPECT_TRUE(OrzaVSMobile::isYUVFormat(2));
  for (int32_t format = 3; format <= 7; ++format) EXPECT_FALSE(OrzaVSMobile::isYUVFormat(format));
  EXPECT_FALSE(OrzaVSMobile::isYUVFormat(-1));
  EXPECT_FALSE(OrzaVSMobile::isYUVFormat(INT32_MIN));
  EXPECT_FALSE(OrzaVSMobile::isYUVFormat(static_cast<ImageFormat>(1000)));
}
