#include <gtest/gtest.h>

#include <cstdint>
#include <thread>
#include <vector>

#include "tests/vsearch/JpegTestSupport.h"
#include "vsearch/JpegEncoder.h"

namespace {

using namespace jpeg_test;

// Encoders share no state: threads encoding at once, each with its own vectors, produce the
// streams a single thread produces.
TEST(JpegEncoderConcurrency, ThreadsEncodingAtOnceGetTheSingleThreadedStreams) {
  const Yuv420 img = smoothYuv(96, 40);  // a partial last band on every call
  const std::vector<uint8_t> nv21 = packYuv(img, OrzaVSMobile::NV21);
  const std::vector<uint8_t> i420 = packYuv(img, OrzaVSMobile::I420);
  const std::vector<uint8_t> bgr = smoothPacked(96, 40, 3, 96 * 3);
  std::vector<uint8_t> work, expectNv21, expectI420, expectBgr;
  ASSERT_TRUE(Tovra::encodeYUVToJpeg(nv21.data(), 40, 96, 96, OrzaVSMobile::NV21, expectNv21, 50, work));
  ASSERT_TRUE(Tovra::encodeYUVToJpeg(i420.data(), 40, 96, 96, OrzaVSMobile::I420, expectI420, 50, work));
  ASSERT_TRUE(
      Tovra::encodePackedToJpeg(bgr.data(), 40, 96, 96 * 3, 3, OrzaVSMobile::BGR, expectBgr, 50, work));

  constexpr int kThreads = 4, kRounds = 25;
  std::vector<int> mismatches(kThreads, 0);
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      std::vector<uint8_t> out, scratch;
      for (int i = 0; i < kRounds; ++i) {
        switch ((t + i) % 3) {
          case 0:
            Tovra::encodeYUVToJpeg(nv21.data(), 40, 96, 96, OrzaVSMobile::NV21, out, 50, scratch);
            mismatches[t] += out != expectNv21;
            break;
          case 1:
            Tovra::encodeYUVToJpeg(i420.data(), 40, 96, 96, OrzaVSMobile::I420, out, 50, scratch);
            mismatches[t] += out != expectI420;
            break;
          default:
            Tovra::encodePackedToJpeg(bgr.data(), 40, 96, 96 * 3, 3, OrzaVSMobile::BGR, out, 50, scratch);
            mismatches[t] += out != expectBgr;
            break;
        }
      }
    });
  }
  for (std::thread& th : threads) th.join();
  for (int t = 0; t < kThreads; ++t) EXPECT_EQ(mismatches[t], 0) << "thread " << t;
}

}  // namespace
