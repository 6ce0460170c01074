package com.orza.vs.mobile.library.impl.jni;

/** A pair of strings ({@code std::pair<std::string, std::string>}). */
public class StringPair extends NativeObject {
  public StringPair(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  StringPair(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(StringPair obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_StringPair(cPtr);
  }

  public StringPair() {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_0(), true);
  }

  public StringPair(String first, String second) {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_1(first, second), true);
  }

  public StringPair(StringPair other) {
    this(OrzaVSMobileJNI.new_StringPair__SWIG_2(StringPair.getCPtr(other), other), true);
  }

  public void setFirst(String value) {
    OrzaVSMobileJNI.StringPair_first_set(swigCPtr(), this, value);
  }

  public String getFirst() {
    return OrzaVSMobileJNI.StringPair_first_get(swigCPtr(), this);
  }

  public void setSecond(String value) {
    OrzaVSMobileJNI.StringPair_second_set(swigCPtr(), this, value);
  }

  public String getSecond() {
    return OrzaVSMobileJNI.StringPair_second_get(swigCPtr(), this);
  }
}
