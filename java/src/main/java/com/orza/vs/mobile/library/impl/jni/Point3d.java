package com.orza.vs.mobile.library.impl.jni;

/** A point with double coordinates. */
public class Point3d {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public Point3d(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  Point3d(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(Point3d obj) {
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
        OrzaVSMobileJNI.delete_Point3d(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public Point3d() {
    this(OrzaVSMobileJNI.new_Point3d__SWIG_0(), true);
  }

  public Point3d(double x, double y, double z) {
    this(OrzaVSMobileJNI.new_Point3d__SWIG_1(x, y, z), true);
  }

  public void setX(double value) {
    OrzaVSMobileJNI.Point3d_x_set(swigCPtr, this, value);
  }

  public double getX() {
    return OrzaVSMobileJNI.Point3d_x_get(swigCPtr, this);
  }

  public void setY(double value) {
    OrzaVSMobileJNI.Point3d_y_set(swigCPtr, this, value);
  }

  public double getY() {
    return OrzaVSMobileJNI.Point3d_y_get(swigCPtr, this);
  }

  public void setZ(double value) {
    OrzaVSMobileJNI.Point3d_z_set(swigCPtr, this, value);
  }

  public double getZ() {
    return OrzaVSMobileJNI.Point3d_z_get(swigCPtr, this);
  }
}
