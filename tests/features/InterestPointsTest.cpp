// The FAST-9 detector against a plain reference, and the interest point step built on it.

#include "features/Fast9.h"
#include "features/InterestPoints.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <numeric>
#include <ostream>
#include <random>
#include <set>
#include <string>
#include <vector>

#include "Fast9Reference.h"
#include "support/GuardedBytes.h"

namespace OrzaVSMobile {
void PrintTo(const Fast9Corner& c, std::ostream* out) { *out << "(" << c.x << "," << c.y << ")"; }
}  // namespace OrzaVSMobile

namespace {

using namespace OrzaVSMobile;
using fast9ref::Content;
using orzavs_test::GuardedBytes;
using Result = fast9ref::Detection;
constexpr Fast9Path kPaths[] = {Fast9Path::Best, Fast9Path::Scalar};

Result detect(const uint8_t* plane, int w, int h, int stride, int b, Fast9Path path, bool nonmax = false) {
  Result r;
  (nonmax ? fast9DetectNonmax : fast9Detect)(plane, w, h, stride, b, r.corners, r.scores, path);
  return r;
}

void assertSame(const Result& actual, const Result& expected) {
  ASSERT_EQ(actual.corners, expected.corners);
  ASSERT_EQ(actual.scores, expected.scores);
}

// Both kernels, raw and suppressed, and the list suppression give the same corners and scores:
// those of the reference detector (small planes) or else those of the scalar kernel.
void expectAgreement(const uint8_t* plane, int w, int h, int stride, int b, bool reference) {
  SCOPED_TRACE(std::to_string(w) + "x" + std::to_string(h) + " stride " + std::to_string(stride) + " b " +
               std::to_string(b));
  const Result raw = reference ? fast9ref::detect(plane, w, h, stride, b) : detect(plane, w, h, stride, b, Fast9Path::Scalar);
  const Result kept = reference ? fast9ref::suppress(raw) : detect(plane, w, h, stride, b, Fast9Path::Scalar, true);
  for (Fast9Path path : kPaths) {
    SCOPED_TRACE(path == Fast9Path::Best ? "best path" : "scalar path");
    ASSERT_NO_FATAL_FAILURE(assertSame(detect(plane, w, h, stride, b, path), raw));
    ASSERT_NO_FATAL_FAILURE(assertSame(detect(plane, w, h, stride, b, path, true), kept));
  }
  Result listKept;
  fast9Suppress(raw.corners.data(), raw.scores.data(), raw.corners.size(), listKept.corners, listKept.scores);
  assertSame(listKept, kept);
}

// A w x h plane of value `background` with single-pixel dots {x, y, value}.
std::vector<uint8_t> dotPlane(int w, int h, const std::vector<std::array<int, 3>>& dots, uint8_t background = 0) {
  std::vector<uint8_t> p(static_cast<size_t>(w) * h, background);
  for (const auto& d : dots) p[static_cast<size_t>(d[1]) * w + d[0]] = static_cast<uint8_t>(d[2]);
  return p;
}

// Widths cover the scalar-only rows (< 22), one exact block, the moved-back last block and
// the paired blocks; contents cover flat areas, noise, low contrast and saturating values.
TEST(Fast9Test, MatchesReferenceOnVariedPlanes) {
  std::mt19937 rng(1234);
  const int thresholds[] = {-40, 0, 1, 7, 20, 50, 90, 160, 254, 255};  // negative: brighter and darker at once
  for (Content content : {Content::Noise, Content::LowContrast, Content::Blocks, Content::Extremes}) {
    SCOPED_TRACE("content " + std::to_string(static_cast<int>(content)));
    for (int w : {7, 8, 13, 21, 22, 23, 30, 37, 38, 39, 54, 70, 71}) {
      for (int h : {7, 8, 12, 19}) {
        const int stride = w + static_cast<int>(rng() % 3) * 7;  // packed or padded rows
        const int b = thresholds[rng() % 10];
        GuardedBytes plane(fast9ref::makePlane(w, h, stride, content, rng));
        expectAgreement(plane.data(), w, h, stride, b, true);
      }
    }
  }
}

// Larger planes than the reference can afford: the kernels against each other; and one plane
// with more than 512 corners (all kept) against the reference.
TEST(Fast9Test, KernelsAgreeOnLargePlanesAndKeepManyCorners) {
  std::mt19937 rng(2024);
  for (int round = 0; round < 24; ++round) {
    const int w = 7 + static_cast<int>(rng() % 300), h = 7 + static_cast<int>(rng() % 60);
    const int stride = w + static_cast<int>(rng() % 20);
    GuardedBytes plane(fast9ref::makePlane(w, h, stride, static_cast<Content>(rng() % 4), rng));
    for (int b : {0, static_cast<int>(rng() % 255), 50}) expectAgreement(plane.data(), w, h, stride, b, false);
  }
  GuardedBytes noise(fast9ref::makePlane(150, 110, 150, Content::Noise, rng));
  for (int b : {20, 50}) {
    EXPECT_GT(detect(noise.data(), 150, 110, 150, b, Fast9Path::Best, true).corners.size(), 512u);  // raw has more
    expectAgreement(noise.data(), 150, 110, 150, b, true);
  }
}

TEST(Fast9Test, ComparisonsAreStrictAndNeedNineContiguousPixels) {
  // Centre 100 at (4, 4); `count` circle pixels from position `first` on at `value`.
  auto arc = [](int first, int count, int value) {
    std::vector<uint8_t> p(9 * 9, 100);
    for (int i = 0; i < count; ++i) {
      const int* o = fast9ref::kCircle[(first + i) % 16];
      p[static_cast<size_t>(4 + o[1]) * 9 + 4 + o[0]] = static_cast<uint8_t>(value);
    }
    return p;
  };
  for (int d : {50, 51, 52, -50, -51, -52}) {  // brighter or darker by d; the threshold is 50
    const std::vector<uint8_t> p = arc(5, 9, 100 + d);
    expectAgreement(p.data(), 9, 9, 9, 50, true);
    // A difference equal to the threshold is no corner; the score is the highest t with |d| > t.
    EXPECT_EQ(detect(p.data(), 9, 9, 9, 50, Fast9Path::Best).scores,
              std::abs(d) == 50 ? std::vector<int>() : std::vector<int>{std::abs(d) - 1}) << d;
  }
  // Eight contiguous pixels are not enough; the ninth may sit across the wrap from 15 to 0.
  EXPECT_TRUE(detect(arc(12, 8, 250).data(), 9, 9, 9, 10, Fast9Path::Best).corners.empty());
  EXPECT_EQ(detect(arc(12, 9, 250).data(), 9, 9, 9, 10, Fast9Path::Best).corners.size(), 1u);
}

TEST(Fast9Test, UniformPlaneBordersAndEqualNeighbours) {
  const int w = 40, h = 30;
  // Dots right at the tested band's edge are found; one pixel further out they are not.
  const std::vector<uint8_t> flat(static_cast<size_t>(w) * h, 77),
      in = dotPlane(w, h, {{3, 3, 200}, {w - 4, 3, 200}, {3, h - 4, 200}, {w - 4, h - 4, 200}}),
      out = dotPlane(w, h, {{2, 10, 200}, {w - 3, 10, 200}, {10, 2, 200}, {20, h - 3, 200}});
  expectAgreement(flat.data(), w, h, w, 0, true);
  expectAgreement(in.data(), w, h, w, 50, true);
  expectAgreement(out.data(), w, h, w, 50, true);
  EXPECT_TRUE(detect(flat.data(), w, h, w, 0, Fast9Path::Best).corners.empty());
  EXPECT_EQ(detect(in.data(), w, h, w, 50, Fast9Path::Best, true).corners,
            (std::vector<Fast9Corner>{{3, 3}, {w - 4, 3}, {3, h - 4}, {w - 4, h - 4}}));
  EXPECT_TRUE(detect(out.data(), w, h, w, 50, Fast9Path::Best).corners.empty());
  // Two-pixel blobs: each pixel sees only background on its circle, so its score is value-1; of
  // two neighbours with equal scores neither is kept, else the stronger one.
  const struct { int dx, dy, second; } blobs[] = {
      {1, 0, 200}, {0, 1, 200}, {1, 1, 200}, {-1, 1, 200}, {1, 0, 201}, {0, 1, 199}, {1, 1, 150}};
  for (const auto& c : blobs) {
    SCOPED_TRACE(std::to_string(c.dx) + "," + std::to_string(c.dy) + " second " + std::to_string(c.second));
    const std::vector<uint8_t> p = dotPlane(w, h, {{14, 14, 200}, {14 + c.dx, 14 + c.dy, c.second}});
    expectAgreement(p.data(), w, h, w, 50, true);
    const Result expected = c.second == 200 ? Result{}
                            : c.second < 200 ? Result{{{14, 14}}, {199}}
                                             : Result{{{14 + c.dx, 14 + c.dy}}, {c.second - 1}};
    assertSame(detect(p.data(), w, h, w, 50, Fast9Path::Best, true), expected);
  }
}

TEST(Fast9Test, DegenerateGeometryHasNoCornersAndReadsNothingOutside) {
  std::mt19937 rng(3);
  auto expectNone = [](const uint8_t* p, int w, int h, int stride) {
    for (Fast9Path path : kPaths) {
      for (auto* run : {&fast9Detect, &fast9DetectNonmax}) {
        Result r{{Fast9Corner{1, 1}}, {9}};  // stale content must be cleared
        run(p, w, h, stride, 20, r.corners, r.scores, path);
        EXPECT_TRUE(r.corners.empty() && r.scores.empty()) << w << "x" << h << " stride " << stride;
      }
    }
  };
  const std::vector<uint8_t> big = fast9ref::makePlane(64, 64, 64, Content::Noise, rng);
  expectNone(nullptr, 64, 64, 64);
  for (const auto& g : {std::array<int, 3>{64, 64, 63}, {0, 64, 64}, {-5, 64, 64}, {64, -5, 64}, {64, 64, -64}}) {
    expectNone(big.data(), g[0], g[1], g[2]);  // includes a stride below the width
  }
  // Planes under 7 in either direction, in guarded memory of exactly their size.
  for (const auto& g : {std::array<int, 2>{1, 1}, {6, 30}, {30, 6}, {7, 6}, {6, 7}}) {
    GuardedBytes p(fast9ref::makePlane(g[0], g[1], g[0], Content::Noise, rng));
    expectNone(p.data(), g[0], g[1], g[0]);
  }
}

using Points = std::vector<std::pair<float, float>>;

Points run(const ImageBuffer& image) {
  std::vector<Point2f> points(3, Point2f(-1, -1));  // stale content must go
  detectInterestPoints(image, points);
  Points out;
  for (const Point2f& p : points) out.emplace_back(p.x, p.y);
  return out;
}

Points runGray(std::vector<uint8_t>& plane, int w, int h, int stride) {
  return run(ImageBuffer(0, GRAY, w, h, stride, 1, plane.data()));
}

// The step as defined, on top of the reference detector: suppression at 50, scores at 50, then
// all corners in row-major order or a selection of the 50 best scores.
Points referenceStep(const uint8_t* plane, int w, int h, int stride) {
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
  Points out;
  for (int i : order) out.emplace_back(kept.corners[static_cast<size_t>(i)].x, kept.corners[static_cast<size_t>(i)].y);
  return out;
}

// Single-pixel dots on black, 7 pixels apart: each is a kept corner scoring its value minus one.
// Values are distinct for up to 190 dots, or all `same` when given.
std::vector<uint8_t> dots(int w, int h, int count, int same = 0) {
  std::vector<std::array<int, 3>> list;
  for (int y = 4; y < h - 4; y += 7) {
    for (int x = 4; x < w - 4 && static_cast<int>(list.size()) < count; x += 7) {
      list.push_back({x, y, same ? same : 60 + static_cast<int>(list.size() * 37 % 190)});
    }
  }
  return dotPlane(w, h, list);
}

TEST(InterestPointsTest, UpToFiftyInRowMajorOrderThenTheFiftyBest) {
  const int w = 60, h = 200;
  for (int count : {0, 1, 12, 50, 51}) {
    std::vector<uint8_t> p = dots(w, h, count);
    const Points points = runGray(p, w, h, w);
    EXPECT_EQ(points.size(), static_cast<size_t>(std::min(count, 50)));
    EXPECT_EQ(points, referenceStep(p.data(), w, h, w));  // row-major, or without the weakest
  }
  std::vector<uint8_t> ties = dots(80, 80, 70, 200);  // every corner ties: any 50 distinct ones
  const Points points = runGray(ties, 80, 80, 80);
  EXPECT_EQ(points.size(), 50u);
  EXPECT_EQ((std::set<std::pair<float, float>>(points.begin(), points.end()).size()), 50u);
}

// Noise gives many more kept corners than 50: the selection must be the step's, exactly.
TEST(InterestPointsTest, NoisyFramesKeepTheFiftyBestKeptCorners) {
  std::mt19937 rng(77);
  for (int round = 0; round < 4; ++round) {
    const int w = 60 + static_cast<int>(rng() % 90), h = 45 + static_cast<int>(rng() % 40);
    const int stride = w + static_cast<int>(rng() % 9);
    std::vector<uint8_t> p = fast9ref::makePlane(w, h, stride, fast9ref::Content::Noise, rng);
    const Points points = runGray(p, w, h, stride);
    EXPECT_EQ(points.size(), 50u);
    EXPECT_EQ(points, referenceStep(p.data(), w, h, stride));
  }
}

TEST(InterestPointsTest, OnlyTheFirstPlaneOfAUsableFrameIsRead) {
  const int w = 64, h = 48;
  std::vector<uint8_t> gray = dots(w, h, 10);
  std::vector<uint8_t> nv21(gray);
  nv21.resize(static_cast<size_t>(w) * h * 3 / 2, 255);  // bright chroma below the last row
  EXPECT_EQ(run(ImageBuffer(0, NV21, w, h, w, 1, nv21.data())), runGray(gray, w, h, w));
  EXPECT_EQ(runGray(gray, w, h, w).size(), 10u);

  EXPECT_TRUE(run(ImageBuffer(0, GRAY, w, h, w, 1, nullptr)).empty());
  for (int bad : {6, 0, -1}) EXPECT_TRUE(runGray(gray, bad, h, w).empty() && runGray(gray, w, bad, w).empty()) << bad;
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
