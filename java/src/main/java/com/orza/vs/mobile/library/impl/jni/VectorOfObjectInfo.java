package com.orza.vs.mobile.library.impl.jni;

/**
 * A {@code std::vector} as a {@link java.util.List}: a vector of results; {@link #get} returns a view into the vector.
 * See {@link NativeList} for the rules on indices, views and copies.
 */
public class VectorOfObjectInfo extends NativeList<ObjectInfo> {
  public VectorOfObjectInfo(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  VectorOfObjectInfo(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  /** The native address of {@code obj} (0 for null); IllegalStateException once it is gone. */
  public static long getCPtr(VectorOfObjectInfo obj) {
    return (obj == null) ? 0 : obj.nref.get();
  }

  /** An empty vector. */
  public VectorOfObjectInfo() {
    this(OrzaVSMobileJNI.new_VectorOfObjectInfo__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements; IllegalArgumentException when {@code n} is negative. */
  public VectorOfObjectInfo(int n) {
    this(OrzaVSMobileJNI.new_VectorOfObjectInfo__SWIG_1(n), true);
  }

  /** An owned vector holding copies of the elements of {@code elements}. */
  public VectorOfObjectInfo(java.util.Collection<? extends ObjectInfo> elements) {
    this();
    addAll(elements);
  }

  @Override
  int nativeSize(long cPtr) {
    return OrzaVSMobileJNI.VectorOfObjectInfo_size(cPtr, this);
  }

  @Override
  boolean nativeIsEmpty(long cPtr) {
    return OrzaVSMobileJNI.VectorOfObjectInfo_isEmpty(cPtr, this);
  }

  @Override
  int nativeCapacity(long cPtr) {
    return OrzaVSMobileJNI.VectorOfObjectInfo_capacity(cPtr, this);
  }

  @Override
  void nativeReserve(long cPtr, int n) {
    OrzaVSMobileJNI.VectorOfObjectInfo_reserve(cPtr, this, n);
  }

  @Override
  ObjectInfo nativeGet(long cPtr, int i) {
    return new ObjectInfo(OrzaVSMobileJNI.VectorOfObjectInfo_get(cPtr, this, i), nref);
  }

  @Override
  void nativeSet(long cPtr, int i, ObjectInfo x) {
    OrzaVSMobileJNI.VectorOfObjectInfo_set(cPtr, this, i, ObjectInfo.getCPtr(x), x);
  }

  @Override
  void nativeAdd(long cPtr, ObjectInfo x) {
    OrzaVSMobileJNI.VectorOfObjectInfo_add(cPtr, this, ObjectInfo.getCPtr(x), x);
  }

  @Override
  void nativeClear(long cPtr) {
    OrzaVSMobileJNI.VectorOfObjectInfo_clear(cPtr, this);
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_VectorOfObjectInfo(cPtr);
  }

  /** An owned copy of a record element. */
  @Override
  ObjectInfo detach(ObjectInfo element) {
    return element.copy();
  }
}
