#ifndef ORZAVS_JNI_MOBILEUTILS_H
#define ORZAVS_JNI_MOBILEUTILS_H

#include <string>

// Device utilities that the Java interface has always carried. This library keeps them inert:
// logging goes to standard output and the detector chooses its SIMD path at build time, so
// there is nothing to set up or test at run time.

struct NEONAccelerationResult {
  std::string resultStr;
};

class MobileUtils {
 public:
  static bool setupLogging(const std::string& path) {
    (void)path;
    return false;
  }
  static bool testNeonSupport() { return false; }
  static bool setupNeonFunctions() { return false; }
  static void testNeon(NEONAccelerationResult& result) { (void)result; }
};

#endif
