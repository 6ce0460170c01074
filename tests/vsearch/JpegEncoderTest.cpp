#include "vsearch/JpegEncoder.h"
#include "vsearch/JpegDeinterleave.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "support/StdoutCapture.h"
#include "tests/vsearch/JpegTestSupport.h"

namespace {

using namespace jpeg_test;
using OrzaVSMobile::ImageFormat;
using Tovra::encodePackedToJpeg;
using Tovra::encodeYUVToJpeg;

constexpr ImageFormat kYuvFormats[] = {OrzaVSMobile::I420, OrzaVSMobile::NV21, OrzaVSMobile::NV12};

std::string name(ImageFormat f) {
  switch (f) {
    case OrzaVSMobile::I420: return "I420";
    case OrzaVSMobile::NV21: return "NV21";
    case OrzaVSMobile::NV12: return "NV12";
    case OrzaVSMobile::RGB: return "RGB";
    case OrzaVSMobile::BGR: return "BGR";
    case OrzaVSMobile::BGRA: return "BGRA";
    case OrzaVSMobile::GRAY: return "GRAY";
    default: return std::to_string(static_cast<int>(f));
  }
}

// Encodes a YUV frame held in exactly-sized guarded memory; fails the test if it returns false.
std::vector<uint8_t> encodeYuv(const std::vector<uint8_t>& frame, int width, int height, ImageFormat format,
                               int quality = 90) {
  GuardedBytes guarded(frame);
  std::vector<uint8_t> out, work;
  EXPECT_TRUE(encodeYUVToJpeg(guarded.data(), height, width, width, format, out, quality, work))
      << name(format) << " " << width << "x" << height;
  return out;
}

std::vector<uint8_t> encodePacked(const std::vector<uint8_t>& frame, int width, int height, int stride,
                                  int channels, ImageFormat format, int quality = 90) {
  GuardedBytes guarded(frame);
  std::vector<uint8_t> out, work;
  EXPECT_TRUE(encodePackedToJpeg(guarded.data(), height, width, stride, channels, format, out, quality, work))
      << name(format) << " " << width << "x" << height << " stride " << stride;
  return out;
}

// ---------------------------------------------------------------------------------------------
// Streams decode back to their input.

// PSNR thresholds sit below what this content measures here (smooth frames: luma 53.8 dB,
// chroma 50.3 dB at quality 90, luma 48.0 dB at quality 50; packed RGB 46.9 dB, grey 54.3 dB at
// quality 90; the worst partial-band frame 48.8 dB; noise at quality 100: 32.1 dB through the
// fast integer DCT, 58.5 dB grey through the library's default DCT). A lost block, a swapped
// plane or a misaddressed row drops them far lower.
TEST(JpegEncoder, YuvFramesDecodeCloseToTheirInput) {
  const Yuv420 img = smoothYuv(320, 240);
  for (ImageFormat format : kYuvFormats) {
    SCOPED_TRACE(name(format));
    const std::vector<uint8_t> jpeg = encodeYuv(packYuv(img, format), 320, 240, format, 90);
    const Decoded d = decodeJpeg(jpeg);
    ASSERT_TRUE(d.ok);
    EXPECT_EQ(d.width, 320);
    EXPECT_EQ(d.height, 240);
    EXPECT_EQ(d.jpegColorSpace, JCS_YCbCr);
    EXPECT_FALSE(d.progressive);
    EXPECT_FALSE(d.arithmetic);
    EXPECT_EQ(d.hSamp[0], 2);
    EXPECT_EQ(d.vSamp[0], 2);
    EXPECT_EQ(d.hSamp[1], 1);
    EXPECT_EQ(d.vSamp[1], 1);
    EXPECT_EQ(d.hSamp[2], 1);
    EXPECT_EQ(d.vSamp[2], 1);
    EXPECT_EQ(d.warnings, 0);
    EXPECT_EQ(d.bytesLeft, 0u);
    EXPECT_GE(lumaPsnr(d, img), 45.0);
    EXPECT_GE(chromaPsnr(d, img, 1), 42.0);
    EXPECT_GE(chromaPsnr(d, img, 2), 42.0);
  }
  const Decoded q50 =
      decodeJpeg(encodeYuv(packYuv(img, OrzaVSMobile::NV21), 320, 240, OrzaVSMobile::NV21, 50));
  ASSERT_TRUE(q50.ok);
  EXPECT_GE(lumaPsnr(q50, img), 40.0);
}

TEST(JpegEncoder, PackedFramesDecodeCloseToTheirInput) {
  const int w = 160, h = 120;
  const std::vector<uint8_t> rgb = smoothPacked(w, h, 3, 3 * w);
  // The same picture in the other channel orders.
  std::vector<uint8_t> bgr(rgb.size()), bgra(static_cast<size_t>(w) * h * 4);
  for (size_t i = 0; i < static_cast<size_t>(w) * h; ++i) {
    bgr[3 * i + 0] = rgb[3 * i + 2];
    bgr[3 * i + 1] = rgb[3 * i + 1];
    bgr[3 * i + 2] = rgb[3 * i + 0];
    bgra[4 * i + 0] = rgb[3 * i + 2];
    bgra[4 * i + 1] = rgb[3 * i + 1];
    bgra[4 * i + 2] = rgb[3 * i + 0];
    bgra[4 * i + 3] = static_cast<uint8_t>(i * 37);
  }
  struct Case {
    ImageFormat format;
    int channels;
    const std::vector<uint8_t>* pixels;
  } cases[] = {{OrzaVSMobile::RGB, 3, &rgb},
               {OrzaVSMobile::BGR, 3, &bgr},
               {OrzaVSMobile::BGRA, 4, &bgra},
               {OrzaVSMobile::BGRX, 4, &bgra}};
  for (const Case& c : cases) {
    SCOPED_TRACE(name(c.format));
    const Decoded d =
        decodeJpeg(encodePacked(*c.pixels, w, h, w * c.channels, c.channels, c.format), JCS_RGB);
    ASSERT_TRUE(d.ok);
    EXPECT_EQ(d.jpegColorSpace, JCS_YCbCr);
    EXPECT_EQ(d.components, 3);
    EXPECT_FALSE(d.progressive);
    EXPECT_EQ(d.warnings, 0);
    // Decoded R, G, B against the RGB picture.
    EXPECT_GE(bytePsnr(d.pixels, rgb), 40.0);
  }

  const std::vector<uint8_t> grey = smoothPacked(w, h, 1, w);
  const Decoded g = decodeJpeg(encodePacked(grey, w, h, w, 1, OrzaVSMobile::GRAY));
  ASSERT_TRUE(g.ok);
  EXPECT_EQ(g.jpegColorSpace, JCS_GRAYSCALE);
  EXPECT_EQ(g.components, 1);
  EXPECT_GE(bytePsnr(g.pixels, grey), 45.0);
}

// Every full work buffer and then the tail reach the output, in order: a stream many times the
// 4096-byte work buffer decodes completely, consuming every byte, with no corrupt-data warning.
TEST(JpegEncoder, LongStreamsArriveWhole) {
  const Yuv420 img = noiseYuv(256, 192, 7);
  std::vector<uint8_t> out(12345, 0xEE), work(3);  // leftovers from an earlier use
  ASSERT_TRUE(encodeYUVToJpeg(packYuv(img, OrzaVSMobile::NV21).data(), 192, 256, 256, OrzaVSMobile::NV21, out,
                              100, work));
  EXPECT_EQ(work.size(), 4096u);
  ASSERT_GT(out.size(), 8 * 4096u);
  EXPECT_EQ(out[0], 0xFF);
  EXPECT_EQ(out[1], 0xD8);
  EXPECT_EQ(out[out.size() - 2], 0xFF);
  EXPECT_EQ(out[out.size() - 1], 0xD9);
  const Decoded d = decodeJpeg(out);
  ASSERT_TRUE(d.ok);
  EXPECT_EQ(d.warnings, 0);
  EXPECT_EQ(d.bytesLeft, 0u);
  EXPECT_GE(lumaPsnr(d, img), 30.0);

  // Reusing both vectors for the next frame starts the output afresh.
  const std::vector<uint8_t> first = out;
  ASSERT_TRUE(encodeYUVToJpeg(packYuv(img, OrzaVSMobile::NV21).data(), 192, 256, 256, OrzaVSMobile::NV21, out,
                              100, work));
  EXPECT_EQ(out, first);

  // The same for the packed encoder.
  std::vector<uint8_t> grey(256 * 192);
  Noise n(3);
  for (auto& b : grey) b = n.next();
  ASSERT_TRUE(encodePackedToJpeg(grey.data(), 192, 256, 256, 1, OrzaVSMobile::GRAY, out, 100, work));
  ASSERT_GT(out.size(), 4 * 4096u);
  const Decoded g = decodeJpeg(out);
  ASSERT_TRUE(g.ok);
  EXPECT_EQ(g.warnings, 0);
  EXPECT_EQ(g.bytesLeft, 0u);
  EXPECT_GE(bytePsnr(g.pixels, grey), 50.0);
}

// ---------------------------------------------------------------------------------------------
// Equivalent inputs give byte-identical streams.

TEST(JpegEncoder, Nv21AndNv12WithSwappedChromaAreIdentical) {
  const int sizes[][2] = {{64, 48}, {100, 36}, {33, 17}, {17, 481}, {2, 2}, {1, 1}};
  for (const auto& s : sizes) {
    const int w = s[0], h = s[1];
    SCOPED_TRACE(std::to_string(w) + "x" + std::to_string(h));
    const std::vector<uint8_t> nv21 = packYuv(smoothYuv(w, h), OrzaVSMobile::NV21);
    std::vector<uint8_t> nv12 = nv21;
    for (int r = 0; r < h / 2; ++r)  // chroma rows are `w` bytes holding w/2 pairs
      for (int c = 0; c < w / 2; ++c) {
        uint8_t* pair = &nv12[static_cast<size_t>(w) * (h + r) + 2 * c];
        std::swap(pair[0], pair[1]);
      }
    EXPECT_EQ(encodeYuv(nv21, w, h, OrzaVSMobile::NV21), encodeYuv(nv12, w, h, OrzaVSMobile::NV12));
  }
  // The order matters: the same bytes read as the other order give another stream.
  const std::vector<uint8_t> frame = packYuv(smoothYuv(64, 48), OrzaVSMobile::NV21);
  EXPECT_NE(encodeYuv(frame, 64, 48, OrzaVSMobile::NV21), encodeYuv(frame, 64, 48, OrzaVSMobile::NV12));
}

TEST(JpegEncoder, PlanarAndSemiPlanarFramesOfOneImageAreIdentical) {
  // Width and height multiples of 16: both layouts then hand the library the same samples.
  for (const auto& s : {std::make_pair(64, 48), std::make_pair(320, 240)}) {
    const Yuv420 img = smoothYuv(s.first, s.second);
    const std::vector<uint8_t> i420 =
        encodeYuv(packYuv(img, OrzaVSMobile::I420), s.first, s.second, OrzaVSMobile::I420);
    EXPECT_EQ(i420, encodeYuv(packYuv(img, OrzaVSMobile::NV12), s.first, s.second, OrzaVSMobile::NV12));
    EXPECT_EQ(i420, encodeYuv(packYuv(img, OrzaVSMobile::NV21), s.first, s.second, OrzaVSMobile::NV21));
  }
}

TEST(JpegEncoder, YuvStrideIsNotUsed) {
  const Yuv420 img = smoothYuv(48, 32);
  const std::vector<uint8_t> frame = packYuv(img, OrzaVSMobile::NV21);
  std::vector<uint8_t> a, b, work;
  ASSERT_TRUE(encodeYUVToJpeg(frame.data(), 32, 48, 48, OrzaVSMobile::NV21, a, 75, work));
  ASSERT_TRUE(encodeYUVToJpeg(frame.data(), 32, 48, 4096, OrzaVSMobile::NV21, b, 75, work));
  EXPECT_EQ(a, b);
  ASSERT_TRUE(encodeYUVToJpeg(frame.data(), 32, 48, -1, OrzaVSMobile::NV21, b, 75, work));
  EXPECT_EQ(a, b);
}

TEST(JpegEncoder, PaddedPackedRowsEncodeLikeTightRows) {
  const int w = 37, h = 29;  // odd sizes: partial MCUs on both edges
  struct Case {
    ImageFormat format;
    int channels;
  } cases[] = {
      {OrzaVSMobile::RGB, 3}, {OrzaVSMobile::BGR, 3}, {OrzaVSMobile::BGRA, 4}, {OrzaVSMobile::GRAY, 1}};
  for (const Case& c : cases) {
    SCOPED_TRACE(name(c.format));
    const size_t row = static_cast<size_t>(w) * c.channels;
    const std::vector<uint8_t> tight = smoothPacked(w, h, c.channels, static_cast<int>(row));
    const std::vector<uint8_t> padded = restride(tight, h, row, row, row + 13, 0xC3);
    EXPECT_EQ(encodePacked(tight, w, h, static_cast<int>(row), c.channels, c.format),
              encodePacked(padded, w, h, static_cast<int>(row) + 13, c.channels, c.format));
  }
}

TEST(JpegEncoder, BgrOrdersAreConvertedToRgbAndAlphaIsDropped) {
  const int w = 24, h = 20;
  const std::vector<uint8_t> rgb = smoothPacked(w, h, 3, 3 * w);
  std::vector<uint8_t> bgr(rgb.size()), bgra(static_cast<size_t>(w) * h * 4), bgrx(bgra.size());
  for (size_t i = 0; i < static_cast<size_t>(w) * h; ++i) {
    for (int k = 0; k < 3; ++k) {
      bgr[3 * i + k] = rgb[3 * i + 2 - k];
      bgra[4 * i + k] = bgrx[4 * i + k] = rgb[3 * i + 2 - k];
    }
    bgra[4 * i + 3] = static_cast<uint8_t>(i);
    bgrx[4 * i + 3] = 0xFF;
  }
  const std::vector<uint8_t> expected = encodePacked(rgb, w, h, 3 * w, 3, OrzaVSMobile::RGB);
  EXPECT_EQ(expected, encodePacked(bgr, w, h, 3 * w, 3, OrzaVSMobile::BGR));
  EXPECT_EQ(expected, encodePacked(bgra, w, h, 4 * w, 4, OrzaVSMobile::BGRA));
  EXPECT_EQ(expected, encodePacked(bgrx, w, h, 4 * w, 4, OrzaVSMobile::BGRX));
  // Only the RGB format is taken as it is; its bytes read as BGR make another stream.
  EXPECT_NE(expected, encodePacked(rgb, w, h, 3 * w, 3, OrzaVSMobile::BGR));
  // One channel is grey whatever the format says.
  const std::vector<uint8_t> grey(rgb.begin(), rgb.begin() + w * h);
  EXPECT_EQ(encodePacked(grey, w, h, w, 1, OrzaVSMobile::GRAY),
            encodePacked(grey, w, h, w, 1, OrzaVSMobile::RGB));
}

TEST(JpegEncoder, QualityIsClampedAndTablesStayBaseline) {
  const Yuv420 img = smoothYuv(64, 48);
  const std::vector<uint8_t> frame = packYuv(img, OrzaVSMobile::NV21);
  const std::vector<uint8_t> grey(img.y);
  auto yuvAt = [&](int q) { return encodeYuv(frame, 64, 48, OrzaVSMobile::NV21, q); };
  auto greyAt = [&](int q) { return encodePacked(grey, 64, 48, 64, 1, OrzaVSMobile::GRAY, q); };

  EXPECT_EQ(yuvAt(-5), yuvAt(0));
  EXPECT_EQ(yuvAt(250), yuvAt(100));
  EXPECT_EQ(yuvAt(INT32_MIN), yuvAt(0));
  EXPECT_EQ(yuvAt(INT32_MAX), yuvAt(100));
  EXPECT_EQ(greyAt(-5), greyAt(0));
  EXPECT_EQ(greyAt(250), greyAt(100));
  // Quality does change the stream.
  EXPECT_NE(yuvAt(0), yuvAt(100));
  EXPECT_NE(yuvAt(50), yuvAt(51));

  // At the lowest quality the scaled tables exceed 8 bits unless baseline tables are forced.
  for (const auto& jpeg : {yuvAt(0), greyAt(0)}) {
    const Decoded d = decodeJpeg(jpeg);
    ASSERT_TRUE(d.ok);
    EXPECT_EQ(d.maxQuantValue, 255);
  }
  EXPECT_EQ(decodeJpeg(yuvAt(100)).maxQuantValue, 1);
}

// ---------------------------------------------------------------------------------------------
// Frame edges: every frame below lies in exactly-sized memory followed by an unreadable page,
// so a read of even one byte past its end (by the encoder or by the library) crashes the test.

TEST(JpegEncoder, TinyFramesEncode) {
  for (ImageFormat format : kYuvFormats) {
    for (const auto& s :
         {std::make_pair(1, 1), std::make_pair(2, 1), std::make_pair(1, 2), std::make_pair(3, 3)}) {
      SCOPED_TRACE(name(format) + " " + std::to_string(s.first) + "x" + std::to_string(s.second));
      const Yuv420 img = smoothYuv(s.first, s.second);
      const Decoded d = decodeJpeg(encodeYuv(packYuv(img, format), s.first, s.second, format));
      ASSERT_TRUE(d.ok);
      EXPECT_EQ(d.width, s.first);
      EXPECT_EQ(d.height, s.second);
      EXPECT_EQ(d.warnings, 0);
      EXPECT_LE(std::abs(static_cast<int>(d.pixels[0]) - img.y[0]), 3);
    }
  }
  const std::vector<uint8_t> one = {200, 10, 60, 255};
  EXPECT_EQ(decodeJpeg(encodePacked({200}, 1, 1, 1, 1, OrzaVSMobile::GRAY)).width, 1);
  EXPECT_EQ(decodeJpeg(encodePacked({1, 2, 3}, 1, 1, 3, 3, OrzaVSMobile::RGB)).height, 1);
  EXPECT_TRUE(decodeJpeg(encodePacked(one, 1, 1, 4, 4, OrzaVSMobile::BGRA)).ok);
}

// Heights that leave the last band of 16 rows partly empty, widths that leave the last MCU
// partly empty. The visible picture must still come out right.
TEST(JpegEncoder, PartialBandsAndColumnsStayInsideTheFrame) {
  const int sizes[][2] = {{640, 481}, {64, 24}, {64, 20}, {33, 17}, {20, 16}, {17, 1}, {100, 7}, {6, 30}};
  for (ImageFormat format : kYuvFormats) {
    for (const auto& s : sizes) {
      const int w = s[0], h = s[1];
      SCOPED_TRACE(name(format) + " " + std::to_string(w) + "x" + std::to_string(h));
      const Yuv420 img = smoothYuv(w, h);
      const Decoded d = decodeJpeg(encodeYuv(packYuv(img, format), w, h, format));
      ASSERT_TRUE(d.ok);
      EXPECT_EQ(d.width, w);
      EXPECT_EQ(d.height, h);
      EXPECT_EQ(d.warnings, 0);
      EXPECT_GE(lumaPsnr(d, img), 42.0);
    }
  }
  const int packedSizes[][2] = {{1, 17}, {3, 5}, {5, 33}, {17, 9}, {31, 2}};
  for (int channels : {1, 3, 4}) {
    for (const auto& s : packedSizes) {
      const int w = s[0], h = s[1];
      SCOPED_TRACE(std::to_string(channels) + " channels " + std::to_string(w) + "x" + std::to_string(h));
      const std::vector<uint8_t> px = smoothPacked(w, h, channels, w * channels);
      const ImageFormat format = channels == 1   ? OrzaVSMobile::GRAY
                                 : channels == 3 ? OrzaVSMobile::RGB
                                                 : OrzaVSMobile::BGRA;
      const Decoded d = decodeJpeg(encodePacked(px, w, h, w * channels, channels, format));
      ASSERT_TRUE(d.ok);
      EXPECT_EQ(d.width, w);
      EXPECT_EQ(d.height, h);
    }
  }
}

// Whatever lies after the frame cannot change the stream (the encoder never looks there).
TEST(JpegEncoder, BytesAfterTheFrameDoNotMatter) {
  for (ImageFormat format : kYuvFormats) {
    for (const auto& s : {std::make_pair(64, 20), std::make_pair(33, 17), std::make_pair(1, 1)}) {
      SCOPED_TRACE(name(format) + " " + std::to_string(s.first) + "x" + std::to_string(s.second));
      std::vector<uint8_t> frame = packYuv(smoothYuv(s.first, s.second), format);
      const size_t size = frame.size();
      frame.resize(size + 4096, 0x00);
      std::vector<uint8_t> a, b, work;
      ASSERT_TRUE(encodeYUVToJpeg(frame.data(), s.second, s.first, s.first, format, a, 80, work));
      std::fill(frame.begin() + static_cast<std::ptrdiff_t>(size), frame.end(), 0xFF);
      ASSERT_TRUE(encodeYUVToJpeg(frame.data(), s.second, s.first, s.first, format, b, 80, work));
      EXPECT_EQ(a, b);
    }
  }
}

// The band addressing, written out plainly on libjpeg's own memory destination. It reads
// wherever the addresses lead, so it is only used on frames where the library reads nothing past
// the picture's own rows and columns: there the encoder must give exactly its bytes. Heights 40
// and 72 make the library complete the last chroma block row from the work rows the previous
// band left behind.
std::vector<uint8_t> referenceEncode(const std::vector<uint8_t>& frame, int w, int h, ImageFormat format,
                                     int quality) {
  jpeg_compress_struct c;
  jpeg_error_mgr e;
  c.err = jpeg_std_error(&e);
  jpeg_create_compress(&c);
  unsigned char* buffer = nullptr;
  unsigned long size = 0;
  jpeg_mem_dest(&c, &buffer, &size);
  c.image_width = w;
  c.image_height = h;
  c.input_components = 3;
  c.in_color_space = JCS_YCbCr;
  jpeg_set_defaults(&c);
  jpeg_set_quality(&c, quality, TRUE);
  jpeg_set_colorspace(&c, JCS_YCbCr);
  c.raw_data_in = TRUE;
  c.dct_method = JDCT_IFAST;
  c.comp_info[0].h_samp_factor = c.comp_info[0].v_samp_factor = 2;
  for (int i = 1; i < 3; ++i) c.comp_info[i].h_samp_factor = c.comp_info[i].v_samp_factor = 1;
  jpeg_start_compress(&c, TRUE);
  const size_t cw = w / 2;
  std::vector<uint8_t> cb(8 * cw + 16), cr(8 * cw + 16);
  uint8_t* px = const_cast<uint8_t*>(frame.data());
  JSAMPROW y[16], u[8], v[8];
  JSAMPARRAY planes[3] = {y, u, v};
  while (c.next_scanline < c.image_height) {
    const size_t n = c.next_scanline;
    for (size_t k = 0; k < 16; ++k) y[k] = px + w * (n + k);
    for (size_t k = 0; k < 8; ++k) {
      if (format == OrzaVSMobile::I420) {
        u[k] = px + w * h + (n * cw) / 2 + k * cw;
        v[k] = px + w * h + (w * h) / 4 + (n * cw) / 2 + k * cw;
      } else {
        u[k] = &cb[k * cw];
        v[k] = &cr[k * cw];
      }
    }
    if (format != OrzaVSMobile::I420) {
      for (size_t k = 0; k < std::min<size_t>((h - n) / 2, 8); ++k)
        for (size_t i = 0; i < cw; ++i) {
          const uint8_t* pair = px + w * (h + n / 2 + k) + 2 * i;
          cb[k * cw + i] = pair[format == OrzaVSMobile::NV21 ? 1 : 0];
          cr[k * cw + i] = pair[format == OrzaVSMobile::NV21 ? 0 : 1];
        }
    }
    jpeg_write_raw_data(&c, planes, 16);
  }
  jpeg_finish_compress(&c);
  jpeg_destroy_compress(&c);
  std::vector<uint8_t> out(buffer, buffer + size);
  std::free(buffer);
  return out;
}

// What the library sees past the bottom of the picture, shown by equivalence: a short frame
// gives the stream of a taller frame (with the same number of block rows) whose extra rows hold
// what the encoder supplies, except for the height in the frame header. Luminance rows past the
// bottom repeat the last row. Semi-planar chroma rows that the last band does not refill keep
// the previous band's rows (the taller frame copies them: chroma row r from row r - 8), and in a
// frame of one band they are mid-grey.
TEST(JpegEncoder, RowsPastTheBottomAreFilledFromInsideThePlane) {
  struct Case {
    int shortHeight, tallHeight;
    bool grey;  // chroma rows past the short frame's are mid-grey instead of rows r - 8
  } cases[] = {{20, 24, false}, {17, 24, false}, {4, 8, true}};
  const int w = 64, cw = w / 2;
  for (ImageFormat format : {OrzaVSMobile::NV21, OrzaVSMobile::NV12}) {
    for (const Case& c : cases) {
      SCOPED_TRACE(name(format) + " height " + std::to_string(c.shortHeight));
      const Yuv420 small = smoothYuv(w, c.shortHeight);
      Yuv420 tall = smoothYuv(w, c.tallHeight);
      for (int r = 0; r < c.tallHeight; ++r)
        std::copy_n(&small.y[std::min(r, c.shortHeight - 1) * w], w, &tall.y[r * w]);
      for (int r = 0; r < tall.chromaHeight(); ++r) {
        for (int x = 0; x < cw; ++x) {
          const bool own = r < small.chromaHeight();
          const int from = own ? r : r - 8;
          tall.u[r * cw + x] = own || !c.grey ? small.u[from * cw + x] : 0x80;
          tall.v[r * cw + x] = own || !c.grey ? small.v[from * cw + x] : 0x80;
        }
      }
      const std::vector<uint8_t> a = encodeYuv(packYuv(small, format), w, c.shortHeight, format);
      std::vector<uint8_t> b = encodeYuv(packYuv(tall, format), w, c.tallHeight, format);
      ASSERT_EQ(a.size(), b.size());
      // Start of frame: FF C0, length (2), precision (1), height (2, big-endian).
      size_t sof = 0;
      while (sof + 1 < b.size() && !(b[sof] == 0xFF && b[sof + 1] == 0xC0)) ++sof;
      ASSERT_LT(sof + 6, b.size());
      EXPECT_EQ(b[sof + 6], c.tallHeight);
      b[sof + 6] = static_cast<uint8_t>(c.shortHeight);
      EXPECT_EQ(a, b);
    }
  }
}

TEST(JpegEncoder, MatchesThePlainBandAddressingWhereItStaysInsideTheFrame) {
  struct Case {
    ImageFormat format;
    int w, h, quality;
  } cases[] = {{OrzaVSMobile::I420, 64, 48, 50}, {OrzaVSMobile::I420, 320, 240, 90},
               {OrzaVSMobile::NV21, 64, 40, 50}, {OrzaVSMobile::NV12, 64, 40, 75},
               {OrzaVSMobile::NV21, 96, 72, 50}, {OrzaVSMobile::NV21, 256, 192, 100}};
  for (const Case& c : cases) {
    SCOPED_TRACE(name(c.format) + " " + std::to_string(c.w) + "x" + std::to_string(c.h));
    const Yuv420 img = c.w == 256 ? noiseYuv(c.w, c.h, 11) : smoothYuv(c.w, c.h);  // noise: many flushes
    const std::vector<uint8_t> frame = packYuv(img, c.format);
    EXPECT_EQ(encodeYuv(frame, c.w, c.h, c.format, c.quality),
              referenceEncode(frame, c.w, c.h, c.format, c.quality));
  }
}

// ---------------------------------------------------------------------------------------------
// Bad input and library errors.

TEST(JpegEncoder, UnusableArgumentsAreRefused) {
  const std::vector<uint8_t> frame(64 * 64 * 4, 0x80);
  std::vector<uint8_t> out{1, 2, 3}, work;
  auto yuv = [&](const uint8_t* px, int h, int w, int format) {
    out.assign(3, 7);
    const bool ok = encodeYUVToJpeg(px, h, w, w, static_cast<ImageFormat>(format), out, 50, work);
    EXPECT_TRUE(out.empty());
    EXPECT_EQ(work.size(), 4096u);
    return ok;
  };
  EXPECT_FALSE(yuv(nullptr, 16, 16, OrzaVSMobile::NV21));
  EXPECT_FALSE(yuv(frame.data(), 0, 16, OrzaVSMobile::NV21));
  EXPECT_FALSE(yuv(frame.data(), 16, 0, OrzaVSMobile::I420));
  EXPECT_FALSE(yuv(frame.data(), -16, 16, OrzaVSMobile::NV12));
  EXPECT_FALSE(yuv(frame.data(), 16, INT32_MIN, OrzaVSMobile::NV12));
  for (int format : {-1, 3, 4, 7, 1000}) EXPECT_FALSE(yuv(frame.data(), 16, 16, format)) << format;

  auto packed = [&](const uint8_t* px, int h, int w, int stride, int channels) {
    out.assign(3, 7);
    const bool ok = encodePackedToJpeg(px, h, w, stride, channels, OrzaVSMobile::BGR, out, 50, work);
    EXPECT_TRUE(out.empty());
    return ok;
  };
  EXPECT_FALSE(packed(nullptr, 16, 16, 48, 3));
  EXPECT_FALSE(packed(frame.data(), 0, 16, 48, 3));
  EXPECT_FALSE(packed(frame.data(), 16, -1, 48, 3));
  EXPECT_FALSE(packed(frame.data(), 16, 16, -48, 3));
  EXPECT_FALSE(packed(frame.data(), 16, 16, 48, 0));
  EXPECT_FALSE(packed(frame.data(), 16, 16, 48, -3));
  EXPECT_FALSE(packed(frame.data(), 16, 16, 48, 2));
}

// Rows closer together than their length overlap inside the frame; a stride of 0 repeats the
// first row. Both are readable, so they encode.
TEST(JpegEncoder, OverlappingPackedRowsEncode) {
  std::vector<uint8_t> row(40);
  for (size_t i = 0; i < row.size(); ++i) row[i] = static_cast<uint8_t>(40 + 5 * i);
  GuardedBytes oneRow(row);
  std::vector<uint8_t> out, work;
  ASSERT_TRUE(encodePackedToJpeg(oneRow.data(), 24, 40, 0, 1, OrzaVSMobile::GRAY, out, 90, work));
  const Decoded d = decodeJpeg(out);
  ASSERT_TRUE(d.ok);
  ASSERT_EQ(d.height, 24);
  for (int r = 0; r < 24; ++r)
    for (int c = 0; c < 40; ++c) EXPECT_NEAR(d.pixels[r * 40 + c], row[c], 4) << r << "," << c;

  // Stride 6 for 4-byte pixels: the frame is (h-1)*6 + 4*w bytes.
  GuardedBytes overlap(static_cast<size_t>(9) * 6 + 4 * 8);
  for (size_t i = 0; i < overlap.size(); ++i) overlap.data()[i] = static_cast<uint8_t>(i * 3);
  EXPECT_TRUE(encodePackedToJpeg(overlap.data(), 10, 8, 6, 4, OrzaVSMobile::BGRA, out, 90, work));
}

// Sizes the library refuses raise its fatal error, which comes back as false: nothing thrown,
// nothing printed, and (under the leak checker) nothing leaked.
TEST(JpegEncoder, LibraryErrorsBecomeFalse) {
  orzavs_test::StdoutCapture capture;
  std::vector<uint8_t> out, work;
  {
    GuardedBytes wide(yuvFrameSize(70000, 2));
    std::memset(wide.data(), 0x80, wide.size());
    for (ImageFormat format : kYuvFormats) {
      bool ok = true;
      EXPECT_NO_THROW(ok = encodeYUVToJpeg(wide.data(), 2, 70000, 70000, format, out, 50, work));
      EXPECT_FALSE(ok) << name(format);
    }
    GuardedBytes tall(yuvFrameSize(2, 70000));
    std::memset(tall.data(), 0x80, tall.size());
    bool ok = true;
    EXPECT_NO_THROW(ok = encodeYUVToJpeg(tall.data(), 70000, 2, 2, OrzaVSMobile::NV21, out, 50, work));
    EXPECT_FALSE(ok);
  }
  {
    GuardedBytes wide(static_cast<size_t>(70000) * 4);
    std::memset(wide.data(), 0x80, wide.size());
    bool ok = true;
    EXPECT_NO_THROW(
        ok = encodePackedToJpeg(wide.data(), 1, 70000, 70000 * 4, 4, OrzaVSMobile::BGRA, out, 50, work));
    EXPECT_FALSE(ok);
    EXPECT_NO_THROW(
        ok = encodePackedToJpeg(wide.data(), 1, 70000, 70000, 1, OrzaVSMobile::GRAY, out, 50, work));
    EXPECT_FALSE(ok);
  }
  EXPECT_EQ(capture.text(), "");

  // The encoder works normally after an error.
  const Yuv420 img = smoothYuv(32, 32);
  EXPECT_TRUE(decodeJpeg(encodeYuv(packYuv(img, OrzaVSMobile::NV21), 32, 32, OrzaVSMobile::NV21)).ok);
}

// The vector de-interleave and its scalar twin give the same rows for every length (vector
// body, scalar tail, both) and both pair orders, from unaligned sources, writing nothing past
// `pairs` bytes.
TEST(JpegEncoder, ChromaDeinterleaveMatchesScalarTwin) {
  Noise n(99);
  std::vector<uint8_t> src(2 * 80 + 1);
  for (auto& b : src) b = n.next();
  for (size_t pairs = 0; pairs <= 80; ++pairs) {
    for (bool cbFirst : {false, true}) {
      std::vector<uint8_t> cb(pairs + 4, 0xAB), cr(pairs + 4, 0xCD), cb2(cb), cr2(cr);
      Tovra::deinterleaveChroma(src.data() + 1, pairs, cbFirst, cb.data(), cr.data());
      Tovra::deinterleaveChromaScalar(src.data() + 1, pairs, cbFirst, cb2.data(), cr2.data());
      ASSERT_EQ(cb, cb2) << pairs;
      ASSERT_EQ(cr, cr2) << pairs;
      for (size_t i = 0; i < pairs; ++i) {
        ASSERT_EQ(cb[i], src[1 + 2 * i + (cbFirst ? 0 : 1)]);
        ASSERT_EQ(cr[i], src[1 + 2 * i + (cbFirst ? 1 : 0)]);
      }
      for (size_t i = pairs; i < pairs + 4; ++i) ASSERT_EQ(cb[i], 0xAB);
    }
  }
}

}  // namespace
