package com.orza.vs.mobile.library.impl.jni;

/**
 * The native receiver of a response. Requests carry one; a transport passes responses to
 * {@link ServerDelegate#pushServerResponse} rather than calling it directly.
 */
public class ServerResponseHandler {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  public ServerResponseHandler(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  ServerResponseHandler(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  public static long getCPtr(ServerResponseHandler obj) {
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
        OrzaVSMobileJNI.delete_ServerResponseHandler(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }

  public void handleServerResponse(ServerResponse response) {
    OrzaVSMobileJNI.ServerResponseHandler_handleServerResponse(swigCPtr, this,
        ServerResponse.getCPtr(response), response);
  }
}
