// The detector keeps per-thread scratch rows; threads working on frames of different widths at
// the same time must each get exactly their single-threaded answer.

#include <gtest/gtest.h>

#include <atomic>
#include <random>
#include <thread>
#include <vector>

#include "Fast9Reference.h"
#include "features/Fast9.h"
#include "features/InterestPoints.h"

namespace {

using namespace OrzaVSMobile;

struct Frame {
  int w, h, stride;
  std::vector<uint8_t> bytes;
  std::vector<Fast9Corner> kept;
  std::vector<int> scores;
  std::vector<Point2f> points;
};

TEST(InterestPointsConcurrencyTest, ThreadsOnDifferentFramesGetTheirOwnResults) {
  std::mt19937 rng(42);
  std::vector<Frame> frames;
  for (int i = 0; i < 4; ++i) {
    Frame f;
    f.w = 90 + 37 * i;
    f.h = 60 + 5 * i;
    f.stride = f.w + 3 * i;
    const fast9ref::Content content = i % 2 ? fast9ref::Content::Noise : fast9ref::Content::Blocks;
    f.bytes = fast9ref::makePlane(f.w, f.h, f.stride, content, rng);
    fast9DetectNonmax(f.bytes.data(), f.w, f.h, f.stride, 50, f.kept, f.scores);
    ImageBuffer image(0, GRAY, f.w, f.h, f.stride, 1, f.bytes.data());
    detectInterestPoints(image, f.points);
    frames.push_back(std::move(f));
  }
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      std::vector<Fast9Corner> kept;
      std::vector<int> scores;
      std::vector<Point2f> points;
      for (int round = 0; round < 30; ++round) {
        Frame& f = frames[static_cast<size_t>((t + round) % 4)];  // widths change under each thread
        fast9DetectNonmax(f.bytes.data(), f.w, f.h, f.stride, 50, kept, scores,
                          round % 3 ? Fast9Path::Best : Fast9Path::Scalar);
        if (kept != f.kept || scores != f.scores) ++mismatches;
        ImageBuffer image(0, GRAY, f.w, f.h, f.stride, 1, f.bytes.data());
        detectInterestPoints(image, points);
        if (points.size() != f.points.size()) {
          ++mismatches;
          continue;
        }
        for (size_t i = 0; i < points.size(); ++i) {
          if (points[i].x != f.points[i].x || points[i].y != f.points[i].y) ++mismatches;
        }
      }
    });
  }
  for (std::thread& th : threads) th.join();
  EXPECT_EQ(mismatches.load(), 0);
}

}  // namespace
