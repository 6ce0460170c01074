package com.orza.vs.tools.soak;

import com.orza.vs.mobile.library.impl.jni.ContentType;
import com.orza.vs.mobile.library.impl.jni.EventDelegateBase;
import com.orza.vs.mobile.library.impl.jni.ExtraFrameData;
import com.orza.vs.mobile.library.impl.jni.ImageBuffer;
import com.orza.vs.mobile.library.impl.jni.ImageFormat;
import com.orza.vs.mobile.library.impl.jni.ObjectInfo;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.impl.jni.ResultMetadata;
import com.orza.vs.mobile.library.impl.jni.ServerDelegate;
import com.orza.vs.mobile.library.impl.jni.ServerRequest;
import com.orza.vs.mobile.library.impl.jni.ServerResponse;
import com.orza.vs.mobile.library.impl.jni.TovraStateEngineFacade;
import com.orza.vs.mobile.library.impl.jni.VectorOfObjectInfo;
import com.orza.vs.mobile.library.impl.jni.VectorOfPoint2f;
import java.io.IOException;
import java.nio.ByteBuffer;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.Locale;
import java.util.Random;
import java.util.concurrent.RejectedExecutionException;
import java.util.concurrent.ScheduledExecutorService;
import java.util.concurrent.ScheduledThreadPoolExecutor;
import java.util.concurrent.TimeUnit;
import java.util.concurrent.atomic.AtomicLong;
import java.util.concurrent.atomic.AtomicLongArray;
import java.util.concurrent.locks.ReentrantReadWriteLock;

/**
 * A long run of the library through its Java binding, as an app uses it, with an unreliable
 * server behind it. Two threads stream camera frames (one through memory the engine lends, one
 * through its own buffer); a control thread pauses, resumes, stops and restarts the engine and
 * processes still images; the transport answers slowly, with errors (500), with text that is
 * not JSON, with the wrong id, or never.
 *
 * <p>Accounting. Every reply is pushed from one thread, and a result callback (didDecode or
 * didReceiveServerError) runs inside the push that caused it, so each callback is attributed to
 * its push. The engine's one job waits for one reply at a time; a reset (pause, stop, start from
 * paused) ends that wait, and so does a callback, even one caused by a late reply to an earlier
 * request (the job takes whatever reply reaches it while it waits).
 *
 * <p>The job starts waiting before its request reaches the transport: it is registered under the
 * request's id, then the upcall is made. A late reply pushed in between (a long time under
 * emulation) ends the wait of a request the transport has not seen yet. So the soak follows the
 * job's wait itself rather than reading a counter when a request arrives: {@link #awaited} is the
 * request it waits for, cleared by a callback or a finished reset; a callback while no seen
 * request is awaited ended the wait of the request being handed over, which then arrives with
 * its wait already over. Resets take {@link #resetLock} for writing and frame calls for reading,
 * so no frame can start a new wait between a reset and its bookkeeping.
 *
 * <p>Hence the rules checked: a push causes at most one callback; no callback happens outside a
 * push, nor while the job waits for nothing; a push of the right id that causes none while its
 * request is still awaited and no reset is under way is a lost reply; no request is sent while
 * the job still waits for the previous one; and once the engine is stopped, or deleted, no push
 * causes a callback.
 *
 * <p>Resources. Resident memory (/proc/self/status), Java heap after garbage collection, live
 * threads, and JNI global references (counted as the "JNI global" roots of a heap dump) are
 * sampled through the run; an early window is compared with a late one.
 *
 * <p>Usage: {@code java -Xcheck:jni -Dorzavs.library.path=... -cp ... Soak --seconds N}. Prints
 * figures and a verdict; exits 1 on any failure.
 */
public final class Soak {
  private static final int WIDTH = 320;
  private static final int HEIGHT = 240;

  private enum Fate { OK, OK_SLOW, ERROR_500, NOT_JSON, WRONG_ID, NEVER }

  private static final String REPLY_TEMPLATE =
      "{\"queryId\":\"%s\",\"quillmark\":{\"searchResult\":["
          + "{\"content\":\"B00SOAK\",\"contentType\":\"PIDN\",\"properties\":{\"score\":0.9}},"
          + "{\"content\":\"?\",\"contentType\":\"Unknown\",\"properties\":{}},"
          + "{\"content\":\"\",\"contentType\":\"BoundingBox\",\"properties\":{\"boundingBox\":"
          + "{\"tlx\":10,\"tly\":20,\"trx\":110,\"try\":20,\"brx\":110,\"bry\":90,\"blx\":10,\"bly\":90}}}],"
          + "\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[\"%s\"]}}}";

