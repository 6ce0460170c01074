// The value types: image buffers and their ownership rules, frame data, results, names, the
// diagnostic output.

#include "types/ImageBuffer.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <map>
#include <numeric>
#include <string>
#include <tuple>
#include <type_traits>
#include <vector>

#include "exec/Job.h"
#include "exec/TovraExecutionEngine.h"
#include "types/ByteArray.h"
#include "types/DiagnosticOutput.h"
#include "types/EnumNames.h"
#include "types/FrameData.h"
#include "types/ObjectInfo.h"
#include "types/ResultMetadata.h"

using OrzaVSMobile::ImageBuffer;

namespace {

std::vector<uint8_t> pattern(size_t n, uint8_t start) {
  std::vector<uint8_t> bytes(n);
  std::iota(bytes.begin(), bytes.end(), start);
  return bytes;
}

std::vector<uint8_t> contents(const ImageBuffer& buffer, int n) { return {buffer.data, buffer.data + n}; }

// Every fill operation with a real source of `n` bytes copies nothing.
void expectEveryFillCopiesNothing(ImageBuffer& buffer, int32_t n) {
  const std::vector<uint8_t> src = pattern(static_cast<size_t>(n), 1);
  EXPECT_EQ(0, buffer.fillBuffer(src.data(), n));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), n));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), n, src.data(), n));
}

}  // namespace

TEST(ImageBufferTest, DefaultAndBorrowingBuffersCannotBeFilled) {
  ImageBuffer buffer;
  EXPECT_TRUE(buffer.format == 1 && buffer.data == nullptr && buffer.allocLen == 0);
  expectEveryFillCopiesNothing(buffer, 16);
  buffer.allocLen = 16;  // a forged allocLen on a null buffer cannot make a fill write
  expectEveryFillCopiesNothing(buffer, 16);

  std::vector<uint8_t> pixels = pattern(64, 7);
  const std::vector<uint8_t> before = pixels;
  {
    ImageBuffer borrowed(5, OrzaVSMobile::GRAY, 8, 6, 10, 1, pixels.data());  // definition first
    EXPECT_EQ(std::make_tuple(5, OrzaVSMobile::GRAY, 10, int64_t{-1}),
              std::make_tuple(borrowed.definition, borrowed.format, borrowed.widthStep, borrowed.knownLength()));
    expectEveryFillCopiesNothing(borrowed, 32);
    borrowed.releaseBuffer();  // frees nothing (ASan would report a bad free)
    EXPECT_EQ(pixels.data(), borrowed.data);
  }
  EXPECT_EQ(before, pixels);
}

TEST(ImageBufferTest, FillsCopyAtMostTheOwnBlock) {
  ImageBuffer buffer;
  ASSERT_EQ(10, buffer.allocateBuffer(10));
  ASSERT_EQ(100, buffer.allocateBuffer(100));  // the 10-byte block is freed (LeakSanitizer)
  const std::vector<uint8_t> src = pattern(150, 3);
  EXPECT_EQ(100, buffer.fillBuffer(src.data(), 150));
  EXPECT_EQ(std::vector<uint8_t>(src.begin(), src.begin() + 100), contents(buffer, 100));
  const std::vector<uint8_t> other = pattern(40, 200);
  EXPECT_EQ(40, buffer.fillBufferWithByteBuffer(other.data(), 40));
  EXPECT_EQ(3 + 40, buffer.data[40]);  // bytes past the fill keep their earlier contents
  // Null sources and negative lengths copy nothing.
  EXPECT_EQ(0, buffer.fillBuffer(nullptr, 32));
  EXPECT_EQ(0, buffer.fillBuffer(src.data(), -5));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(src.data(), INT32_MIN));
  EXPECT_EQ(200, buffer.data[0]);
  // allocLen is a public field (settable from Java): a forged one never reaches past the block.
  buffer.allocLen = 1 << 20;
  EXPECT_EQ(100, buffer.fillBuffer(src.data(), 150));
  EXPECT_EQ(100, buffer.fillBufferWithByteBuffer(src.data(), 60, src.data(), 150));
  buffer.allocLen = -7;
  expectEveryFillCopiesNothing(buffer, 10);
}

