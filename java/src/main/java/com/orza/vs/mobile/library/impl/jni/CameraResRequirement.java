package com.orza.vs.mobile.library.impl.jni;

/** The camera resolution the engine asks for, in pixel rows. */
public class CameraResRequirement {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public CameraResRequirement(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  CameraResRequirement(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(CameraResRequirement obj) {
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
        OrzaVSMobileJNI.delete_CameraResRequirement(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public CameraResRequirement() {
    this(OrzaVSMobileJNI.new_CameraResRequirement(), true);
  }

  public void setMinHeight(int value) {
    OrzaVSMobileJNI.CameraResRequirement_minHeight_set(swigCPtr, this, value);
  }

  public int getMinHeight() {
    return OrzaVSMobileJNI.CameraResRequirement_minHeight_get(swigCPtr, this);
  }

  public void setMaxHeight(int value) {
    OrzaVSMobileJNI.CameraResRequirement_maxHeight_set(swigCPtr, this, value);
  }

  public int getMaxHeight() {
    return OrzaVSMobileJNI.CameraResRequirement_maxHeight_get(swigCPtr, this);
  }
}