  /** What one push was, and the callbacks it caused. */
  private static final class Push {
    final Fate fate;
    final int code;
    final String queryId;
    int callbacks;
    boolean bad;

    Push(Fate fate, int code, String queryId) {
      this.fate = fate;
      this.code = code;
      this.queryId = queryId;
    }
  }

  private static final ThreadLocal<Push> CURRENT_PUSH = new ThreadLocal<>();

  // The library writes its diagnostics to standard output; the report goes to standard error so
  // that the two never interleave within a line.
  private static final java.io.PrintStream REPORT = System.err;

  private final Counters counters = new Counters();
  private final List<String> failures = Collections.synchronizedList(new ArrayList<String>());
  private final Random random = new Random(20240601L);
  private final ScheduledExecutorService pusher = new ScheduledThreadPoolExecutor(1);

  private volatile boolean forceAnswer;
  private volatile boolean stopped;
  private volatile boolean deleted;
  private final ReentrantReadWriteLock resetLock = new ReentrantReadWriteLock();
  // The job's wait, as the callbacks, resets and requests show it (guarded by sendLock).
  private final Object sendLock = new Object();
  /** The request the job waits for; null when its last wait has ended. */
  private String awaited;
  /** Callbacks that ended the wait of a request the transport had not received yet (0 or 1). */
  private int earlyCallbacks;
  private int resetsUnderWay;
  private final List<String> outstanding = new ArrayList<>();

  private Events events;
  private Transport transport;
  private TovraStateEngineFacade engine;

  static final class Counters {
    final AtomicLong frames = new AtomicLong();
    final AtomicLong lentFrames = new AtomicLong();
    final AtomicLong badFrames = new AtomicLong();
    final AtomicLong pointCallbacks = new AtomicLong();
    final AtomicLong points = new AtomicLong();
    final AtomicLong sends = new AtomicLong();
    final AtomicLong pushes = new AtomicLong();
    final AtomicLong pushesRightId = new AtomicLong();
    final AtomicLong decodes = new AtomicLong();
    final AtomicLong serverErrors = new AtomicLong();
    final AtomicLong excusedSilent = new AtomicLong();
    final AtomicLong endedOnTheWay = new AtomicLong();
    final AtomicLong lost = new AtomicLong();
    final AtomicLong duplicated = new AtomicLong();
    final AtomicLong unattributed = new AtomicLong();
    final AtomicLong doubleDispatch = new AtomicLong();
    final AtomicLong afterStop = new AtomicLong();
    final AtomicLong resets = new AtomicLong();
    final AtomicLong stills = new AtomicLong();
    final AtomicLongArray fates = new AtomicLongArray(Fate.values().length);
  }

  private void fail(String what) {
    if (failures.size() < 50) failures.add(what);
  }

  // --- The app's event delegate ------------------------------------------------------------

  private final class Events extends EventDelegateBase {
    @Override
    public void didDetectInterestPoints(VectorOfPoint2f points) {
      try {
        int n = points.size();
        counters.pointCallbacks.incrementAndGet();
        counters.points.addAndGet(n);
        if (n > 50) fail("more than 50 interest points: " + n);
      } catch (Throwable t) {
        fail("didDetectInterestPoints threw " + t);
      }
    }

    @Override
    public void didDecode(VectorOfObjectInfo objects, ResultMetadata metadata) {
      try {
        counters.decodes.incrementAndGet();
        Push push = attribute();
        if (push == null) return;
        boolean ok = (push.fate == Fate.OK || push.fate == Fate.OK_SLOW) && objects.size() == 2
            && metadata.getQueryID().equals(push.queryId)
            && "TeskarMobileDecorator".equals(metadata.getMobileDecorator());
        if (ok) {
          ObjectInfo first = objects.get(0);
          ObjectInfo second = objects.get(1);
          ok = first.getContentType() == ContentType.PIDN && "B00SOAK".equals(first.getContent())
              && first.getSrcObjectModule() == ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD
              && second.getContentType() == ContentType.BOUNDING_BOX && second.getLocation().size() == 4;
        }
        if (!ok) push.bad = true;
      } catch (Throwable t) {
        fail("didDecode threw " + t);
      }
    }

