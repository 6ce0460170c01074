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

ImageBuffer grayImage(std::vector<uint8_t>& plane, int w, int h, int stride) {
  return ImageBuffer(0, GRAY, w, h, stride, 1, plane.data());
}

std::vector<Point2f> run(const ImageBuffer& image) {
  std::vector<Point2f> points(3, Point2f(-1, -1));  // stale content must go
  detectInterestPoints(image, points);
  return points;
}

// The step as defined, on top of the reference detector: suppression at 50, scores again at
// 50, then either all corners in list order or a selection of 50 by descending score.
std::vector<Point2f> referenceStep(const uint8_t* plane, int w, int h, int stride) {
  const fast9ref::Detection kept = fast9ref::suppress(fast9ref::detect(plane, w, h, stride, 50));
  std::vector<int> scores;
  for (const Fast9Corner& c : kept.corners) scores.push_back(fast9ref::score(plane, stride, c.x, c.y, 50));
  std::vector<Point2f> out;
  if (kept.corners.size() <= 50) {
    for (const Fast9Corner& c : kept.corners) out.emplace_back(static_cast<float>(c.x), static_cast<float>(c.y));
    return out;
  }
  std::vector<int> order(kept.corners.size());
  std::iota(order.begin(), order.end(), 0);
  std::nth_element(order.begin(), order.begin() + 50, order.end(),
                   [&](int a, int b) { return scores[static_cast<size_t>(a)] > scores[static_cast<size_t>(b)]; });
  for (int i = 0; i < 50; ++i) {
    const Fast9Corner& c = kept.corners[static_cast<size_t>(order[static_cast<size_t>(i)])];
    out.emplace_back(static_cast<float>(c.x), static_cast<float>(c.y));
  }
  return out;
}

void expectSamePoints(const std::vector<Point2f>& a, const std::vector<Point2f>& b) {
  ASSERT_EQ(a.size(), b.size());
  for (size_t i = 0; i < a.size(); ++i) {
    EXPECT_EQ(a[i].x, b[i].x) << i;
    EXPECT_EQ(a[i].y, b[i].y) << i;
  }
}

// Single-pixel dots of distinct brightness on black, 7 pixels apart: each is a kept corner
// whose score is its value minus one.
std::vector<uint8_t> dots(int w, int h, int count, std::vector<int>* values = nullptr) {
  std::vector<uint8_t> p(static_cast<size_t>(w) * h, 0);
  int i = 0;
  for (int y = 4; y < h - 4 && i < count; y += 7) {
    for (int x = 4; x < w - 4 && i < count; x += 7, ++i) {
      const int v = 60 + (i * 37) % 190;  // distinct for up to 190 dots
      p[static_cast<size_t>(y) * w + x] = static_cast<uint8_t>(v);
      if (values != nullptr) values->push_back(v);
    }
  }
  return p;
}

TEST(InterestPointsTest, FewCornersComeInRowMajorOrder) {
  const int w = 60, h = 40;
  for (int count : {0, 1, 12, 50}) {
    std::vector<uint8_t> p = dots(w, h * 5, count);
    const std::vector<Point2f> points = run(grayImage(p, w, h * 5, w));
    ASSERT_EQ(points.size(), static_cast<size_t>(count));
    for (size_t i = 1; i < points.size(); ++i) {
      EXPECT_TRUE(points[i - 1].y < points[i].y || (points[i - 1].y == points[i].y && points[i - 1].x < points[i].x));
    }
    expectSamePoints(points, referenceStep(p.data(), w, h * 5, w));
  }
}

TEST(InterestPointsTest, MoreThanFiftyKeepsTheFiftyBest) {
  // 51 dots of distinct scores: exactly the weakest one is left out.
  const int w = 60, h = 80;
  std::vector<int> values;
  std::vector<uint8_t> p = dots(w, h, 51, &values);
  ASSERT_EQ(values.size(), 51u);
  const std::vector<Point2f> points = run(grayImage(p, w, h, w));
  ASSERT_EQ(points.size(), 50u);
  for (const Point2f& pt : points) {
    const int v = p[static_cast<size_t>(pt.y) * w + static_cast<size_t>(pt.x)];
    EXPECT_NE(v, *std::min_element(values.begin(), values.end()));
  }
  expectSamePoints(points, referenceStep(p.data(), w, h, w));
}

