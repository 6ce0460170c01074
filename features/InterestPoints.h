#ifndef ORZAVS_FEATURES_INTERESTPOINTS_H
#define ORZAVS_FEATURES_INTERESTPOINTS_H

#include <vector>

#include "types/ImageBuffer.h"
#include "types/Point.h"

namespace OrzaVSMobile {

// The engine's per-frame interest-point step: FAST-9 corners with non-maximum suppression at
// threshold 50 on the first plane (data, width, height, widthStep). At most 50 points: all of
// them in row-major order when 50 or fewer survive, otherwise the 50 best scores (in no
// particular order). `points` is resized to the result. A plane under 7x7, a null data pointer
// or a stride below the width yields no points.
void detectInterestPoints(const ImageBuffer& image, std::vector<Point2f>& points);

}  // namespace OrzaVSMobile

#endif
