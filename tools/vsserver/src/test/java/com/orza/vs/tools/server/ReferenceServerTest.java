package com.orza.vs.tools.server;

import static java.nio.charset.StandardCharsets.ISO_8859_1;
import static org.junit.jupiter.api.Assertions.*;

import java.awt.Graphics2D;
import java.awt.RenderingHints;
import java.awt.geom.AffineTransform;
import java.awt.image.BufferedImage;
import java.io.ByteArrayOutputStream;
import java.io.File;
import java.io.IOException;
import java.net.URI;
import java.net.http.HttpClient;
import java.net.http.HttpRequest;
import java.net.http.HttpRequest.BodyPublishers;
import java.net.http.HttpResponse;
import java.net.http.HttpResponse.BodyHandlers;
import java.nio.file.Files;
import java.nio.file.Path;
import java.time.Duration;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.AfterAll;
import org.junit.jupiter.api.BeforeAll;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** The server over real HTTP on loopback, recognising a small catalogue folder. */
class ReferenceServerTest {
  static final HttpClient HTTP = HttpClient.newBuilder().version(HttpClient.Version.HTTP_1_1).build();
  static final String PARAMS = "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}";

  @TempDir
  static Path tmp;
  static ReferenceServer server;
  static final List<String> log = Collections.synchronizedList(new ArrayList<>());

  /** A catalogue folder of three photographs, one with details in catalog.json. */
  @BeforeAll
  static void start() throws IOException {
    File dir = Files.createDirectory(tmp.resolve("catalog")).toFile();
    ImageIO.write(BuiltInCatalog.photo("coffee.png"), "png", new File(dir, "coffee.png"));
    ImageIO.write(BuiltInCatalog.photo("chelsea.png"), "jpg", new File(dir, "chelsea.jpeg"));
    ImageIO.write(BuiltInCatalog.photo("camera.png"), "png", new File(dir, "camera.png"));
    Files.writeString(new File(dir, "catalog.json").toPath(),
        "{\"coffee\": {\"title\": \"Espresso\", \"searchTerms\": \"espresso cup\", \"url\": \"https://x.test/c\"}}");
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.accumulate = 2;
    o.maxBodyBytes = 2 * 1024 * 1024;
    o.log = log::add;
    o.catalog = Catalog.load(dir);
    server = new ReferenceServer(o).start();
  }

  @AfterAll
  static void stop() {
    server.close();
  }

