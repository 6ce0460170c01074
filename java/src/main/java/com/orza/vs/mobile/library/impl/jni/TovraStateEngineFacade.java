package com.orza.vs.mobile.library.impl.jni;

/**
 * The visual search engine. Typical use:
 *
 * <pre>
 *   TovraStateEngineFacade engine = new TovraStateEngineFacade(myEvents);
 *   engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, myTransport);
 *   engine.startEngine();
 *   // for each camera frame:
 *   String[] key = new String[1];
 *   engine.requestImageBuffer(image, key);        // image: format, width, height, widthStep set
 *   image.fillBufferWithByteBuffer(frame, size);  // a direct ByteBuffer
 *   engine.process(key[0], image, extra);
 *   // ...
 *   engine.close();                               // stops the engine, then deletes it
 * </pre>
 *
 * <p>The facade is {@link AutoCloseable}: {@code try (TovraStateEngineFacade engine = ...)}.
 *
 * <p>Delegates: while the engine lives, this proxy holds the event delegate and every transport
 * given to it, and owns their native objects, so that neither a collection nor a finalizer
 * running before this proxy's can free a delegate the engine still calls. {@link #delete} hands
 * them back (and frees those the application deleted meanwhile). Delete the engine first.
 */
public class TovraStateEngineFacade implements NativeProxy {
  private transient long swigCPtr;
  protected transient boolean swigCMemOwn;
  // A delegate the native engine calls, held (and its native object owned) while it lives.
  private static final class HeldDelegate {
    final Object proxy;
    final long handle;
    final boolean ownershipTaken;

    HeldDelegate(Object proxy, long handle, boolean ownershipTaken) {
      this.proxy = proxy;
      this.handle = handle;
      this.ownershipTaken = ownershipTaken;
    }
  }

  private final java.util.List<HeldDelegate> swigDelegates = new java.util.ArrayList<HeldDelegate>();

