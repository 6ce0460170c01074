package com.orza.vs.mobile.library.http;

import com.orza.vs.mobile.library.impl.jni.ByteArray;
import com.orza.vs.mobile.library.impl.jni.MapOfStringToString;
import com.orza.vs.mobile.library.impl.jni.ServerDelegate;
import com.orza.vs.mobile.library.impl.jni.ServerRequest;
import com.orza.vs.mobile.library.impl.jni.ServerResponse;
import com.orza.vs.mobile.library.impl.jni.VectorOfString;
import java.io.Closeable;
import java.net.MalformedURLException;
import java.net.URL;
import java.util.ArrayList;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.RejectedExecutionException;
import java.util.concurrent.ThreadFactory;
import java.util.concurrent.ThreadPoolExecutor;
import java.util.concurrent.TimeUnit;
import java.util.concurrent.atomic.AtomicInteger;

/**
 * The reference HTTP transport for the visual search module: hand an instance to
 * {@code TovraStateEngineFacade.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, delegate)}.
 *
 * <p>For each request the engine sends, {@link #sendServerRequestImpl} copies the request id,
 * its parameters, its metadata and the JPEG bytes, and returns at once; one of the delegate's
 * own threads then posts them with {@link VisualSearchHttpClient} (multipart/form-data: the
 * JPEG as part "file", the parameter "vsearch_params_json" and every metadata entry as form
 * fields) and pushes a {@link ServerResponse} with:
 * <ul>
 *   <li>{@code id}: the request's id;</li>
 *   <li>{@code responseCode}: the HTTP status, or, when no HTTP answer came,
 *       {@link VisualSearchHttpClient#CODE_CONNECTION_FAILED} (-1: refused, unreachable,
 *       broken), {@link VisualSearchHttpClient#CODE_TIMEOUT} (-2: connect or read timeout) or
 *       {@link VisualSearchHttpClient#CODE_CLOSED} (-3: the delegate was closed first);</li>
 *   <li>{@code responseStr}: the reply body (for negative codes, a description of the failure);</li>
 *   <li>{@code roundtripTime}: the measured round trip in <b>seconds</b>.</li>
 * </ul>
 * The engine reports every code other than 200 to the event delegate's
 * {@code didReceiveServerError} with that code. Every request is answered exactly once, so the
 * engine's visual search job never waits for ever, and no exception reaches the engine.
 *
 * <p>Lifetime: the engine holds this object through a weak reference; keep it reachable for as
 * long as the engine may use it. Call {@link #close()} after stopping the engine and before
 * {@code delete()}: it answers queued requests with code -3, breaks requests in flight, and waits
 * (up to the timeouts) until the delegate's threads have pushed their last response.
 */
public class HttpServerDelegate extends ServerDelegate implements Closeable {
  public static final int DEFAULT_CONNECT_TIMEOUT_MS = 5000;
  public static final int DEFAULT_READ_TIMEOUT_MS = 15000;

  /** Observes the exchanges, for logs and tools. Methods run on the threads named below. */
  public abstract static class Listener {
    /** A request was copied and queued (the engine's thread). */
    public void onRequest(String id, Map<String, String> params, Map<String, String> metadata, byte[] jpeg) {}

    /** The answer is about to be pushed to the engine (a transport thread). */
    public void onResponse(String id, VisualSearchHttpClient.Exchange exchange) {}
  }

  private final VisualSearchHttpClient client;
  private final ThreadPoolExecutor executor;
  private final int closeWaitMs;
  private volatile Listener listener;

  /** A transport to {@code url} with the default timeouts (5 s connect, 15 s read). */
  public HttpServerDelegate(String url) throws MalformedURLException {
    this(url, DEFAULT_CONNECT_TIMEOUT_MS, DEFAULT_READ_TIMEOUT_MS);
  }

  /**
   * @param url the service, for example {@code http://10.0.2.2:8080/vsearch}
   * @param connectTimeoutMs connect timeout in milliseconds
   * @param readTimeoutMs read timeout in milliseconds (time allowed between bytes of the reply)
   */
  public HttpServerDelegate(String url, int connectTimeoutMs, int readTimeoutMs) throws MalformedURLException {
    this(url, connectTimeoutMs, readTimeoutMs, 2);
  }

  /** As above, with {@code threads} concurrent requests at most (at least 1). */
  public HttpServerDelegate(String url, int connectTimeoutMs, int readTimeoutMs, int threads)
      throws MalformedURLException {
    super();
    this.client = new VisualSearchHttpClient(new URL(url), connectTimeoutMs, readTimeoutMs);
    this.closeWaitMs = Math.max(1, connectTimeoutMs) + Math.max(1, readTimeoutMs) + 1000;
    final AtomicInteger count = new AtomicInteger();
    int n = Math.max(1, threads);
    this.executor = new ThreadPoolExecutor(n, n, 30, TimeUnit.SECONDS, new LinkedBlockingQueue<Runnable>(),
        new ThreadFactory() {
          @Override
          public Thread newThread(Runnable r) {
            Thread t = new Thread(r, "vs-http-" + count.incrementAndGet());
            t.setDaemon(true);
            return t;
          }
        });
    this.executor.allowCoreThreadTimeOut(true);
  }

