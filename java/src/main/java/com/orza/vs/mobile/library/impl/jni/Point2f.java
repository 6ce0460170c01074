package com.orza.vs.mobile.library.impl.jni;

/** A point with float coordinates. */
public class Point2f extends NativeObject {
  public Point2f(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  Point2f(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(Point2f obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_Point2f(cPtr);
  }

  public Point2f() {
    this(OrzaVSMobileJNI.new_Point2f__SWIG_0(), true);
  }

  public Point2f(float x, float y) {
    this(OrzaVSMobileJNI.new_Point2f__SWIG_1(x, y), true);
  }

  public void setX(float value) {
    OrzaVSMobileJNI.Point2f_x_set(swigCPtr(), this, value);
  }

  public float getX() {
    return OrzaVSMobileJNI.Point2f_x_get(swigCPtr(), this);
  }

  public void setY(float value) {
    OrzaVSMobileJNI.Point2f_y_set(swigCPtr(), this, value);
  }

  public float getY() {
    return OrzaVSMobileJNI.Point2f_y_get(swigCPtr(), this);
  }
}
