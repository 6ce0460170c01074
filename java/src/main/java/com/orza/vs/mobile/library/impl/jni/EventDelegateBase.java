package com.orza.vs.mobile.library.impl.jni;

/**
 * How the engine tells the application what happened. Extend this class and override the
 * callbacks you care about; the others do nothing.
 *
 * <p>Threads: callbacks arrive on whichever thread the engine is on: the thread that called
 * {@code process} ({@link #didDetectInterestPoints}, with the engine's lock held: do not call
 * the engine from it), the engine's worker thread, or the thread that pushed a server reply
 * ({@link #didDecode}, {@link #didReceiveServerError}). Implementations must be thread-safe and
 * should return quickly.
 *
 * <p>Arguments are borrowed: the vectors and the metadata are views of the engine's objects,
 * valid only until the callback returns; afterwards any use of them, or of an element or field
 * taken from them, throws IllegalStateException. Copy what you keep:
 * {@code new ArrayList<>(objects)} gives owned copies of the results, {@code metadata.copy()}
 * an owned metadata. An enumeration value that has no constant in its Java class arrives as null.
 *
 * <p>An exception thrown by a callback does not reach the engine. When the callback runs inside
 * a call from Java (for example {@code process} or {@code pushServerResponse}), that call throws
 * the same exception object when it returns; otherwise (the engine's worker thread) it goes to
 * {@link OrzaVSMobile#setCallbackExceptionHandler the callback exception handler}.
 *
 * <p>Lifetime: the native side holds this object through a weak reference. Keep the delegate
 * reachable for as long as the engine may call it (the {@link TovraStateEngineFacade} proxy
 * keeps the one it was built with).
 */
public class EventDelegateBase implements NativeProxy {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;

  public EventDelegateBase(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  public static long getCPtr(EventDelegateBase obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  /** Frees the native delegate if this proxy owns it. */
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_EventDelegateBase(swigCPtr);
      }
      swigCPtr = 0;
    }
  }

  /** Called by the native delegate while it is destroyed: forget the handle. */
  protected void swigDirectorDisconnect() {
    swigCMemOwn = false;
    delete();
  }

  /** Hands ownership of the native delegate to native code (it then holds this object strongly). */
  public void swigReleaseOwnership() {
    swigCMemOwn = false;
    OrzaVSMobileJNI.EventDelegateBase_change_ownership(this, swigCPtr, false);
  }

  /** Takes ownership back into Java (native code then holds this object weakly). */
  public void swigTakeOwnership() {
    swigCMemOwn = true;
    OrzaVSMobileJNI.EventDelegateBase_change_ownership(this, swigCPtr, true);
  }

  public EventDelegateBase() {
    this(OrzaVSMobileJNI.new_EventDelegateBase(), true);
    OrzaVSMobileJNI.EventDelegateBase_director_connect(this, swigCPtr, true, true);
  }

  private boolean isBase() {
    return getClass() == EventDelegateBase.class;
  }

  public void didReceiveEvent(ObjectModuleID module, ContentType contentType, ActionID action,
                              StatusID status) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didReceiveEvent(swigCPtr, this, module.swigValue(),
          contentType.swigValue(), action.swigValue(), status.swigValue());
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didReceiveEventSwigExplicitEventDelegateBase(swigCPtr,
          this, module.swigValue(), contentType.swigValue(), action.swigValue(),
          status.swigValue());
    }
  }

  public void didProcessFrame(ObjectModuleID module, StatusID status, long value64, int value32) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didProcessFrame(swigCPtr, this, module.swigValue(),
          status.swigValue(), value64, value32);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didProcessFrameSwigExplicitEventDelegateBase(swigCPtr,
          this, module.swigValue(), status.swigValue(), value64, value32);
    }
  }

  public void didDetect(VectorOfObjectInfo objects) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didDetect(swigCPtr, this,
          VectorOfObjectInfo.getCPtr(objects), objects);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didDetectSwigExplicitEventDelegateBase(swigCPtr, this,
          VectorOfObjectInfo.getCPtr(objects), objects);
    }
  }

  /** Results of a server query with their metadata; {@code objects} may be empty. */
  public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didDecode(swigCPtr, this,
          VectorOfObjectInfo.getCPtr(objects), objects, ResultMetadata.getCPtr(metadata), metadata);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didDecodeSwigExplicitEventDelegateBase(swigCPtr, this,
          VectorOfObjectInfo.getCPtr(objects), objects, ResultMetadata.getCPtr(metadata), metadata);
    }
  }

  /** The interest points of a frame, on the thread that called {@code process}. */
  public void didDetectInterestPoints(VectorOfPoint2f points) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didDetectInterestPoints(swigCPtr, this,
          VectorOfPoint2f.getCPtr(points), points);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didDetectInterestPointsSwigExplicitEventDelegateBase(
          swigCPtr, this, VectorOfPoint2f.getCPtr(points), points);
    }
  }

  /** A failed server exchange: the status says why, {@code responseCode} is the transport's code. */
  public void didReceiveServerError(ObjectModuleID module, ResponseStatus status,
                                    int responseCode) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didReceiveServerError(swigCPtr, this, module.swigValue(),
          status.swigValue(), responseCode);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didReceiveServerErrorSwigExplicitEventDelegateBase(
          swigCPtr, this, module.swigValue(), status.swigValue(), responseCode);
    }
  }

  public void suggestDarkScene() {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_suggestDarkScene(swigCPtr, this);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_suggestDarkSceneSwigExplicitEventDelegateBase(swigCPtr,
          this);
    }
  }

  public void suggestBoringEvent() {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_suggestBoringEvent(swigCPtr, this);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_suggestBoringEventSwigExplicitEventDelegateBase(swigCPtr,
          this);
    }
  }

  public void showMessage(String message) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_showMessage(swigCPtr, this, message);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_showMessageSwigExplicitEventDelegateBase(swigCPtr, this,
          message);
    }
  }

  public void didProcessFrameDecision(CameraStabilityIssue issue, double value) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didProcessFrameDecision(swigCPtr, this,
          issue.swigValue(), value);
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didProcessFrameDecisionSwigExplicitEventDelegateBase(
          swigCPtr, this, issue.swigValue(), value);
    }
  }

  public void didProcessModuleDecision(ObjectModuleID module, JudgeVerdictOnModule verdict) {
    if (isBase()) {
      OrzaVSMobileJNI.EventDelegateBase_didProcessModuleDecision(swigCPtr, this,
          module.swigValue(), verdict.swigValue());
    } else {
      OrzaVSMobileJNI.EventDelegateBase_didProcessModuleDecisionSwigExplicitEventDelegateBase(
          swigCPtr, this, module.swigValue(), verdict.swigValue());
    }
  }
}
