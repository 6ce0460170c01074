package com.orza.vs.mobile.library.session;

import com.orza.vs.mobile.library.http.HttpServerDelegate;
import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.ObjectInfo;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.impl.jni.ResultMetadata;
import com.orza.vs.mobile.library.impl.jni.ServerDelegate;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.impl.jni.VectorOfObjectInfo;
import com.orza.vs.mobile.library.impl.jni.VectorOfPoint2f;
import com.orza.vs.mobile.library.impl.jni.VectorOfString;
import java.net.MalformedURLException;
import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.List;

/**
 * A visual search session: the engine, its transport and a listener, fed camera frames. Build
 * one with {@link #builder()}, {@link #start()} it, pass every preview frame in, and
 * {@link #close()} it when done. A complete camera loop on Android (Camera2 with an
 * {@code ImageReader} in {@code YUV_420_888}):
 *
 * <pre>{@code
 * VisualSearchSession session = VisualSearchSession.builder()
 *     .serverUrl("https://search.example.com/vsearch")      // or .transport(myServerDelegate)
 *     .listener(new SessionListener() {
 *       @Override public void onResults(SearchResults results) {
 *         mainHandler.post(() -> showResults(results));       // owned values: safe to keep
 *       }
 *       @Override public void onServerError(ResponseStatus status, int responseCode) {
 *         mainHandler.post(() -> showError(status, responseCode));
 *       }
 *     })
 *     .build();
 * session.start();
 *
 * ImageReader reader = ImageReader.newInstance(1280, 720, ImageFormat.YUV_420_888, 3);
 * reader.setOnImageAvailableListener(r -> {
 *   try (Image image = r.acquireLatestImage()) {
 *     if (image == null) return;
 *     Image.Plane[] p = image.getPlanes();
 *     session.processYuv420(image.getWidth(), image.getHeight(),
 *         p[0].getBuffer(), p[0].getRowStride(),
 *         p[1].getBuffer(), p[2].getBuffer(), p[1].getRowStride(), p[1].getPixelStride(),
 *         image.getTimestamp());
 *   }
 * }, cameraHandler);
 * // add reader.getSurface() to the camera's repeating preview request
 *
 * // Activity.onPause(): session.pause();   onResume(): session.resume();
 * // onDestroy(): session.close();          (or try-with-resources)
 * }</pre>
 *
 * <p>Frames. {@link #processYuv420} takes the three planes as the camera delivers them. When
 * they already form NV21 or NV12 in one block (chroma pixel stride 2, which most devices
 * deliver), the engine reads them where they lie: no copy is made. Otherwise they are written
 * once, in one pass, into memory the engine lends for the frame. {@link #processNv21(byte[], int,
 * int, long)} takes an NV21 array (the old camera API's preview callback) or buffer, copied once
 * into the lent memory: while a query is out the engine keeps a copy of nearly every frame, and a
 * frame already in its memory needs none. Width and height must be even. The frame's memory must
 * stay unchanged until the call returns, and not longer.
 *
 * <p>Each process call returns whether the engine took the frame: false while the session is
 * not running (before {@link #start()}, while paused, after {@link #close()}) or when every
 * frame slot is busy. Bad frame arguments raise NullPointerException or
 * IllegalArgumentException with a one-line message.
 *
 * <p>Threads: frames may come from any thread, one at a time (calls are serialised). The
 * lifecycle methods may be called from any thread, but not from inside
 * {@link SessionListener#onInterestPoints} (IllegalStateException). Timestamps are in
 * nanoseconds of any monotonic clock (the camera's); the engine chooses frames for a query by
 * their time and sharpness.
 */
public final class VisualSearchSession implements AutoCloseable {
  private enum State { READY, RUNNING, PAUSED, CLOSED }

