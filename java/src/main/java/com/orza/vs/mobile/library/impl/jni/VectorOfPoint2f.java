package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::vector} as a {@link java.util.List}: a vector of points; {@link #get} returns a view into the vector.
 * See {@link NativeList} for the rules on indices, views and copies.
 */
public class VectorOfPoint2f extends NativeList<Point2f> {
  public VectorOfPoint2f(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  VectorOfPoint2f(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(VectorOfPoint2f obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty vector. */
  public VectorOfPoint2f() {
    this(OrzaVSMobileJNI.new_VectorOfPoint2f__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements; IllegalArgumentException when {@code n} is negative. */
  public VectorOfPoint2f(int n) {
    this(OrzaVSMobileJNI.new_VectorOfPoint2f__SWIG_1(n), true);
  }

  /** An owned vector holding copies of the elements of {@code elements}. */
  public VectorOfPoint2f(java.util.Collection<? extends Point2f> elements) {
    this();
    addAll(elements);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.VectorOfPoint2f_size(cPtr, this);
  }

  @Override
  boolean nativeIsEmpty(long cPtr) {
    return OrzaVSMobileJNI.VectorOfPoint2f_isEmpty(cPtr, this);
  }

  @Override
  int nativeCapacity(long cPtr) {
    return OrzaVSMobileJNI.VectorOfPoint2f_capacity(cPtr, this);
  }

  @Override
  void nativeReserve(long cPtr, int n) {
    OrzaVSMobileJNI.VectorOfPoint2f_reserve(cPtr, this, n);
  }

  @Override
  Point2f nativeGet(long cPtr, int i) {
    return new Point2f(OrzaVSMobileJNI.VectorOfPoint2f_get(cPtr, this, i), nref);
  }

  @Override
  void nativeSet(long cPtr, int i, Point2f x) {
    OrzaVSMobileJNI.VectorOfPoint2f_set(cPtr, this, i, Point2f.getCPtr(x), x);
  }

  @Override
  void nativeAdd(long cPtr, Point2f x) {
    OrzaVSMobileJNI.VectorOfPoint2f_add(cPtr, this, Point2f.getCPtr(x), x);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.VectorOfPoint2f_clear(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_VectorOfPoint2f(cPtr);
  }

  /** An owned copy of a record element. */
  @Override
  Point2f detach(Point2f element) {
    return new Point2f(element.getX(), element.getY());
  }
}