    @Override
    public void didReceiveServerError(ObjectModuleID module, ResponseStatus status, int code) {
      try {
        counters.serverErrors.incrementAndGet();
        Push push = attribute();
        if (push == null) return;
        boolean ok = module == ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD && code == push.code
            && ((push.fate == Fate.ERROR_500 && status == ResponseStatus.RESPONSE_SERVER_ERROR)
                || (push.fate == Fate.NOT_JSON && status == ResponseStatus.RESPONSE_PARSE_ERROR));
        if (!ok) push.bad = true;
      } catch (Throwable t) {
        fail("didReceiveServerError threw " + t);
      }
    }

    private Push attribute() {
      synchronized (sendLock) {
        if (awaited != null) {
          awaited = null;
        } else if (++earlyCallbacks > 1) {
          fail("a result callback while the job waited for no request");
        }
      }
      Push push = CURRENT_PUSH.get();
      if (push == null) {
        counters.unattributed.incrementAndGet();
        fail("result callback outside any push, on thread " + Thread.currentThread().getName());
        return null;
      }
      push.callbacks++;
      return push;
    }
  }

  // --- The app's transport -----------------------------------------------------------------

  private final class Transport extends ServerDelegate {
    @Override
    public boolean sendServerRequestImpl(ServerRequest request) {
      try {
        final String id = request.getId();
        byte[] jpeg = request.getData().getData();
        if (jpeg == null || jpeg.length < 4 || (jpeg[0] & 0xFF) != 0xFF || (jpeg[1] & 0xFF) != 0xD8) {
          fail("request " + id + " does not carry a JPEG");
        }
        if (!request.getParams().has_key("vsearch_params_json")) fail("request " + id + " without parameters");
        synchronized (sendLock) {
          if (awaited != null) {
            counters.doubleDispatch.incrementAndGet();
            fail("request " + id + " sent while the job still waited for " + awaited);
          }
          if (earlyCallbacks > 0) {
            earlyCallbacks = 0;  // a late reply ended this wait before the request got here
            counters.endedOnTheWay.incrementAndGet();
            awaited = null;
          } else {
            awaited = id;
          }
          outstanding.add(id);
        }
        counters.sends.incrementAndGet();
        final Fate fate = forceAnswer ? Fate.OK : pickFate();
        counters.fates.incrementAndGet(fate.ordinal());
        long delayMs;
        switch (fate) {
          case OK_SLOW: delayMs = 200 + random(600); break;
          case NEVER: return true;
          default: delayMs = random(60); break;
        }
        try {
          pusher.schedule(new Runnable() {
            @Override
            public void run() {
              answer(id, fate);
            }
          }, delayMs, TimeUnit.MILLISECONDS);
        } catch (RejectedExecutionException e) {
          // Shutting down: the request stays unanswered and is answered after the final stop.
        }
        return true;
      } catch (Throwable t) {
        fail("sendServerRequestImpl threw " + t);
        return false;
      }
    }
  }

  private synchronized int random(int bound) {
    return random.nextInt(bound);
  }

  private Fate pickFate() {
    int r = random(100);
    if (r < 45) return Fate.OK;
    if (r < 65) return Fate.OK_SLOW;
    if (r < 75) return Fate.ERROR_500;
    if (r < 85) return Fate.NOT_JSON;
    if (r < 92) return Fate.WRONG_ID;
    return Fate.NEVER;
  }

  /** Runs on the pusher thread: the reply for request {@code id}, as its fate says. */
  private void answer(String id, Fate fate) {
    String queryId = "soak-" + counters.pushes.get();
    int code = 200;
    String body;
    switch (fate) {
      case ERROR_500: code = 500; body = "Internal Server Error"; break;
      case NOT_JSON: body = "<html>not json</html>"; break;
      default: body = String.format(Locale.ROOT, REPLY_TEMPLATE, queryId, id); break;
    }
    String pushedId = fate == Fate.WRONG_ID ? id + "-wrong" : id;
    Push push = push(pushedId, code, body, fate, queryId);
    if (fate == Fate.WRONG_ID) {
      if (push.callbacks != 0) fail("a reply with an unknown id caused a callback");
      return;
    }
    boolean stillAwaited;
    synchronized (sendLock) {
      outstanding.remove(id);
      stillAwaited = id.equals(awaited) && resetsUnderWay == 0;
    }
    counters.pushesRightId.incrementAndGet();
    if (push.callbacks == 0) {
      if (stillAwaited && !stopped) {
        counters.lost.incrementAndGet();
        fail("reply " + id + " (" + fate + ") caused no callback though the job waited undisturbed");
      } else {
        counters.excusedSilent.incrementAndGet();
      }
    }
  }

