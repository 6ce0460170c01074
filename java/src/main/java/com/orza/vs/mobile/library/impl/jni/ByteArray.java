package com.orza.vs.mobile.library.impl.jni;

/** A view of bytes that native code keeps alive; {@link #getData} copies them into Java. */
public class ByteArray extends NativeObject {
  public ByteArray(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ByteArray(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ByteArray obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ByteArray(cPtr);
  }

  public ByteArray() {
    this(OrzaVSMobileJNI.new_ByteArray__SWIG_0(), true);
  }

  public ByteArray(ByteArray other) {
    this(OrzaVSMobileJNI.new_ByteArray__SWIG_1(ByteArray.getCPtr(other), other), true);
  }

  /** A fresh copy of the bytes ({@link #getLength} of them); empty when there are none. */
  public byte[] getData() {
    return OrzaVSMobileJNI.ByteArray_getData(swigCPtr(), this);
  }

  public int getLength() {
    return OrzaVSMobileJNI.ByteArray_getLength(swigCPtr(), this);
  }

  /** Forgets the bytes (nothing is freed). */
  public void clear() {
    OrzaVSMobileJNI.ByteArray_clear(swigCPtr(), this);
  }
}