  private final Object frameLock = new Object();
  private final TovraStateEngineFacade engine;
  private final Events events;
  private final HttpServerDelegate ownTransport;  // built from a URL: closed and deleted here
  private final ImageBuffer image = new ImageBuffer();
  private final ExtraFrameData extra = new ExtraFrameData();
  private final String[] frameKey = new String[1];
  private final long imageHandle;
  private volatile State state = State.READY;
  private Thread processingThread;
  // The geometry last given to `image`, to set only what changes.
  private int format = -1;
  private int width = -1;
  private int height = -1;
  private int widthStep = -1;
  // Buffers the engine reads in place, kept reachable until it has done so.
  private ByteBuffer pinnedY;
  private ByteBuffer pinnedU;
  private ByteBuffer pinnedV;

  private VisualSearchSession(ServerDelegate transport, HttpServerDelegate ownTransport,
                              SessionListener listener) {
    this.ownTransport = ownTransport;
    this.events = overridesInterestPoints(listener) ? new EventsWithPoints(listener) : new Events(listener);
    this.engine = new TovraStateEngineFacade(events);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    image.setNumChannels(1);
    imageHandle = ImageBuffer.getCPtr(image);
  }

  public static Builder builder() {
    return new Builder();
  }

  /** Starts the engine (again after {@link #pause()}: a fresh start). */
  public void start() {
    synchronized (frameLock) {
      checkCallable();
      if (state == State.RUNNING) return;
      engine.startEngine();
      state = State.RUNNING;
    }
  }

  /** Stops taking frames and cancels the query in preparation; {@link #resume()} goes on. */
  public void pause() {
    synchronized (frameLock) {
      checkCallable();
      if (state != State.RUNNING) return;
      engine.pauseEngine();
      state = State.PAUSED;
    }
  }

  public void resume() {
    synchronized (frameLock) {
      checkCallable();
      if (state != State.PAUSED) return;
      engine.resumeEngine();
      state = State.RUNNING;
    }
  }

  public boolean isRunning() {
    return state == State.RUNNING;
  }

  /**
   * Stops the engine and frees everything the session made: the engine, the built-in transport
   * (whose unanswered queries end with an error), the frame buffers. A transport given to the
   * builder stays the application's. Idempotent. Not from a listener method: the built-in
   * transport would wait for its own thread.
   */
  @Override
  public void close() {
    synchronized (frameLock) {
      if (Thread.currentThread() == processingThread) {
        throw new IllegalStateException("the session cannot be closed from onInterestPoints");
      }
      if (state == State.CLOSED) return;
      state = State.CLOSED;
      engine.stopEngine();
    }
    if (ownTransport != null) ownTransport.close();
    engine.delete();
    if (ownTransport != null) ownTransport.delete();
    events.delete();
    image.delete();
    extra.delete();
  }

  /** An NV21 frame in an array of at least width x height x 3/2 bytes. */
  public boolean processNv21(byte[] nv21, int width, int height, long timestampNanos) {
    if (nv21 == null) throw new NullPointerException("NV21 frame is null");
    int needed = nv21Bytes(nv21.length, width, height);
    synchronized (frameLock) {
      if (!lendFrame(width, height, timestampNanos)) return false;
      image.fillBuffer(nv21, needed);
      return run(true);
    }
  }

  /**
   * An NV21 frame in a direct buffer, or a heap buffer with an accessible array, of at least
   * width x height x 3/2 bytes from its start; copied once into lent memory, like an array.
   */
  public boolean processNv21(ByteBuffer nv21, int width, int height, long timestampNanos) {
    if (nv21 == null) throw new NullPointerException("NV21 frame is null");
    if (!nv21.isDirect()) {
      if (nv21.hasArray() && nv21.arrayOffset() == 0) return processNv21(nv21.array(), width, height, timestampNanos);
      throw new IllegalArgumentException("NV21 frame is neither a direct ByteBuffer nor array-backed");
    }
    int needed = nv21Bytes(nv21.capacity(), width, height);
    synchronized (frameLock) {
      if (!lendFrame(width, height, timestampNanos)) return false;
      image.fillBufferWithByteBuffer(nv21, needed);
      return run(true);
    }
  }

