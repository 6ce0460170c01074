package com.example.scan;

import com.orza.vs.mobile.library.impl.jni.ResponseStatus;
import com.orza.vs.mobile.library.session.SearchResults;
import com.orza.vs.mobile.library.session.SessionListener;
import com.orza.vs.mobile.library.session.VisualSearchSession;
import com.sun.net.httpserver.HttpServer;
import java.io.ByteArrayOutputStream;
import java.io.InputStream;
import java.net.InetSocketAddress;
import java.nio.ByteBuffer;
import java.nio.charset.StandardCharsets;
import java.util.concurrent.ArrayBlockingQueue;
import java.util.concurrent.TimeUnit;

/**
 * One scan as an application makes it: a local HTTP search service, a session built with its
 * URL, camera planes in, the answer out. Exits 0 when the service's answer came back whole.
 */
public final class ConsumerScan {
  public static void main(String[] args) throws Exception {
    HttpServer server = HttpServer.create(new InetSocketAddress("127.0.0.1", 0), 0);
    server.createContext("/vsearch", exchange -> {
      ByteArrayOutputStream body = new ByteArrayOutputStream();
      InputStream in = exchange.getRequestBody();
      for (int b; (b = in.read()) >= 0;) body.write(b);
      String text = new String(body.toByteArray(), StandardCharsets.ISO_8859_1);
      boolean ok = text.contains("name=\"vsearch_params_json\"") && text.contains("\u00ff\u00d8\u00ff");
      byte[] reply = (ok ? "{\"queryId\":\"c-1\",\"quillmark\":{\"searchResult\":[{\"content\":\"teapot\","
          + "\"contentType\":\"PIDN\",\"properties\":{}}],\"resultMetadata\":{\"finalAccumulation\":true}}}"
          : "no JPEG or parameters").getBytes(StandardCharsets.UTF_8);
      exchange.sendResponseHeaders(ok ? 200 : 400, reply.length);
      exchange.getResponseBody().write(reply);
      exchange.close();
    });
    server.start();
    ArrayBlockingQueue<Object> answers = new ArrayBlockingQueue<Object>(16);
    int w = 320;
    int h = 240;
    ByteBuffer frame = ByteBuffer.allocateDirect(w * h * 3 / 2);  // NV21, as a camera's planes
    for (int i = 0; i < frame.capacity(); i++) frame.put(i, (byte) (i < w * h ? i * 7919 >> 3 : 128));
    frame.position(w * h + 1);
    ByteBuffer u = frame.slice();
    frame.position(w * h);
    ByteBuffer v = frame.slice();
    v.limit(w * h / 2 - 1);
    frame.position(0).limit(w * h);
    ByteBuffer y = frame.slice();
    Object answer = null;
    try (VisualSearchSession session = VisualSearchSession.builder()
        .serverUrl("http://127.0.0.1:" + server.getAddress().getPort() + "/vsearch")
        .listener(new SessionListener() {
          @Override public void onResults(SearchResults results) { answers.offer(results); }

          @Override public void onServerError(ResponseStatus status, int code) { answers.offer(status + " " + code); }
        })
        .build()) {
      session.start();
      for (int i = 0; i < 600 && answer == null; i++) {
        session.processYuv420(w, h, y, w, u, v, w, 2, i * 33_000_000L);
        answer = answers.poll(50, TimeUnit.MILLISECONDS);
      }
    } finally {
      server.stop(0);
    }
    boolean ok = answer instanceof SearchResults && ((SearchResults) answer).queryId().equals("c-1")
        && ((SearchResults) answer).results().get(0).content().equals("teapot");
    System.out.println("consumer scan: " + (ok ? "PASS " : "FAIL ") + answer);
    System.exit(ok ? 0 : 1);
  }
}
