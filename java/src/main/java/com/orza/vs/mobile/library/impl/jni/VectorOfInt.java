package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::vector} as a {@link java.util.List}: a vector of {@code int}.
 * See {@link NativeList} for the rules on indices, views and copies.
 */
public class VectorOfInt extends NativeList<Integer> {
  public VectorOfInt(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  VectorOfInt(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(VectorOfInt obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty vector. */
  public VectorOfInt() {
    this(OrzaVSMobileJNI.new_VectorOfInt__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements; IllegalArgumentException when {@code n} is negative. */
  public VectorOfInt(int n) {
    this(OrzaVSMobileJNI.new_VectorOfInt__SWIG_1(n), true);
  }

  /** An owned vector holding copies of the elements of {@code elements}. */
  public VectorOfInt(java.util.Collection<? extends Integer> elements) {
    this();
    addAll(elements);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.VectorOfInt_size(cPtr, this);
  }

  @Override
  boolean nativeIsEmpty(long cPtr) {
    return OrzaVSMobileJNI.VectorOfInt_isEmpty(cPtr, this);
  }

  @Override
  int nativeCapacity(long cPtr) {
    return OrzaVSMobileJNI.VectorOfInt_capacity(cPtr, this);
  }

  @Override
  void nativeReserve(long cPtr, int n) {
    OrzaVSMobileJNI.VectorOfInt_reserve(cPtr, this, n);
  }

  @Override
  Integer nativeGet(long cPtr, int i) {
    return OrzaVSMobileJNI.VectorOfInt_get(cPtr, this, i);
  }

  @Override
  void nativeSet(long cPtr, int i, Integer x) {
    OrzaVSMobileJNI.VectorOfInt_set(cPtr, this, i, x);
  }

  @Override
  void nativeAdd(long cPtr, Integer x) {
    OrzaVSMobileJNI.VectorOfInt_add(cPtr, this, x);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.VectorOfInt_clear(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_VectorOfInt(cPtr);
  }
}