  /**
   * A 640x480 JPEG of the table with a built-in {@code photo} (null: none) turned by {@code degrees}
   * about the centre at {@code scale}; its corners tl, tr, br, bl as they land go to {@code corners}.
   */
  static byte[] view(String photo, double degrees, double scale, double[] corners) throws IOException {
    BufferedImage f = new BufferedImage(640, 480, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = f.createGraphics();
    g.setRenderingHint(RenderingHints.KEY_INTERPOLATION, RenderingHints.VALUE_INTERPOLATION_BILINEAR);
    g.drawImage(BuiltInCatalog.background(), 0, 0, 640, 480, null);
    if (photo != null) {
      BufferedImage p = BuiltInCatalog.photo(photo);
      int w = p.getWidth(), h = p.getHeight();
      AffineTransform t = AffineTransform.getTranslateInstance(320, 240);
      t.rotate(Math.toRadians(degrees));
      t.scale(scale, scale);
      t.translate(-w / 2.0, -h / 2.0);
      g.drawImage(p, t, null);
      t.transform(new double[] {0, 0, w, 0, w, h, 0, h}, 0, corners, 0, 4);
    }
    g.dispose();
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    ImageIO.write(f, "jpg", out);
    return out.toByteArray();
  }

  /** A multipart body with boundary "bnd": the fields that are not null, then the file. */
  static byte[] form(String params, String lastQueryId, byte[] file) {
    String s = "";
    if (params != null) s += "--bnd\r\nContent-Disposition: form-data; name=\"vsearch_params_json\"\r\n\r\n" + params + "\r\n";
    if (lastQueryId != null) s += "--bnd\r\nContent-Disposition: form-data; name=\"lastQueryId\"\r\n\r\n" + lastQueryId + "\r\n";
    if (file != null) {
      s += "--bnd\r\nContent-Disposition: form-data; name=\"file\"; filename=\"f.jpg\"\r\n\r\n" + new String(file, ISO_8859_1) + "\r\n";
    }
    return (s + "--bnd--\r\n").getBytes(ISO_8859_1);
  }

  /** One exchange; a body goes as multipart/form-data with boundary "bnd". */
  static HttpResponse<String> send(String method, String path, byte[] body) throws Exception {
    HttpRequest.Builder b = HttpRequest.newBuilder(URI.create(server.baseUrl() + path)).timeout(Duration.ofSeconds(5));
    if (body != null) b.header("Content-Type", "multipart/form-data; boundary=bnd");
    b.method(method, body == null ? BodyPublishers.noBody() : BodyPublishers.ofByteArray(body));
    return HTTP.send(b.build(), BodyHandlers.ofString());
  }

  static Object search(byte[] jpeg, String lastQueryId) throws Exception {
    HttpResponse<String> r = send("POST", "/vsearch", form(PARAMS, lastQueryId, jpeg));
    assertEquals(200, r.statusCode(), r.body());
    return Json.parse(r.body());
  }

  static List<?> results(Object doc) {
    return (List<?>) Json.member(Json.member(doc, "quillmark"), "searchResult");
  }

  @Test
  void namesTheProductWithItsCornersInOrderAndChainsSessions() throws Exception {
    // Turned by 100 degrees: the product's top-left corner lands at the frame's top right.
    double[] expected = new double[8];
    Object doc = search(view("coffee.png", 100, 0.6, expected), null);
    List<?> results = results(doc);
    assertEquals(1, results.size(), results.toString());
    Object pidn = results.get(0);
    assertEquals(List.of("PIDN", "coffee"), List.of(Json.member(pidn, "contentType"), Json.member(pidn, "content")));
    Object box = Json.member(Json.member(pidn, "properties"), "boundingBox");
    String[] names = {"tlx", "tly", "trx", "try", "brx", "bry", "blx", "bly"};
    for (int i = 0; i < 8; i++) assertEquals(expected[i], (Double) Json.member(box, names[i]), 8.0, names[i] + " of " + box);
    assertEquals("[{\"content\":\"espresso cup\",\"contentType\":\"SearchTerms\",\"properties\":{}},{\"content\":\"https://x.test/c\","
        + "\"contentType\":\"ExternalResult\",\"properties\":{\"title\":\"Espresso\",\"url\":\"https://x.test/c\"}}]",
        Json.write(Json.member(pidn, "subContent")));

    // The next query of the chain accumulates and, at the limit of 2, is final.
    String q1 = (String) Json.member(doc, "queryId");
    Object doc2 = search(view("coffee.png", -20, 0.5, expected), q1);
    String q2 = (String) Json.member(doc2, "queryId");
    assertNotEquals(q1, q2);
    Object meta = Json.member(Json.member(doc2, "quillmark"), "resultMetadata");
    assertEquals(Boolean.TRUE, Json.member(meta, "finalAccumulation"));
    assertEquals(List.of(q1, q2), Json.member(meta, "accumulatedQueries"));
    assertTrue(log.stream().anyMatch(l -> l.contains("-> 200 " + q1) && l.contains("coffee")), log.toString());
  }

  @Test
  void unknownImagesGetNoResultAndProductsWithoutDetailsGetDefaults() throws Exception {
    double[] c = new double[8];
    assertEquals(List.of(), results(search(view("astronaut.png", 10, 0.7, c), null)), "not in this catalogue");
    assertEquals(List.of(), results(search(view(null, 0, 0, null), null)));
    List<?> r = results(search(view("chelsea.png", 0, 0.9, c), null));
    assertEquals("chelsea", Json.member(r.get(0), "content"));
    assertEquals("[{\"content\":\"chelsea\",\"contentType\":\"SearchTerms\",\"properties\":{}}]",
        Json.write(Json.member(r.get(0), "subContent")), "the id as search terms, and no link without one in the catalogue");
  }

  @Test
  void outlinesThatNoCameraCanSeeAreRejected() {
    double[][] outlines = {
        {100, 100, 300, 110, 290, 300, 90, 280}, // a turned rectangle, tl tr br bl
        {100, 100, 90, 280, 290, 300, 300, 110}, // the same, mirrored
        {100, 100, 300, 300, 300, 100, 100, 300}, // crossed
        {100, 100, 300, 100, 180, 120, 100, 300}, // not convex
        {100, 100, 105, 100, 105, 104, 100, 104}, // tiny
    };
    boolean[] plausible = {true, false, false, false, false};
    for (int i = 0; i < outlines.length; i++) {
      assertEquals(plausible[i], Recognizer.plausible(outlines[i], 640, 480), "outline " + i);
    }
  }

  @Test
  void testHooksAndBadRequestsAnswerAsDocumented() throws Exception {
    byte[] ok = form(PARAMS, null, view(null, 0, 0, null));
    byte[] huge = view(null, 0, 0, null); // a small file whose frame header (SOF0) claims 60000 x 60000
    int sof = new String(huge, ISO_8859_1).indexOf("\u00ff\u00c0");
    huge[sof + 5] = huge[sof + 7] = (byte) 0xea;
    huge[sof + 6] = huge[sof + 8] = (byte) 0x60;
    Object[][] cases = {
        {"POST", "/test/500", ok, 500}, {"POST", "/test/notjson", ok, 200},
        {"POST", "/test/slow/abc", ok, 404}, {"POST", "/test/nothing", ok, 404}, {"POST", "/elsewhere", ok, 404},
        {"GET", "/vsearch", null, 405}, {"GET", "/", null, 200},
        {"POST", "/vsearch", form(PARAMS, null, null), 400}, {"POST", "/vsearch", form(null, null, new byte[10]), 400},
        {"POST", "/vsearch", form("{not json", null, new byte[10]), 400},
        {"POST", "/vsearch", form("{\"quillmark\":{}}", null, new byte[10]), 400},
        {"POST", "/vsearch", form(PARAMS, null, "not an image".getBytes(ISO_8859_1)), 415},
        {"POST", "/vsearch", "garbage".getBytes(ISO_8859_1), 400},
        {"POST", "/vsearch", form(PARAMS, null, new byte[3 * 1024 * 1024]), 413}, {"POST", "/vsearch", form(PARAMS, null, huge), 413},
    };
    for (Object[] k : cases) {
      HttpResponse<String> r = send((String) k[0], (String) k[1], (byte[]) k[2]);
      assertEquals(k[3], r.statusCode(), k[0] + " " + k[1] + ": " + r.body());
      if ((Integer) k[3] >= 400) assertTrue(Json.member(Json.parse(r.body()), "error") instanceof String, r.body());
    }
    assertThrows(IllegalArgumentException.class, () -> Json.parse(send("POST", "/test/notjson", ok).body()), "/test/notjson is not JSON");
    long t0 = System.nanoTime();
    assertEquals(200, send("POST", "/test/slow/300", ok).statusCode());
    assertTrue(System.nanoTime() - t0 >= 290_000_000L, "/test/slow/300 answers late");
  }

  @Test
  void commandLineOptions() throws IOException {
    ReferenceServer.Options o = ReferenceServer.parseArgs(
        new String[] {"--port", "8080", "--delay", "20", "--fail", "notjson", "--accumulate", "3", "--host", "::1"}, System.out);
    assertEquals(List.of(8080, 20, "notjson", 3, "::1"), List.of(o.port, o.delayMs, o.fail, o.accumulate, o.host));
    assertEquals(null, ReferenceServer.parseArgs(new String[] {"--help"}, System.out));
    Path notImages = Files.createDirectory(tmp.resolve("empty"));
    Files.writeString(notImages.resolve("catalog.json"), "[1]");
    String[][] bad = {{"--port"}, {"--port", "x"}, {"--port", "70000"}, {"--fail", "404"}, {"--bogus"},
        {"--catalog", tmp.resolve("missing").toString()}, {"--catalog", notImages.toString()}};
    for (String[] args : bad) {
      IllegalArgumentException e = assertThrows(IllegalArgumentException.class, () -> ReferenceServer.parseArgs(args, System.out));
      assertFalse(e.getMessage().isEmpty(), String.join(" ", args));
    }
  }
}
