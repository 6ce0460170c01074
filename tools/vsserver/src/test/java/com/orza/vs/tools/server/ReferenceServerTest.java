package com.orza.vs.tools.server;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertNotEquals;
import static org.junit.jupiter.api.Assertions.assertNotNull;
import static org.junit.jupiter.api.Assertions.assertThrows;
import static org.junit.jupiter.api.Assertions.assertTrue;

import java.awt.Color;
import java.awt.Graphics2D;
import java.awt.image.BufferedImage;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.InputStream;
import java.io.OutputStream;
import java.net.HttpURLConnection;
import java.net.URL;
import java.nio.charset.StandardCharsets;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.Map;
import java.util.Random;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.AfterEach;
import org.junit.jupiter.api.BeforeEach;
import org.junit.jupiter.api.Test;

/** The server over real HTTP on loopback. */
class ReferenceServerTest {
  static final String PARAMS = "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}";

  ReferenceServer server;
  final List<String> log = Collections.synchronizedList(new ArrayList<>());

  @BeforeEach
  void start() throws IOException {
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.accumulate = 2;
    o.maxBodyBytes = 2 * 1024 * 1024;
    o.log = log::add;
    server = new ReferenceServer(o).start();
  }

  @AfterEach
  void stop() {
    server.close();
  }