  // The bytes of a width x height NV21 frame, checked against the `length` the caller holds.
  private static int nv21Bytes(int length, int width, int height) {
    checkSize(width, height);
    int needed = width * height / 2 * 3;
    if (length < needed) {
      throw new IllegalArgumentException("NV21 frame holds " + length + " bytes, " + width + "x" + height
          + " needs " + needed);
    }
    return needed;
  }

  /**
   * A YUV 4:2:0 frame as three planes (Android's {@code YUV_420_888}): the luminance plane with
   * its row stride (pixel stride 1), and the U and V planes, which share a row stride and a pixel
   * stride. All three must be direct buffers, read from their start.
   */
  public boolean processYuv420(int width, int height, ByteBuffer y, int yRowStride, ByteBuffer u,
                               ByteBuffer v, int uvRowStride, int uvPixelStride, long timestampNanos) {
    synchronized (frameLock) {
      if (state != State.RUNNING) return false;
      int wrapped = FrameNatives.wrapPlanes(imageHandle, y, yRowStride, u, v, uvRowStride, uvPixelStride,
          width, height);
      if (wrapped >= 0) {
        remember(wrapped, width, height, yRowStride);
        pinnedY = y;
        pinnedU = u;
        pinnedV = v;
        extra.setTimeStamp(timestampNanos / 1e9);
        return run(false);
      }
      if (!lendFrame(width, height, timestampNanos)) return false;
      FrameNatives.copyPlanes(imageHandle, y, yRowStride, u, v, uvRowStride, uvPixelStride, width, height);
      return run(true);
    }
  }

  // Describes an NV21 frame and borrows engine memory for it; false when none is lent.
  private boolean lendFrame(int width, int height, long timestampNanos) {
    if (state != State.RUNNING) return false;
    describe(ImageFormat.NV21, width, height, width);
    frameKey[0] = null;
    engine.requestImageBuffer(image, frameKey);
    if (frameKey[0] == null) return false;
    extra.setTimeStamp(timestampNanos / 1e9);
    return true;
  }

  // Runs the frame described by `image`: in lent memory (under frameKey) or read in place.
  private boolean run(boolean lent) {
    processingThread = Thread.currentThread();
    try {
      if (lent) {
        engine.process(frameKey[0], image, extra);
      } else {
        engine.process(image, extra);
      }
    } finally {
      processingThread = null;
      pinnedY = null;
      pinnedU = null;
      pinnedV = null;
    }
    return true;
  }

  private void describe(ImageFormat f, int w, int h, int step) {
    if (format != f.swigValue()) image.setFormat(f);
    if (width != w) image.setWidth(w);
    if (height != h) image.setHeight(h);
    if (widthStep != step) image.setWidthStep(step);
    remember(f.swigValue(), w, h, step);
  }

  private void remember(int f, int w, int h, int step) {
    format = f;
    width = w;
    height = h;
    widthStep = step;
  }

  private void checkCallable() {
    if (state == State.CLOSED) throw new IllegalStateException("the session is closed");
    if (Thread.currentThread() == processingThread) {
      throw new IllegalStateException("the session cannot be changed from onInterestPoints");
    }
  }

  private static void checkSize(int width, int height) {
    if (width <= 0 || height <= 0 || width % 2 != 0 || height % 2 != 0 || width > 16384 || height > 16384) {
      throw new IllegalArgumentException("frame size " + width + "x" + height + " must be even and between 2 and 16384");
    }
  }

  private static boolean overridesInterestPoints(SessionListener listener) {
    try {
      return listener.getClass().getMethod("onInterestPoints", float[].class).getDeclaringClass()
          != SessionListener.class;
    } catch (NoSuchMethodException e) {
      return false;
    }
  }