  private Push push(String id, int code, String body, Fate fate, String queryId) {
    Push push = new Push(fate, code, queryId);
    ServerResponse response = new ServerResponse();
    try {
      response.setId(id);
      response.setResponseCode(code);
      response.setResponseStr(body);
      response.setRoundtripTime(0.05);
      CURRENT_PUSH.set(push);
      counters.pushes.incrementAndGet();
      transport.pushServerResponse(response);
    } finally {
      CURRENT_PUSH.remove();
      response.delete();
    }
    if (push.callbacks > 1) {
      counters.duplicated.incrementAndGet();
      fail("reply " + id + " caused " + push.callbacks + " callbacks");
    }
    if (push.bad) fail("reply " + id + " (" + fate + ") was reported with the wrong content");
    if ((stopped || deleted) && push.callbacks != 0) {
      counters.afterStop.incrementAndGet();
      fail("reply " + id + " caused a callback after the engine was stopped");
    }
    return push;
  }

  // --- Frames ----------------------------------------------------------------------------

  /** NV21 frames of a textured card moving over a smooth background. */
  private static byte[][] makeFrames(int count, long seed) {
    Random r = new Random(seed);
    int card = 96;
    // Speckle: isolated bright and dark pixels give FAST many corners (more than 50 a frame).
    byte[] texture = new byte[card * card];
    for (int k = 0; k < texture.length; ++k) texture[k] = (byte) (r.nextInt(8) == 0 ? (r.nextBoolean() ? 230 : 20) : 128);
    byte[][] frames = new byte[count][];
    for (int i = 0; i < count; ++i) {
      byte[] f = new byte[WIDTH * HEIGHT * 3 / 2];
      int ox = 40 + 8 * i;
      int oy = 50 + 4 * i;
      for (int y = 0; y < HEIGHT; ++y) {
        for (int x = 0; x < WIDTH; ++x) {
          int v = 90 + (x + y) / 8;
          int cx = x - ox;
          int cy = y - oy;
          if (cx >= 0 && cy >= 0 && cx < card && cy < card) v = texture[cy * card + cx] & 0xFF;
          f[y * WIDTH + x] = (byte) v;
        }
      }
      for (int k = WIDTH * HEIGHT; k < f.length; ++k) f[k] = (byte) 128;
      frames[i] = f;
    }
    return frames;
  }

  private abstract class FrameThread extends Thread {
    final byte[][] frames;
    final long deadlineNs;
    final long startNs = System.nanoTime();

    FrameThread(String name, long seed, long deadlineNs) {
      super(name);
      this.frames = makeFrames(12, seed);
      this.deadlineNs = deadlineNs;
    }

    double now() {
      return (System.nanoTime() - startNs) / 1e9;
    }

    @Override
    public void run() {
      try {
        int i = 0;
        while (System.nanoTime() < deadlineNs) {
          frame(frames[i++ % frames.length]);
          counters.frames.incrementAndGet();
          Thread.sleep(25);
        }
      } catch (Throwable t) {
        fail(getName() + " threw " + t);
      }
    }

    abstract void frame(byte[] pixels);
  }

  /** Frames written into memory the engine lends (requestImageBuffer, then process by key). */
  private final class LentFrames extends FrameThread {
    final ImageBuffer image = new ImageBuffer();
    final ExtraFrameData extra = new ExtraFrameData();
    final ByteBuffer luma = ByteBuffer.allocateDirect(WIDTH * HEIGHT);
    final ByteBuffer chroma = ByteBuffer.allocateDirect(WIDTH * HEIGHT / 2);
    final String[] key = new String[1];
    int n;

    LentFrames(long deadlineNs) {
      super("frames-lent", 1, deadlineNs);
    }

