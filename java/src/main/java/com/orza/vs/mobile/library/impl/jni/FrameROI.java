package com.orza.vs.mobile.library.impl.jni;

/** A rectangle in frame pixels; -1 in all four fields means "no rectangle". */
public class FrameROI extends NativeObject {
  public FrameROI(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  FrameROI(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(FrameROI obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_FrameROI(cPtr);
  }

  public FrameROI() {
    this(OrzaVSMobileJNI.new_FrameROI(), true);
  }

  public void setX(int value) {
    OrzaVSMobileJNI.FrameROI_x_set(swigCPtr(), this, value);
  }

  public int getX() {
    return OrzaVSMobileJNI.FrameROI_x_get(swigCPtr(), this);
  }

  public void setY(int value) {
    OrzaVSMobileJNI.FrameROI_y_set(swigCPtr(), this, value);
  }

  public int getY() {
    return OrzaVSMobileJNI.FrameROI_y_get(swigCPtr(), this);
  }

  public void setWidth(int value) {
    OrzaVSMobileJNI.FrameROI_width_set(swigCPtr(), this, value);
  }

  public int getWidth() {
    return OrzaVSMobileJNI.FrameROI_width_get(swigCPtr(), this);
  }

  public void setHeight(int value) {
    OrzaVSMobileJNI.FrameROI_height_set(swigCPtr(), this, value);
  }

  public int getHeight() {
    return OrzaVSMobileJNI.FrameROI_height_get(swigCPtr(), this);
  }
}
