package com.orza.vs.mobile.library.impl.jni;

/**
 * A vector of results ({@code std::vector}). Indices outside 0..size()-1 raise
 * IndexOutOfBoundsException "vector index out of range".
 * {@link #get} returns a view into the vector, valid until the vector changes.
 */
public class VectorOfObjectInfo extends java.util.AbstractList<ObjectInfo> implements java.util.RandomAccess {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public VectorOfObjectInfo(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  VectorOfObjectInfo(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(VectorOfObjectInfo obj) {
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
        OrzaVSMobileJNI.delete_VectorOfObjectInfo(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public VectorOfObjectInfo() {
    this(OrzaVSMobileJNI.new_VectorOfObjectInfo__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements. */
  public VectorOfObjectInfo(int n) {
    this(OrzaVSMobileJNI.new_VectorOfObjectInfo__SWIG_1(n), true);
  }

  @Override
  public int size() {
    return OrzaVSMobileJNI.VectorOfObjectInfo_size(swigCPtr, this);
  }

  public int capacity() {
    return OrzaVSMobileJNI.VectorOfObjectInfo_capacity(swigCPtr, this);
  }

  public void reserve(int n) {
    OrzaVSMobileJNI.VectorOfObjectInfo_reserve(swigCPtr, this, n);
  }

  @Override
  public boolean isEmpty() {
    return OrzaVSMobileJNI.VectorOfObjectInfo_isEmpty(swigCPtr, this);
  }

  @Override
  public void clear() {
    OrzaVSMobileJNI.VectorOfObjectInfo_clear(swigCPtr, this);
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(ObjectInfo x) {
    OrzaVSMobileJNI.VectorOfObjectInfo_add(swigCPtr, this, ObjectInfo.getCPtr(x), x);
    return true;
  }

  /** A view of element {@code i} inside this vector (not a copy). */
  @Override
  public ObjectInfo get(int i) {
    return new ObjectInfo(OrzaVSMobileJNI.VectorOfObjectInfo_get(swigCPtr, this, i), this);
  }

  // A detached copy: the element copied into a vector of its own, viewed through it.
  private static ObjectInfo copyOf(ObjectInfo o) {
    VectorOfObjectInfo holder = new VectorOfObjectInfo();
    holder.add(o);
    return holder.get(0);
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns the previous element. */
  @Override
  public ObjectInfo set(int i, ObjectInfo x) {
    ObjectInfo previous = copyOf(get(i));
    OrzaVSMobileJNI.VectorOfObjectInfo_set(swigCPtr, this, i, ObjectInfo.getCPtr(x), x);
    return previous;
  }
}
