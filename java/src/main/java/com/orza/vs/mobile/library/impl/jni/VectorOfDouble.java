package com.orza.vs.mobile.library.impl.jni;

/**
 * A vector of double ({@code std::vector}). Indices outside 0..size()-1 raise
 * IndexOutOfBoundsException "vector index out of range".
 */
public class VectorOfDouble extends java.util.AbstractList<Double> implements java.util.RandomAccess {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public VectorOfDouble(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  VectorOfDouble(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(VectorOfDouble obj) {
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
        OrzaVSMobileJNI.delete_VectorOfDouble(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public VectorOfDouble() {
    this(OrzaVSMobileJNI.new_VectorOfDouble__SWIG_0(), true);
  }

  /** A vector of {@code n} default elements. */
  public VectorOfDouble(int n) {
    this(OrzaVSMobileJNI.new_VectorOfDouble__SWIG_1(n), true);
  }

  @Override
  public int size() {
    return OrzaVSMobileJNI.VectorOfDouble_size(swigCPtr, this);
  }

  public int capacity() {
    return OrzaVSMobileJNI.VectorOfDouble_capacity(swigCPtr, this);
  }

  public void reserve(int n) {
    OrzaVSMobileJNI.VectorOfDouble_reserve(swigCPtr, this, n);
  }

  @Override
  public boolean isEmpty() {
    return OrzaVSMobileJNI.VectorOfDouble_isEmpty(swigCPtr, this);
  }

  @Override
  public void clear() {
    OrzaVSMobileJNI.VectorOfDouble_clear(swigCPtr, this);
  }

  /** Appends a copy of {@code x}. */
  @Override
  public boolean add(Double x) {
    OrzaVSMobileJNI.VectorOfDouble_add(swigCPtr, this, x);
    return true;
  }

  @Override
  public Double get(int i) {
    return OrzaVSMobileJNI.VectorOfDouble_get(swigCPtr, this, i);
  }

  /** Assigns a copy of {@code x} to element {@code i}; returns the previous element. */
  @Override
  public Double set(int i, Double x) {
    Double previous = get(i);
    OrzaVSMobileJNI.VectorOfDouble_set(swigCPtr, this, i, x);
    return previous;
  }
}
