package com.orza.vs.mobile.library.impl.jni;

/** A frame's identifier. */
public class FrameID {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public FrameID(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  FrameID(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(FrameID obj) {
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
        OrzaVSMobileJNI.delete_FrameID(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public FrameID() {
    this(OrzaVSMobileJNI.new_FrameID(), true);
  }

  public void setId(String value) {
    OrzaVSMobileJNI.FrameID_id_set(swigCPtr, this, value);
  }

  public String getId() {
    return OrzaVSMobileJNI.FrameID_id_get(swigCPtr, this);
  }
}
