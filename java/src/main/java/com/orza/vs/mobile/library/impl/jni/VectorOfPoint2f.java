package com.orza.vs.mobile.library.impl.jni;

/**
 * A vector of points ({@code std::vector}). Indices outside 0..size()-1 raise
 * IndexOutOfBoundsException "vector index out of range".
 * {@link #get} returns a view into the vector, valid until the vector changes.
 */
public class VectorOfPoint2f extends java.util.AbstractList<Point2f> implements java.util.RandomAccess {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public VectorOfPoint2f(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  VectorOfPoint2f(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(VectorOfPoint2f obj) {
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
        OrzaVSMobileJNI.delete_VectorOfPoint2f(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public VectorOfPoint2f() {
    this(OrzaVSMobileJNI.new_VectorOfPoint2f__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements. */
  public VectorOfPoint2f(int n) {
    this(OrzaVSMobileJNI.new_VectorOfPoint2f__SWIG_1(n), true);
  }

  @Override
  public int size() {
    return OrzaVSMobileJNI.VectorOfPoint2f_size(swigCPtr, this);
  }

  public int capacity() {
    return OrzaVSMobileJNI.VectorOfPoint2f_capacity(swigCPtr, this);
  }

  public void reserve(int n) {
    OrzaVSMobileJNI.VectorOfPoint2f_reserve(swigCPtr, this, n);
  }

  @Override
  public boolean isEmpty() {
    return OrzaVSMobileJNI.VectorOfPoint2f_isEmpty(swigCPtr, this);
  }

  @Override
  public void clear() {
    OrzaVSMobileJNI.VectorOfPoint2f_clear(swigCPtr, this);
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(Point2f x) {
    OrzaVSMobileJNI.VectorOfPoint2f_add(swigCPtr, this, Point2f.getCPtr(x), x);
    return true;
  }

  /** A view of element {@code i} inside this vector (not a copy). */
  @Override
  public Point2f get(int i) {
    return new Point2f(OrzaVSMobileJNI.VectorOfPoint2f_get(swigCPtr, this, i), this);
  }

  private static Point2f copyOf(Point2f p) {
    return new Point2f(p.getX(), p.getY());
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns the previous element. */
  @Override
  public Point2f set(int i, Point2f x) {
    Point2f previous = copyOf(get(i));
    OrzaVSMobileJNI.VectorOfPoint2f_set(swigCPtr, this, i, Point2f.getCPtr(x), x);
    return previous;
  }
}
