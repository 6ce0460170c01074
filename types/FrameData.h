#ifndef ORZAVS_TYPES_FRAMEDATA_H
#define ORZAVS_TYPES_FRAMEDATA_H

#include <cstdint>
#include <string>

namespace OrzaVSMobile {

// A rectangle in frame pixels; all four fields -1 means "no rectangle".
struct FrameROI {
  int32_t x = -1;
  int32_t y = -1;
  int32_t width = -1;
  int32_t height = -1;
};

// Side data that comes with every frame.
struct ExtraFrameData {
  FrameROI displayROI;
  FrameROI focusROI;
  bool flat = false;
  int32_t screenOrient = 0;
  double fieldOfView = 0.0;
  double timeStamp = -1.0;  // seconds; -1.0 means unknown
};

struct FrameID {
  std::string id;
};

}  // namespace OrzaVSMobile

namespace Tovra {

// The camera resolution the engine asks for, in pixel rows.
struct CameraResRequirement {
  int32_t minHeight = 0;
  int32_t maxHeight = 0;
};

}  // namespace Tovra

#endif
