package com.orza.vs.tools.scan;

import java.util.ArrayList;
import java.util.Collections;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/**
 * Everything a scan observed, in plain Java values (no native handles), filled from the
 * scanning thread, the engine's worker and the transport's threads. All methods are
 * synchronized; readers take snapshots.
 */
public final class ScanLog {
  /** One frame fed to the engine. */
  public static final class FrameEntry {
    public final int index;
    public final double timeStamp;
    public final int width;
    public final int height;
    /** Frame id the engine gave the frame's record (from the frame key), or -1. */
    public final long frameId;
    /** When the frame was fed, seconds since the scan started. */
    public final double fedAt;
    /** Interest points as x0,y0,x1,y1,...; null until reported. */
    public float[] points;

    FrameEntry(int index, double timeStamp, int width, int height, long frameId, double fedAt) {
      this.index = index;
      this.fedAt = fedAt;
      this.timeStamp = timeStamp;
      this.width = width;
      this.height = height;
      this.frameId = frameId;
    }

    public int pointCount() {
      return points == null ? 0 : points.length / 2;
    }
  }

  /** One result as the engine reported it. */
  public static final class Result {
    public final String type;
    public final String content;
    public final String properties;
    /** Corners tl, tr, br, bl as x,y pairs (8 values), or null. */
    public final float[] location;
    public final List<Result> subContents;

    public Result(String type, String content, String properties, float[] location, List<Result> subContents) {
      this.type = type;
      this.content = content;
      this.properties = properties;
      this.location = location;
      this.subContents = subContents == null ? Collections.<Result>emptyList() : subContents;
    }
  }

  /** One request the engine sent, and what became of it. */
  public static final class RequestEntry {
    public final int number;
    public final String id;
    public final int frameIndex;
    public final double sentAt;
    public final byte[] jpeg;
    public final Map<String, String> metadata;
    // The transport's answer.
    public double answeredAt = -1;
    public int code;
    public double roundTrip = -1;
    public String body;
    // The engine's report: decoded results or a server error.
    public boolean reported;
    public boolean decoded;
    public List<Result> results = Collections.emptyList();
    public String queryId = "";
    public boolean finalAccumulation;
    public List<String> accumulated = Collections.emptyList();
    public int errorStatus;
    public int errorCode;

    RequestEntry(int number, String id, int frameIndex, double sentAt, byte[] jpeg, Map<String, String> metadata) {
      this.number = number;
      this.id = id;
      this.frameIndex = frameIndex;
      this.sentAt = sentAt;
      this.jpeg = jpeg;
      this.metadata = metadata;
    }

    public boolean isError() {
      return reported && !decoded;
    }
  }

  private volatile long startNanos = System.nanoTime();
  private final List<FrameEntry> frames = new ArrayList<>();
  private final Map<Long, FrameEntry> framesById = new LinkedHashMap<>();
  private final List<RequestEntry> requests = new ArrayList<>();
  private final Map<String, RequestEntry> requestsById = new LinkedHashMap<>();
  private final ThreadLocal<RequestEntry> answering = new ThreadLocal<>();
  private FrameEntry current;
  private int reportsWithoutRequest;

  /** Makes "now" the scan's time origin (call it just before the first frame). */
  public void markStart() {
    startNanos = System.nanoTime();
  }

  /** Seconds since the scan started (or since the log was created). */
  public double now() {
    return (System.nanoTime() - startNanos) / 1e9;
  }

  /** Records a frame about to enter the engine; it becomes the frame interest points go to. */
  public synchronized FrameEntry frameIn(int index, double timeStamp, int width, int height, long frameId) {
    FrameEntry f = new FrameEntry(index, timeStamp, width, height, frameId, now());
    frames.add(f);
    if (frameId >= 0) framesById.put(frameId, f);
    current = f;
    return f;
  }

  /** Interest points reported while the current frame was being processed. */
  public synchronized void points(float[] xy) {
    if (current != null) current.points = xy;
  }

  /** The frame id in a request id "...-<seconds>-<frameId>", or -1. */
  static long frameIdOf(String requestId) {
    int dash = requestId == null ? -1 : requestId.lastIndexOf('-');
    if (dash < 0) return -1;
    try {
      return Long.parseLong(requestId.substring(dash + 1));
    } catch (NumberFormatException e) {
      return -1;
    }
  }

  public synchronized RequestEntry requestSent(String id, Map<String, String> metadata, byte[] jpeg) {
    FrameEntry f = framesById.get(frameIdOf(id));
    RequestEntry r = new RequestEntry(requests.size() + 1, id, f == null ? -1 : f.index, now(), jpeg, metadata);
    requests.add(r);
    requestsById.put(id, r);
    return r;
  }

  /**
   * The transport's answer for {@code id}, just before it is pushed to the engine on this same
   * thread: the engine's report that follows on this thread belongs to this request.
   */
  public synchronized void answered(String id, int code, String body, double roundTrip) {
    RequestEntry r = requestsById.get(id);
    if (r == null) return;
    r.answeredAt = now();
    r.code = code;
    r.body = body;
    r.roundTrip = roundTrip;
    answering.set(r);
  }

  /** The request whose report arrives on this thread: the one answered here, else the oldest open one. */
  private RequestEntry reportTarget() {
    RequestEntry r = answering.get();
    answering.remove();
    if (r != null && !r.reported) return r;
    for (RequestEntry e : requests) {
      if (!e.reported) return e;
    }
    return null;
  }

  public synchronized RequestEntry decoded(List<Result> results, String queryId, boolean isFinal, List<String> accumulated) {
    RequestEntry r = reportTarget();
    if (r == null) {
      reportsWithoutRequest++;
      return null;
    }
    r.reported = true;
    r.decoded = true;
    r.results = results;
    r.queryId = queryId;
    r.finalAccumulation = isFinal;
    r.accumulated = accumulated;
    return r;
  }

  public synchronized RequestEntry serverError(int status, int code) {
    RequestEntry r = reportTarget();
    if (r == null) {
      reportsWithoutRequest++;
      return null;
    }
    r.reported = true;
    r.errorStatus = status;
    r.errorCode = code;
    return r;
  }

  public synchronized List<FrameEntry> frames() {
    return new ArrayList<>(frames);
  }

  public synchronized List<RequestEntry> requests() {
    return new ArrayList<>(requests);
  }

  public synchronized int openRequests() {
    int n = 0;
    for (RequestEntry r : requests) {
      if (!r.reported) n++;
    }
    return n;
  }

  public synchronized int reportsWithoutRequest() {
    return reportsWithoutRequest;
  }
}
