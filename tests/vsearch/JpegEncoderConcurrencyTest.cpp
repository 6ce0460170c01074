#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "support/Threads.h"
#include "tests/vsearch/JpegTestSupport.h"
#include "vsearch/JpegEncoder.h"

namespace {

using namespace OrzaVSMobile;

// The encoders share no state: threads encoding at once get the streams a single thread gets.
TEST(JpegEncoderConcurrency, ThreadsEncodingAtOnceGetTheSingleThreadedStreams) {
  const jpeg_test::Yuv420 img = jpeg_test::makeYuv(96, 40);  // a partial last band on every call
  const std::vector<uint8_t> frames[] = {jpeg_test::packYuv(img, NV21), jpeg_test::packYuv(img, I420)};
  EXPECT_EQ(0, orzavs_test::threadedMismatches(3, [&](int kind, int) {
    std::vector<uint8_t> out, work;
    const bool ok = kind == 2 ? Tovra::encodePackedToJpeg(img.y.data(), 40, 96, 96, 1, GRAY, out, 50, work)
                              : Tovra::encodeYUVToJpeg(frames[kind].data(), 40, 96, 96, kind ? I420 : NV21, out, 50, work);
    return ok ? out : std::vector<uint8_t>();
  }));
}

}  // namespace
