#include <gtest/gtest.h>

#include <cstdint>
#include <thread>
#include <vector>

#include "tests/vsearch/JpegTestSupport.h"
#include "vsearch/JpegEncoder.h"

namespace {

using namespace jpeg_test;
using namespace OrzaVSMobile;

// The encoders share no state: threads encoding at once, each with its own vectors, get the
// streams a single thread gets.
TEST(JpegEncoderConcurrency, ThreadsEncodingAtOnceGetTheSingleThreadedStreams) {
  const Yuv420 img = makeYuv(96, 40);  // a partial last band on every call
  const std::vector<uint8_t> frames[] = {packYuv(img, NV21), packYuv(img, I420), img.y};
  auto encode = [&](int kind, std::vector<uint8_t>& out, std::vector<uint8_t>& work) {
    if (kind == 2) return Tovra::encodePackedToJpeg(img.y.data(), 40, 96, 96, 1, GRAY, out, 50, work);
    return Tovra::encodeYUVToJpeg(frames[kind].data(), 40, 96, 96, kind == 0 ? NV21 : I420, out, 50, work);
  };
  std::vector<uint8_t> expected[3], work;
  for (int kind = 0; kind < 3; ++kind) ASSERT_TRUE(encode(kind, expected[kind], work));

  std::vector<int> mismatches(4, 0);
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      std::vector<uint8_t> out, scratch;
      for (int i = 0; i < 30; ++i) {
        const int kind = (t + i) % 3;
        mismatches[t] += !encode(kind, out, scratch) || out != expected[kind];
      }
    });
  }
  for (std::thread& th : threads) th.join();
  for (int t = 0; t < 4; ++t) EXPECT_EQ(mismatches[t], 0) << "thread " << t;
}

}  // namespace