  public TovraStateEngineFacade(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  public static long getCPtr(TovraStateEngineFacade obj) {
    return (obj == null) ? 0 : obj.swigCPtr;
  }

  @Override
  protected void finalize() {
    delete();
  }

  /** Stops and destroys the engine if this proxy owns it, then hands the delegates back. */
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        OrzaVSMobileJNI.delete_TovraStateEngineFacade(swigCPtr);
      }
      swigCPtr = 0;
    }
    java.util.List<HeldDelegate> held;
    synchronized (swigDelegates) {
      held = new java.util.ArrayList<HeldDelegate>(swigDelegates);
      swigDelegates.clear();
    }
    for (HeldDelegate d : held) {
      if (!d.ownershipTaken) continue;
      if (d.proxy instanceof EventDelegateBase) {
        EventDelegateBase events = (EventDelegateBase) d.proxy;
        if (EventDelegateBase.getCPtr(events) != 0) {
          events.swigTakeOwnership();
        } else {
          OrzaVSMobileJNI.delete_EventDelegateBase(d.handle);  // deleted by the app meanwhile
        }
      } else {
        ServerDelegate transport = (ServerDelegate) d.proxy;
        if (ServerDelegate.getCPtr(transport) != 0) {
          transport.swigTakeOwnership();
        } else {
          OrzaVSMobileJNI.delete_ServerDelegate(d.handle);
        }
      }
    }
  }

  /**
   * Stops the engine (joining its worker), then does what {@link #delete()} does; for
   * try-with-resources. Calling it again does nothing.
   */
  @Override
  public void close() {
    if (swigCPtr != 0) stopEngine();
    delete();
  }

  // Holds a delegate; when Java owns its native object, ownership passes to this facade until
  // delete() (the native side then refers to the Java object strongly).
  private void keep(EventDelegateBase events) {
    if (events == null) return;
    boolean take = events.swigCMemOwn && EventDelegateBase.getCPtr(events) != 0;
    if (take) events.swigReleaseOwnership();
    synchronized (swigDelegates) {
      swigDelegates.add(new HeldDelegate(events, EventDelegateBase.getCPtr(events), take));
    }
  }

  private void keep(ServerDelegate transport) {
    if (transport == null) return;
    boolean take = transport.swigCMemOwn && ServerDelegate.getCPtr(transport) != 0;
    if (take) transport.swigReleaseOwnership();
    synchronized (swigDelegates) {
      swigDelegates.add(new HeldDelegate(transport, ServerDelegate.getCPtr(transport), take));
    }
  }

  /** An engine that reports to {@code eventDelegate} (null: no callbacks). */
  public TovraStateEngineFacade(EventDelegateBase eventDelegate) {
    this(OrzaVSMobileJNI.new_TovraStateEngineFacade(EventDelegateBase.getCPtr(eventDelegate),
        eventDelegate), true);
    keep(eventDelegate);
  }

  /** Minimum and maximum camera preview height the engine asks for. */
  public void getCameraResRequirement(CameraResRequirement out) {
    OrzaVSMobileJNI.TovraStateEngineFacade_getCameraResRequirement(swigCPtr, this,
        CameraResRequirement.getCPtr(out), out);
  }

  public void startEngine() {
    OrzaVSMobileJNI.TovraStateEngineFacade_startEngine(swigCPtr, this);
  }

  public void stopEngine() {
    OrzaVSMobileJNI.TovraStateEngineFacade_stopEngine(swigCPtr, this);
  }

  public void pauseEngine() {
    OrzaVSMobileJNI.TovraStateEngineFacade_pauseEngine(swigCPtr, this);
  }

  public void resumeEngine() {
    OrzaVSMobileJNI.TovraStateEngineFacade_resumeEngine(swigCPtr, this);
  }

  /** Registers the transport of a module (only VISUAL_SEARCH_SERVICE_MOD is used); call before start. */
  public void addObjectModule(ObjectModuleID id, ServerDelegate serverDelegate) {
    OrzaVSMobileJNI.TovraStateEngineFacade_addObjectModule__SWIG_0(swigCPtr, this, id.swigValue(),
        ServerDelegate.getCPtr(serverDelegate), serverDelegate);
    keep(serverDelegate);
  }

  public void addObjectModule(ObjectModuleID id, ServerDelegate serverDelegate, String props) {
    OrzaVSMobileJNI.TovraStateEngineFacade_addObjectModule__SWIG_1(swigCPtr, this, id.swigValue(),
        ServerDelegate.getCPtr(serverDelegate), serverDelegate, props);
    keep(serverDelegate);
  }

  /** Accepted and without effect. */
  public void addObjectModule(ObjectModuleID id, MapOfStringToString props) {
    OrzaVSMobileJNI.TovraStateEngineFacade_addObjectModule__SWIG_2(swigCPtr, this, id.swigValue(),
        MapOfStringToString.getCPtr(props), props);
  }

  /**
   * Lends the pixel memory of a free frame record to {@code buffer} (set its format, height and
   * widthStep first) and stores the frame's key in {@code frameKey[0]}. Fill the buffer, then
   * pass the key to {@link #process(String, ImageBuffer, ExtraFrameData)}. When no memory can be
   * lent (engine not running, every record busy), buffer and key are left as they were.
   */
  public void requestImageBuffer(ImageBuffer buffer, String[] frameKey) {
    OrzaVSMobileJNI.TovraStateEngineFacade_requestImageBuffer(swigCPtr, this,
        ImageBuffer.getCPtr(buffer), buffer, frameKey);
  }

  /** Continuous scanning of a frame in the caller's memory. */
  public void process(ImageBuffer image, ExtraFrameData extra) {
    OrzaVSMobileJNI.TovraStateEngineFacade_process__SWIG_0(swigCPtr, this,
        ImageBuffer.getCPtr(image), image, ExtraFrameData.getCPtr(extra), extra);
  }

  /** Continuous scanning of a frame written into memory lent by {@link #requestImageBuffer}. */
  public void process(String frameKey, ImageBuffer image, ExtraFrameData extra) {
    OrzaVSMobileJNI.TovraStateEngineFacade_process__SWIG_1(swigCPtr, this, frameKey,
        ImageBuffer.getCPtr(image), image, ExtraFrameData.getCPtr(extra), extra);
  }

  /**
   * Analyses one still image and returns once its reply has been handled: the transport must
   * push the reply from another thread.
   */
  public void processSingleImage(ImageBuffer image, ExtraFrameData extra) {
    OrzaVSMobileJNI.TovraStateEngineFacade_processSingleImage(swigCPtr, this,
        ImageBuffer.getCPtr(image), image, ExtraFrameData.getCPtr(extra), extra);
  }

  /** Accepted and without effect. */
  public void enableSingleImageMode() {
    OrzaVSMobileJNI.TovraStateEngineFacade_enableSingleImageMode(swigCPtr, this);
  }

  /** Accepted and without effect. */
  public void disableSingleImageMode() {
    OrzaVSMobileJNI.TovraStateEngineFacade_disableSingleImageMode(swigCPtr, this);
  }

  /** Accepted and without effect. */
  public void removeObjectModule(ObjectModuleID id) {
    OrzaVSMobileJNI.TovraStateEngineFacade_removeObjectModule(swigCPtr, this, id.swigValue());
  }

  /** Accepted and without effect. */
  public void removeAllObjectModules() {
    OrzaVSMobileJNI.TovraStateEngineFacade_removeAllObjectModules(swigCPtr, this);
  }

  /** Accepted and without effect. */
  public void readProps(String props) {
    OrzaVSMobileJNI.TovraStateEngineFacade_readProps(swigCPtr, this, props);
  }

  /** Accepted and without effect. */
  public void readObjectModuleProps(ObjectModuleID id, String props) {
    OrzaVSMobileJNI.TovraStateEngineFacade_readObjectModuleProps__SWIG_0(swigCPtr, this,
        id.swigValue(), props);
  }

  /** Accepted and without effect. */
  public void readObjectModuleProps(MapOfStringToString props) {
    OrzaVSMobileJNI.TovraStateEngineFacade_readObjectModuleProps__SWIG_1(swigCPtr, this,
        MapOfStringToString.getCPtr(props), props);
  }

  /** Accepted and without effect: both maps are left as they are. */
  public void getAndClearMetrics(MapOfStringToUInt counts, MapOfStringToDouble values) {
    OrzaVSMobileJNI.TovraStateEngineFacade_getAndClearMetrics(swigCPtr, this,
        MapOfStringToUInt.getCPtr(counts), counts, MapOfStringToDouble.getCPtr(values), values);
  }

  /** Accepted and without effect. */
  public void enableEventLogging() {
    OrzaVSMobileJNI.TovraStateEngineFacade_enableEventLogging(swigCPtr, this);
  }

  /** Accepted and without effect. */
  public void saveEventLog(String path) {
    OrzaVSMobileJNI.TovraStateEngineFacade_saveEventLog(swigCPtr, this, path);
  }
}
