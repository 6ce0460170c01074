package com.orza.vs.mobile.library.impl.jni;

/** Device utilities; inert in this library, kept for the interface. */
public class MobileUtils extends NativeObject {
  public MobileUtils(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MobileUtils(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(MobileUtils obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MobileUtils(cPtr);
  }

  public MobileUtils() {
    this(OrzaVSMobileJNI.new_MobileUtils(), true);
  }

  /** Accepted and inert in this library: returns false. */
  public static boolean setupLogging(String path) {
    return OrzaVSMobileJNI.MobileUtils_setupLogging(path);
  }

  /** Inert in this library: returns false. */
  public static boolean testNeonSupport() {
    return OrzaVSMobileJNI.MobileUtils_testNeonSupport();
  }

  /** Inert in this library: returns false. */
  public static boolean setupNeonFunctions() {
    return OrzaVSMobileJNI.MobileUtils_setupNeonFunctions();
  }

  /** Inert in this library: leaves {@code result} untouched. */
  public static void testNeon(NEONAccelerationResult result) {
    OrzaVSMobileJNI.MobileUtils_testNeon(NEONAccelerationResult.getCPtr(result), result);
  }
}
