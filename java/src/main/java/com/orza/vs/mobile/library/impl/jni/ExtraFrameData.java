package com.orza.vs.mobile.library.impl.jni;

/**
 * Side data of one frame. {@code timeStamp} is the capture time in seconds (-1.0 when
 * unknown); the engine chooses frames by it.
 */
public class ExtraFrameData extends NativeObject {
  public ExtraFrameData(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ExtraFrameData(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ExtraFrameData obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ExtraFrameData(cPtr);
  }

  public ExtraFrameData() {
    this(OrzaVSMobileJNI.new_ExtraFrameData(), true);
  }

  /** Copies {@code value} into this object. */
  public void setDisplayROI(FrameROI value) {
    OrzaVSMobileJNI.ExtraFrameData_displayROI_set(swigCPtr(), this, FrameROI.getCPtr(value), value);
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public FrameROI getDisplayROI() {
    long cPtr = OrzaVSMobileJNI.ExtraFrameData_displayROI_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new FrameROI(cPtr, nref);
  }

  /** Copies {@code value} into this object. */
  public void setFocusROI(FrameROI value) {
    OrzaVSMobileJNI.ExtraFrameData_focusROI_set(swigCPtr(), this, FrameROI.getCPtr(value), value);
  }

  /** A view into this object (not a copy); valid while this object lives. */
  public FrameROI getFocusROI() {
    long cPtr = OrzaVSMobileJNI.ExtraFrameData_focusROI_get(swigCPtr(), this);
    return (cPtr == 0) ? null : new FrameROI(cPtr, nref);
  }

  public void setScreenOrient(int value) {
    OrzaVSMobileJNI.ExtraFrameData_screenOrient_set(swigCPtr(), this, value);
  }

  public int getScreenOrient() {
    return OrzaVSMobileJNI.ExtraFrameData_screenOrient_get(swigCPtr(), this);
  }

  public void setFieldOfView(double value) {
    OrzaVSMobileJNI.ExtraFrameData_fieldOfView_set(swigCPtr(), this, value);
  }

  public double getFieldOfView() {
    return OrzaVSMobileJNI.ExtraFrameData_fieldOfView_get(swigCPtr(), this);
  }

  public void setFlat(boolean value) {
    OrzaVSMobileJNI.ExtraFrameData_flat_set(swigCPtr(), this, value);
  }

  public boolean getFlat() {
    return OrzaVSMobileJNI.ExtraFrameData_flat_get(swigCPtr(), this);
  }

  public void setTimeStamp(double value) {
    OrzaVSMobileJNI.ExtraFrameData_timeStamp_set(swigCPtr(), this, value);
  }

  public double getTimeStamp() {
    return OrzaVSMobileJNI.ExtraFrameData_timeStamp_get(swigCPtr(), this);
  }
}
