#include "features/InterestPoints.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <random>
#include <vector>

#include "Fast9Reference.h"
#include "features/Fast9.h"

namespace {

using namespace OrzaVSMobile;

std::vector<Point2f> run(const ImageBuffer& image) {
  std::vector<Point2f> points(3, Point2f(-1, -1));  // stale content must go
  detectInterestPoints(image, points);
  return points;
}

std::vector<Point2f> runGray(std::vector<uint8_t>& plane, int w, int h, int stride) {
  return run(ImageBuffer(0, GRAY, w, h, stride, 1, plane.data()));
}

// The step as defined, on top of the reference detector: suppression at 50, scores at 50, then
// all corners in row-major order or a selection of the 50 best scores.
std::vector<Point2f> referenceStep(const uint8_t* plane, int w, int h, int stride) {
  const fast9ref::Detection kept = fast9ref::suppress(fast9ref::detect(plane, w, h, stride, 50));
  std::vector<int> order(kept.corners.size());
  std::iota(order.begin(), order.end(), 0);
  if (order.size() > 50) {
    std::vector<int> scores;
    for (const Fast9Corner& c : kept.corners) scores.push_back(fast9ref::score(plane, stride, c.x, c.y, 50));
    std::nth_element(order.begin(), order.begin() + 50, order.end(),
                     [&](int a, int b) { return scores[static_cast<size_t>(a)] > scores[static_cast<size_t>(b)]; });
    order.resize(50);
  }
  std::vector<Point2f> out;
  for (int i : order) {
    const Fast9Corner& c = kept.corners[static_cast<size_t>(i)];
    out.emplace_back(static_cast<float>(c.x), static_cast<float>(c.y));
  }
  return out;
}

void expectSamePoints(const std::vector<Point2f>& a, const std::vector<Point2f>& b) {
  ASSERT_EQ(a.size(), b.size());
  for (size_t i = 0; i < a.size(); ++i) EXPECT_TRUE(a[i].x == b[i].x && a[i].y == b[i].y) << i;
}

// Single-pixel dots on black, 7 pixels apart: each is a kept corner scoring its value minus one.
// Values are distinct for up to 190 dots, or all `same` when given.
std::vector<uint8_t> dots(int w, int h, int count, int same = 0) {
  std::vector<uint8_t> p(static_cast<size_t>(w) * h, 0);
  int i = 0;
  for (int y = 4; y < h - 4 && i < count; y += 7) {
    for (int x = 4; x < w - 4 && i < count; x += 7, ++i) {
      p[static_cast<size_t>(y) * w + x] = static_cast<uint8_t>(same ? same : 60 + (i * 37) % 190);
    }
  }
  return p;
}

TEST(InterestPointsTest, UpToFiftyInRowMajorOrderThenTheFiftyBest) {
  const int w = 60, h = 200;
  for (int count : {0, 1, 12, 50, 51}) {
    std::vector<uint8_t> p = dots(w, h, count);
    const std::vector<Point2f> points = runGray(p, w, h, w);
    ASSERT_EQ(points.size(), static_cast<size_t>(std::min(count, 50)));
    expectSamePoints(points, referenceStep(p.data(), w, h, w));  // row-major, or without the weakest
  }
  std::vector<uint8_t> ties = dots(80, 80, 70, 200);  // every corner ties: any 50 distinct ones
  const std::vector<Point2f> points = runGray(ties, 80, 80, 80);
  ASSERT_EQ(points.size(), 50u);
  for (size_t i = 0; i < points.size(); ++i) {
    for (size_t j = 0; j < i; ++j) EXPECT_FALSE(points[i].x == points[j].x && points[i].y == points[j].y);
  }
}

// Noise gives many more kept corners than 50: the selection must be the step's, exactly.
TEST(InterestPointsTest, NoisyFramesKeepTheFiftyBestKeptCorners) {
  std::mt19937 rng(77);
  for (int round = 0; round < 4; ++round) {
    const int w = 60 + static_cast<int>(rng() % 90), h = 45 + static_cast<int>(rng() % 40);
    const int stride = w + static_cast<int>(rng() % 9);
    std::vector<uint8_t> p = fast9ref::makePlane(w, h, stride, fast9ref::Content::Noise, rng);
    const std::vector<Point2f> points = runGray(p, w, h, stride);
    ASSERT_EQ(points.size(), 50u);
    expectSamePoints(points, referenceStep(p.data(), w, h, stride));
  }
}

TEST(InterestPointsTest, OnlyTheFirstPlaneOfAUsableFrameIsRead) {
  const int w = 64, h = 48;
  std::vector<uint8_t> gray = dots(w, h, 10);
  std::vector<uint8_t> nv21(gray);
  nv21.resize(static_cast<size_t>(w) * h * 3 / 2, 255);  // bright chroma below the last row
  expectSamePoints(run(ImageBuffer(0, NV21, w, h, w, 1, nv21.data())), runGray(gray, w, h, w));
  EXPECT_EQ(runGray(gray, w, h, w).size(), 10u);

  EXPECT_TRUE(run(ImageBuffer(0, GRAY, w, h, w, 1, nullptr)).empty());
  for (int bad : {6, 0, -1}) {
    EXPECT_TRUE(runGray(gray, bad, h, w).empty()) << bad;
    EXPECT_TRUE(runGray(gray, w, bad, w).empty()) << bad;
  }
  EXPECT_TRUE(runGray(gray, w, h, w - 1).empty());  // stride below width

  // A buffer that knows its size: a plane reaching past it is not read at all.
  ImageBuffer owned(0, GRAY, w, h, w, 1, nullptr);
  ASSERT_EQ(owned.allocateBuffer(w * h), w * h);
  ASSERT_EQ(owned.fillBuffer(gray.data(), w * h), w * h);
  EXPECT_EQ(run(owned).size(), 10u);
  owned.height = h + 1;
  EXPECT_TRUE(run(owned).empty());
  owned.height = h;
  owned.widthStep = w + 1;
  EXPECT_TRUE(run(owned).empty());
}

}  // namespace