  public VisualSearchHttpClient client() {
    return client;
  }

  public void setListener(Listener l) {
    listener = l;
  }

  /** The transfer, called by the engine on its own thread: copies the request and queues it. */
  @Override
  public boolean sendServerRequestImpl(ServerRequest request) {
    String id = "";
    try {
      // The request belongs to the engine and is reused after this call: copy all of it now.
      id = request.getId();
      Map<String, String> params = copy(request.getParams());
      Map<String, String> metadata = copy(request.getMetadata());
      ByteArray data = request.getData();
      byte[] jpeg = data == null ? new byte[0] : data.getData();
      if (jpeg == null) jpeg = new byte[0];
      Listener l = listener;
      if (l != null) {
        try {
          l.onRequest(id, params, metadata, jpeg);
        } catch (RuntimeException ignored) {
          // A listener's fault must not break the transfer.
        }
      }
      final Post post = new Post(id, params, metadata, jpeg);
      if (client.isClosed()) {
        answerLater(id, new VisualSearchHttpClient.Exchange(VisualSearchHttpClient.CODE_CLOSED, "transport: closed", 0.0));
        return false;
      }
      try {
        executor.execute(post);
      } catch (RejectedExecutionException e) {
        answerLater(id, new VisualSearchHttpClient.Exchange(VisualSearchHttpClient.CODE_CLOSED, "transport: closed", 0.0));
        return false;
      }
      return true;
    } catch (Throwable t) {
      // Nothing may be thrown into the engine; it still needs an answer for this id.
      answerLater(id, new VisualSearchHttpClient.Exchange(VisualSearchHttpClient.CODE_CONNECTION_FAILED,
          "transport: could not copy the request (" + t + ")", 0.0));
      return false;
    }
  }

  /**
   * Stops the transport: no new request is sent (each is answered with code -3), queued ones
   * are answered with -3, connections in flight are broken (their answer is -3), and the call
   * waits until every answer has been pushed. Idempotent.
   */
  @Override
  public void close() {
    client.close();
    executor.shutdown();
    List<Runnable> queued = new ArrayList<Runnable>();
    executor.getQueue().drainTo(queued);
    for (Runnable r : queued) {
      if (r instanceof Post) ((Post) r).answer(new VisualSearchHttpClient.Exchange(
          VisualSearchHttpClient.CODE_CLOSED, "transport: closed before sending", 0.0));
    }
    try {
      executor.awaitTermination(closeWaitMs, TimeUnit.MILLISECONDS);
    } catch (InterruptedException e) {
      Thread.currentThread().interrupt();
    }
  }

  /** Same as {@link #close()}. */
  public void shutdown() {
    close();
  }

  private static Map<String, String> copy(MapOfStringToString map) {
    Map<String, String> out = new LinkedHashMap<String, String>();
    if (map == null) return out;
    VectorOfString keys = map.getKeys();
    try {
      int n = keys.size();
      for (int i = 0; i < n; i++) {
        String k = keys.get(i);
        out.put(k, map.get(k));
      }
    } finally {
      keys.delete();
    }
    return out;
  }

  /** Pushes an answer from a short-lived thread: never from inside sendServerRequestImpl. */
  private void answerLater(final String id, final VisualSearchHttpClient.Exchange exchange) {
    Thread t = new Thread(new Runnable() {
      @Override
      public void run() {
        push(id, exchange);
      }
    }, "vs-http-late");
    t.setDaemon(true);
    t.start();
  }

  /** Builds the ServerResponse for one exchange and pushes it to the engine. */
  void push(String id, VisualSearchHttpClient.Exchange exchange) {
    Listener l = listener;
    if (l != null) {
      try {
        l.onResponse(id, exchange);
      } catch (RuntimeException ignored) {
        // A listener's fault must not keep the engine from its answer.
      }
    }
    ServerResponse response = new ServerResponse();
    try {
      response.setId(id);
      response.setResponseCode(exchange.code);
      response.setResponseStr(exchange.body == null ? "" : exchange.body);
      response.setRoundtripTime(exchange.seconds);
      pushServerResponse(response);
    } catch (RuntimeException e) {
      // The delegate was deleted (its native object is gone) or the event delegate threw:
      // there is nobody left to tell; keep the transport thread alive.
    } finally {
      response.delete();
    }
  }

  /** One queued request. */
  private final class Post implements Runnable {
    final String id;
    final Map<String, String> params;
    final Map<String, String> metadata;
    final byte[] jpeg;
    private final AtomicInteger answered = new AtomicInteger();

    Post(String id, Map<String, String> params, Map<String, String> metadata, byte[] jpeg) {
      this.id = id;
      this.params = params;
      this.metadata = metadata;
      this.jpeg = jpeg;
    }

    @Override
    public void run() {
      answer(client.post(id, params, metadata, jpeg));
    }

    /** Pushes the answer unless this request was already answered. */
    void answer(VisualSearchHttpClient.Exchange exchange) {
      if (answered.compareAndSet(0, 1)) push(id, exchange);
    }
  }
}
