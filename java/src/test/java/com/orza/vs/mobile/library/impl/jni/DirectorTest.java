package com.orza.vs.mobile.library.impl.jni;

import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertNpe;
import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertThrowsWithMessage;
import static org.junit.jupiter.api.Assertions.*;

import java.lang.ref.WeakReference;
import java.util.ArrayList;
import java.util.Arrays;
import java.util.Collections;
import java.util.List;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.function.Executable;

class DirectorTest {
  /**
   * Records every callback with its arguments and thread; keeps what didDecode was lent, and
   * copies of it; throws {@code next} (when set) from showMessage and didDecode.
   */
  static class Recorder extends EventDelegateBase {
    final List<String> calls = Collections.synchronizedList(new ArrayList<String>());
    volatile Thread lastThread;
    volatile Throwable next;
    final List<Object> lent = new ArrayList<Object>();
    List<ObjectInfo> copies;
    ResultMetadata metadataCopy;

    private void record(String call) {
      lastThread = Thread.currentThread();
      calls.add(call);
      Throwable t = next;
      if (t instanceof Error) throw (Error) t;
      if (t != null && (call.startsWith("message") || call.startsWith("decode"))) throw (RuntimeException) t;
    }

    // One line each: these overrides only make the callbacks visible.
    @Override public void didReceiveEvent(ObjectModuleID m, ContentType c, ActionID a, StatusID s) {
      record("event " + m + " " + c + " " + a + " " + s);
    }
    @Override public void didProcessFrame(ObjectModuleID m, StatusID s, long v64, int v32) {
      record("frame " + m + " " + s + " " + v64 + " " + v32);
    }
    @Override public void didDetect(VectorOfObjectInfo objects) { record("detect " + objects.size()); }
    @Override public void didDetectInterestPoints(VectorOfPoint2f points) { record("points " + points.size()); }
    @Override public void didReceiveServerError(ObjectModuleID m, ResponseStatus s, int code) {
      record("error " + m + " " + s + " " + code);
    }
    @Override public void suggestDarkScene() { record("dark"); }
    @Override public void suggestBoringEvent() { record("boring"); }
    @Override public void showMessage(String message) { record("message [" + message + "]"); }
    @Override public void didProcessFrameDecision(CameraStabilityIssue issue, double value) {
      record("decision " + issue + " " + value);
    }
    @Override public void didProcessModuleDecision(ObjectModuleID m, JudgeVerdictOnModule verdict) {
      record("module " + m + " " + verdict);
    }

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      StringBuilder text = new StringBuilder("decode " + metadata.getQueryID());
      for (ObjectInfo o : objects) {
        text.append(' ').append(o.getContent()).append('/').append(o.getContentType())
            .append('/').append(o.getLocation().size());
      }
      copies = new ArrayList<ObjectInfo>(objects);
      metadataCopy = metadata.copy();
      lent.clear();
      lent.addAll(Arrays.asList(objects, metadata, metadata.getAccumulatedQueries()));
      if (!objects.isEmpty()) {
        ObjectInfo first = objects.get(0);
        lent.addAll(Arrays.asList(first, first.getLocation(), first.getLocation().get(0), first.getSubContents()));
      }
      record(text.append(' ').append(metadata.getAccumulatedQueries()).toString());
    }
  }

  /** An application's exception with a field of its own. */
  public static class AppError extends RuntimeException {
    private static final long serialVersionUID = 1L;
    public final int code;

    public AppError(String message, int code, Throwable cause) {
      super(message, cause);
      this.code = code;
    }
  }

  /** Runs {@code body} with a callback exception handler; returns what the handler received. */
  static List<Throwable> callbackExceptionsDuring(Executable body) throws Throwable {
    List<Throwable> handled = Collections.synchronizedList(new ArrayList<Throwable>());
    OrzaVSMobile.setCallbackExceptionHandler((thread, e) -> handled.add(e));
    try {
      body.execute();
    } finally {
      OrzaVSMobile.setCallbackExceptionHandler(null);
    }
    return handled;
  }

  @Test
  void everyEventReachesTheJavaOverrideThroughTheNativeDelegate() {
    Recorder r = new Recorder();
    long h = EventDelegateBase.getCPtr(r);
    OrzaVSMobileJNI.EventDelegateBase_didReceiveEvent(h, r, 1, 10, 0, 1);
    OrzaVSMobileJNI.EventDelegateBase_didProcessFrame(h, r, 6, 0, 1L << 40, -7);
    VectorOfObjectInfo objects = new VectorOfObjectInfo(2);
    OrzaVSMobileJNI.EventDelegateBase_didDetect(h, r, VectorOfObjectInfo.getCPtr(objects), objects);
    ResultMetadata metadata = new ResultMetadata();
    metadata.setQueryID("q7");
    VectorOfObjectInfo none = new VectorOfObjectInfo();
    long noneAt = VectorOfObjectInfo.getCPtr(none);
    long metadataAt = ResultMetadata.getCPtr(metadata);
    OrzaVSMobileJNI.EventDelegateBase_didDecode(h, r, noneAt, none, metadataAt, metadata);
    VectorOfPoint2f points = new VectorOfPoint2f(3);
    OrzaVSMobileJNI.EventDelegateBase_didDetectInterestPoints(h, r, VectorOfPoint2f.getCPtr(points), points);
    OrzaVSMobileJNI.EventDelegateBase_didReceiveServerError(h, r, 1, 2, 200);
    OrzaVSMobileJNI.EventDelegateBase_suggestDarkScene(h, r);
    OrzaVSMobileJNI.EventDelegateBase_suggestBoringEvent(h, r);
    OrzaVSMobileJNI.EventDelegateBase_showMessage(h, r, "");
    OrzaVSMobileJNI.EventDelegateBase_showMessage(h, r, "gr\u00fc\u00df \ud83d\ude00");
    OrzaVSMobileJNI.EventDelegateBase_didProcessFrameDecision(h, r, 0, 0.75);
    OrzaVSMobileJNI.EventDelegateBase_didProcessModuleDecision(h, r, 5, 0);
    // Values without a Java constant arrive as null instead of failing the callback.
    OrzaVSMobileJNI.EventDelegateBase_didReceiveEvent(h, r, 99, -3, 4, 5);
    List<String> expected = Arrays.asList(
        "event VISUAL_SEARCH_SERVICE_MOD BOUNDING_BOX NO_ACTION FAILURE_STATUS",
        "frame UNSPECIFIED_OBJECT_MOD SUCCESS_STATUS 1099511627776 -7",
        "detect 2", "decode q7 []", "points 3",
        "error VISUAL_SEARCH_SERVICE_MOD RESPONSE_PARSE_ERROR 200",
        "dark", "boring", "message []", "message [gr\u00fc\u00df \ud83d\ude00]",
        "decision NO_STABILITY_ISSUE 0.75", "module RESERVED_MOD NO_VERDICT", "event null null null null");
    assertEquals(expected, r.calls);
    assertSame(Thread.currentThread(), r.lastThread);

    // Neither the explicit forms (the base implementation) nor null references reach Java.
    OrzaVSMobileJNI.EventDelegateBase_showMessageSwigExplicitEventDelegateBase(h, r, "x");
    OrzaVSMobileJNI.EventDelegateBase_suggestDarkSceneSwigExplicitEventDelegateBase(h, r);
    assertNpe("std::vector< Tovra::ObjectInfo > const & reference is null",
        () -> OrzaVSMobileJNI.EventDelegateBase_didDecode(h, r, 0, null, metadataAt, metadata));
    assertNpe("Tovra::ResultMetadata const & reference is null",
        () -> OrzaVSMobileJNI.EventDelegateBase_didDecodeSwigExplicitEventDelegateBase(h, r, noneAt, none, 0, null));
    assertNpe("std::vector< OrzaVSMobile::Point2f > const & reference is null",
        () -> OrzaVSMobileJNI.EventDelegateBase_didDetectInterestPoints(h, r, 0, null));
    assertNpe("null string", () -> OrzaVSMobileJNI.EventDelegateBase_showMessage(h, r, null));
    assertEquals(expected, r.calls);
  }

  @Test
  void onlyOverriddenOperationsGoToJava() {
    List<String> calls = new ArrayList<String>();
    EventDelegateBase d = new EventDelegateBase() {  // overrides didDecode only
      @Override
      public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
        calls.add("decode " + objects.size());
      }
    };
    VectorOfObjectInfo objects = new VectorOfObjectInfo(1);
    ResultMetadata metadata = new ResultMetadata();
    long h = EventDelegateBase.getCPtr(d);
    OrzaVSMobileJNI.EventDelegateBase_didDetect(h, d, VectorOfObjectInfo.getCPtr(objects), objects);
    OrzaVSMobileJNI.EventDelegateBase_didDecode(h, d, VectorOfObjectInfo.getCPtr(objects), objects,
        ResultMetadata.getCPtr(metadata), metadata);
    assertEquals(Collections.singletonList("decode 1"), calls);

    // The proxy class itself overrides nothing: every call is absorbed natively.
    EventDelegateBase base = new EventDelegateBase();
    base.didDecode(objects, metadata);
    base.showMessage("absorbed");
    base.didReceiveEvent(ObjectModuleID.BARCODE_MOD, ContentType.PIDN, ActionID.NO_ACTION, StatusID.SUCCESS_STATUS);
  }

  /** Exceptions as an application may throw them: the Java caller must get each very object. */
  static List<Throwable> appExceptions() throws Exception {
    // The same class loaded by a loader of its own: it cannot be found by name from the library.
    java.net.URL jar = DirectorTest.class.getProtectionDomain().getCodeSource().getLocation();
    ClassLoader isolated = new java.net.URLClassLoader(new java.net.URL[] {jar}, null);
    Class<?> foreign = isolated.loadClass(AppError.class.getName());
    assertNotSame(AppError.class, foreign);
    return Arrays.asList(
        new AppError("custom 42", 42, new java.io.IOException("root")),
        new IllegalStateException(""),
        new IllegalArgumentException((String) null),
        new AssertionError("an Error"),
        (Throwable) foreign.getConstructor(String.class, int.class, Throwable.class)
            .newInstance("from another loader", 7, null));
  }

  @Test
  void callbackExceptionsReachTheJavaCallerAsTheSameObject() throws Throwable {
    Recorder t = new Recorder();
    long h = EventDelegateBase.getCPtr(t);
    VectorOfObjectInfo none = new VectorOfObjectInfo();
    ResultMetadata metadata = new ResultMetadata();
    List<Throwable> thrown = appExceptions();
    List<Throwable> handled = callbackExceptionsDuring(() -> {
      for (Throwable e : thrown) {
        t.next = e;
        assertSame(e, assertThrows(Throwable.class, () -> OrzaVSMobileJNI.EventDelegateBase_showMessage(h, t, "hi")));
        assertSame(e, assertThrows(Throwable.class, () -> OrzaVSMobileJNI.EventDelegateBase_didDecode(
            h, t, VectorOfObjectInfo.getCPtr(none), none, ResultMetadata.getCPtr(metadata), metadata)));
        // No Java caller on a native thread: the handler gets it; the thread returns, detached.
        assertEquals("detached-before;called;detached-after", NativeTestHooks.showMessageOnNativeThread(h, "x"));
      }
    });
    assertEquals(thrown, handled);  // each one once, in order
  }

  @Test
  void nativeThreadsAreAttachedForOneUpcallAndBorrowedArgumentsEndWithIt() throws Exception {
    Recorder r = new Recorder();
    long h = EventDelegateBase.getCPtr(r);
    assertEquals("detached-before;called;detached-after", NativeTestHooks.showMessageOnNativeThread(h, "one"));
    Thread first = r.lastThread;
    assertEquals("detached-before;called;detached-after", NativeTestHooks.didDecodeOnNativeThread(h, 2, "q9"));
    assertNotSame(first, r.lastThread);
    first.join(5000);
    assertFalse(first.isAlive(), "a thread attached for an upcall is detached after it");
    assertEquals(Arrays.asList("message [one]",
        "decode q9 result-0/BOUNDING_BOX/4 result-1/BOUNDING_BOX/4 [q-1, q-2]"), r.calls);

    // What the callback was lent is gone; its copies stay.
    assertEquals(7, r.lent.size());
    for (Object view : r.lent) {
      Throwable late = assertThrows(IllegalStateException.class, () -> {
        if (view instanceof java.util.Collection) ((java.util.Collection<?>) view).size();
        else if (view instanceof ResultMetadata) ((ResultMetadata) view).getQueryID();
        else if (view instanceof ObjectInfo) ((ObjectInfo) view).getContent();
        else ((Point2f) view).getX();
      }, view.getClass().getSimpleName());
      assertTrue(late.getMessage().contains("lives only during the callback"), late.getMessage());
    }
    assertEquals("result-1", r.copies.get(1).getContent());
    assertEquals(4f, r.copies.get(1).getLocation().get(2).getY());
    assertEquals("q9", r.metadataCopy.getQueryID());
    assertEquals(Arrays.asList("q-1", "q-2"), r.metadataCopy.getAccumulatedQueries());

    // A Java thread stays attached.
    assertTrue(NativeTestHooks.showMessageOnThisThread(h, "two"));
    assertSame(Thread.currentThread(), r.lastThread);
  }

  @Test
  void theNativeDelegateHoldsItsJavaObjectStronglyOnlyWhileItOwnsIt() {
    Recorder owned = new Recorder();
    long ownedAt = EventDelegateBase.getCPtr(owned);
    owned.swigReleaseOwnership();  // native code now owns the delegate and holds its object strongly
    WeakReference<Recorder> strong = new WeakReference<Recorder>(owned);
    owned = null;
    for (int i = 0; i < 5; i++) System.gc();
    Recorder alive = strong.get();
    assertNotNull(alive, "a strongly held Java object is not collected");
    alive.swigTakeOwnership();
    // Destroying the native delegate disconnects the proxy: it forgets its handle.
    OrzaVSMobileJNI.delete_EventDelegateBase(ownedAt);
    assertEquals(0, EventDelegateBase.getCPtr(alive));
    alive.delete();  // nothing left to free

    // Owned by Java, the object is held weakly: once collected, a call raises the null-upcall error.
    Recorder r = new Recorder();
    long h = EventDelegateBase.getCPtr(r);
    r.swigCMemOwn = false;  // the native delegate outlives its Java object
    WeakReference<Recorder> ref = new WeakReference<Recorder>(r);
    r = null;
    // The proxy has a finalizer, so the native weak reference clears only once the finalized
    // object is reclaimed by a later collection: call until the native side sees it gone.
    VectorOfObjectInfo objects = new VectorOfObjectInfo();
    ResultMetadata metadata = new ResultMetadata();
    NullPointerException seen = null;
    for (int i = 0; i < 300 && seen == null; i++) {
      System.gc();
      System.runFinalization();
      try {
        OrzaVSMobileJNI.EventDelegateBase_didDecode(h, null, VectorOfObjectInfo.getCPtr(objects), objects,
            ResultMetadata.getCPtr(metadata), metadata);
      } catch (NullPointerException e) {
        seen = e;
      }
    }
    assertNull(ref.get());
    assertNotNull(seen, "the collected delegate was never reported");
    assertEquals("null upcall object in Tovra::EventDelegateBase::didDecode ", seen.getMessage());
    assertEquals("detached-before;called;detached-after", NativeTestHooks.showMessageOnNativeThread(h, "nobody"));
    OrzaVSMobileJNI.delete_EventDelegateBase(h);
  }

  @Test
  void serverDelegateReachesTheJavaTransport() throws Throwable {
    TestTransport t = new TestTransport();
    long h = ServerDelegate.getCPtr(t);
    ServerRequest request = new ServerRequest();
    request.setId("r-1");
    // Not overridden: the base sendServerRequest registers and calls the Java Impl.
    assertTrue(OrzaVSMobileJNI.ServerDelegate_sendServerRequest(h, t, ServerRequest.getCPtr(request), request));
    assertTrue(t.sendServerRequest(request));
    assertEquals(2, t.sent.size());
    assertTrue(t.sent.poll().startsWith("r-1|"));
    assertEquals("detached-before;result=true;detached-after", NativeTestHooks.sendRequestOnNativeThread(h, "r-2"));
    // A request handed to the transport is borrowed for the call only.
    assertThrows(IllegalStateException.class, t.last::getId);

    // The transport's own exception: back to a Java caller as the same object; to a native
    // caller as a director exception (the engine catches it), and then to the handler.
    t.fail = new IllegalStateException("transport down");
    assertSame(t.fail, assertThrows(IllegalStateException.class, () -> t.sendServerRequest(request)));
    List<Throwable> handled = callbackExceptionsDuring(() -> {
      String report = NativeTestHooks.sendRequestOnNativeThread(h, "r-3");
      assertTrue(report.matches("detached-before;threw=.*DirectorException.*:transport down;detached-after"), report);
    });
    assertEquals(Collections.singletonList(t.fail), handled);

    assertNpe("Tovra::Server::ServerRequest const & reference is null", () -> t.sendServerRequest(null));
    assertNpe("Tovra::Server::ServerResponse const & reference is null", () -> t.pushServerResponse(null));
    t.pushServerResponse(TestTransport.response("never-sent", 200, ""));  // an unknown id is ignored
    t.close();
    assertEquals(0, ServerDelegate.getCPtr(t));
  }

  @Test
  void serverDelegateVariants() {
    ServerRequest request = new ServerRequest();
    request.setId("w");
    // Overriding sendServerRequest wraps the base, which still reaches the Impl override.
    List<String> seen = new ArrayList<String>();
    ServerDelegate w = new ServerDelegate() {
      @Override
      public boolean sendServerRequest(ServerRequest r) {
        seen.add("send " + r.getId());
        return super.sendServerRequest(r);
      }

      @Override
      public boolean sendServerRequestImpl(ServerRequest r) {
        seen.add("impl " + r.getId());
        return false;
      }
    };
    assertFalse(OrzaVSMobileJNI.ServerDelegate_sendServerRequest(ServerDelegate.getCPtr(w), w,
        ServerRequest.getCPtr(request), request));
    assertEquals(Arrays.asList("send w", "impl w"), seen);

    // Without an Impl every request fails with the pure-virtual error (false to a native caller).
    String pureVirtual =
        "Attempted to invoke pure virtual method Tovra::Server::ServerDelegate::sendServerRequestImpl.";
    assertThrowsWithMessage(RuntimeException.class, pureVirtual, () -> new ServerDelegate().sendServerRequest(request));
    ServerDelegate subclass = new ServerDelegate() {};
    assertThrowsWithMessage(RuntimeException.class, pureVirtual, () -> subclass.sendServerRequest(request));
    assertEquals("detached-before;result=false;detached-after",
        NativeTestHooks.sendRequestOnNativeThread(ServerDelegate.getCPtr(subclass), "p"));
    // An override calling its superclass fails at once instead of recursing into itself.
    ServerDelegate superCaller = new ServerDelegate() {
      @Override
      public boolean sendServerRequestImpl(ServerRequest r) {
        return super.sendServerRequestImpl(r);
      }
    };
    assertThrowsWithMessage(UnsupportedOperationException.class, "ServerDelegate.sendServerRequestImpl "
        + "has no implementation: an override must not call super.sendServerRequestImpl()",
        () -> superCaller.sendServerRequest(request));

    // Destroying through the interface disconnects the Java transport.
    TestTransport t = new TestTransport();
    long h = ServerDelegate.getCPtr(t);
    t.swigReleaseOwnership();
    try (ServerDelegateInterface owner =
             new ServerDelegateInterface(OrzaVSMobileJNI.ServerDelegate_SWIGUpcast(h), true)) {
      assertTrue(owner.sendServerRequest(request));
    }
    assertEquals(0, ServerDelegate.getCPtr(t));
  }
}
