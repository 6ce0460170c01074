package com.orza.vs.mobile.library.impl.jni;

/** A frame's identifier. */
public class FrameID extends NativeObject {
  public FrameID(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  FrameID(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(FrameID obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_FrameID(cPtr);
  }

  public FrameID() {
    this(OrzaVSMobileJNI.new_FrameID(), true);
  }

  public void setId(String value) {
    OrzaVSMobileJNI.FrameID_id_set(swigCPtr(), this, value);
  }

  public String getId() {
    return OrzaVSMobileJNI.FrameID_id_get(swigCPtr(), this);
  }
}
