// The interest-point step runs on every camera frame: once a thread has seen a frame of a given
// size, further frames must not touch the heap. This binary counts operator new calls made on
// the current thread (the replacement below, over malloc/free, serves every test of the
// binary; it only counts).

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>
#include <random>
#include <vector>

#include "Fast9Reference.h"
#include "features/Fast9.h"
#include "features/InterestPoints.h"

namespace {
thread_local uint64_t t_allocations = 0;

void* countedAllocate(std::size_t n) {
  ++t_allocations;
  if (void* p = std::malloc(n == 0 ? 1 : n)) return p;
  throw std::bad_alloc();
}
}  // namespace

void* operator new(std::size_t n) { return countedAllocate(n); }
void* operator new[](std::size_t n) { return countedAllocate(n); }
void* operator new(std::size_t n, const std::nothrow_t&) noexcept {
  ++t_allocations;
  return std::malloc(n == 0 ? 1 : n);
}
void* operator new[](std::size_t n, const std::nothrow_t& t) noexcept { return operator new(n, t); }
void operator delete(void* p) noexcept { std::free(p); }
void operator delete(void* p, const std::nothrow_t&) noexcept { std::free(p); }
void operator delete[](void* p, const std::nothrow_t&) noexcept { std::free(p); }
void operator delete[](void* p) noexcept { std::free(p); }
void operator delete(void* p, std::size_t) noexcept { std::free(p); }
void operator delete[](void* p, std::size_t) noexcept { std::free(p); }

namespace {

using namespace OrzaVSMobile;

TEST(InterestPointsAllocationTest, SteadyStateFramesMakeNoAllocation) {
  std::mt19937 rng(8);
  const int w = 160, h = 120;
  std::vector<uint8_t> noisy = fast9ref::makePlane(w, h, w, fast9ref::Content::Noise, rng);
  std::vector<uint8_t> blocks = fast9ref::makePlane(w, h, w, fast9ref::Content::Blocks, rng);
  ImageBuffer a(0, GRAY, w, h, w, 1, noisy.data());
  ImageBuffer b(0, NV21, w, h, w, 1, blocks.data());
  std::vector<Point2f> points;
  // First frames size the per-thread scratch and the point vector.
  detectInterestPoints(a, points);
  detectInterestPoints(b, points);
  ASSERT_EQ(points.size(), 50u);
  const uint64_t before = t_allocations;
  for (int i = 0; i < 10; ++i) {
    detectInterestPoints(i % 2 ? a : b, points);
    ASSERT_FALSE(points.empty());
  }
  EXPECT_EQ(t_allocations - before, 0u);

  // The lower-level detector likewise, with the caller's vectors kept.
  std::vector<Fast9Corner> kept;
  std::vector<int> scores;
  fast9DetectNonmax(noisy.data(), w, h, w, 50, kept, scores);
  const uint64_t again = t_allocations;
  fast9DetectNonmax(noisy.data(), w, h, w, 50, kept, scores, Fast9Path::Scalar);
  fast9DetectNonmax(blocks.data(), w, h, w, 50, kept, scores);
  EXPECT_EQ(t_allocations - again, 0u);
}

}  // namespace
