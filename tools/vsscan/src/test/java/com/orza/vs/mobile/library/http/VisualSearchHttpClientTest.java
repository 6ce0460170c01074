package com.orza.vs.mobile.library.http;

import static org.junit.jupiter.api.Assertions.*;

import com.orza.vs.tools.server.Multipart;
import com.sun.net.httpserver.Headers;
import com.sun.net.httpserver.HttpHandler;
import com.sun.net.httpserver.HttpServer;
import java.io.IOException;
import java.io.OutputStream;
import java.net.InetAddress;
import java.net.InetSocketAddress;
import java.net.URL;
import java.nio.charset.StandardCharsets;
import java.util.Map;
import java.util.concurrent.atomic.AtomicReference;
import org.junit.jupiter.api.Test;

/** The transport's HTTP exchange over loopback, without the engine. */
class VisualSearchHttpClientTest {
  /** Posts one request to a loopback server that answers it with {@code handler}. */
  static VisualSearchHttpClient.Exchange post(HttpHandler handler, int maxReplyBytes, String id, Map<String, String> params,
                                              Map<String, String> metadata, byte[] jpeg) throws IOException {
    HttpServer server = HttpServer.create(new InetSocketAddress(InetAddress.getLoopbackAddress(), 0), 4);
    server.createContext("/", handler);
    server.start();
    try {
      VisualSearchHttpClient c = new VisualSearchHttpClient(new URL("http://127.0.0.1:" + server.getAddress().getPort() + "/vs"), 1000, 2000);
      c.setMaxReplyBytes(maxReplyBytes);
      return c.post(id, params, metadata, jpeg);
    } finally {
      server.stop(0);
    }
  }

  @Test
  void wireFormatIsTheMultipartFormTheServerReads() throws IOException {
    AtomicReference<byte[]> body = new AtomicReference<>();
    AtomicReference<Headers> headers = new AtomicReference<>();
    byte[] jpeg = new byte[5000];
    for (int i = 0; i < jpeg.length; i++) jpeg[i] = (byte) (i * 7); // includes CR, LF and '-'
    String params = "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}";
    VisualSearchHttpClient.Exchange e = post(ex -> {
      headers.set(ex.getRequestHeaders());
      body.set(ex.getRequestBody().readAllBytes());
      byte[] reply = "{\"ok\":\"\u00e9\"}".getBytes(StandardCharsets.UTF_8);
      ex.getResponseHeaders().set("Content-Type", "application/json; charset=utf-8");
      ex.sendResponseHeaders(201, reply.length);
      try (OutputStream os = ex.getResponseBody()) {
        os.write(reply);
      }
    }, 1000, "TovraStateEngine-1-2\r\nX: y", Map.of("vsearch_params_json", params),
        Map.of("version", "0.6", "orientation", "90", "na\"me", "\u00fcmlaut"), jpeg);
    assertEquals(201, e.code);
    assertEquals("{\"ok\":\"\u00e9\"}", e.body);
    assertTrue(e.seconds > 0 && e.seconds < 2, "round trip in seconds: " + e.seconds);
    assertEquals("TovraStateEngine-1-2  X: y", headers.get().getFirst("X-Request-Id"));
    Multipart m = Multipart.parse(body.get(), Multipart.boundaryOf(headers.get().getFirst("Content-Type")));
    assertEquals(Map.of("vsearch_params_json", params, "version", "0.6", "orientation", "90", "na%22me", "\u00fcmlaut"), m.fields);
    assertArrayEquals(jpeg, m.files.get("file"));
  }

  @Test
  void oversizedOrUnusableAnswersFailWithoutHanging() throws IOException {
    // (A reply too slow for the read timeout: EngineOverHttpTest, through the engine.)
    assertThrows(IllegalArgumentException.class, () -> new VisualSearchHttpClient(new URL("file:///tmp/x"), 1, 1));
    VisualSearchHttpClient.Exchange e = post(ex -> {
      ex.getRequestBody().readAllBytes();
      ex.sendResponseHeaders(200, 0);
      try (OutputStream os = ex.getResponseBody()) {
        os.write(new byte[300_000]);
      } catch (IOException ignored) {
        // the client hangs up once it has seen enough
      }
    }, 100_000, "a", Map.of(), Map.of(), new byte[1]);
    assertEquals(VisualSearchHttpClient.CODE_CONNECTION_FAILED, e.code);
    assertTrue(e.body.contains("longer than 100000"), e.body);
  }
}
