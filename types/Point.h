#ifndef ORZAVS_TYPES_POINT_H
#define ORZAVS_TYPES_POINT_H

namespace OrzaVSMobile {

template <typename T>
struct Point2 {
  T x;
  T y;
  Point2() : x(0), y(0) {}
  Point2(T px, T py) : x(px), y(py) {}
};

typedef Point2<float> Point2f;

struct Point3d {
  double x;
  double y;
  double z;
  Point3d() : x(0), y(0), z(0) {}
  Point3d(double px, double py, double pz) : x(px), y(py), z(pz) {}
};

}  // namespace OrzaVSMobile

#endif
