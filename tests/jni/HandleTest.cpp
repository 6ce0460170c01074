#include "jni/Handle.h"

#include <gtest/gtest.h>

#include <cstdint>

namespace {

using orzavs::jni::fromHandle;
using orzavs::jni::toHandle;

struct Record {
  int value = 0;
};

TEST(Handle, RoundTripsRealObjects) {
  Record record;
  const jlong handle = toHandle(&record);
  EXPECT_NE(handle, 0);
  EXPECT_EQ(fromHandle<Record>(handle), &record);
  const Record* constant = &record;
  EXPECT_EQ(fromHandle<const Record>(toHandle(constant)), constant);
  EXPECT_EQ(toHandle(static_cast<Record*>(nullptr)), 0);
  EXPECT_EQ(fromHandle<Record>(0), nullptr);
}

TEST(Handle, AddressesWithTheTopBitSetAreZeroExtended) {
  // An address in the upper half of a 32-bit space (common on 32-bit Android) must become a
  // positive handle, not a sign-extended negative one.
  const uintptr_t high = static_cast<uintptr_t>(0xF0001234u);
  auto* pointer = reinterpret_cast<Record*>(high);
  const jlong handle = toHandle(pointer);
  EXPECT_EQ(handle, static_cast<jlong>(0xF0001234LL));
  EXPECT_GT(handle, 0);
  EXPECT_EQ(fromHandle<Record>(handle), pointer);
}

TEST(Handle, HandlesWiderThanAnAddressNameNothingOn32Bit) {
  const jlong wide = static_cast<jlong>(0x1F0001234LL);
  const jlong negative = -4;  // a sign-extended 32-bit address
  if (sizeof(void*) == 4) {
    EXPECT_EQ(fromHandle<Record>(wide), nullptr);
    EXPECT_EQ(fromHandle<Record>(negative), nullptr);
  } else {
    EXPECT_EQ(reinterpret_cast<uintptr_t>(fromHandle<Record>(wide)), static_cast<uintptr_t>(wide));
  }
}

}  // namespace
