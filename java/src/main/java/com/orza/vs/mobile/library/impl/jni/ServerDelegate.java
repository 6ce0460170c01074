package com.orza.vs.mobile.library.impl.jni;

/**
 * The application's transport to the visual search server. Extend it and override
 * {@link #sendServerRequestImpl}: copy what you need from the request (it is borrowed: id,
 * params, metadata, {@code getData().getData()}) and return at once; perform the exchange on
 * your own thread and hand the answer back with {@link #pushServerResponse}, carrying the
 * request's id, from any thread. Each id is answered at most once.
 *
 * <p>{@link #sendServerRequest} registers the request's handler and then calls
 * {@link #sendServerRequestImpl}; override it only to wrap that (and call
 * {@code super.sendServerRequest}). A subclass that overrides neither fails every request with
 * RuntimeException "Attempted to invoke pure virtual method
 * Tovra::Server::ServerDelegate::sendServerRequestImpl.".
 *
 * <p>Lifetime: the native delegate holds this object through a weak reference only. The
 * application must keep its transport reachable (and must not {@link #delete} it) for as long
 * as the engine may use it, that is until the facade has been stopped and deleted. The
 * {@link TovraStateEngineFacade} proxy keeps a reference to every transport added to it.
 *
 * <p>The request is borrowed: after {@code sendServerRequestImpl} returns, any use of it (or of
 * its parameters, metadata or data) throws IllegalStateException.
 *
 * <p>An exception thrown by {@code sendServerRequestImpl} makes the engine give the frame up.
 * On the engine's worker thread no Java caller can receive it: it goes to
 * {@link OrzaVSMobile#setCallbackExceptionHandler the callback exception handler}. When the
 * send was called from Java, that call throws the same exception object. Report transfer
 * failures by pushing a response with a code other than 200 instead.
 *
 * <p>{@link #close()} is {@link #delete()}, for try-with-resources.
 */
public class ServerDelegate extends ServerDelegateInterface {
  private transient long swigCPtr;

  public ServerDelegate(long cPtr, boolean cMemoryOwn) {
    super(OrzaVSMobileJNI.ServerDelegate_SWIGUpcast(cPtr), cMemoryOwn);
    swigCPtr = cPtr;
  }

  public static long getCPtr(ServerDelegate obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  /** Frees the native delegate if this proxy owns it. */
  @Override
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_ServerDelegate(swigCPtr);
      }
      swigCPtr = 0;
    }
    super.delete();
  }

  /** Called by the native delegate while it is destroyed: forget the handle. */
  protected void swigDirectorDisconnect() {
    swigCMemOwn = false;
    delete();
  }

  /** Hands ownership of the native delegate to native code (it then holds this object strongly). */
  public void swigReleaseOwnership() {
    swigCMemOwn = false;
    OrzaVSMobileJNI.ServerDelegate_change_ownership(this, swigCPtr, false);
  }

  /** Takes ownership back into Java (native code then holds this object weakly). */
  public void swigTakeOwnership() {
    swigCMemOwn = true;
    OrzaVSMobileJNI.ServerDelegate_change_ownership(this, swigCPtr, true);
  }

  public ServerDelegate() {
    this(OrzaVSMobileJNI.new_ServerDelegate(), true);
    OrzaVSMobileJNI.ServerDelegate_director_connect(this, swigCPtr, true, true);
  }

  /** Registers the request's handler under its id, then calls {@link #sendServerRequestImpl}. */
  @Override
  public boolean sendServerRequest(ServerRequest request) {
    if (getClass() == ServerDelegate.class) {
      return OrzaVSMobileJNI.ServerDelegate_sendServerRequest(swigCPtr, this,
          ServerRequest.getCPtr(request), request);
    }
    return OrzaVSMobileJNI.ServerDelegate_sendServerRequestSwigExplicitServerDelegate(swigCPtr,
        this, ServerRequest.getCPtr(request), request);
  }

  /**
   * The transfer itself; override it. Returns whether the request was accepted for sending.
   * This class has no implementation of its own: an override must not call
   * {@code super.sendServerRequestImpl} (UnsupportedOperationException).
   */
  public boolean sendServerRequestImpl(ServerRequest request) {
    if (overridesSendServerRequestImpl()) {
      // Only an override's call to its superclass gets here; going native would come straight
      // back into the override and recurse without end.
      throw new UnsupportedOperationException("ServerDelegate.sendServerRequestImpl has no "
          + "implementation: an override must not call super.sendServerRequestImpl()");
    }
    return OrzaVSMobileJNI.ServerDelegate_sendServerRequestImpl(swigCPtr, this,
        ServerRequest.getCPtr(request), request);
  }

  private boolean overridesSendServerRequestImpl() {
    if (getClass() == ServerDelegate.class) return false;
    try {
      return getClass().getMethod("sendServerRequestImpl", ServerRequest.class).getDeclaringClass()
          != ServerDelegate.class;
    } catch (NoSuchMethodException e) {
      return false;  // cannot happen: the method is public here
    }
  }

  /**
   * Routes a response to the handler registered under its id (unknown or repeated ids are
   * ignored). The response stays the caller's: delete it when done.
   */
  public void pushServerResponse(ServerResponse response) {
    OrzaVSMobileJNI.ServerDelegate_pushServerResponse(swigCPtr, this,
        ServerResponse.getCPtr(response), response);
  }
}
