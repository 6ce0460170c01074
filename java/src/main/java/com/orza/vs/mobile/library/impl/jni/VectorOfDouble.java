package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::vector} as a {@link java.util.List}: a vector of {@code double}.
 * See {@link NativeList} for the rules on indices, views and copies.
 */
public class VectorOfDouble extends NativeList<Double> {
  public VectorOfDouble(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  VectorOfDouble(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(VectorOfDouble obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty vector. */
  public VectorOfDouble() {
    this(OrzaVSMobileJNI.new_VectorOfDouble__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements; IllegalArgumentException when {@code n} is negative. */
  public VectorOfDouble(int n) {
    this(OrzaVSMobileJNI.new_VectorOfDouble__SWIG_1(n), true);
  }

  /** An owned vector holding copies of the elements of {@code elements}. */
  public VectorOfDouble(java.util.Collection<? extends Double> elements) {
    this();
    addAll(elements);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.VectorOfDouble_size(cPtr, this);
  }

  @Override
  boolean nativeIsEmpty(long cPtr) {
    return OrzaVSMobileJNI.VectorOfDouble_isEmpty(cPtr, this);
  }

  @Override
  int nativeCapacity(long cPtr) {
    return OrzaVSMobileJNI.VectorOfDouble_capacity(cPtr, this);
  }

  @Override
  void nativeReserve(long cPtr, int n) {
    OrzaVSMobileJNI.VectorOfDouble_reserve(cPtr, this, n);
  }

  @Override
  Double nativeGet(long cPtr, int i) {
    return OrzaVSMobileJNI.VectorOfDouble_get(cPtr, this, i);
  }

  @Override
  void nativeSet(long cPtr, int i, Double x) {
    OrzaVSMobileJNI.VectorOfDouble_set(cPtr, this, i, x);
  }

  @Override
  void nativeAdd(long cPtr, Double x) {
    OrzaVSMobileJNI.VectorOfDouble_add(cPtr, this, x);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.VectorOfDouble_clear(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_VectorOfDouble(cPtr);
  }
}
