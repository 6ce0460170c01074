package com.orza.vs.mobile.library.impl.jni;

/** The outcome of a NEON self test (inert in this library). */
public class NEONAccelerationResult {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public NEONAccelerationResult(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  NEONAccelerationResult(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(NEONAccelerationResult obj) {
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
        OrzaVSMobileJNI.delete_NEONAccelerationResult(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public NEONAccelerationResult() {
    this(OrzaVSMobileJNI.new_NEONAccelerationResult(), true);
  }

  public void setResultStr(String value) {
    OrzaVSMobileJNI.NEONAccelerationResult_resultStr_set(swigCPtr, this, value);
  }

  public String getResultStr() {
    return OrzaVSMobileJNI.NEONAccelerationResult_resultStr_get(swigCPtr, this);
  }
}