TEST(ImageBufferTest, FailedReleasedAndEmptyBlocksForbidEveryFill) {
  ImageBuffer buffer;
  ASSERT_EQ(64, buffer.allocateBuffer(64));
  uint8_t* block = buffer.data;
  buffer.releaseBuffer();
  EXPECT_TRUE(buffer.data == block && buffer.allocLen == 0);  // the stale pointer stays
  buffer.releaseBuffer();  // nothing is freed twice
  buffer.allocLen = 64;    // without the guard the fill would be a use after free
  expectEveryFillCopiesNothing(buffer, 64);
  EXPECT_TRUE(buffer.allocateBuffer(-1) == 0 && buffer.allocLen == 0);
  expectEveryFillCopiesNothing(buffer, 8);
  EXPECT_TRUE(buffer.allocateBuffer(0) == 0 && buffer.data != nullptr);
  expectEveryFillCopiesNothing(buffer, 8);
}

TEST(ImageBufferTest, TwoPlaneFillPlacesTheSecondAfterTheFirstWithinTheBlock) {
  ImageBuffer buffer;
  ASSERT_EQ(150, buffer.allocateBuffer(150));
  const std::vector<uint8_t> luma = pattern(200, 0), chroma = pattern(200, 100);
  EXPECT_EQ(150, buffer.fillBufferWithByteBuffer(luma.data(), 100, chroma.data(), 100));
  std::vector<uint8_t> expected(luma.begin(), luma.begin() + 100);
  expected.insert(expected.end(), chroma.begin(), chroma.begin() + 50);
  EXPECT_EQ(expected, contents(buffer, 150));
  EXPECT_EQ(150, buffer.fillBufferWithByteBuffer(luma.data(), 200, chroma.data(), 100));
  EXPECT_EQ(std::vector<uint8_t>(luma.begin(), luma.begin() + 150), contents(buffer, 150));
  EXPECT_EQ(0, buffer.fillBufferWithByteBuffer(luma.data(), 0, chroma.data(), 0));
  // A bad plane contributes nothing; the other is still bounded by the block.
  EXPECT_EQ(150, buffer.fillBufferWithByteBuffer(luma.data(), -20, chroma.data(), 200));
  EXPECT_EQ(100, buffer.data[0]);
  EXPECT_EQ(20, buffer.fillBufferWithByteBuffer(nullptr, 10, luma.data(), 20));
  EXPECT_EQ(10, buffer.fillBufferWithByteBuffer(chroma.data(), 10, nullptr, 30));
  EXPECT_EQ(10, buffer.fillBufferWithByteBuffer(chroma.data(), 10, luma.data(), -1));
}

TEST(ImageBufferTest, LentMemoryIsFilledWithinItsSizeAndNeverFreed) {
  std::vector<uint8_t> record(120, 0xEE);
  {
    ImageBuffer buffer;
    ASSERT_EQ(30, buffer.allocateBuffer(30));  // an own block as well, freed normally
    buffer.lend(record.data(), 100);
    EXPECT_EQ(100, buffer.allocLen);
    const std::vector<uint8_t> src = pattern(200, 0);
    buffer.allocLen = 120;  // forged: still only the lent 100 bytes are writable
    EXPECT_EQ(100, buffer.fillBufferWithByteBuffer(src.data(), 90, src.data(), 90));
    EXPECT_EQ(0xEE, record[100]);
    buffer.releaseBuffer();
    EXPECT_EQ(record.data(), buffer.data);
    expectEveryFillCopiesNothing(buffer, 10);
  }
  EXPECT_EQ(9, record[99]);  // the second plane filled bytes 90..99
  ImageBuffer none;
  none.lend(nullptr, 50);
  EXPECT_EQ(0, none.allocLen);
}

