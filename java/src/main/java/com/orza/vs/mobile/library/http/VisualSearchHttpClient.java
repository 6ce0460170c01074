package com.orza.vs.mobile.library.http;

import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.InputStream;
import java.io.InterruptedIOException;
import java.io.OutputStream;
import java.io.UnsupportedEncodingException;
import java.net.HttpURLConnection;
import java.net.SocketTimeoutException;
import java.net.URL;
import java.nio.charset.Charset;
import java.security.SecureRandom;
import java.util.Collections;
import java.util.Locale;
import java.util.Map;
import java.util.Set;
import java.util.concurrent.ConcurrentHashMap;

/**
 * Posts one visual search request over HTTP and reads the answer; used by
 * {@link HttpServerDelegate}, usable on its own.
 *
 * <p>The request is {@code multipart/form-data}: every parameter and every metadata entry as a
 * form field of the same name (parameters first), then the JPEG as the part named "file"
 * (filename "frame.jpg", type image/jpeg). The request id travels in the header
 * {@code X-Request-Id}.
 *
 * <p>{@link #post} never throws: a failure to talk HTTP at all becomes an {@link Exchange} with
 * one of the negative codes below, so that it cannot be mistaken for a status sent by a server.
 * Only {@code HttpURLConnection} is used, so the class works on Android as it does on a desktop.
 */
public final class VisualSearchHttpClient {
  /** No HTTP answer: connection refused, host unknown or unreachable, connection broken, reply unreadable. */
  public static final int CODE_CONNECTION_FAILED = -1;
  /** The connect or read timeout expired. */
  public static final int CODE_TIMEOUT = -2;
  /** The client was closed while the request was waiting or in flight. */
  public static final int CODE_CLOSED = -3;

  /** Replies longer than this are refused (code {@link #CODE_CONNECTION_FAILED}) rather than held in memory. */
  public static final int DEFAULT_MAX_REPLY_BYTES = 8 * 1024 * 1024;

  /** The outcome of one request. */
  public static final class Exchange {
    /** HTTP status, or one of the negative CODE_ values. */
    public final int code;
    /** The reply body as text (for negative codes, a description of the failure). */
    public final String body;
    /** Round trip from the start of the connection to the last byte of the reply, in seconds. */
    public final double seconds;

    public Exchange(int code, String body, double seconds) {
      this.code = code;
      this.body = body;
      this.seconds = seconds;
    }

    @Override
    public String toString() {
      return String.format(Locale.ROOT, "%d in %.3f s: %s", code, seconds, body);
    }
  }

  private final URL url;
  private final int connectTimeoutMs;
  private final int readTimeoutMs;
  private volatile int maxReplyBytes = DEFAULT_MAX_REPLY_BYTES;
  private volatile boolean closed;
  private final Set<HttpURLConnection> active =
      Collections.newSetFromMap(new ConcurrentHashMap<HttpURLConnection, Boolean>());
  private final SecureRandom random = new SecureRandom();

  /**
   * @param url the service, for example {@code http://127.0.0.1:8080/vsearch} (http or https)
   * @param connectTimeoutMs connect timeout in milliseconds (at least 1)
   * @param readTimeoutMs timeout for each read of the reply in milliseconds (at least 1)
   */
  public VisualSearchHttpClient(URL url, int connectTimeoutMs, int readTimeoutMs) {
    String protocol = url.getProtocol();
    if (!"http".equals(protocol) && !"https".equals(protocol)) {
      throw new IllegalArgumentException("not an http(s) URL: " + url);
    }
    this.url = url;
    // Zero would mean "wait forever" to HttpURLConnection; a transport must never hang.
    this.connectTimeoutMs = Math.max(1, connectTimeoutMs);
    this.readTimeoutMs = Math.max(1, readTimeoutMs);
  }

  public URL url() {
    return url;
  }

  public void setMaxReplyBytes(int bytes) {
    maxReplyBytes = Math.max(1, bytes);
  }

  /**
   * Refuses new requests and breaks the connections of requests in flight, which then end with
   * {@link #CODE_CLOSED}.
   */
  public void close() {
    closed = true;
    for (HttpURLConnection c : active) c.disconnect();
  }

  public boolean isClosed() {
    return closed;
  }

