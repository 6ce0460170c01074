package com.orza.vs.mobile.library.impl.jni;

/** A point with float coordinates. */
public class Point2f {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public Point2f(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  Point2f(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(Point2f obj) {
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
        OrzaVSMobileJNI.delete_Point2f(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public Point2f() {
    this(OrzaVSMobileJNI.new_Point2f__SWIG_0(), true);
  }

  public Point2f(float x, float y) {
    this(OrzaVSMobileJNI.new_Point2f__SWIG_1(x, y), true);
  }

  public void setX(float value) {
    OrzaVSMobileJNI.Point2f_x_set(swigCPtr, this, value);
  }

  public float getX() {
    return OrzaVSMobileJNI.Point2f_x_get(swigCPtr, this);
  }

  public void setY(float value) {
    OrzaVSMobileJNI.Point2f_y_set(swigCPtr, this, value);
  }

  public float getY() {
    return OrzaVSMobileJNI.Point2f_y_get(swigCPtr, this);
  }
}