    @Override
    void frame(byte[] pixels) {
      image.setFormat(ImageFormat.NV21);
      image.setWidth(WIDTH);
      image.setHeight(HEIGHT);
      image.setWidthStep(WIDTH);
      key[0] = null;
      engine.requestImageBuffer(image, key);
      extra.setTimeStamp(now());
      extra.setScreenOrient(90 * (n++ % 4));
      if (key[0] == null || key[0].isEmpty()) return;  // not running, or every record is out
      luma.clear();
      luma.put(pixels, 0, WIDTH * HEIGHT);
      chroma.clear();
      chroma.put(pixels, WIDTH * HEIGHT, WIDTH * HEIGHT / 2);
      int copied = image.fillBufferWithByteBuffer(luma, WIDTH * HEIGHT, chroma, WIDTH * HEIGHT / 2);
      if (copied != pixels.length) fail("lent buffer took " + copied + " of " + pixels.length + " bytes");
      resetLock.readLock().lock();
      try {
        engine.process(key[0], image, extra);
      } finally {
        resetLock.readLock().unlock();
      }
      counters.lentFrames.incrementAndGet();
    }
  }

  /** Frames in a buffer of the app's own (allocateBuffer, fillBuffer), grey and NV12 in turn. */
  private final class OwnFrames extends FrameThread {
    final ImageBuffer image = new ImageBuffer();
    final ExtraFrameData extra = new ExtraFrameData();
    int n;

    OwnFrames(long deadlineNs) {
      super("frames-own", 2, deadlineNs);
      image.allocateBuffer(WIDTH * HEIGHT * 3 / 2);
    }

    @Override
    void frame(byte[] pixels) {
      boolean grey = (n++ & 1) == 0;
      image.setFormat(grey ? ImageFormat.GRAY : ImageFormat.NV12);
      image.setWidth(WIDTH);
      image.setHeight(HEIGHT);
      image.setWidthStep(WIDTH);
      image.setNumChannels(1);
      int copied = image.fillBuffer(pixels, pixels.length);
      if (copied != pixels.length) fail("own buffer took " + copied + " of " + pixels.length + " bytes");
      extra.setTimeStamp(now());
      // Now and then a frame described wrongly, as a buggy app would: taller than its buffer,
      // rows shorter than the width, an unknown format. The engine must drop it and go on.
      if (n % 37 == 0) image.setHeight(HEIGHT * 4);
      if (n % 41 == 0) image.setWidthStep(WIDTH / 2);
      if (n % 43 == 0) image.setFormat(ImageFormat.BGRA);
      if (n % 37 == 0 || n % 41 == 0 || n % 43 == 0) counters.badFrames.incrementAndGet();
      resetLock.readLock().lock();
      try {
        engine.process(image, extra);
      } finally {
        resetLock.readLock().unlock();
      }
    }
  }

  // --- Engine control --------------------------------------------------------------------

  /**
   * An engine reset: it ends the job's wait. Frames are held off until the wait is noted as
   * ended, or a fresh start could let the job begin a new one first.
   */
  private void reset(Runnable action) {
    resetLock.writeLock().lock();
    try {
      synchronized (sendLock) {
        ++resetsUnderWay;
      }
      action.run();
      synchronized (sendLock) {
        --resetsUnderWay;
        awaited = null;
        if (earlyCallbacks > 0) fail("a result callback while the job waited for no request");
        earlyCallbacks = 0;
      }
      counters.resets.incrementAndGet();
    } finally {
      resetLock.writeLock().unlock();
    }
  }

  private void controlStep(ImageBuffer still, ExtraFrameData stillExtra) throws InterruptedException {
    int r = random(100);
    if (r < 30) {
      reset(engine::pauseEngine);
      Thread.sleep(100 + random(400));
      engine.resumeEngine();
    } else if (r < 45) {
      reset(engine::stopEngine);
      Thread.sleep(50 + random(300));
      reset(engine::startEngine);
    } else if (r < 55) {
      engine.startEngine();  // already running: nothing happens
    } else if (r < 65) {
      reset(engine::pauseEngine);
      Thread.sleep(50 + random(200));
      reset(engine::startEngine);  // a fresh start from paused
    } else if (r < 85) {
      // A still image: answered for sure, since the call blocks until its reply is handled.
      forceAnswer = true;
      try {
        stillExtra.setTimeStamp(-1.0);
        engine.processSingleImage(still, stillExtra);
        counters.stills.incrementAndGet();
      } finally {
        forceAnswer = false;
      }
    }
  }

  // --- Resources -------------------------------------------------------------------------

