package com.orza.vs.tools.scan;

import com.orza.vs.mobile.library.http.HttpServerDelegate;
import com.orza.vs.mobile.library.http.VisualSearchHttpClient;
import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.ObjectInfo;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import com.orza.vs.mobile.library.impl.jni.Point2f;
import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.impl.jni.ResultMetadata;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.impl.jni.VectorOfObjectInfo;
import com.orza.vs.mobile.library.impl.jni.VectorOfPoint2f;
import com.orza.vs.mobile.library.impl.jni.VectorOfString;
import java.io.Closeable;
import java.net.MalformedURLException;
import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.List;
import java.util.Map;
import java.util.function.Consumer;

/**
 * Drives the engine through its Java API exactly as an app would: an event delegate, the
 * reference HTTP transport, and frames entering through {@code requestImageBuffer},
 * {@code fillBufferWithByteBuffer} (a direct buffer) and {@code process(frameKey, ...)}.
 * Everything observed goes into a {@link ScanLog}.
 */
public final class ScanEngine implements Closeable {
  private final ScanLog log;
  private final Events events;
  private final HttpServerDelegate transport;
  private final TovraStateEngineFacade engine;
  private final ExtraFrameData extra = new ExtraFrameData();
  private ByteBuffer direct;
  private int refusedFrames;
  private boolean closed;

  /** Called with each request once the engine reported its outcome (any thread). */
  private final Consumer<ScanLog.RequestEntry> onOutcome;

  /** Copies every callback into plain Java values (the arguments are borrowed). */
  private final class Events extends EventDelegateBase {
    @Override
    public void didDetectInterestPoints(VectorOfPoint2f points) {
      int n = points.size();
      float[] xy = new float[2 * n];
      for (int i = 0; i < n; i++) {
        Point2f p = points.get(i);
        xy[2 * i] = p.getX();
        xy[2 * i + 1] = p.getY();
      }
      log.points(xy);
    }

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      List<ScanLog.Result> results = copy(objects, 0);
      VectorOfString acc = metadata.getAccumulatedQueries();
      List<String> accumulated = new ArrayList<>(acc);
      ScanLog.RequestEntry r = log.decoded(results, metadata.getQueryID(), metadata.getIsFinalAccumulation(), accumulated);
      if (r != null && onOutcome != null) onOutcome.accept(r);
    }

