package com.orza.vs.mobile.library.impl.jni;

/** A point with double coordinates. */
public class Point3d extends NativeObject {
  public Point3d(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  Point3d(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(Point3d obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_Point3d(cPtr);
  }

  public Point3d() {
    this(OrzaVSMobileJNI.new_Point3d__SWIG_0(), true);
  }

  public Point3d(double x, double y, double z) {
    this(OrzaVSMobileJNI.new_Point3d__SWIG_1(x, y, z), true);
  }

  public void setX(double value) {
    OrzaVSMobileJNI.Point3d_x_set(swigCPtr(), this, value);
  }

  public double getX() {
    return OrzaVSMobileJNI.Point3d_x_get(swigCPtr(), this);
  }

  public void setY(double value) {
    OrzaVSMobileJNI.Point3d_y_set(swigCPtr(), this, value);
  }

  public double getY() {
    return OrzaVSMobileJNI.Point3d_y_get(swigCPtr(), this);
  }

  public void setZ(double value) {
    OrzaVSMobileJNI.Point3d_z_set(swigCPtr(), this, value);
  }

  public double getZ() {
    return OrzaVSMobileJNI.Point3d_z_get(swigCPtr(), this);
  }
}
