package com.orza.vs.mobile.library.impl.jni;

/** The outcome of a NEON self test (inert in this library). */
public class NEONAccelerationResult extends NativeObject {
  public NEONAccelerationResult(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  NEONAccelerationResult(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(NEONAccelerationResult obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_NEONAccelerationResult(cPtr);
  }

  public NEONAccelerationResult() {
    this(OrzaVSMobileJNI.new_NEONAccelerationResult(), true);
  }

  public void setResultStr(String value) {
    OrzaVSMobileJNI.NEONAccelerationResult_resultStr_set(swigCPtr(), this, value);
  }

  public String getResultStr() {
    return OrzaVSMobileJNI.NEONAccelerationResult_resultStr_get(swigCPtr(), this);
  }
}
