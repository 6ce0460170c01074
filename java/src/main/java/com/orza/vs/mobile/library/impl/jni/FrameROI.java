package com.orza.vs.mobile.library.impl.jni;

/** A rectangle in frame pixels; -1 in all four fields means "no rectangle". */
public class FrameROI {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public FrameROI(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  FrameROI(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(FrameROI obj) {
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
        OrzaVSMobileJNI.delete_FrameROI(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public FrameROI() {
    this(OrzaVSMobileJNI.new_FrameROI(), true);
  }

  public void setX(int value) {
    OrzaVSMobileJNI.FrameROI_x_set(swigCPtr, this, value);
  }

  public int getX() {
    return OrzaVSMobileJNI.FrameROI_x_get(swigCPtr, this);
  }

  public void setY(int value) {
    OrzaVSMobileJNI.FrameROI_y_set(swigCPtr, this, value);
  }

  public int getY() {
    return OrzaVSMobileJNI.FrameROI_y_get(swigCPtr, this);
  }

  public void setWidth(int value) {
    OrzaVSMobileJNI.FrameROI_width_set(swigCPtr, this, value);
  }

  public int getWidth() {
    return OrzaVSMobileJNI.FrameROI_width_get(swigCPtr, this);
  }

  public void setHeight(int value) {
    OrzaVSMobileJNI.FrameROI_height_set(swigCPtr, this, value);
  }

  public int getHeight() {
    return OrzaVSMobileJNI.FrameROI_height_get(swigCPtr, this);
  }
}
