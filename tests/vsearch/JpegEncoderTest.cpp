#include "vsearch/JpegEncoder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <tuple>
#include <vector>

#include "support/DiagnosticsRecorder.h"
#include "tests/vsearch/JpegTestSupport.h"

namespace {

using namespace jpeg_test;
using namespace OrzaVSMobile;
using Tovra::encodePackedToJpeg;
using Tovra::encodeYUVToJpeg;

constexpr ImageFormat kYuvFormats[] = {I420, NV21, NV12};

std::string label(int format, int w, int h) {
  return "format " + std::to_string(format) + " " + std::to_string(w) + "x" + std::to_string(h);
}

// Both helpers encode a frame in guarded memory: a read past it (encoder or library) crashes.
std::vector<uint8_t> yuvJpeg(const std::vector<uint8_t>& frame, int w, int h, ImageFormat format, int q = 90) {
  GuardedBytes guarded(frame);
  std::vector<uint8_t> out, work;
  EXPECT_TRUE(encodeYUVToJpeg(guarded.data(), h, w, w, format, out, q, work)) << label(format, w, h);
  return out;
}

std::vector<uint8_t> packedJpeg(const std::vector<uint8_t>& frame, int w, int h, int stride, int channels,
                                ImageFormat format, int q = 90) {
  GuardedBytes guarded(frame);
  std::vector<uint8_t> out, work;
  EXPECT_TRUE(encodePackedToJpeg(guarded.data(), h, w, stride, channels, format, out, q, work)) << label(format, w, h);
  return out;
}

// Smooth packed pixels, `channels` bytes a pixel, rows `stride` bytes apart (padding 0xC3).
std::vector<uint8_t> packedFrame(int w, int h, int channels, int stride) {
  std::vector<uint8_t> px(static_cast<size_t>(h - 1) * stride + static_cast<size_t>(w) * channels, 0xC3);
  for (int r = 0; r < h; ++r)
    for (int i = 0; i < w * channels; ++i)
      px[static_cast<size_t>(r) * stride + i] = clampByte(128 + 60 * std::sin(i / 17.0) + 40 * std::cos(r / 29.0));
  return px;
}

// PSNR thresholds sit below what this content measures here: smooth frames give luma 53.8 dB and
// chroma 50.3 dB at quality 90 (at least 48.8 dB luma for every odd size below), luma 48.0 dB at
// quality 50; noise at quality 100 gives 32.2 dB through the fast integer DCT. A lost block, a
// swapped plane or a misaddressed row drops them far lower.
TEST(JpegEncoder, YuvFramesOfAnySizeDecodeCloseToTheirInput) {
  const int sizes[][2] = {{320, 240}, {640, 481}, {33, 17}, {17, 1}, {6, 30}, {3, 3}, {1, 1}, {100, 36}, {17, 481}};
  for (const auto& s : sizes) {
    const int w = s[0], h = s[1];
    const Yuv420 img = makeYuv(w, h);
    std::vector<uint8_t> streams[3];
    for (int f = 0; f < 3; ++f) {
      SCOPED_TRACE(label(kYuvFormats[f], w, h));
      streams[f] = yuvJpeg(packYuv(img, kYuvFormats[f]), w, h, kYuvFormats[f]);
      const Decoded d = decodeJpeg(streams[f]);
      ASSERT_TRUE(d.ok);
      EXPECT_TRUE(d.width == w && d.height == h && d.colorSpace == JCS_YCbCr && !d.progressive && d.warnings == 0);
      EXPECT_EQ(std::vector<int>({d.samp[0][0], d.samp[0][1], d.samp[1][0], d.samp[1][1], d.samp[2][0], d.samp[2][1]}),
                std::vector<int>({2, 2, 1, 1, 1, 1}));
      EXPECT_GE(planePsnr(d, img, 0), w * h == 1 ? 40.0 : 45.0);
      if (w >= 16 && h >= 16) {
        EXPECT_GE(std::min(planePsnr(d, img, 1), planePsnr(d, img, 2)), 42.0);
      }
    }
    // One picture gives one stream in both semi-planar layouts, and in I420 too when no MCU is
    // partial.
    EXPECT_EQ(streams[1], streams[2]) << label(NV12, w, h);
    if (w % 16 == 0 && h % 16 == 0) {
      EXPECT_EQ(streams[0], streams[1]) << label(I420, w, h);
    }
  }
}

// BGR and BGRA/BGRX rows are turned into RGB (alpha dropped), RGB is taken as is, one channel is
// grey whatever the format; padding between rows is never looked at.
TEST(JpegEncoder, PackedFramesDecodeCloseToTheirInputWhateverTheirPadding) {
  const int w = 37, h = 29;  // partial MCUs on both edges
  const std::vector<uint8_t> rgb = packedFrame(w, h, 3, 3 * w);
  const Decoded d = decodeJpeg(packedJpeg(rgb, w, h, 3 * w, 3, RGB), JCS_RGB);
  ASSERT_TRUE(d.ok && d.colorSpace == JCS_YCbCr && d.components == 3);
  EXPECT_GE(psnr(d.pixels.data(), rgb.data(), rgb.size()), 42.0);  // measured 48.5 dB

  std::vector<uint8_t> bgr(rgb.size()), bgra(static_cast<size_t>(4) * w * h);
  for (size_t i = 0; i < static_cast<size_t>(w) * h; ++i) {
    for (int k = 0; k < 3; ++k) bgr[3 * i + k] = bgra[4 * i + k] = rgb[3 * i + 2 - k];
    bgra[4 * i + 3] = static_cast<uint8_t>(i);
  }
  const std::vector<uint8_t> expected = packedJpeg(rgb, w, h, 3 * w, 3, RGB);
  EXPECT_EQ(expected, packedJpeg(bgr, w, h, 3 * w, 3, BGR));
  EXPECT_EQ(expected, packedJpeg(bgra, w, h, 4 * w, 4, BGRA));
  EXPECT_EQ(expected, packedJpeg(bgra, w, h, 4 * w, 4, BGRX));
  EXPECT_NE(expected, packedJpeg(rgb, w, h, 3 * w, 3, BGR));
  for (int channels : {1, 3, 4}) {
    const ImageFormat format = channels == 1 ? GRAY : channels == 3 ? BGR : BGRA;
    const int padded = w * channels + 13;
    EXPECT_EQ(packedJpeg(packedFrame(w, h, channels, w * channels), w, h, w * channels, channels, format),
              packedJpeg(packedFrame(w, h, channels, padded), w, h, padded, channels, format)) << channels;
    // One-pixel frames.
    EXPECT_EQ(decodeJpeg(packedJpeg(std::vector<uint8_t>(channels, 200), 1, 1, channels, channels, BGRA)).width, 1);
  }
  const std::vector<uint8_t> grey = packedFrame(w, h, 1, w);
  EXPECT_EQ(packedJpeg(grey, w, h, w, 1, GRAY), packedJpeg(grey, w, h, w, 1, RGB));
  const Decoded g = decodeJpeg(packedJpeg(grey, w, h, w, 1, GRAY));
  EXPECT_EQ(g.colorSpace, JCS_GRAYSCALE);
  EXPECT_GE(psnr(g.pixels.data(), grey.data(), grey.size()), 48.0);  // measured 54.4 dB
}

// Every full 4096-byte work buffer and then the tail reach the output in order, whatever the
// caller's vectors held: a long stream decodes completely, every byte consumed, without warnings.
TEST(JpegEncoder, LongStreamsArriveWhole) {
  const Yuv420 img = makeYuv(256, 192, true);
  const std::vector<uint8_t> frame = packYuv(img, NV21);
  std::vector<uint8_t> out(12345, 0xEE), work(3);
  ASSERT_TRUE(encodeYUVToJpeg(frame.data(), 192, 256, 256, NV21, out, 100, work));
  EXPECT_EQ(work.size(), 4096u);
  ASSERT_GT(out.size(), 8 * 4096u);
  const Decoded d = decodeJpeg(out);
  ASSERT_TRUE(d.ok && d.warnings == 0 && d.bytesLeft == 0u) << d.warnings << " warnings, " << d.bytesLeft << " left";
  EXPECT_GE(planePsnr(d, img, 0), 30.0);
  const std::vector<uint8_t> first = out;
  ASSERT_TRUE(encodeYUVToJpeg(frame.data(), 192, 256, 256, NV21, out, 100, work));
  EXPECT_EQ(out, first);
}

TEST(JpegEncoder, ThePairOrderMattersAndTheStrideDoesNot) {
  const std::vector<uint8_t> nv21 = packYuv(makeYuv(64, 48), NV21);
  EXPECT_NE(yuvJpeg(nv21, 64, 48, NV21), yuvJpeg(nv21, 64, 48, NV12));
  std::vector<uint8_t> a, b, work;
  ASSERT_TRUE(encodeYUVToJpeg(nv21.data(), 48, 64, 4096, NV21, a, 90, work));
  ASSERT_TRUE(encodeYUVToJpeg(nv21.data(), 48, 64, -1, NV21, b, 90, work));
  EXPECT_EQ(a, b);
}

TEST(JpegEncoder, QualityIsClampedAndTablesStayBaseline) {
  const std::vector<uint8_t> frame = packYuv(makeYuv(64, 48), NV21);
  auto yuvAt = [&](int q) { return yuvJpeg(frame, 64, 48, NV21, q); };
  auto greyAt = [&](int q) { return packedJpeg(frame, 64, 48, 64, 1, GRAY, q); };
  for (int q : {-5, INT32_MIN}) EXPECT_TRUE(yuvAt(q) == yuvAt(0) && greyAt(q) == greyAt(0)) << q;
  EXPECT_TRUE(yuvAt(250) == yuvAt(100) && greyAt(250) == greyAt(100));
  EXPECT_EQ(yuvAt(0), yuvAt(1));  // the library's scaling takes 0 as 1
  EXPECT_NE(yuvAt(1), yuvAt(2));
  EXPECT_NE(yuvAt(99), yuvAt(100));
  // At the lowest quality the scaled tables exceed 8 bits unless baseline tables are forced.
  EXPECT_EQ(std::make_tuple(255, 255, 1),
            std::make_tuple(decodeJpeg(yuvAt(0)).maxQuant, decodeJpeg(greyAt(0)).maxQuant, decodeJpeg(yuvAt(100)).maxQuant));
}

TEST(JpegEncoder, UnusableArgumentsAndLibraryErrorsGiveFalseAndOverlappingRowsAreAccepted) {
  const std::vector<uint8_t> frame(64 * 64 * 4, 0x80);
  std::vector<uint8_t> out, work;
  auto yuv = [&](const uint8_t* px, int h, int w, int format) {
    out.assign(3, 7);
    const bool ok = encodeYUVToJpeg(px, h, w, w, static_cast<ImageFormat>(format), out, 50, work);
    EXPECT_TRUE(out.empty() && work.size() == 4096u);
    return ok;
  };
  EXPECT_FALSE(yuv(nullptr, 16, 16, NV21) || yuv(frame.data(), 0, 16, NV21) || yuv(frame.data(), -16, 16, NV12) ||
               yuv(frame.data(), 16, INT32_MIN, I420));
  for (int format : {-1, 3, 7, 1000}) EXPECT_FALSE(yuv(frame.data(), 16, 16, format)) << format;

  auto packed = [&](const uint8_t* px, int h, int w, int stride, int channels) {
    out.assign(3, 7);
    const bool ok = encodePackedToJpeg(px, h, w, stride, channels, BGR, out, 50, work);
    EXPECT_TRUE(ok || out.empty());
    return ok;
  };
  EXPECT_FALSE(packed(nullptr, 16, 16, 48, 3) || packed(frame.data(), 0, 16, 48, 3) ||
               packed(frame.data(), 16, -1, 48, 3) || packed(frame.data(), 16, 16, -48, 3));
  for (int channels : {0, -3, 2}) EXPECT_FALSE(packed(frame.data(), 16, 16, 48, channels)) << channels;

  // Rows closer together than their length overlap inside the frame: stride 0 repeats one row.
  std::vector<uint8_t> row(40);
  for (size_t i = 0; i < row.size(); ++i) row[i] = static_cast<uint8_t>(40 + 5 * i);
  const Decoded d = decodeJpeg(packedJpeg(row, 40, 24, 0, 1, GRAY));
  ASSERT_EQ(d.height, 24);
  for (int r = 0; r < 24; ++r) EXPECT_GE(psnr(&d.pixels[r * 40], row.data(), 40), 40.0) << r;
  EXPECT_TRUE(decodeJpeg(packedJpeg(std::vector<uint8_t>(9 * 6 + 4 * 8, 9), 8, 10, 6, 4, BGRA)).ok);

  // Sizes the library refuses raise its fatal error: false with its message, nothing thrown,
  // printed or leaked, and the next call works.
  orzavs_test::DiagnosticsRecorder diagnostics;
  const std::vector<uint8_t> wide(70000 * 2 * 3 / 2, 0x80);  // 70000 x 2 in any layout
  const std::string tooBig = "Maximum supported image dimension is 65500 pixels";
  for (ImageFormat format : kYuvFormats) {
    std::string reason;
    EXPECT_FALSE(encodeYUVToJpeg(wide.data(), 2, 70000, 70000, format, out, 50, work, &reason));
    EXPECT_EQ(reason, tooBig);
    EXPECT_FALSE(encodeYUVToJpeg(wide.data(), 70000, 2, 2, format, out, 50, work));
  }
  std::string reason;
  EXPECT_FALSE(encodePackedToJpeg(wide.data(), 1, 70000, 0, 3, BGR, out, 50, work, &reason));
  EXPECT_EQ(reason, tooBig);
  EXPECT_FALSE(encodePackedToJpeg(wide.data(), 1, 8, 0, 2, BGR, out, 50, work, &reason));
  EXPECT_EQ(reason, "invalid channel count or stride");
  EXPECT_EQ(diagnostics.text(), "");
  EXPECT_TRUE(decodeJpeg(yuvJpeg(packYuv(makeYuv(32, 32), NV21), 32, 32, NV21)).ok);
}

}  // namespace