  /** Sends one request and waits for its answer; never throws. */
  public Exchange post(String requestId, Map<String, String> params, Map<String, String> metadata, byte[] jpeg) {
    long start = System.nanoTime();
    if (closed) return new Exchange(CODE_CLOSED, "transport: closed", 0.0);
    HttpURLConnection conn = null;
    boolean reusable = false;
    try {
      String boundary = "OrzaVSFormBoundary" + Long.toHexString(random.nextLong() & Long.MAX_VALUE);
      byte[] body = multipartBody(boundary, params, metadata, jpeg);
      conn = (HttpURLConnection) url.openConnection();
      active.add(conn);
      if (closed) throw new IOException("closed");
      conn.setConnectTimeout(connectTimeoutMs);
      conn.setReadTimeout(readTimeoutMs);
      conn.setUseCaches(false);
      conn.setInstanceFollowRedirects(false);
      conn.setDoOutput(true);
      conn.setRequestMethod("POST");
      conn.setFixedLengthStreamingMode(body.length);
      conn.setRequestProperty("Content-Type", "multipart/form-data; boundary=" + boundary);
      conn.setRequestProperty("Accept", "application/json");
      if (requestId != null) conn.setRequestProperty("X-Request-Id", headerSafe(requestId));
      OutputStream out = conn.getOutputStream();
      try {
        out.write(body);
      } finally {
        out.close();
      }
      int code = conn.getResponseCode();
      if (code < 0) {
        return new Exchange(CODE_CONNECTION_FAILED, "transport: the reply is not HTTP", elapsed(start));
      }
      InputStream in = code >= 400 ? conn.getErrorStream() : conn.getInputStream();
      String text = in == null ? "" : readAll(in, charsetOf(conn.getContentType()));
      reusable = true; // the reply was read to its end: the connection may serve the next request
      return new Exchange(code, text, elapsed(start));
    } catch (SocketTimeoutException e) {
      return new Exchange(closed ? CODE_CLOSED : CODE_TIMEOUT, "transport: timed out (" + describe(e) + ") after "
          + String.format(Locale.ROOT, "%.3f s", elapsed(start)) + " posting to " + url, elapsed(start));
    } catch (InterruptedIOException e) {
      return new Exchange(closed ? CODE_CLOSED : CODE_TIMEOUT, "transport: interrupted (" + describe(e) + ")", elapsed(start));
    } catch (IOException | RuntimeException e) {
      // RuntimeException: HttpURLConnection implementations throw unchecked exceptions on some
      // malformed replies; the transport must report them like any other failure.
      return new Exchange(closed ? CODE_CLOSED : CODE_CONNECTION_FAILED,
          "transport: " + (closed ? "closed" : "no answer from " + url) + " (" + describe(e) + ")", elapsed(start));
    } finally {
      if (conn != null) {
        active.remove(conn);
        if (!reusable || closed) conn.disconnect();
      }
    }
  }

  private static String describe(Throwable e) {
    String m = e.getMessage();
    return e.getClass().getSimpleName() + (m == null ? "" : ": " + m);
  }

  private static double elapsed(long startNanos) {
    return (System.nanoTime() - startNanos) / 1e9;
  }

  private String readAll(InputStream in, Charset charset) throws IOException {
    try {
      ByteArrayOutputStream buf = new ByteArrayOutputStream();
      byte[] chunk = new byte[8192];
      int limit = maxReplyBytes;
      int n;
      while ((n = in.read(chunk)) > 0) {
        if (buf.size() + n > limit) throw new IOException("reply longer than " + limit + " bytes");
        buf.write(chunk, 0, n);
      }
      return new String(buf.toByteArray(), charset);
    } finally {
      in.close();
    }
  }

  /** The charset parameter of a Content-Type header; UTF-8 when absent or unknown. */
  static Charset charsetOf(String contentType) {
    Charset utf8 = Charset.forName("UTF-8");
    if (contentType == null) return utf8;
    for (String part : contentType.split(";")) {
      String p = part.trim();
      if (p.toLowerCase(Locale.ROOT).startsWith("charset=")) {
        String name = p.substring("charset=".length()).trim().replace("\"", "");
        try {
          return Charset.forName(name);
        } catch (RuntimeException e) {
          return utf8;
        }
      }
    }
    return utf8;
  }

  /** Header values may not contain line breaks. */
  private static String headerSafe(String value) {
    return value.replace('\r', ' ').replace('\n', ' ');
  }

  /** Form field names are quoted; quotes and line breaks in them are percent-encoded. */
  private static String fieldName(String name) {
    return name.replace("\"", "%22").replace("\r", "%0D").replace("\n", "%0A");
  }

  /** The multipart body: fields from both maps in order, then the "file" part. */
  static byte[] multipartBody(String boundary, Map<String, String> params, Map<String, String> metadata, byte[] jpeg) {
    try {
      ByteArrayOutputStream out = new ByteArrayOutputStream((jpeg == null ? 0 : jpeg.length) + 2048);
      writeFields(out, boundary, params);
      writeFields(out, boundary, metadata);
      text(out, "--" + boundary + "\r\n");
      text(out, "Content-Disposition: form-data; name=\"file\"; filename=\"frame.jpg\"\r\n");
      text(out, "Content-Type: image/jpeg\r\n\r\n");
      if (jpeg != null) out.write(jpeg);
      text(out, "\r\n--" + boundary + "--\r\n");
      return out.toByteArray();
    } catch (IOException e) {
      throw new IllegalStateException(e); // a ByteArrayOutputStream does not fail
    }
  }

  private static void writeFields(OutputStream out, String boundary, Map<String, String> fields) throws IOException {
    if (fields == null) return;
    for (Map.Entry<String, String> e : fields.entrySet()) {
      text(out, "--" + boundary + "\r\n");
      text(out, "Content-Disposition: form-data; name=\"" + fieldName(e.getKey()) + "\"\r\n");
      text(out, "Content-Type: text/plain; charset=UTF-8\r\n\r\n");
      text(out, e.getValue() == null ? "" : e.getValue());
      text(out, "\r\n");
    }
  }

  private static void text(OutputStream out, String s) throws IOException {
    try {
      out.write(s.getBytes("UTF-8"));
    } catch (UnsupportedEncodingException e) {
      throw new IllegalStateException(e);
    }
  }
}
