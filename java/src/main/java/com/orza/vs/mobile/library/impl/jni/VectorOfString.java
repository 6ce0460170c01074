package com.orza.vs.mobile.library.impl.jni;

/**
 * A vector of strings ({@code std::vector}). Indices outside 0..size()-1 raise
 * IndexOutOfBoundsException "vector index out of range".
 */
public class VectorOfString extends java.util.AbstractList<String> implements java.util.RandomAccess {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public VectorOfString(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  VectorOfString(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(VectorOfString obj) {
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
        OrzaVSMobileJNI.delete_VectorOfString(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public VectorOfString() {
    this(OrzaVSMobileJNI.new_VectorOfString__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements. */
  public VectorOfString(int n) {
    this(OrzaVSMobileJNI.new_VectorOfString__SWIG_1(n), true);
  }

  @Override
  public int size() {
    return OrzaVSMobileJNI.VectorOfString_size(swigCPtr, this);
  }

  public int capacity() {
    return OrzaVSMobileJNI.VectorOfString_capacity(swigCPtr, this);
  }

  public void reserve(int n) {
    OrzaVSMobileJNI.VectorOfString_reserve(swigCPtr, this, n);
  }

  @Override
  public boolean isEmpty() {
    return OrzaVSMobileJNI.VectorOfString_isEmpty(swigCPtr, this);
  }

  @Override
  public void clear() {
    OrzaVSMobileJNI.VectorOfString_clear(swigCPtr, this);
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(String x) {
    OrzaVSMobileJNI.VectorOfString_add(swigCPtr, this, x);
    return true;
  }

  @Override
  public String get(int i) {
    return OrzaVSMobileJNI.VectorOfString_get(swigCPtr, this, i);
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns the previous element. */
  @Override
  public String set(int i, String x) {
    String previous = get(i);
    OrzaVSMobileJNI.VectorOfString_set(swigCPtr, this, i, x);
    return previous;
  }
}
