package com.orza.vs.mobile.library.impl.jni;

/**
 * An ordered map from string to unsigned 32-bit integer (values 0 to 4294967295;
 * a value set from Java is taken modulo 2^32). A missing key in {@link #get} or {@link #del} raises IndexOutOfBoundsException
 * "key not found"; a null key raises NullPointerException "null string".
 */
public class MapOfStringToUInt extends NativeObject {
  public MapOfStringToUInt(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  MapOfStringToUInt(long cPtr, Object parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(MapOfStringToUInt obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_MapOfStringToUInt(cPtr);
  }

  public MapOfStringToUInt() {
    this(OrzaVSMobileJNI.new_MapOfStringToUInt__SWIG_0(), true);
  }

  /** A copy of {@code other}. */
  public MapOfStringToUInt(MapOfStringToUInt other) {
    this(OrzaVSMobileJNI.new_MapOfStringToUInt__SWIG_1(MapOfStringToUInt.getCPtr(other), other), true);
  }

  public int size() {
    return OrzaVSMobileJNI.MapOfStringToUInt_size(swigCPtr, this);
  }

  public boolean empty() {
    return OrzaVSMobileJNI.MapOfStringToUInt_empty(swigCPtr, this);
  }

  public void clear() {
    OrzaVSMobileJNI.MapOfStringToUInt_clear(swigCPtr, this);
  }

  public long get(String key) {
    return OrzaVSMobileJNI.MapOfStringToUInt_get(swigCPtr, this, key);
  }

  /** Inserts or overwrites. */
  public void set(String key, long x) {
    OrzaVSMobileJNI.MapOfStringToUInt_set(swigCPtr, this, key, x);
  }

  public void del(String key) {
    OrzaVSMobileJNI.MapOfStringToUInt_del(swigCPtr, this, key);
  }

  public boolean has_key(String key) {
    return OrzaVSMobileJNI.MapOfStringToUInt_has_key(swigCPtr, this, key);
  }

  /** Every key in ascending order, as a new vector owned by the caller. */
  public VectorOfString getKeysForIntMap() {
    return new VectorOfString(OrzaVSMobileJNI.MapOfStringToUInt_getKeysForIntMap(swigCPtr, this), true);
  }

  /** Same as {@link #getKeysForIntMap}. */
  public VectorOfString getKeys() {
    return getKeysForIntMap();
  }
}
