package com.orza.vs.mobile.library.impl.jni;

/** A view of bytes that native code keeps alive; {@link #getData} copies them into Java. */
public class ByteArray {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public ByteArray(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  ByteArray(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(ByteArray obj) {
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
        OrzaVSMobileJNI.delete_ByteArray(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public ByteArray() {
    this(OrzaVSMobileJNI.new_ByteArray__SWIG_0(), true);
  }

  public ByteArray(ByteArray other) {
    this(OrzaVSMobileJNI.new_ByteArray__SWIG_1(ByteArray.getCPtr(other), other), true);
  }

  /** A fresh copy of the bytes ({@link #getLength} of them); empty when there are none. */
  public byte[] getData() {
    return OrzaVSMobileJNI.ByteArray_getData(swigCPtr, this);
  }

  public int getLength() {
    return OrzaVSMobileJNI.ByteArray_getLength(swigCPtr, this);
  }

  /** Forgets the bytes (nothing is freed). */
  public void clear() {
    OrzaVSMobileJNI.ByteArray_clear(swigCPtr, this);
  }
}
