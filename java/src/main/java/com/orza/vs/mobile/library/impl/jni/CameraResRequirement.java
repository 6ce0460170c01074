package com.orza.vs.mobile.library.impl.jni;

/** The camera resolution the engine asks for, in pixel rows. */
public class CameraResRequirement extends NativeObject {
  public CameraResRequirement(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  CameraResRequirement(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(CameraResRequirement obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_CameraResRequirement(cPtr);
  }

  public CameraResRequirement() {
    this(OrzaVSMobileJNI.new_CameraResRequirement(), true);
  }

  public void setMinHeight(int value) {
    OrzaVSMobileJNI.CameraResRequirement_minHeight_set(swigCPtr(), this, value);
  }

  public int getMinHeight() {
    return OrzaVSMobileJNI.CameraResRequirement_minHeight_get(swigCPtr(), this);
  }

  public void setMaxHeight(int value) {
    OrzaVSMobileJNI.CameraResRequirement_maxHeight_set(swigCPtr(), this, value);
  }

  public int getMaxHeight() {
    return OrzaVSMobileJNI.CameraResRequirement_maxHeight_get(swigCPtr(), this);
  }
}