  /** A 320x240 JPEG: smooth grey with a noisy block at (200, 40) of 64x64. */
  static byte[] jpeg() throws IOException {
    BufferedImage img = new BufferedImage(320, 240, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = img.createGraphics();
    g.setColor(new Color(120, 130, 140));
    g.fillRect(0, 0, 320, 240);
    g.dispose();
    Random rnd = new Random(1);
    for (int y = 40; y < 104; y++) {
      for (int x = 200; x < 264; x++) img.setRGB(x, y, rnd.nextBoolean() ? 0x101010 : 0xf0f0f0);
    }
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    ImageIO.write(img, "jpg", out);
    return out.toByteArray();
  }

  static final class Reply {
    int code;
    String body;
    String contentType;
  }

  static byte[] form(String params, String lastQueryId, byte[] file) {
    ByteArrayOutputStream b = new ByteArrayOutputStream();
    StringBuilder s = new StringBuilder();
    if (params != null) {
      s.append("--bnd\r\nContent-Disposition: form-data; name=\"vsearch_params_json\"\r\n\r\n").append(params).append("\r\n");
    }
    s.append("--bnd\r\nContent-Disposition: form-data; name=\"orientation\"\r\n\r\n90\r\n");
    if (lastQueryId != null) {
      s.append("--bnd\r\nContent-Disposition: form-data; name=\"lastQueryId\"\r\n\r\n").append(lastQueryId).append("\r\n");
    }
    b.writeBytes(s.toString().getBytes(StandardCharsets.UTF_8));
    if (file != null) {
      b.writeBytes("--bnd\r\nContent-Disposition: form-data; name=\"file\"; filename=\"f.jpg\"\r\n\r\n".getBytes(StandardCharsets.UTF_8));
      b.writeBytes(file);
      b.writeBytes("\r\n".getBytes(StandardCharsets.UTF_8));
    }
    b.writeBytes("--bnd--\r\n".getBytes(StandardCharsets.UTF_8));
    return b.toByteArray();
  }

  Reply send(String method, String path, byte[] body) throws IOException {
    HttpURLConnection c = (HttpURLConnection) new URL(server.baseUrl() + path).openConnection();
    c.setConnectTimeout(2000);
    c.setReadTimeout(5000);
    c.setRequestMethod(method);
    if (body != null) {
      c.setDoOutput(true);
      c.setRequestProperty("Content-Type", "multipart/form-data; boundary=bnd");
      try (OutputStream os = c.getOutputStream()) {
        os.write(body);
      }
    }
    Reply r = new Reply();
    r.code = c.getResponseCode();
    r.contentType = c.getContentType();
    InputStream in = r.code >= 400 ? c.getErrorStream() : c.getInputStream();
    r.body = in == null ? "" : new String(in.readAllBytes(), StandardCharsets.UTF_8);
    return r;
  }

  @Test
  void searchAnswersBoxAndTermsWithFreshIdsAndSessions() throws IOException {
    Reply a = send("POST", "/vsearch", form(PARAMS, null, jpeg()));
    assertEquals(200, a.code, a.body);
    assertTrue(a.contentType.startsWith("application/json"));
    Object doc = Json.parse(a.body);
    String q1 = (String) Json.member(doc, "queryId");
    assertNotNull(q1);
    Object quill = Json.member(doc, "quillmark");
    List<?> results = (List<?>) Json.member(quill, "searchResult");
    assertEquals(2, results.size());
    Object box = results.get(0);
    assertEquals("BoundingBox", Json.member(box, "contentType"));
    Object bb = Json.member(Json.member(box, "properties"), "boundingBox");
    double tlx = (Double) Json.member(bb, "tlx"), tly = (Double) Json.member(bb, "tly");
    double brx = (Double) Json.member(bb, "brx"), bry = (Double) Json.member(bb, "bry");
    assertTrue(Math.abs(tlx - 200) <= 10 && Math.abs(tly - 40) <= 10, bb.toString());
    assertTrue(Math.abs(brx - 264) <= 10 && Math.abs(bry - 104) <= 10, bb.toString());
    assertEquals(tlx, Json.member(bb, "blx"));
    assertEquals(brx, Json.member(bb, "trx"));
    Object terms = results.get(1);
    assertEquals("SearchTerms", Json.member(terms, "contentType"));
    assertTrue(((String) Json.member(terms, "content")).startsWith("texture energy "), terms.toString());
    assertEquals("90", Json.member(Json.member(terms, "properties"), "rotation"));
    Object meta = Json.member(quill, "resultMetadata");
    assertEquals(Boolean.FALSE, Json.member(meta, "finalAccumulation"));
    assertEquals(List.of(q1), Json.member(meta, "accumulatedQueries"));

    // The next query of the chain accumulates and, at the limit of 2, is final.
    Reply b = send("POST", "/vsearch", form(PARAMS, q1, jpeg()));
    Object doc2 = Json.parse(b.body);
    String q2 = (String) Json.member(doc2, "queryId");
    assertNotEquals(q1, q2);
    Object meta2 = Json.member(Json.member(doc2, "quillmark"), "resultMetadata");
    assertEquals(Boolean.TRUE, Json.member(meta2, "finalAccumulation"));
    assertEquals(List.of(q1, q2), Json.member(meta2, "accumulatedQueries"));

    assertEquals(2, server.requestCount());
    assertTrue(log.get(0).contains("POST /vsearch -> 200 " + q1), log.get(0));
  }

  @Test
  void testHooksFailAsAsked() throws IOException {
    Reply e500 = send("POST", "/test/500", form(PARAMS, null, jpeg()));
    assertEquals(500, e500.code);
    Reply notJson = send("POST", "/test/notjson", form(PARAMS, null, jpeg()));
    assertEquals(200, notJson.code);
    assertThrows(IllegalArgumentException.class, () -> Json.parse(notJson.body));
    long t0 = System.nanoTime();
    Reply slow = send("POST", "/test/slow/300", form(PARAMS, null, jpeg()));
    long ms = (System.nanoTime() - t0) / 1_000_000;
    assertEquals(200, slow.code);
    assertTrue(ms >= 290, "answered after " + ms + " ms");
    assertNotNull(Json.member(Json.parse(slow.body), "queryId"));
    assertEquals(404, send("POST", "/test/slow/abc", form(PARAMS, null, jpeg())).code);
    assertEquals(404, send("POST", "/test/nothing", form(PARAMS, null, jpeg())).code);
  }

  @Test
  void badRequestsGetClearErrors() throws IOException {
    assertEquals(404, send("POST", "/elsewhere", form(PARAMS, null, jpeg())).code);
    assertEquals(405, send("GET", "/vsearch", null).code);
    Reply help = send("GET", "/", null);
    assertEquals(200, help.code);
    assertTrue(help.body.contains("POST /vsearch"));

    Reply noFile = send("POST", "/vsearch", form(PARAMS, null, null));
    assertEquals(400, noFile.code);
    assertTrue(noFile.body.contains("missing file part"), noFile.body);
    assertEquals(400, send("POST", "/vsearch", form(null, null, jpeg())).code);
    assertEquals(400, send("POST", "/vsearch", form("{not json", null, jpeg())).code);
    assertEquals(400, send("POST", "/vsearch", form("{\"quillmark\":{}}", null, jpeg())).code);
    assertEquals(415, send("POST", "/vsearch", form(PARAMS, null, "not an image".getBytes(StandardCharsets.UTF_8))).code);
    assertEquals(400, send("POST", "/vsearch", "garbage".getBytes(StandardCharsets.UTF_8)).code);
    // Bodies over the limit are refused.
    assertEquals(413, send("POST", "/vsearch", form(PARAMS, null, new byte[3 * 1024 * 1024])).code);
    // Error answers are JSON documents with an "error" member.
    Map<?, ?> err = (Map<?, ?>) Json.parse(noFile.body);
    assertTrue(err.containsKey("error"));
  }

  @Test
  void aSmallFileClaimingAHugeFrameIsRefusedBeforeDecoding() throws IOException {
    byte[] j = jpeg();
    // Patch the baseline frame header (SOF0: FF C0, length, precision, height, width).
    for (int i = 0; i + 8 < j.length; i++) {
      if ((j[i] & 0xff) == 0xff && (j[i + 1] & 0xff) == 0xc0) {
        j[i + 5] = (byte) 0xea; // height 60000
        j[i + 6] = (byte) 0x60;
        j[i + 7] = (byte) 0xea; // width 60000
        j[i + 8] = (byte) 0x60;
        break;
      }
    }
    Reply r = send("POST", "/vsearch", form(PARAMS, null, j));
    assertEquals(413, r.code, r.body);
    assertTrue(r.body.contains("too large"), r.body);
  }

  @Test
  void commandLineOptions() {
    ReferenceServer.Options o = ReferenceServer.parseArgs(
        new String[] {"--port", "8080", "--delay", "20", "--fail", "notjson", "--accumulate", "3", "--host", "::1"}, System.out);
    assertEquals(8080, o.port);
    assertEquals(20, o.delayMs);
    assertEquals("notjson", o.fail);
    assertEquals(3, o.accumulate);
    assertEquals("::1", o.host);
    assertEquals(null, ReferenceServer.parseArgs(new String[] {"--help"}, System.out));
    for (String[] bad : new String[][] {{"--port"}, {"--port", "x"}, {"--port", "70000"}, {"--fail", "404"}, {"--bogus"}}) {
      assertThrows(IllegalArgumentException.class, () -> ReferenceServer.parseArgs(bad, System.out), String.join(" ", bad));
    }
  }
}