  static final class Sample {
    final double t;
    final long rssKb;
    final long heapKb;
    final int threads;

    Sample(double t, long rssKb, long heapKb, int threads) {
      this.t = t;
      this.rssKb = rssKb;
      this.heapKb = heapKb;
      this.threads = threads;
    }
  }

  private static Sample sample(double t) {
    Resources.gc();
    long heapKb = Resources.heapUsedKb();  // before reading /proc, whose text is garbage
    return new Sample(t, Resources.rssKb(), heapKb, Resources.threadCount());
  }

  private static double median(List<Sample> window, java.util.function.ToLongFunction<Sample> f) {
    long[] v = new long[window.size()];
    for (int i = 0; i < v.length; ++i) v[i] = f.applyAsLong(window.get(i));
    java.util.Arrays.sort(v);
    if (v.length == 0) return Double.NaN;
    return v.length % 2 == 1 ? v[v.length / 2] : (v[v.length / 2 - 1] + v[v.length / 2]) / 2.0;
  }

  // --- The run ---------------------------------------------------------------------------

  private int run(double seconds) throws Exception {
    long startNs = System.nanoTime();
    long deadlineNs = startNs + (long) (seconds * 1e9);
    events = new Events();
    transport = new Transport();
    engine = new TovraStateEngineFacade(events);
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, transport);
    engine.startEngine();

    ImageBuffer still = new ImageBuffer();
    byte[] stillPixels = makeFrames(1, 3)[0];
    still.allocateBuffer(stillPixels.length);
    still.fillBuffer(stillPixels, stillPixels.length);
    still.setFormat(ImageFormat.NV21);
    still.setWidth(WIDTH);
    still.setHeight(HEIGHT);
    still.setWidthStep(WIDTH);
    ExtraFrameData stillExtra = new ExtraFrameData();

    FrameThread a = new LentFrames(deadlineNs);
    FrameThread b = new OwnFrames(deadlineNs);
    a.start();
    b.start();

    List<Sample> samples = new ArrayList<>();
    double sampleEvery = Math.max(2.0, Math.min(15.0, seconds / 20.0));
    double nextSample = sampleEvery;
    int globalsEarly = -1;
    double earlyFrom = 0.25 * seconds;
    double earlyTo = 0.45 * seconds;
    double lateFrom = 0.8 * seconds;
    while (System.nanoTime() < deadlineNs) {
      controlStep(still, stillExtra);
      Thread.sleep(500 + random(1500));
      double t = (System.nanoTime() - startNs) / 1e9;
      if (t >= nextSample) {
        samples.add(sample(t));
        nextSample = t + sampleEvery;
        if (globalsEarly < 0 && t >= earlyFrom) globalsEarly = Resources.jniGlobalRefs();
      }
    }
    a.join();
    b.join();
    samples.add(sample((System.nanoTime() - startNs) / 1e9));
    int globalsLate = Resources.jniGlobalRefs();

    // Shut down: let the last request go out and the scheduled replies arrive, stop the engine,
    // then answer everything still out. Nothing may call back after the stop.
    Thread.sleep(500);
    pusher.shutdown();
    if (!pusher.awaitTermination(10, TimeUnit.SECONDS)) fail("scheduled replies did not finish");
    reset(engine::stopEngine);
    stopped = true;
    List<String> left;
    synchronized (sendLock) {
      left = new ArrayList<>(outstanding);
    }
    for (String id : left) push(id, 200, String.format(Locale.ROOT, REPLY_TEMPLATE, "late", id), Fate.OK, "late");
    engine.delete();
    deleted = true;
    for (String id : left) push(id, 500, "late", Fate.ERROR_500, "late");
    still.delete();
    stillExtra.delete();

    // Figures.
    List<Sample> early = new ArrayList<>();
    List<Sample> late = new ArrayList<>();
    for (Sample s : samples) {
      if (s.t >= earlyFrom && s.t <= earlyTo) early.add(s);
      if (s.t >= lateFrom) late.add(s);
    }
    double rssEarly = median(early, s -> s.rssKb) / 1024.0;
    double rssLate = median(late, s -> s.rssKb) / 1024.0;
    double heapEarly = median(early, s -> s.heapKb) / 1024.0;
    double heapLate = median(late, s -> s.heapKb) / 1024.0;
    double threadsEarly = median(early, s -> s.threads);
    double threadsLate = median(late, s -> s.threads);

