// The detector keeps per-thread scratch rows; threads working on frames of different widths at
// the same time must each get exactly their single-threaded answer.

#include <gtest/gtest.h>

#include <random>
#include <tuple>
#include <vector>

#include "Fast9Reference.h"
#include "features/Fast9.h"
#include "features/InterestPoints.h"
#include "support/Threads.h"

namespace {

using namespace OrzaVSMobile;

TEST(InterestPointsConcurrencyTest, ThreadsOnDifferentFramesGetTheirOwnResults) {
  std::mt19937 rng(42);
  std::vector<std::vector<uint8_t>> planes;
  for (int i = 0; i < 4; ++i) {
    const auto content = i % 2 ? fast9ref::Content::Noise : fast9ref::Content::Blocks;
    planes.push_back(fast9ref::makePlane(90 + 37 * i, 60 + 5 * i, 90 + 40 * i, content, rng));
  }
  // Frame i is (90 + 37i) x (60 + 5i) with stride 90 + 40i; the kernel alternates.
  EXPECT_EQ(0, orzavs_test::threadedMismatches(4, [&](int i, int round) {
    const int w = 90 + 37 * i, h = 60 + 5 * i, stride = 90 + 40 * i;
    std::tuple<std::vector<Fast9Corner>, std::vector<int>, std::vector<float>> result;
    fast9DetectNonmax(planes[i].data(), w, h, stride, 50, std::get<0>(result), std::get<1>(result),
                      round % 3 ? Fast9Path::Best : Fast9Path::Scalar);
    std::vector<Point2f> points;
    detectInterestPoints(ImageBuffer(0, GRAY, w, h, stride, 1, planes[i].data()), points);
    for (const Point2f& p : points) std::get<2>(result).insert(std::get<2>(result).end(), {p.x, p.y});
    return result;
  }));
}

}  // namespace