TEST(ImageBufferTest, CopiesOfOwnBlocksAreDeepAndOtherCopiesKeepTheirBounds) {
  ImageBuffer original(3, OrzaVSMobile::I420, 4, 4, 4, 1, nullptr);
  ASSERT_EQ(24, original.allocateBuffer(24));
  const std::vector<uint8_t> src = pattern(24, 10), ones(24, 1), many = pattern(100, 1);
  ASSERT_EQ(24, original.fillBuffer(src.data(), 24));
  ImageBuffer copy(original), assigned;
  ASSERT_EQ(8, assigned.allocateBuffer(8));  // replaced (and freed) by the assignment
  assigned = original;
  for (ImageBuffer* d : {&copy, &assigned}) {
    EXPECT_TRUE(d->data != original.data && d->definition == 3 && contents(*d, 24) == src);
  }
  original.releaseBuffer();  // the copies outlive the original's block
  ASSERT_EQ(24, assigned.fillBuffer(ones.data(), 24));
  ImageBuffer& alias = assigned;
  assigned = alias;
  EXPECT_EQ(ones, contents(assigned, 24));

  std::vector<uint8_t> pixels(40, 0);
  ImageBuffer lent, lentCopy;
  lent.lend(pixels.data(), 40);
  lentCopy = lent;
  EXPECT_EQ(pixels.data(), lentCopy.data);
  lentCopy.allocLen = 4000;
  EXPECT_EQ(24, lentCopy.fillBuffer(src.data(), 24));
  EXPECT_EQ(40, lentCopy.fillBuffer(many.data(), 100));

  ImageBuffer released;
  ASSERT_EQ(16, released.allocateBuffer(16));
  released.releaseBuffer();
  ImageBuffer releasedCopy(released);
  releasedCopy.allocLen = 16;
  expectEveryFillCopiesNothing(releasedCopy, 16);
  // A block whose allocLen was zeroed is still duplicated: a forged allocLen on the copy
  // cannot reach the original's memory.
  ImageBuffer zeroed;
  ASSERT_EQ(12, zeroed.allocateBuffer(12));
  zeroed.allocLen = 0;
  ImageBuffer zeroedCopy(zeroed);
  EXPECT_NE(zeroed.data, zeroedCopy.data);
  zeroedCopy.allocLen = 100;
  EXPECT_EQ(12, zeroedCopy.fillBuffer(many.data(), 100));
}

TEST(FrameDataTest, YuvFormatsByteArraysAndDefaults) {
  for (int32_t format : {0, 1, 2}) EXPECT_TRUE(OrzaVSMobile::isYUVFormat(format));
  for (int32_t format : {3, 4, 7, -1, INT32_MIN, 1000}) EXPECT_FALSE(OrzaVSMobile::isYUVFormat(format));
  uint8_t bytes[5] = {1, 2, 3, 4, 5};
  {
    OrzaVSMobile::ByteArray array(bytes, 5);
    OrzaVSMobile::ByteArray copy(array);  // shares the bytes
    copy.getData()[0] = 9;
    copy.clear();
    EXPECT_TRUE(copy.getData() == nullptr && array.getLength() == 5);
  }  // stack memory: freeing it would be reported by ASan
  EXPECT_EQ(9, bytes[0]);
  const OrzaVSMobile::ExtraFrameData extra;  // -1 means unknown
  EXPECT_EQ(std::make_tuple(-1, -1, false, 0, -1.0),
            std::make_tuple(extra.displayROI.x, extra.focusROI.height, extra.flat, extra.screenOrient, extra.timeStamp));
}

using Tovra::ObjectInfo;
using Tovra::ResultMetadata;

