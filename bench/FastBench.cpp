// Interest points: our per-frame step against OpenCV's cv::FAST (threshold 50, non-maximum
// suppression, 9 of 16), on the same luminance planes, plus our scalar kernel and raw
// detection for reference. Also cross-checks the corner sets and scores against OpenCV.

#include <algorithm>
#include <cstdio>
#include <set>
#include <utility>
#include <vector>

#include "bench/BenchHarness.h"
#include "features/Fast9.h"
#include "features/InterestPoints.h"
#include "types/ImageBuffer.h"

#ifdef ORZAVS_HAVE_OPENCV
#include <opencv2/core.hpp>
#include <opencv2/features2d.hpp>
#endif

namespace {

using namespace OrzaVSMobile;
using namespace orzavs_bench;

constexpr int kThreshold = 50;

#ifdef ORZAVS_HAVE_OPENCV
// Compares our kept corners (and their scores) with OpenCV's keypoints; prints the result.
void crossCheck(const BenchFrame& f, const char* what, const std::vector<Fast9Corner>& ours,
                const std::vector<int>& ourScores, const std::vector<cv::KeyPoint>& theirs) {
  std::set<std::pair<int, int>> a, b;
  std::vector<std::pair<std::pair<int, int>, int>> ourList;
  for (size_t i = 0; i < ours.size(); ++i) {
    a.insert({ours[i].x, ours[i].y});
    ourList.push_back({{ours[i].x, ours[i].y}, ourScores[i]});
  }
  std::sort(ourList.begin(), ourList.end());
  size_t scoreDiffs = 0;
  for (const cv::KeyPoint& k : theirs) {
    const std::pair<int, int> p{static_cast<int>(k.pt.x), static_cast<int>(k.pt.y)};
    b.insert(p);
    auto it = std::lower_bound(ourList.begin(), ourList.end(), std::make_pair(p, -100000));
    if (it != ourList.end() && it->first == p && it->second != static_cast<int>(k.response)) ++scoreDiffs;
  }
  size_t onlyOurs = 0, onlyTheirs = 0;
  for (const auto& p : a) onlyOurs += b.count(p) == 0;
  for (const auto& p : b) onlyTheirs += a.count(p) == 0;
  if (onlyOurs == 0 && onlyTheirs == 0 && scoreDiffs == 0) {
    std::printf("  %-18s %-34s match: %zu corners, same set and scores as OpenCV\n", f.name.c_str(), what, a.size());
  } else {
    std::printf("  %-18s %-34s *** MISMATCH ***: ours %zu, OpenCV %zu, only ours %zu, only OpenCV %zu, "
                "score differences %zu\n",
                f.name.c_str(), what, a.size(), b.size(), onlyOurs, onlyTheirs, scoreDiffs);
  }
}
#endif

void runFastBench(const std::vector<const BenchFrame*>& frames) {
  printHeading(std::string("fast: interest points, threshold 50 (vector kernel: ") + fast9BestPathName() + ")");
  std::vector<Point2f> points;
  std::vector<Fast9Corner> corners;
  std::vector<int> scores;
  for (const BenchFrame* fp : frames) {
    const BenchFrame& f = *fp;
    ImageBuffer image(0, GRAY, f.width, f.height, f.width, 1, const_cast<uint8_t*>(f.luma()));
    auto step = [&] {
      detectInterestPoints(image, points);
      keep(points.data());
    };
    auto nmsScalar = [&] {
      fast9DetectNonmax(f.luma(), f.width, f.height, f.width, kThreshold, corners, scores, Fast9Path::Scalar);
      keep(corners.data());
    };
    auto raw = [&] {
      fast9Detect(f.luma(), f.width, f.height, f.width, kThreshold, corners, scores, Fast9Path::Best);
      keep(corners.data());
    };
    raw();
    const size_t rawCount = corners.size();
    fast9DetectNonmax(f.luma(), f.width, f.height, f.width, kThreshold, corners, scores, Fast9Path::Best);
    step();
    std::printf("  %-18s %-34s raw %zu, kept %zu, points %zu\n", f.name.c_str(), "ours: corner counts", rawCount,
                corners.size(), points.size());
#ifdef ORZAVS_HAVE_OPENCV
    const cv::Mat y(f.height, f.width, CV_8UC1, const_cast<uint8_t*>(f.luma()), static_cast<size_t>(f.width));
    std::vector<cv::KeyPoint> kps, rawKps;
    auto cvNms = [&] {
      cv::FAST(y, kps, kThreshold, true, cv::FastFeatureDetector::TYPE_9_16);
      keep(kps.data());
    };
    auto cvRaw = [&] {
      cv::FAST(y, rawKps, kThreshold, false, cv::FastFeatureDetector::TYPE_9_16);
      keep(rawKps.data());
    };
    cvNms();
    crossCheck(f, "check: detect+nonmax vs OpenCV", corners, scores, kps);
    cvRaw();
    fast9Detect(f.luma(), f.width, f.height, f.width, kThreshold, corners, scores, Fast9Path::Best);
    std::vector<int> noScores(corners.size(), 0);
    for (cv::KeyPoint& k : rawKps) k.response = 0;  // raw OpenCV keypoints carry no score
    crossCheck(f, "check: raw detect vs OpenCV", corners, noScores, rawKps);

    const TimingPair stepPair = measurePair(step, cvNms);
    printTiming(f.name, "ours: interest-point step", stepPair.a);
    printTiming(f.name, "OpenCV: FAST nonmax", stepPair.b);
    printRatio(f.name, "step / OpenCV nonmax", stepPair.a, stepPair.b);
    const TimingPair rawPair = measurePair(raw, cvRaw);
    printTiming(f.name, "ours: raw detect, no nonmax", rawPair.a);
    printTiming(f.name, "OpenCV: FAST raw, no nonmax", rawPair.b);
    printRatio(f.name, "raw detect / OpenCV raw", rawPair.a, rawPair.b);
    const TimingPair scalarPair = measurePair(nmsScalar, cvNms);
    printTiming(f.name, "ours: detect+nonmax, scalar kernel", scalarPair.a);
    printRatio(f.name, "scalar / OpenCV nonmax", scalarPair.a, scalarPair.b);
#else
    printTiming(f.name, "ours: interest-point step", measure(step));
    printTiming(f.name, "ours: raw detect, no nonmax", measure(raw));
    printTiming(f.name, "ours: detect+nonmax, scalar kernel", measure(nmsScalar));
    std::printf("  (OpenCV not found at configure time: no peer figures)\n");
#endif
  }
}

}  // namespace

ORZAVS_BENCH_SECTION("fast", runFastBench);