    REPORT.printf(Locale.ROOT,
        "soak: %.0f s, %d frames (%d through lent buffers, %d described wrongly), %d still images, %d resets%n",
        seconds, counters.frames.get(), counters.lentFrames.get(), counters.badFrames.get(), counters.stills.get(),
        counters.resets.get());
    REPORT.printf(Locale.ROOT, "soak: interest points: %d callbacks, %d points%n",
        counters.pointCallbacks.get(), counters.points.get());
    StringBuilder fates = new StringBuilder();
    for (Fate f : Fate.values()) fates.append(' ').append(f.name().toLowerCase(Locale.ROOT)).append('=').append(counters.fates.get(f.ordinal()));
    REPORT.printf(Locale.ROOT, "soak: requests sent %d; fates:%s%n", counters.sends.get(), fates);
    REPORT.printf(Locale.ROOT,
        "soak: replies pushed %d (%d with the request's id); callbacks: %d didDecode, %d didReceiveServerError; "
            + "silent pushes explained by a reset or an earlier reply %d (waits ended by a late reply before their "
            + "request reached the transport %d); lost %d, duplicated %d, outside a push %d, "
            + "double dispatch %d, after stop %d; %d requests left unanswered at the end%n",
        counters.pushes.get(), counters.pushesRightId.get(), counters.decodes.get(), counters.serverErrors.get(),
        counters.excusedSilent.get(), counters.endedOnTheWay.get(), counters.lost.get(), counters.duplicated.get(),
        counters.unattributed.get(), counters.doubleDispatch.get(), counters.afterStop.get(), left.size());
    REPORT.printf(Locale.ROOT, "soak: samples %d (early window %.0f-%.0f s: %d, late window from %.0f s: %d)%n",
        samples.size(), earlyFrom, earlyTo, early.size(), lateFrom, late.size());
    REPORT.printf(Locale.ROOT, "soak: resident memory   early %.1f MB, late %.1f MB%n", rssEarly, rssLate);
    REPORT.printf(Locale.ROOT, "soak: Java heap after GC early %.1f MB, late %.1f MB%n", heapEarly, heapLate);
    REPORT.printf(Locale.ROOT, "soak: live threads      early %.0f, late %.0f%n", threadsEarly, threadsLate);
    REPORT.printf(Locale.ROOT, "soak: JNI global refs   early %d, late %d (heap dump roots)%n", globalsEarly, globalsLate);
    String nmt = Resources.nativeMemoryTotal();
    if (nmt != null) REPORT.println("soak: JVM native memory (NMT) at the end: " + nmt);

    if (early.isEmpty() || late.isEmpty()) fail("too few samples to compare early and late");
    if (rssLate - rssEarly > Math.max(16.0, 0.15 * rssEarly)) {
      fail(String.format(Locale.ROOT, "resident memory grew from %.1f to %.1f MB", rssEarly, rssLate));
    }
    if (heapLate - heapEarly > 8.0) fail(String.format(Locale.ROOT, "heap grew from %.1f to %.1f MB", heapEarly, heapLate));
    if (threadsLate - threadsEarly > 4) fail("threads grew from " + threadsEarly + " to " + threadsLate);
    if (globalsEarly >= 0 && globalsLate - globalsEarly > 16) {
      fail("JNI global references grew from " + globalsEarly + " to " + globalsLate);
    }
    if (counters.frames.get() == 0 || counters.sends.get() == 0 || counters.decodes.get() == 0
        || counters.serverErrors.get() == 0) {
      fail("the run exercised too little: " + counters.frames.get() + " frames, " + counters.sends.get() + " requests");
    }
    if (failures.isEmpty()) {
      REPORT.println("soak: PASS");
      return 0;
    }
    for (String f : failures) REPORT.println("soak: FAIL: " + f);
    return 1;
  }

  public static void main(String[] args) throws Exception {
    double seconds = 60;
    for (int i = 0; i < args.length; ++i) {
      if ("--seconds".equals(args[i]) && i + 1 < args.length) {
        seconds = Double.parseDouble(args[++i]);
      } else {
        System.err.println("usage: Soak [--seconds N]");
        System.exit(2);
      }
    }
    int status;
    try {
      status = new Soak().run(seconds);
    } catch (IOException e) {
      REPORT.println("soak: FAIL: " + e);
      status = 1;
    }
    System.exit(status);
  }
}
