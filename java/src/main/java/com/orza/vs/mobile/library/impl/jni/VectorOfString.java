package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::vector} as a {@link java.util.List}: a vector of strings; a null element raises NullPointerException "null string".
 * See {@link NativeList} for the rules on indices, views and copies.
 */
public class VectorOfString extends NativeList<String> {
  public VectorOfString(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  VectorOfString(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(VectorOfString obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty vector. */
  public VectorOfString() {
    this(OrzaVSMobileJNI.new_VectorOfString__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements; IllegalArgumentException when {@code n} is negative. */
  public VectorOfString(int n) {
    this(OrzaVSMobileJNI.new_VectorOfString__SWIG_1(n), true);
  }

  /** An owned vector holding copies of the elements of {@code elements}. */
  public VectorOfString(java.util.Collection<? extends String> elements) {
    this();
    addAll(elements);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.VectorOfString_size(cPtr, this);
  }

  @Override
  boolean nativeIsEmpty(long cPtr) {
    return OrzaVSMobileJNI.VectorOfString_isEmpty(cPtr, this);
  }

  @Override
  int nativeCapacity(long cPtr) {
    return OrzaVSMobileJNI.VectorOfString_capacity(cPtr, this);
  }

  @Override
  void nativeReserve(long cPtr, int n) {
    OrzaVSMobileJNI.VectorOfString_reserve(cPtr, this, n);
  }

  @Override
  String nativeGet(long cPtr, int i) {
    return OrzaVSMobileJNI.VectorOfString_get(cPtr, this, i);
  }

  @Override
  void nativeSet(long cPtr, int i, String x) {
    OrzaVSMobileJNI.VectorOfString_set(cPtr, this, i, x);
  }

  @Override
  void nativeAdd(long cPtr, String x) {
    OrzaVSMobileJNI.VectorOfString_add(cPtr, this, x);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.VectorOfString_clear(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_VectorOfString(cPtr);
  }
}
