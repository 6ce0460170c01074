package com.orza.vs.mobile.library.impl.jni;

/** The engine's view of a transport: something it can send a request to. */
public class ServerDelegateInterface implements NativeProxy {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;

  public ServerDelegateInterface(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  public static long getCPtr(ServerDelegateInterface obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_ServerDelegateInterface(swigCPtr);
      }
      swigCPtr = 0;
    }
  }

  public boolean sendServerRequest(ServerRequest request) {
    return OrzaVSMobileJNI.ServerDelegateInterface_sendServerRequest(swigCPtr, this,
        ServerRequest.getCPtr(request), request);
  }
}
