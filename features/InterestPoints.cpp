#include "features/InterestPoints.h"

#include <algorithm>
#include <numeric>

#include "features/Fast9.h"

namespace OrzaVSMobile {
namespace {

constexpr int kThreshold = 50;
constexpr size_t kMaxPoints = 50;

// The frame comes from the client, so its geometry is checked before any pixel is read: a
// null plane, a plane under 7x7 or a stride below the width has no corners (the detector
// itself refuses those). When the buffer knows its capacity (allocLen > 0), a first plane that
// would reach past it is refused as well instead of being read out of bounds.
bool planeWithinBuffer(const ImageBuffer& image) {
  if (image.allocLen <= 0 || image.data == nullptr || image.width <= 0 || image.height <= 0 ||
      image.widthStep < image.width) {
    return true;  // nothing more to check here; the detector handles these cases
  }
  const long long span = static_cast<long long>(image.height - 1) * image.widthStep + image.width;
  return span <= image.allocLen;
}

// Reused by every call on the same thread, so that a frame costs no allocation once these
// have grown to the frame size.
struct PointScratch {
  std::vector<Fast9Corner> kept;
  std::vector<int> scores;
  std::vector<int> order;
};

}  // namespace

void detectInterestPoints(const ImageBuffer& image, std::vector<Point2f>& points) {
  thread_local PointScratch scratch;
  std::vector<Fast9Corner>& kept = scratch.kept;
  std::vector<int>& scores = scratch.scores;
  if (!planeWithinBuffer(image)) {
    points.clear();
    return;
  }
  // Detection with suppression at threshold 50. The kept corners' scores at that same
  // threshold come out of the detector, so they are not computed a second time.
  fast9DetectNonmax(image.data, image.width, image.height, image.widthStep, kThreshold, kept, scores);
  const size_t n = kept.size();
  if (n <= kMaxPoints) {
    points.resize(n);
    for (size_t i = 0; i < n; ++i) {
      points[i] = Point2f(static_cast<float>(kept[i].x), static_cast<float>(kept[i].y));
    }
    return;
  }
  // More than 50: the 50 best scores by selection, in the order the selection leaves them.
  std::vector<int>& order = scratch.order;
  order.resize(n);
  std::iota(order.begin(), order.end(), 0);
  std::nth_element(order.begin(), order.begin() + kMaxPoints, order.end(),
                   [&scores](int a, int b) { return scores[static_cast<size_t>(a)] > scores[static_cast<size_t>(b)]; });
  points.resize(kMaxPoints);
  for (size_t i = 0; i < kMaxPoints; ++i) {
    const Fast9Corner& c = kept[static_cast<size_t>(order[i])];
    points[i] = Point2f(static_cast<float>(c.x), static_cast<float>(c.y));
  }
}

}  // namespace OrzaVSMobile