TEST(InterestPointsTest, NoisyFramesMatchTheDefinedStep) {
  std::mt19937 rng(77);
  for (int round = 0; round < 6; ++round) {
    const int w = 60 + static_cast<int>(rng() % 90), h = 45 + static_cast<int>(rng() % 40);
    const int stride = w + static_cast<int>(rng() % 9);
    const auto content = fast9ref::Content::Noise;
    std::vector<uint8_t> p = fast9ref::makePlane(w, h, stride, content, rng);
    const std::vector<Point2f> points = run(grayImage(p, w, h, stride));
    ASSERT_EQ(points.size(), 50u);
    expectSamePoints(points, referenceStep(p.data(), w, h, stride));

    // Independently of the selection's order: the 50 are distinct kept corners, and no corner
    // left out scores above one that was taken.
    std::vector<Fast9Corner> kept;
    std::vector<int> scores;
    fast9DetectNonmax(p.data(), w, h, stride, 50, kept, scores);
    ASSERT_GT(kept.size(), 50u);
    std::vector<bool> taken(kept.size(), false);
    for (const Point2f& pt : points) {
      const auto it = std::find(kept.begin(), kept.end(), Fast9Corner{static_cast<int>(pt.x), static_cast<int>(pt.y)});
      ASSERT_NE(it, kept.end());
      ASSERT_FALSE(taken[static_cast<size_t>(it - kept.begin())]);
      taken[static_cast<size_t>(it - kept.begin())] = true;
    }
    int lowestTaken = 1000, highestLeft = -1000;
    for (size_t i = 0; i < kept.size(); ++i) {
      if (taken[i]) {
        lowestTaken = std::min(lowestTaken, scores[i]);
      } else {
        highestLeft = std::max(highestLeft, scores[i]);
      }
    }
    EXPECT_GE(lowestTaken, highestLeft);
  }
}

TEST(InterestPointsTest, TiesAtTheFiftiethScoreStillGiveFifty) {
  // 70 dots of the same value: every corner ties, any 50 distinct ones will do.
  const int w = 80, h = 80;
  std::vector<uint8_t> p(static_cast<size_t>(w) * h, 0);
  int n = 0;
  for (int y = 4; y < h - 4; y += 7) {
    for (int x = 4; x < w - 4 && n < 70; x += 7, ++n) p[static_cast<size_t>(y) * w + x] = 200;
  }
  ASSERT_EQ(n, 70);
  const std::vector<Point2f> points = run(grayImage(p, w, h, w));
  ASSERT_EQ(points.size(), 50u);
  for (size_t i = 0; i < points.size(); ++i) {
    EXPECT_EQ(p[static_cast<size_t>(points[i].y) * w + static_cast<size_t>(points[i].x)], 200);
    for (size_t j = 0; j < i; ++j) EXPECT_FALSE(points[i].x == points[j].x && points[i].y == points[j].y);
  }
  expectSamePoints(points, referenceStep(p.data(), w, h, w));
}

TEST(InterestPointsTest, OnlyTheFirstPlaneIsRead) {
  const int w = 64, h = 48;
  std::vector<uint8_t> gray = dots(w, h, 20);
  std::vector<uint8_t> nv21(gray);
  nv21.resize(static_cast<size_t>(w) * h * 3 / 2, 255);  // bright chroma below the last row
  std::mt19937 rng(1);
  for (size_t i = static_cast<size_t>(w) * h; i < nv21.size(); ++i) nv21[i] = static_cast<uint8_t>(rng());
  ImageBuffer yuv(0, NV21, w, h, w, 1, nv21.data());
  expectSamePoints(run(yuv), run(grayImage(gray, w, h, w)));
  EXPECT_EQ(run(yuv).size(), 20u);
}

TEST(InterestPointsTest, UnusableFramesGiveNoPoints) {
  const int w = 64, h = 48;
  std::vector<uint8_t> p = dots(w, h, 10);
  EXPECT_EQ(run(grayImage(p, w, h, w)).size(), 10u);

  ImageBuffer image = grayImage(p, w, h, w);
  image.data = nullptr;
  EXPECT_TRUE(run(image).empty());
  for (int bad : {6, 0, -1}) {
    image = grayImage(p, bad, h, w);
    EXPECT_TRUE(run(image).empty()) << bad;
    image = grayImage(p, w, bad, w);
    EXPECT_TRUE(run(image).empty()) << bad;
  }
  image = grayImage(p, w, h, w - 1);  // stride below width
  EXPECT_TRUE(run(image).empty());

  // A buffer that knows its size: a plane reaching past it is not read at all.
  ImageBuffer owned;
  ASSERT_EQ(owned.allocateBuffer(w * h), w * h);
  ASSERT_EQ(owned.fillBuffer(p.data(), w * h), w * h);
  owned.format = GRAY;
  owned.width = w;
  owned.height = h;
  owned.widthStep = w;
  EXPECT_EQ(run(owned).size(), 10u);
  owned.height = h + 1;
  EXPECT_TRUE(run(owned).empty());
  owned.height = h;
  owned.widthStep = w + 1;
  EXPECT_TRUE(run(owned).empty());
}

}  // namespace
