#ifndef ORZAVS_FEATURES_FAST9_H
#define ORZAVS_FEATURES_FAST9_H

// FAST-9 corner detection on one plane of 8-bit samples.
//
// Segment test: a pixel at (x, y), with 3 <= x < width-3 and 3 <= y < height-3, whose value is c,
// is a corner at threshold b when 9 or more contiguous pixels of the 16-pixel Bresenham circle of
// radius 3 around it (contiguity wraps round the circle) are all brighter (p > c + b) or all
// darker (p < c - b). Both comparisons are strict and use plain integer arithmetic.
//
// Score: the highest threshold t in [b, 254] at which the pixel is still a corner (the result
// of a binary search between b and 255). For a pixel that is not a corner at b, the score is b.
//
// Non-maximum suppression: a corner is dropped when any of its 8 neighbours is a corner whose
// score is greater than or equal to its own. Two adjacent corners of equal score therefore both
// disappear.
//
// Corner lists are always in row-major order (by row, then by column). Output vectors are
// cleared and refilled; their capacity is reused, so a caller that keeps them across frames
// makes no allocation once they have grown.
//
// Every entry point accepts any geometry: a null plane, a width or height below 7, or a stride
// below the width gives no corners, and nothing outside rows 0..height-1, columns
// 0..width-1 of the plane is ever read (the last row needs no padding). Thresholds of 255 and
// above give no corners (no 8-bit difference can exceed them); negative thresholds are
// honoured exactly, by a slower per-pixel path.
//
// Threads: every function may run on several threads at once; each thread keeps a few rows of
// scratch memory for the detector.

#include <cstddef>
#include <cstdint>
#include <vector>

namespace OrzaVSMobile {

struct Fast9Corner {
  int32_t x;
  int32_t y;
};

inline bool operator==(const Fast9Corner& a, const Fast9Corner& b) { return a.x == b.x && a.y == b.y; }
inline bool operator!=(const Fast9Corner& a, const Fast9Corner& b) { return !(a == b); }

// Which segment-test kernel runs. `Best` is the vector kernel compiled for this target (SSE2 on
// x86-64, NEON on ARM) when there is one, else the scalar kernel; `Scalar` forces the scalar
// kernel. Both give identical corners and scores.
enum class Fast9Path { Best, Scalar };

// Name of the vector kernel behind Fast9Path::Best: "SSE2", "NEON" or "scalar".
const char* fast9BestPathName();

// Segment test on the whole plane, no suppression: every corner with its score.
void fast9Detect(const uint8_t* plane, int width, int height, int stride, int threshold,
                 std::vector<Fast9Corner>& corners, std::vector<int>& scores,
                 Fast9Path path = Fast9Path::Best);

// Non-maximum suppression of a row-ordered corner list with its scores (as fast9Detect gives).
// `kept` receives the surviving corners in list order, `keptScores` their scores.
void fast9Suppress(const Fast9Corner* corners, const int* scores, size_t count,
                   std::vector<Fast9Corner>& kept, std::vector<int>& keptScores);

// Detection with suppression in one pass over the plane (the same result as fast9Detect
// followed by fast9Suppress, without materialising the raw corner list). `keptScores` receives
// the score of each kept corner at `threshold`.
void fast9DetectNonmax(const uint8_t* plane, int width, int height, int stride, int threshold,
                       std::vector<Fast9Corner>& kept, std::vector<int>& keptScores,
                       Fast9Path path = Fast9Path::Best);

// Score of each listed corner at `threshold`. The plane has no size here, so every corner must
// lie at least 3 pixels inside it (as every detected corner does).
void fast9Score(const uint8_t* plane, int stride, const Fast9Corner* corners, size_t count, int threshold,
                std::vector<int>& scores);

}  // namespace OrzaVSMobile

#endif
