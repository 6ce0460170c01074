package com.orza.vs.mobile.library.impl.jni;

/**
 * A vector of int ({@code std::vector}). Indices outside 0..size()-1 raise
 * IndexOutOfBoundsException "vector index out of range".
 */
public class VectorOfInt extends java.util.AbstractList<Integer> implements java.util.RandomAccess {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public VectorOfInt(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  VectorOfInt(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(VectorOfInt obj) {
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
        OrzaVSMobileJNI.delete_VectorOfInt(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public VectorOfInt() {
    this(OrzaVSMobileJNI.new_VectorOfInt__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements. */
  public VectorOfInt(int n) {
    this(OrzaVSMobileJNI.new_VectorOfInt__SWIG_1(n), true);
  }

  @Override
  public int size() {
    return OrzaVSMobileJNI.VectorOfInt_size(swigCPtr, this);
  }

  public int capacity() {
    return OrzaVSMobileJNI.VectorOfInt_capacity(swigCPtr, this);
  }

  public void reserve(int n) {
    OrzaVSMobileJNI.VectorOfInt_reserve(swigCPtr, this, n);
  }

  @Override
  public boolean isEmpty() {
    return OrzaVSMobileJNI.VectorOfInt_isEmpty(swigCPtr, this);
  }

  @Override
  public void clear() {
    OrzaVSMobileJNI.VectorOfInt_clear(swigCPtr, this);
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(Integer x) {
    OrzaVSMobileJNI.VectorOfInt_add(swigCPtr, this, x);
    return true;
  }

  @Override
  public Integer get(int i) {
    return OrzaVSMobileJNI.VectorOfInt_get(swigCPtr, this, i);
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns the previous element. */
  @Override
  public Integer set(int i, Integer x) {
    Integer previous = get(i);
    OrzaVSMobileJNI.VectorOfInt_set(swigCPtr, this, i, x);
    return previous;
  }
}
