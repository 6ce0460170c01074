package com.orza.vs.mobile.library.impl.jni;

/**
 * An ordered map from string to string. A missing key in {@link #get} or {@link #del} raises IndexOutOfBoundsException
 * "key not found"; a null key raises NullPointerException "null string".
 */
public class MapOfStringToString extends NativeObject {
  public MapOfStringToString(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToString(long cPtr, Object parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(MapOfStringToString obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToString(cPtr);
  }

  public MapOfStringToString() {
    this(OrzaVSMobileJNI.new_MapOfStringToString__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToString(MapOfStringToString other) {
    this(OrzaVSMobileJNI.new_MapOfStringToString__SWIG_1(MapOfStringToString.getCPtr(other), other), true);
  }

  public int size() {
    return OrzaVSMobileJNI.MapOfStringToString_size(swigCPtr, this);
  }

  public boolean empty() {
    return OrzaVSMobileJNI.MapOfStringToString_empty(swigCPtr, this);
  }

  public void clear() {
    OrzaVSMobileJNI.MapOfStringToString_clear(swigCPtr, this);
  }

  public String get(String key) {
    return OrzaVSMobileJNI.MapOfStringToString_get(swigCPtr, this, key);
  }

  /** Inserts or overwrites. */
  public void set(String key, String x) {
    OrzaVSMobileJNI.MapOfStringToString_set(swigCPtr, this, key, x);
  }

  public void del(String key) {
    OrzaVSMobileJNI.MapOfStringToString_del(swigCPtr, this, key);
  }

  public boolean has_key(String key) {
    return OrzaVSMobileJNI.MapOfStringToString_has_key(swigCPtr, this, key);
  }

  /** Every key in ascending order, as a new vector owned by the caller. */
  public VectorOfString getKeys() {
    return new VectorOfString(OrzaVSMobileJNI.MapOfStringToString_getKeys(swigCPtr, this), true);
  }
}
