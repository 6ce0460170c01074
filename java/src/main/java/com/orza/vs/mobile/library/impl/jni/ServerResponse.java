package com.orza.vs.mobile.library.impl.jni;

/**
 * The transport's answer to one {@link ServerRequest}: the same {@code id}, the transport's
 * status code (200 for success), the body, and the measured round trip.
 */
public class ServerResponse {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public ServerResponse(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  ServerResponse(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(ServerResponse obj) {
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
        OrzaVSMobileJNI.delete_ServerResponse(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public ServerResponse() {
    this(OrzaVSMobileJNI.new_ServerResponse(), true);
  }

  public void setId(String value) {
    OrzaVSMobileJNI.ServerResponse_id_set(swigCPtr, this, value);
  }

  public String getId() {
    return OrzaVSMobileJNI.ServerResponse_id_get(swigCPtr, this);
  }

  public void setResponseCode(int value) {
    OrzaVSMobileJNI.ServerResponse_responseCode_set(swigCPtr, this, value);
  }

  public int getResponseCode() {
    return OrzaVSMobileJNI.ServerResponse_responseCode_get(swigCPtr, this);
  }

  public void setResponseStr(String value) {
    OrzaVSMobileJNI.ServerResponse_responseStr_set(swigCPtr, this, value);
  }

  public String getResponseStr() {
    return OrzaVSMobileJNI.ServerResponse_responseStr_get(swigCPtr, this);
  }

  public void setRoundtripTime(double value) {
    OrzaVSMobileJNI.ServerResponse_roundtripTime_set(swigCPtr, this, value);
  }

  public double getRoundtripTime() {
    return OrzaVSMobileJNI.ServerResponse_roundtripTime_get(swigCPtr, this);
  }

  public void setCompressed(boolean value) {
    OrzaVSMobileJNI.ServerResponse_compressed_set(swigCPtr, this, value);
  }

  public boolean getCompressed() {
    return OrzaVSMobileJNI.ServerResponse_compressed_get(swigCPtr, this);
  }
}
