package com.orza.vs.mobile.library.impl.jni;

/**
 * The native receiver of a response. Requests carry one; a transport passes responses to
 * {@link ServerDelegate#pushServerResponse} rather than calling it directly.
 */
public class ServerResponseHandler extends NativeObject {
  public ServerResponseHandler(long cPtr, boolean cMemoryOwn) {
    super(cPtr, cMemoryOwn);
  }

  ServerResponseHandler(long cPtr, NativeRef parent) {
    super(cPtr, parent);
  }

  public static long getCPtr(ServerResponseHandler obj) {
    return (obj == null) ? 0 : obj.swigCPtr();
  }

  @Override
  void deleteNative(long cPtr) {
    OrzaVSMobileJNI.delete_ServerResponseHandler(cPtr);
  }

  public void handleServerResponse(ServerResponse response) {
    OrzaVSMobileJNI.ServerResponseHandler_handleServerResponse(swigCPtr(), this,
        ServerResponse.getCPtr(response), response);
  }
}
