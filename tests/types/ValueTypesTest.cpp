#include <gtest/gtest.h>

#include <cstdint>
#include <type_traits>

#include "types/ByteArray.h"
#include "types/FrameData.h"
#include "types/Identifiers.h"
#include "types/Point.h"

// Every enumeration has a fixed 32-bit underlying type, so any integer that arrives from Java
// is a valid value of the type.
static_assert(std::is_same<std::underlying_type<Tovra::ObjectModuleID>::type, int32_t>::value, "");
static_assert(std::is_same<std::underlying_type<Tovra::ContentType>::type, int32_t>::value, "");
static_assert(std::is_same<std::underlying_type<Tovra::ActionID>::type, int32_t>::value, "");
static_assert(std::is_same<std::underlying_type<Tovra::StatusID>::type, int32_t>::value, "");
static_assert(std::is_same<std::underlying_type<Tovra::CameraStabilityIssue>::type, int32_t>::value,
              "");
static_assert(std::is_same<std::underlying_type<Tovra::JudgeVerdictOnModule>::type, int32_t>::value,
              "");
static_assert(
    std::is_same<std::underlying_type<Tovra::Server::ResponseStatus>::type, int32_t>::value, "");
static_assert(std::is_same<OrzaVSMobile::Point2f, OrzaVSMobile::Point2<float>>::value, "");

TEST(ByteArrayTest, NeverOwnsAndCopiesShareTheBytes) {
  OrzaVSMobile::ByteArray empty;
  EXPECT_EQ(nullptr, empty.getData());
  EXPECT_EQ(0, empty.getLength());

  uint8_t bytes[5] = {1, 2, 3, 4, 5};
  OrzaVSMobile::ByteArray array(bytes, 5);
  EXPECT_EQ(bytes, array.getData());
  EXPECT_EQ(5, array.getLength());

  OrzaVSMobile::ByteArray copy(array);
  EXPECT_EQ(bytes, copy.getData());
  EXPECT_EQ(5, copy.getLength());
  copy.getData()[0] = 9;
  EXPECT_EQ(9, array.getData()[0]);

  copy.clear();
  EXPECT_EQ(nullptr, copy.getData());
  EXPECT_EQ(0, copy.getLength());
  EXPECT_EQ(bytes, array.getData());
  EXPECT_EQ(5, array.getLength());

  // Stack memory: if clearing or destroying a ByteArray freed anything, ASan would report it.
  {
    OrzaVSMobile::ByteArray scoped(bytes, 5);
    scoped.clear();
  }
  EXPECT_EQ(9, bytes[0]);
}

TEST(FrameDataTest, DefaultsMeanNothingIsKnown) {
  OrzaVSMobile::FrameROI roi;
  EXPECT_EQ(-1, roi.x);
  EXPECT_EQ(-1, roi.y);
  EXPECT_EQ(-1, roi.width);
  EXPECT_EQ(-1, roi.height);

  OrzaVSMobile::ExtraFrameData extra;
  EXPECT_EQ(-1, extra.displayROI.x);
  EXPECT_EQ(-1, extra.displayROI.height);
  EXPECT_EQ(-1, extra.focusROI.y);
  EXPECT_EQ(-1, extra.focusROI.width);
  EXPECT_FALSE(extra.flat);
  EXPECT_EQ(0, extra.screenOrient);
  EXPECT_EQ(0.0, extra.fieldOfView);
  EXPECT_EQ(-1.0, extra.timeStamp);

  OrzaVSMobile::FrameID frameId;
  EXPECT_TRUE(frameId.id.empty());

  Tovra::CameraResRequirement requirement;
  EXPECT_EQ(0, requirement.minHeight);
  EXPECT_EQ(0, requirement.maxHeight);
}

