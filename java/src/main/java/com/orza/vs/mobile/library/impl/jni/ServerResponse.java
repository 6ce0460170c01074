package com.orza.vs.mobile.library.impl.jni;

/**
 * The transport's answer to one {@link ServerRequest}: the same {@code id}, the transport's
 * status code (200 for success), the body, and the measured round trip.
 */
public class ServerResponse extends NativeObject {
  public ServerResponse(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ServerResponse(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ServerResponse obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ServerResponse(cPtr);
  }

  public ServerResponse() {
    this(OrzaVSMobileJNI.new_ServerResponse(), true);
  }

  public void setId(String value) {
    OrzaVSMobileJNI.ServerResponse_id_set(swigCPtr(), this, value);
  }

  public String getId() {
    return OrzaVSMobileJNI.ServerResponse_id_get(swigCPtr(), this);
  }

  public void setResponseCode(int value) {
    OrzaVSMobileJNI.ServerResponse_responseCode_set(swigCPtr(), this, value);
  }

  public int getResponseCode() {
    return OrzaVSMobileJNI.ServerResponse_responseCode_get(swigCPtr(), this);
  }

  public void setResponseStr(String value) {
    OrzaVSMobileJNI.ServerResponse_responseStr_set(swigCPtr(), this, value);
  }

  public String getResponseStr() {
    return OrzaVSMobileJNI.ServerResponse_responseStr_get(swigCPtr(), this);
  }

  public void setRoundtripTime(double value) {
    OrzaVSMobileJNI.ServerResponse_roundtripTime_set(swigCPtr(), this, value);
  }

  public double getRoundtripTime() {
    return OrzaVSMobileJNI.ServerResponse_roundtripTime_get(swigCPtr(), this);
  }

  public void setCompressed(boolean value) {
    OrzaVSMobileJNI.ServerResponse_compressed_set(swigCPtr(), this, value);
  }

  public boolean getCompressed() {
    return OrzaVSMobileJNI.ServerResponse_compressed_get(swigCPtr(), this);
  }
}
