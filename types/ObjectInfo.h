#ifndef ORZAVS_TYPES_OBJECTINFO_H
#define ORZAVS_TYPES_OBJECTINFO_H

#include <string>
#include <vector>

#include "types/Identifiers.h"
#include "types/Point.h"

namespace Tovra {

// One detected or decoded object. `subContents` nests objects of the same type to any depth;
// `location` is the object's outline in frame pixels (top-left, top-right, bottom-right,
// bottom-left when it comes from a bounding box).
struct ObjectInfo {
  ObjectModuleID srcObjectModule;
  ContentType contentType;
  std::string content;
  std::string properties;
  std::vector<ObjectInfo> subContents;
  std::vector<OrzaVSMobile::Point2f> location;

  explicit ObjectInfo(ContentType type = UNSPECIFIED_CONTENT_TYPE)
      : srcObjectModule(UNSPECIFIED_OBJECT_MOD), contentType(type) {}
  ObjectInfo(const ObjectInfo& other) = default;
  ObjectInfo(ObjectInfo&& other) noexcept = default;
  ObjectInfo& operator=(const ObjectInfo& other) = default;
  ObjectInfo& operator=(ObjectInfo&& other) noexcept = default;
};

}  // namespace Tovra

#endif
