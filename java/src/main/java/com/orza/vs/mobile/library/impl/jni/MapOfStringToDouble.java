package com.orza.vs.mobile.library.impl.jni;

/**
 * An ordered map from string to double. A missing key in {@link #get} or {@link #del} raises IndexOutOfBoundsException
 * "key not found"; a null key raises NullPointerException "null string".
 */
public class MapOfStringToDouble extends NativeObject {
  public MapOfStringToDouble(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToDouble(long cPtr, Object parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(MapOfStringToDouble obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToDouble(cPtr);
  }

  public MapOfStringToDouble() {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToDouble(MapOfStringToDouble other) {
    this(OrzaVSMobileJNI.new_MapOfStringToDouble__SWIG_1(MapOfStringToDouble.getCPtr(other), other), true);
  }

  public int size() {
    return OrzaVSMobileJNI.MapOfStringToDouble_size(swigCPtr, this);
  }

  public boolean empty() {
    return OrzaVSMobileJNI.MapOfStringToDouble_empty(swigCPtr, this);
  }

  public void clear() {
    OrzaVSMobileJNI.MapOfStringToDouble_clear(swigCPtr, this);
  }

  public double get(String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_get(swigCPtr, this, key);
  }

  /** Inserts or overwrites. */
  public void set(String key, double x) {
    OrzaVSMobileJNI.MapOfStringToDouble_set(swigCPtr, this, key, x);
  }

  public void del(String key) {
    OrzaVSMobileJNI.MapOfStringToDouble_del(swigCPtr, this, key);
  }

  public boolean has_key(String key) {
    return OrzaVSMobileJNI.MapOfStringToDouble_has_key(swigCPtr, this, key);
  }

  /** Every key in ascending order, as a new vector owned by the caller. */
  public VectorOfString getKeysForDoubleMap() {
    return new VectorOfString(OrzaVSMobileJNI.MapOfStringToDouble_getKeysForDoubleMap(swigCPtr, this), true);
  }

  /** Same as {@link #getKeysForDoubleMap}. */
  public VectorOfString getKeys() {
    return getKeysForDoubleMap();
  }
}
