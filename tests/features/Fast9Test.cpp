#include "features/Fast9.h"

#include <gtest/gtest.h>

#include <array>
#include <random>
#include <string>
#include <vector>

#include "Fast9Reference.h"

namespace {

using namespace OrzaVSMobile;
using fast9ref::Content;
using fast9ref::GuardedPlane;

struct Result {
  std::vector<Fast9Corner> corners;
  std::vector<int> scores;
};

Result detect(const uint8_t* plane, int w, int h, int stride, int b, Fast9Path path) {
  Result r;
  fast9Detect(plane, w, h, stride, b, r.corners, r.scores, path);
  return r;
}

Result detectNonmax(const uint8_t* plane, int w, int h, int stride, int b, Fast9Path path) {
  Result r;
  fast9DetectNonmax(plane, w, h, stride, b, r.corners, r.scores, path);
  return r;
}

std::string describe(const std::vector<Fast9Corner>& c, const std::vector<int>& s) {
  std::string out;
  for (size_t i = 0; i < c.size() && i < 12; ++i) {
    out += "(" + std::to_string(c[i].x) + "," + std::to_string(c[i].y) + ":" +
           (i < s.size() ? std::to_string(s[i]) : std::string("?")) + ") ";
  }
  return out + (c.size() > 12 ? "..." : "");
}

// Both kernels, raw and suppressed, and the list suppression, against the reference.
void expectMatchesReference(const uint8_t* plane, int w, int h, int stride, int b, const std::string& what) {
  SCOPED_TRACE(what + " " + std::to_string(w) + "x" + std::to_string(h) + " stride " + std::to_string(stride) +
               " b " + std::to_string(b));
  const fast9ref::Detection raw = fast9ref::detect(plane, w, h, stride, b);
  const fast9ref::Detection kept = fast9ref::suppress(raw);
  for (Fast9Path path : {Fast9Path::Best, Fast9Path::Scalar}) {
    SCOPED_TRACE(path == Fast9Path::Best ? "best path" : "scalar path");
    const Result r = detect(plane, w, h, stride, b, path);
    ASSERT_EQ(r.corners, raw.corners) << describe(r.corners, r.scores) << " vs " << describe(raw.corners, raw.scores);
    ASSERT_EQ(r.scores, raw.scores);
    const Result k = detectNonmax(plane, w, h, stride, b, path);
    ASSERT_EQ(k.corners, kept.corners) << describe(k.corners, k.scores) << " vs "
                                       << describe(kept.corners, kept.scores);
    ASSERT_EQ(k.scores, kept.scores);
  }
  Result listKept;
  fast9Suppress(raw.corners.data(), raw.scores.data(), raw.corners.size(), listKept.corners, listKept.scores);
  ASSERT_EQ(listKept.corners, kept.corners);
  ASSERT_EQ(listKept.scores, kept.scores);
}

// A plane of value `background` with single-pixel dots.
struct Dot {
  int x, y, value;
};
std::vector<uint8_t> dotPlane(int w, int h, const std::vector<Dot>& dots, uint8_t background = 0) {
  std::vector<uint8_t> p(static_cast<size_t>(w) * h, background);
  for (const Dot& d : dots) p[static_cast<size_t>(d.y) * w + d.x] = static_cast<uint8_t>(d.value);
  return p;
}

// Widths cover the scalar-only rows (< 22), one exact block, the moved-back last block and
// the paired blocks; contents cover flat areas, noise, low contrast and saturating values.
TEST(Fast9Test, MatchesReferenceOnVariedPlanes) {
  std::mt19937 rng(1234);
  const int widths[] = {7, 8, 13, 21, 22, 23, 30, 37, 38, 39, 54, 70, 71};
  const int heights[] = {7, 8, 12, 19};
  const int thresholds[] = {-40, 0, 1, 7, 20, 50, 90, 160, 254, 255};  // negative: brighter and darker at once
  const Content contents[] = {Content::Noise, Content::LowContrast, Content::Blocks, Content::Extremes};
  const char* names[] = {"noise", "low contrast", "blocks", "extremes"};
  for (int ci = 0; ci < 4; ++ci) {
    for (int w : widths) {
      for (int h : heights) {
        const int stride = w + static_cast<int>(rng() % 3) * 7;  // packed or padded rows
        const int b = thresholds[rng() % 10];
        const std::vector<uint8_t> bytes = fast9ref::makePlane(w, h, stride, contents[ci], rng);
        GuardedPlane plane(bytes);
        expectMatchesReference(plane.data(), w, h, stride, b, names[ci]);
      }
    }
  }
}

TEST(Fast9Test, MoreThan512CornersAreAllKept) {
  std::mt19937 rng(99);
  const int w = 150, h = 110;
  const std::vector<uint8_t> bytes = fast9ref::makePlane(w, h, w, Content::Noise, rng);
  GuardedPlane plane(bytes);
  for (int b : {20, 50}) {
    const Result raw = detect(plane.data(), w, h, w, b, Fast9Path::Best);
    const Result kept = detectNonmax(plane.data(), w, h, w, b, Fast9Path::Best);
    EXPECT_GT(raw.corners.size(), 512u);
    EXPECT_GT(kept.corners.size(), 512u);
    expectMatchesReference(plane.data(), w, h, w, b, "noise");
  }
}

TEST(Fast9Test, ComparisonsAreStrict) {
  // Centre 100; an arc of 9 circle pixels at 100 + d, the rest at 100.
  for (int polarity : {1, -1}) {
    for (int d : {50, 51, 52}) {
      std::vector<uint8_t> p(9 * 9, 100);
      for (int i = 0; i < 9; ++i) {
        const int* o = fast9ref::kCircle[(i + 5) % 16];
        p[static_cast<size_t>(4 + o[1]) * 9 + 4 + o[0]] = static_cast<uint8_t>(100 + polarity * d);
      }
      const Result r = detect(p.data(), 9, 9, 9, 50, Fast9Path::Best);
      const Result s = detect(p.data(), 9, 9, 9, 50, Fast9Path::Scalar);
      EXPECT_EQ(r.corners, s.corners);
      if (d == 50) {
        EXPECT_TRUE(r.corners.empty()) << "difference equal to the threshold is no corner";
      } else {
        ASSERT_EQ(r.corners.size(), 1u);
        EXPECT_EQ(r.corners[0], (Fast9Corner{4, 4}));
        EXPECT_EQ(r.scores[0], d - 1);  // highest t with d > t
      }
    }
  }
  // Eight contiguous pixels are not enough.
  std::vector<uint8_t> p(9 * 9, 100);
  for (int i = 0; i < 8; ++i) {
    const int* o = fast9ref::kCircle[(i + 12) % 16];  // wraps from 15 to 0
    p[static_cast<size_t>(4 + o[1]) * 9 + 4 + o[0]] = 250;
  }
  EXPECT_TRUE(detect(p.data(), 9, 9, 9, 10, Fast9Path::Best).corners.empty());
  const int* o = fast9ref::kCircle[4];
  p[static_cast<size_t>(4 + o[1]) * 9 + 4 + o[0]] = 250;  // ninth, across the wrap
  EXPECT_EQ(detect(p.data(), 9, 9, 9, 10, Fast9Path::Best).corners.size(), 1u);
}

TEST(Fast9Test, UniformPlaneAndBorders) {
  const int w = 40, h = 30;
  std::vector<uint8_t> flat(static_cast<size_t>(w) * h, 77);
  EXPECT_TRUE(detect(flat.data(), w, h, w, 0, Fast9Path::Best).corners.empty());
  EXPECT_TRUE(detect(flat.data(), w, h, w, 0, Fast9Path::Scalar).corners.empty());
  // Dots right at the tested band's edge are found; one pixel further out they are not.
  const std::vector<Dot> inside = {{3, 3, 200}, {w - 4, 3, 200}, {3, h - 4, 200}, {w - 4, h - 4, 200}};
  const std::vector<Dot> outside = {{2, 10, 200}, {w - 3, 10, 200}, {10, 2, 200}, {20, h - 3, 200}};
  for (Fast9Path path : {Fast9Path::Best, Fast9Path::Scalar}) {
    const std::vector<uint8_t> in = dotPlane(w, h, inside);
    const Result r = detectNonmax(in.data(), w, h, w, 50, path);
    ASSERT_EQ(r.corners.size(), 4u);
    for (size_t i = 0; i < 4; ++i) EXPECT_EQ(r.corners[i], (Fast9Corner{inside[i].x, inside[i].y}));
    const std::vector<uint8_t> out = dotPlane(w, h, outside);
    EXPECT_TRUE(detect(out.data(), w, h, w, 50, path).corners.empty());
  }
}

TEST(Fast9Test, EqualNeighboursSuppressEachOther) {
  const int w = 30, h = 30;
  // Two-pixel blobs: each pixel sees only background on its circle, so its score is value-1.
  struct Case {
    int dx, dy, second;
    size_t kept;
  };
  const Case cases[] = {{1, 0, 200, 0}, {0, 1, 200, 0}, {1, 1, 200, 0}, {-1, 1, 200, 0},
                        {1, 0, 201, 1}, {0, 1, 199, 1}, {1, 1, 150, 1}};
  for (const Case& c : cases) {
    SCOPED_TRACE(std::to_string(c.dx) + "," + std::to_string(c.dy) + " second " + std::to_string(c.second));
    const std::vector<uint8_t> p = dotPlane(w, h, {{14, 14, 200}, {14 + c.dx, 14 + c.dy, c.second}});
    for (Fast9Path path : {Fast9Path::Best, Fast9Path::Scalar}) {
      EXPECT_EQ(detect(p.data(), w, h, w, 50, path).corners.size(), 2u);
      const Result k = detectNonmax(p.data(), w, h, w, 50, path);
      ASSERT_EQ(k.corners.size(), c.kept);
      if (c.kept == 1) {
        const bool firstWins = c.second < 200;
        EXPECT_EQ(k.corners[0], firstWins ? (Fast9Corner{14, 14}) : (Fast9Corner{14 + c.dx, 14 + c.dy}));
        EXPECT_EQ(k.scores[0], std::max(200, c.second) - 1);
      }
    }
  }
}

TEST(Fast9Test, DegenerateGeometryHasNoCornersAndReadsNothingOutside) {
  std::mt19937 rng(3);
  auto expectNone = [](const uint8_t* p, int w, int h, int stride) {
    for (Fast9Path path : {Fast9Path::Best, Fast9Path::Scalar}) {
      Result r{{Fast9Corner{1, 1}}, {9}};  // stale content must be cleared
      fast9Detect(p, w, h, stride, 20, r.corners, r.scores, path);
      EXPECT_TRUE(r.corners.empty() && r.scores.empty()) << w << "x" << h << " stride " << stride;
      r = Result{{Fast9Corner{1, 1}}, {9}};
      fast9DetectNonmax(p, w, h, stride, 20, r.corners, r.scores, path);
      EXPECT_TRUE(r.corners.empty() && r.scores.empty()) << w << "x" << h << " stride " << stride;
    }
  };
  const std::vector<uint8_t> big = fast9ref::makePlane(64, 64, 64, Content::Noise, rng);
  expectNone(nullptr, 64, 64, 64);
  for (const auto& g : {std::array<int, 3>{64, 64, 63}, {0, 64, 64}, {-5, 64, 64}, {64, -5, 64}, {64, 64, -64}}) {
    expectNone(big.data(), g[0], g[1], g[2]);  // includes a stride below the width
  }
  // Planes under 7 in either direction, in guarded memory of exactly their size.
  for (const auto& g : {std::array<int, 2>{1, 1}, {6, 30}, {30, 6}, {7, 6}, {6, 7}}) {
    GuardedPlane p(fast9ref::makePlane(g[0], g[1], g[0], Content::Noise, rng));
    expectNone(p.data(), g[0], g[1], g[0]);
  }
}

// Larger planes than the reference can afford: the two kernels against each other, and the
// fused suppression against the list suppression.
TEST(Fast9Test, VectorAndScalarKernelsAgree) {
  std::mt19937 rng(2024);
  for (int round = 0; round < 24; ++round) {
    const int w = 7 + static_cast<int>(rng() % 300), h = 7 + static_cast<int>(rng() % 60);
    const int stride = w + static_cast<int>(rng() % 20);
    const Content content = static_cast<Content>(rng() % 4);
    const std::vector<uint8_t> bytes = fast9ref::makePlane(w, h, stride, content, rng);
    GuardedPlane plane(bytes);
    for (int b : {0, static_cast<int>(rng() % 255), 50}) {
      SCOPED_TRACE(std::to_string(w) + "x" + std::to_string(h) + " stride " + std::to_string(stride) + " b " +
                   std::to_string(b));
      const Result vr = detect(plane.data(), w, h, stride, b, Fast9Path::Best);
      const Result sr = detect(plane.data(), w, h, stride, b, Fast9Path::Scalar);
      ASSERT_EQ(vr.corners, sr.corners);
      ASSERT_EQ(vr.scores, sr.scores);
      const Result vk = detectNonmax(plane.data(), w, h, stride, b, Fast9Path::Best);
      const Result sk = detectNonmax(plane.data(), w, h, stride, b, Fast9Path::Scalar);
      ASSERT_EQ(vk.corners, sk.corners);
      ASSERT_EQ(vk.scores, sk.scores);
      Result lk;
      fast9Suppress(vr.corners.data(), vr.scores.data(), vr.corners.size(), lk.corners, lk.scores);
      ASSERT_EQ(vk.corners, lk.corners);
      ASSERT_EQ(vk.scores, lk.scores);
    }
  }
}

}  // namespace