// Every enumeration that crosses JNI has a fixed 32-bit underlying type, so any integer that
// arrives from Java is a valid value of the type.
template <typename... E>
constexpr bool allInt32 = (std::is_same<typename std::underlying_type<E>::type, int32_t>::value && ...);
static_assert(allInt32<Tovra::ObjectModuleID, Tovra::ContentType, Tovra::ActionID, Tovra::StatusID,
                       Tovra::CameraStabilityIssue, Tovra::JudgeVerdictOnModule, Tovra::Server::ResponseStatus,
                       OrzaVSMobile::ImageFormat, Tovra::JobState>, "");

TEST(ResultsTest, DefaultsAndAMetadataClearThatEqualsAFreshOne) {
  const ObjectInfo info, qr(Tovra::QR_CODE);
  EXPECT_EQ(std::make_tuple(6, 11, 6, 2), std::make_tuple(+info.srcObjectModule, +info.contentType,
                                                           +qr.srcObjectModule, +qr.contentType));
  EXPECT_TRUE(info.content.empty() && info.properties.empty() && info.subContents.empty() && info.location.empty());
  ResultMetadata metadata;
  metadata.isFinalAccumulation = true;
  metadata.queryID = "q";
  metadata.mobileDecorator = "TeskarMobileDecorator";
  metadata.accumulatedQueries.assign(10, "q");
  auto isEmpty = [](const ResultMetadata& m) {
    return !m.isFinalAccumulation && m.queryID.empty() && m.mobileDecorator.empty() && m.accumulatedQueries.empty();
  };
  metadata.clear();
  EXPECT_TRUE(isEmpty(metadata) && isEmpty(ResultMetadata()));
}

TEST(EnumNamesTest, TablesHoldExactlyTheNamedEnumerators) {
#define ORZAVS_NAMED(e) {Tovra::e, #e}
  const std::map<Tovra::ObjectModuleID, std::string> modules = {
      ORZAVS_NAMED(BARCODE_MOD), ORZAVS_NAMED(VISUAL_SEARCH_SERVICE_MOD), ORZAVS_NAMED(TWOD_BARCODE_MOD),
      ORZAVS_NAMED(PACKAGE_LABEL_MOD), ORZAVS_NAMED(GIFTCARD_MOD), ORZAVS_NAMED(UNSPECIFIED_OBJECT_MOD),
      ORZAVS_NAMED(NUM_OBJECT_MODS)};
  const std::map<Tovra::ContentType, std::string> contents = {
      ORZAVS_NAMED(BARCODE_UPC_EAN), ORZAVS_NAMED(BARCODE_128), ORZAVS_NAMED(QR_CODE), ORZAVS_NAMED(DATA_MATRIX),
      ORZAVS_NAMED(PDF_417), ORZAVS_NAMED(GIFT_CARD), ORZAVS_NAMED(PIDN), ORZAVS_NAMED(SEARCH_TERMS),
      ORZAVS_NAMED(DIRECTED_RESULT), ORZAVS_NAMED(EXTERNAL_RESULT), ORZAVS_NAMED(UNSPECIFIED_CONTENT_TYPE),
      ORZAVS_NAMED(NUM_CONTENT_TYPES)};
#undef ORZAVS_NAMED
  EXPECT_EQ(modules, Tovra::ObjectModuleIDNames);
  EXPECT_EQ(contents, Tovra::ContentTypeNames);
}

TEST(Diagnostics, DefaultSinkWritesEachLineAndANewlineToStandardOutput) {
  const std::string reply(300, 'x');  // past the formatting buffer of short lines
  testing::internal::CaptureStdout();
  Tovra::TovraExecutionEngine none(0);
  OrzaVSMobile::reportLinef("VSS SERVER ERROR: response: %s", reply.c_str());
  OrzaVSMobile::reportLinef("Skipped input frame: invalid image size %dx%d", -1, 0);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "Initialized TovraExecutionEngine with invalid number of threads\n"
            "VSS SERVER ERROR: response: " + reply + "\n"
            "Skipped input frame: invalid image size -1x0\n");
}
