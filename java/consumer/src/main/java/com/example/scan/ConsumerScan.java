package com.example.scan;

import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.session.SearchResults;
import com.orza.vs.mobile.library.session.SessionListener;
import com.orza.vs.mobile.library.session.VisualSearchSession;
import com.sun.net.httpserver.HttpServer;
import java.io.ByteArrayOutputStream;
import java.io.InputStream;
import java.io.OutputStream;
import java.net.InetSocketAddress;
import java.nio.ByteBuffer;
import java.nio.charset.StandardCharsets;
import java.util.concurrent.ArrayBlockingQueue;
import java.util.concurrent.BlockingQueue;
import java.util.concurrent.TimeUnit;

/**
 * One scan as an application makes it: a local HTTP search service, a session built with its
 * URL, camera-like frames in, the answer out. Exits 0 when the answer came back complete.
 */
public final class ConsumerScan {
  static final String REPLY = "{\"queryId\":\"consumer-1\",\"quillmark\":{\"searchResult\":["
      + "{\"content\":\"teapot\",\"contentType\":\"PIDN\",\"properties\":{}}],"
      + "\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[]}}}";

  public static void main(String[] args) throws Exception {
    HttpServer server = HttpServer.create(new InetSocketAddress("127.0.0.1", 0), 0);
    server.createContext("/vsearch", exchange -> {
      byte[] body = readAll(exchange.getRequestBody());
      String text = new String(body, StandardCharsets.ISO_8859_1);
      boolean ok = text.contains("name=\"vsearch_params_json\"") && text.contains("\u00ff\u00d8\u00ff");
      byte[] reply = (ok ? REPLY : "no JPEG or parameters").getBytes(StandardCharsets.UTF_8);
      exchange.sendResponseHeaders(ok ? 200 : 400, reply.length);
      try (OutputStream out = exchange.getResponseBody()) {
        out.write(reply);
      }
    });
    server.start();
    BlockingQueue<Object> answers = new ArrayBlockingQueue<Object>(16);
    String url = "http://127.0.0.1:" + server.getAddress().getPort() + "/vsearch";
    int width = 320;
    int height = 240;
    ByteBuffer frame = ByteBuffer.allocateDirect(width * height * 3 / 2);
    for (int i = 0; i < frame.capacity(); i++) frame.put(i, (byte) (i < width * height ? (i * 7919 >> 3) : 128));
    ByteBuffer y = slice(frame, 0, width * height);
    ByteBuffer v = slice(frame, width * height, width * height / 2 - 1);
    ByteBuffer u = slice(frame, width * height + 1, width * height / 2 - 1);
    Object answer;
    try (VisualSearchSession session = VisualSearchSession.builder()
        .serverUrl(url)
        .listener(new SessionListener() {
          @Override
          public void onResults(SearchResults results) {
            answers.offer(results);
          }

          @Override
          public void onServerError(ResponseStatus status, int responseCode) {
            answers.offer("server error " + status + " " + responseCode);
          }
        })
        .build()) {
      session.start();
      long time = System.nanoTime();
      answer = null;
      for (int i = 0; i < 600 && answer == null; i++) {
        session.processYuv420(width, height, y, width, u, v, width, 2, time + i * 33_000_000L);
        answer = answers.poll(50, TimeUnit.MILLISECONDS);
      }
    } finally {
      server.stop(0);
    }
    boolean ok = answer instanceof SearchResults
        && ((SearchResults) answer).queryId().equals("consumer-1")
        && ((SearchResults) answer).results().get(0).content().equals("teapot");
    System.out.println("consumer scan: " + (ok ? "PASS " : "FAIL ") + answer);
    System.exit(ok ? 0 : 1);
  }

  static ByteBuffer slice(ByteBuffer b, int at, int length) {
    ByteBuffer d = b.duplicate();
    d.position(at);
    d.limit(at + length);
    return d.slice();
  }

  static byte[] readAll(InputStream in) throws java.io.IOException {
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    byte[] chunk = new byte[8192];
    for (int n; (n = in.read(chunk)) > 0;) out.write(chunk, 0, n);
    return out.toByteArray();
  }
}