  /** Copies the engine's borrowed results into owned values. */
  static SearchResults copyResults(VectorOfObjectInfo objects, ResultMetadata metadata) {
    VectorOfString queries = metadata.getAccumulatedQueries();
    List<String> accumulated = new ArrayList<String>(queries.size());
    for (int i = 0; i < queries.size(); i++) accumulated.add(queries.get(i));
    return new SearchResults(copyObjects(objects), metadata.getQueryID(),
        metadata.getIsFinalAccumulation(), accumulated);
  }

  private static List<SearchResult> copyObjects(VectorOfObjectInfo objects) {
    int n = objects.size();
    List<SearchResult> out = new ArrayList<SearchResult>(n);
    for (int i = 0; i < n; i++) {
      ObjectInfo o = objects.get(i);
      out.add(new SearchResult(o.getSrcObjectModule(), o.getContentType(), o.getContent(), o.getProperties(),
          FrameNatives.points(VectorOfPoint2f.getCPtr(o.getLocation())), copyObjects(o.getSubContents())));
    }
    return out;
  }

  /** The engine's callbacks, turned into the listener's owned values. */
  private static class Events extends EventDelegateBase {
    final SessionListener listener;

    Events(SessionListener listener) {
      this.listener = listener;
    }

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      listener.onResults(copyResults(objects, metadata));
    }

    @Override
    public void didReceiveServerError(ObjectModuleID module, ResponseStatus status, int responseCode) {
      listener.onServerError(status, responseCode);
    }
  }

  // Only a listener that wants the points gets this delegate: the engine calls back into Java
  // for every frame only then.
  private static final class EventsWithPoints extends Events {
    EventsWithPoints(SessionListener listener) {
      super(listener);
    }

    @Override
    public void didDetectInterestPoints(VectorOfPoint2f points) {
      listener.onInterestPoints(FrameNatives.points(VectorOfPoint2f.getCPtr(points)));
    }
  }

  /** Puts a session together. A transport is required: a server URL or a delegate of your own. */
  public static final class Builder {
    private String url;
    private ServerDelegate transport;
    private SessionListener listener;
    private int connectTimeoutMs = HttpServerDelegate.DEFAULT_CONNECT_TIMEOUT_MS;
    private int readTimeoutMs = HttpServerDelegate.DEFAULT_READ_TIMEOUT_MS;

    private Builder() {}

    /** Queries go over HTTP to {@code url} with the built-in {@link HttpServerDelegate}. */
    public Builder serverUrl(String url) {
      this.url = url;
      return this;
    }

    /** Timeouts of the built-in HTTP transport, in milliseconds (defaults: 5000 and 15000). */
    public Builder timeouts(int connectTimeoutMs, int readTimeoutMs) {
      this.connectTimeoutMs = connectTimeoutMs;
      this.readTimeoutMs = readTimeoutMs;
      return this;
    }

    /**
     * Queries go to the application's own transport, which stays the application's: keep it
     * reachable while the session lives, and free it after {@link VisualSearchSession#close()}.
     */
    public Builder transport(ServerDelegate transport) {
      this.transport = transport;
      return this;
    }

    public Builder listener(SessionListener listener) {
      this.listener = listener;
      return this;
    }

    /**
     * @throws IllegalStateException when neither or both of a URL and a transport were given
     * @throws IllegalArgumentException when the URL is not an http(s) URL
     */
    public VisualSearchSession build() {
      if ((url == null) == (transport == null)) {
        throw new IllegalStateException("give the session either a server URL or a transport");
      }
      SessionListener l = listener != null ? listener : new SessionListener() {};
      if (transport != null) return new VisualSearchSession(transport, null, l);
      HttpServerDelegate http;
      try {
        http = new HttpServerDelegate(url, connectTimeoutMs, readTimeoutMs);
      } catch (MalformedURLException e) {
        throw new IllegalArgumentException("not a URL: " + url, e);
      }
      return new VisualSearchSession(http, http, l);
    }
  }
}
