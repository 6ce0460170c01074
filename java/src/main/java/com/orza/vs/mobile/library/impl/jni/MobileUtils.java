package com.orza.vs.mobile.library.impl.jni;

/** Device utilities; inert in this library, kept for the interface. */
public class MobileUtils {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public MobileUtils(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  MobileUtils(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(MobileUtils obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  /** Frees the native object if this proxy owns it; afterwards the proxy is unusable. */
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_MobileUtils(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
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