    @Override
    public void didReceiveServerError(ObjectModuleID module, ResponseStatus status, int value) {
      ScanLog.RequestEntry r = log.serverError(status == null ? -1 : status.swigValue(), value);
      if (r != null && onOutcome != null) onOutcome.accept(r);
    }
  }

  /** Sub-contents nest; a reply cannot make this recurse without bound (depth is capped). */
  static List<ScanLog.Result> copy(VectorOfObjectInfo objects, int depth) {
    List<ScanLog.Result> out = new ArrayList<>();
    if (depth > 16) return out;
    int n = objects.size();
    for (int i = 0; i < n; i++) {
      ObjectInfo o = objects.get(i);
      VectorOfPoint2f loc = o.getLocation();
      float[] corners = null;
      if (loc.size() == 4) {
        corners = new float[8];
        for (int k = 0; k < 4; k++) {
          corners[2 * k] = loc.get(k).getX();
          corners[2 * k + 1] = loc.get(k).getY();
        }
      }
      out.add(new ScanLog.Result(typeName(o), o.getContent(), o.getProperties(), corners, copy(o.getSubContents(), depth + 1)));
    }
    return out;
  }

  /** The reply's own name for a content type ("BoundingBox", "SearchTerms", ...). */
  static String typeName(ObjectInfo o) {
    if (o.getContentType() == null) return "?";
    switch (o.getContentType()) {
      case PIDN: return "PIDN";
      case SEARCH_TERMS: return "SearchTerms";
      case DIRECTED_RESULT: return "DirectedResult";
      case EXTERNAL_RESULT: return "ExternalResult";
      case BOUNDING_BOX: return "BoundingBox";
      default: return o.getContentType().name();
    }
  }

  /**
   * Creates and starts an engine that sends its requests to {@code serverUrl}.
   *
   * @param onOutcome called with each request whose outcome the engine reported (may be null)
   */
  public ScanEngine(ScanLog log, String serverUrl, int connectTimeoutMs, int readTimeoutMs,
                    Consumer<ScanLog.RequestEntry> onOutcome) throws MalformedURLException {
    this.log = log;
    this.onOutcome = onOutcome;
    this.events = new Events();
    this.transport = new HttpServerDelegate(serverUrl, connectTimeoutMs, readTimeoutMs);
    this.transport.setListener(new HttpServerDelegate.Listener() {
      @Override
      public void onRequest(String id, Map<String, String> params, Map<String, String> metadata, byte[] jpeg) {
        log.requestSent(id, metadata, jpeg);
      }

      @Override
      public void onResponse(String id, VisualSearchHttpClient.Exchange exchange) {
        log.answered(id, exchange.code, exchange.body, exchange.seconds);
      }
    });
    this.engine = new TovraStateEngineFacade(events);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    engine.startEngine();
  }

  /** Closes the transport while the engine keeps running, as an app does when it goes offline. */
  void closeTransport() {
    transport.close();
  }

  /** Frames the engine could not take (no free record): none in a healthy run. */
  public int refusedFrames() {
    return refusedFrames;
  }

  /** Feeds one frame with the given time stamp (seconds) and screen orientation. */
  public void feed(Frame f, double timeStamp, int orientation) {
    int len = f.data.length;
    if (direct == null || direct.capacity() < len) direct = ByteBuffer.allocateDirect(len);
    direct.clear();
    direct.put(f.data);
    direct.flip();

    ImageBuffer image = new ImageBuffer();
    try {
      image.setFormat(f.format == Frame.I420 ? ImageFormat.I420 : ImageFormat.NV21);
      image.setWidth(f.width);
      image.setHeight(f.height);
      image.setWidthStep(f.width);
      image.setNumChannels(1);
      String[] key = new String[1];
      engine.requestImageBuffer(image, key);
      long frameId = -1;
      if (key[0] != null && !key[0].isEmpty()) {
        frameId = ScanLog.frameIdOf(key[0]);
        int copied = image.fillBufferWithByteBuffer(direct, len);
        if (copied != len) throw new IllegalStateException("filled " + copied + " of " + len + " bytes");
      } else {
        // No memory could be lent: hand the frame over in our own buffer instead.
        refusedFrames++;
        image.allocateBuffer(len);
        image.fillBufferWithByteBuffer(direct, len);
      }
      extra.setTimeStamp(timeStamp);
      extra.setScreenOrient(orientation);
      log.frameIn(f.index, timeStamp, f.width, f.height, frameId);
      engine.process(key[0] == null ? "" : key[0], image, extra);
    } finally {
      image.delete();
    }
  }

  /**
   * Waits until every request has its outcome, at most {@code timeoutMs}. The last frame fed
   * may still be on its way to the transport (the engine's worker encodes it after
   * {@code process} returns), so "every request" means: none open, and no new one for a
   * quiet period of {@link #QUIET_MS}.
   */
  public boolean awaitOutcomes(long timeoutMs) throws InterruptedException {
    long end = System.nanoTime() + timeoutMs * 1_000_000L;
    int seen = -1;
    long quietSince = 0;
    while (true) {
      int sent = log.requests().size();
      long now = System.nanoTime();
      if (log.openRequests() > 0 || sent != seen) {
        seen = sent;
        quietSince = now;
      } else if (now - quietSince >= QUIET_MS * 1_000_000L) {
        return true;
      }
      if (now > end) return false;
      Thread.sleep(10);
    }
  }

  static final long QUIET_MS = 300;

  /** Stops the engine, closes the transport and frees the native objects. */
  @Override
  public synchronized void close() {
    if (closed) return;
    closed = true;
    engine.stopEngine();
    transport.close();
    engine.delete();
    extra.delete();
    transport.delete();
    events.delete();
  }
}
