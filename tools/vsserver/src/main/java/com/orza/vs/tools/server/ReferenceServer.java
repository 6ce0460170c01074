package com.orza.vs.tools.server;

import com.sun.net.httpserver.HttpExchange;
import com.sun.net.httpserver.HttpServer;
import java.awt.image.BufferedImage;
import java.io.ByteArrayInputStream;
import java.io.ByteArrayOutputStream;
import java.io.IOException;
import java.io.InputStream;
import java.io.OutputStream;
import java.io.PrintStream;
import java.net.InetAddress;
import java.net.InetSocketAddress;
import java.nio.charset.StandardCharsets;
import java.security.SecureRandom;
import java.util.ArrayList;
import java.util.Iterator;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Locale;
import java.util.Map;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.TimeUnit;
import java.util.concurrent.atomic.AtomicInteger;
import java.util.function.Consumer;
import javax.imageio.ImageIO;
import javax.imageio.ImageReader;
import javax.imageio.stream.ImageInputStream;

/**
 * A local stand-in for the visual search server.
 *
 * <p>It accepts the multipart request a visual search transport sends (the JPEG frame as part
 * "file", the form field "vsearch_params_json" and the metadata fields), looks for the products
 * of its catalogue in the frame ({@link Recognizer}) and answers a reply document: for a product
 * it recognised, a "PIDN" result with the product's id and its outline in the frame as
 * "boundingBox", holding the product's "SearchTerms" and, when the catalogue has a link, an
 * "ExternalResult" as sub-contents; for anything else an empty result list. Every reply has a
 * fresh "queryId" and the "resultMetadata" of the query's accumulation session
 * ({@link QuerySessions}).
 *
 * <p>Paths: {@code POST /vsearch} is the service. For failure-path tests, {@code /test/500}
 * answers 500, {@code /test/notjson} answers 200 with a body that is not JSON, and
 * {@code /test/slow/<ms>} waits that long (at most a minute) before answering normally. The
 * options {@code delayMs} and {@code fail} apply the same behaviour to {@code /vsearch}.
 * {@code /recognize} does the product search alone for a server in another JVM
 * ({@link RemoteRecognizer}).
 */
public final class ReferenceServer implements AutoCloseable {
  /** Frames larger than this many pixels are refused before decoding (decompression bombs). */
  static final long MAX_PIXELS = 40L * 1000 * 1000;
  static final int MAX_SLOW_MS = 60_000;

  /** Settings; the defaults make a loopback server on a free port. */
  public static final class Options {
    public String host = "127.0.0.1";
    public int port = 0;
    /** Extra wait before every answer of /vsearch, in milliseconds. */
    public int delayMs = 0;
    /** null for normal answers, "500" or "notjson" to make /vsearch fail that way. */
    public String fail = null;
    /** Queries per accumulation session. */
    public int accumulate = 5;
    public int maxBodyBytes = 16 * 1024 * 1024;
    public int threads = 8;
    /** Receives one line per request and the start-up lines; null discards them. */
    public Consumer<String> log = System.out::println;
    /** Products to recognise; null for the built-in catalogue. */
    public Catalog catalog;
    /** An index already built (shared between servers); null to index {@link #catalog} at start. */
    public Recognizer recognizer;
    /** Run the recognition benchmark instead of serving. */
    boolean bench;
  }

  private final Options options;
  private final QuerySessions sessions;
  private final AtomicInteger requestCounter = new AtomicInteger();
  private HttpServer http;
  private ExecutorService executor;
  private Recognizer recognizer;

  public ReferenceServer(Options options) {
    this.options = options;
    byte[] tag = new byte[2];
    new SecureRandom().nextBytes(tag);
    this.sessions = new QuerySessions(String.format("%02x%02x", tag[0] & 0xff, tag[1] & 0xff), options.accumulate);
  }

  /** Binds and starts serving; returns this server. */
  public synchronized ReferenceServer start() throws IOException {
    if (http != null) return this;
    recognizer = options.recognizer;
    if (recognizer == null) {
      long t0 = System.nanoTime();
      recognizer = new Recognizer(options.catalog != null ? options.catalog : BuiltInCatalog.load());
      log(String.format(Locale.ROOT, "vsserver: %s: %d of %d products indexed in %d ms", recognizer.catalog().origin,
          recognizer.indexedProducts(), recognizer.catalog().products.size(), (System.nanoTime() - t0) / 1_000_000));
    }
    http = HttpServer.create(new InetSocketAddress(InetAddress.getByName(options.host), options.port), 64);
    executor = Executors.newFixedThreadPool(Math.max(1, options.threads), r -> {
      Thread t = new Thread(r, "vsserver-http");
      t.setDaemon(true);
      return t;
    });
    http.setExecutor(executor);
    http.createContext("/", this::handle);
    warmUp();
    http.start();
    return this;
  }

  /**
   * Decodes and searches one frame made of a catalogue image, so that the first real request
   * does not pay for loading the image decoder and compiling the search.
   */
  private void warmUp() {
    try {
      ByteArrayOutputStream out = new ByteArrayOutputStream();
      ImageIO.write(recognizer.catalog().products.get(0).image, "jpg", out);
      BufferedImage back = decode(out.toByteArray());
      if (back != null) recognizer.find(back);
    } catch (IOException | RuntimeException e) {
      // Only a warm-up: the first request will show any real problem.
    }
  }

  /** The bound port (after {@link #start()}). */
  public synchronized int port() {
    if (http == null) throw new IllegalStateException("server not started");
    return http.getAddress().getPort();
  }

  /** http://host:port, without a path. */
  public String baseUrl() {
    String host = options.host.contains(":") ? "[" + options.host + "]" : options.host;
    return "http://" + host + ":" + port();
  }

  /** The service's URL: {@code baseUrl() + "/vsearch"}. */
  public String url() {
    return baseUrl() + "/vsearch";
  }

  /** Number of requests received so far (any path). */
  public int requestCount() {
    return requestCounter.get();
  }

  @Override
  public synchronized void close() {
    if (http == null) return;
    http.stop(0);
    executor.shutdownNow();
    try {
      executor.awaitTermination(2, TimeUnit.SECONDS);
    } catch (InterruptedException e) {
      Thread.currentThread().interrupt();
    }
    http = null;
  }

  private void log(String line) {
    Consumer<String> l = options.log;
    if (l != null) l.accept(line);
  }

  // ---------------------------------------------------------------------------------------------
  // Request handling

  /** An answer with its status, content type and body, plus what the log line should say. */
  static final class Answer {
    final int status;
    final String contentType;
    final String body;
    final String note;

    Answer(int status, String contentType, String body, String note) {
      this.status = status;
      this.contentType = contentType;
      this.body = body;
      this.note = note;
    }

    static Answer error(int status, String message) {
      Map<String, Object> doc = new LinkedHashMap<>();
      doc.put("error", message);
      return new Answer(status, "application/json", Json.write(doc), message);
    }
  }

  private void handle(HttpExchange ex) throws IOException {
    int n = requestCounter.incrementAndGet();
    long start = System.nanoTime();
    String path = ex.getRequestURI().getPath();
    String method = ex.getRequestMethod();
    String requestId = ex.getRequestHeaders().getFirst("X-Request-Id");
    Answer answer;
    try {
      answer = route(ex, method, path);
    } catch (Throwable t) {
      answer = Answer.error(500, "internal error: " + t);
    }
    byte[] body = answer.body.getBytes(StandardCharsets.UTF_8);
    try {
      ex.getResponseHeaders().set("Content-Type", answer.contentType + "; charset=utf-8");
      ex.getResponseHeaders().set("Cache-Control", "no-store");
      if (answer.status == 405) ex.getResponseHeaders().set("Allow", "POST");
      ex.sendResponseHeaders(answer.status, body.length == 0 ? -1 : body.length);
      if (body.length > 0) {
        try (OutputStream os = ex.getResponseBody()) {
          os.write(body);
        }
      }
    } catch (IOException e) {
      // The client went away (for example after its own timeout); say so in the log line.
      answer = new Answer(answer.status, answer.contentType, answer.body, answer.note + " (client gone: " + e.getMessage() + ")");
    } finally {
      ex.close();
    }
    long ms = (System.nanoTime() - start) / 1_000_000;
    String remote = ex.getRemoteAddress() == null ? "?" : ex.getRemoteAddress().getAddress().getHostAddress();
    log(String.format(Locale.ROOT, "vsserver: #%d %s %s %s%s -> %d %s [%d ms]", n, remote, method, path,
        requestId == null ? "" : " id " + requestId, answer.status, answer.note, ms));
  }

  private Answer route(HttpExchange ex, String method, String path) throws IOException {
    if (path.equals("/") || path.equals("/help")) {
      if (!method.equals("GET") && !method.equals("HEAD")) return Answer.error(405, "use GET for " + path);
      return new Answer(200, "text/plain", usage(), "help page");
    }
    if (path.equals("/recognize")) return recognize(ex, method);
    boolean service = path.equals("/vsearch");
    boolean hook = path.startsWith("/test/");
    if (!service && !hook) return Answer.error(404, "no such path " + path + " (the service is POST /vsearch)");
    if (!method.equals("POST")) return Answer.error(405, "use POST for " + path);

    String fail = service ? options.fail : null;
    int delay = service ? options.delayMs : 0;
    if (hook) {
      String what = path.substring("/test/".length());
      if (what.equals("500") || what.equals("notjson")) {
        fail = what;
      } else if (what.startsWith("slow/")) {
        try {
          delay = Integer.parseInt(what.substring("slow/".length()));
        } catch (NumberFormatException e) {
          return Answer.error(404, "bad test hook " + path + " (use /test/slow/<milliseconds>)");
        }
      } else {
        return Answer.error(404, "unknown test hook " + path + " (hooks: /test/500, /test/notjson, /test/slow/<ms>)");
      }
    }

    // Read the body in every case, so that the client's upload completes before we answer.
    byte[] body = readBody(ex);
    if (body == null) return Answer.error(413, "request body over " + options.maxBodyBytes + " bytes");

    if (delay > 0) {
      try {
        Thread.sleep(Math.min(delay, MAX_SLOW_MS));
      } catch (InterruptedException e) {
        Thread.currentThread().interrupt();
        return Answer.error(503, "server shutting down");
      }
    }
    if ("500".equals(fail)) return Answer.error(500, "test hook: internal server error");
    if ("notjson".equals(fail)) {
      return new Answer(200, "text/html", "<html><body>Service temporarily unavailable (test hook: not JSON)</body></html>",
          "test hook: body that is not JSON");
    }
    return search(ex.getRequestHeaders().getFirst("Content-Type"), body);
  }

  /**
   * The search alone, for {@link RemoteRecognizer}: GET lists the indexed products, POST
   * {@code ?width=W&height=H} with W x H luminance bytes answers the product seen.
   */
  private Answer recognize(HttpExchange ex, String method) throws IOException {
    if (method.equals("GET")) {
      Map<String, Object> doc = new LinkedHashMap<>();
      doc.put("products", recognizer.indexedIds());
      return new Answer(200, "application/json", Json.write(doc), "recognizer: product list");
    }
    if (!method.equals("POST")) return Answer.error(405, "use GET or POST for /recognize");
    int w = 0, h = 0;
    String query = ex.getRequestURI().getQuery();
    for (String kv : query == null ? new String[0] : query.split("&")) {
      try {
        if (kv.startsWith("width=")) w = Integer.parseInt(kv.substring(6));
        if (kv.startsWith("height=")) h = Integer.parseInt(kv.substring(7));
      } catch (NumberFormatException e) {
        return Answer.error(400, "bad /recognize query " + query);
      }
    }
    byte[] body = readBody(ex);
    if (body == null) return Answer.error(413, "request body over " + options.maxBodyBytes + " bytes");
    if (w <= 0 || h <= 0 || (long) w * h != body.length) {
      return Answer.error(400, "expected ?width=W&height=H and W x H luminance bytes, got " + body.length + " bytes for " + query);
    }
    Recognizer.Match m = recognizer.find(body, w, h);
    Map<String, Object> doc = new LinkedHashMap<>();
    if (m != null) {
      List<Object> corners = new ArrayList<>();
      for (double c : m.corners) corners.add(c);
      doc.put("product", m.product.id);
      doc.put("corners", corners);
      doc.put("inliers", m.inliers);
      doc.put("matches", m.matches);
    }
    return new Answer(200, "application/json", Json.write(doc),
        String.format(Locale.ROOT, "recognizer: %dx%d: %s", w, h, m == null ? "no product" : m.product.id));
  }

  /**
   * The request body, or null when it is longer than the limit. An oversized body is still read
   * and discarded (up to a few times the limit) so that the client, which is still sending,
   * receives the 413 answer instead of a reset connection.
   */
  private byte[] readBody(HttpExchange ex) throws IOException {
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    byte[] buf = new byte[16384];
    long total = 0;
    long drainLimit = 4L * options.maxBodyBytes;
    try (InputStream in = ex.getRequestBody()) {
      int r;
      while ((r = in.read(buf)) > 0) {
        total += r;
        if (total > drainLimit) break;
        if (total <= options.maxBodyBytes) out.write(buf, 0, r);
      }
    }
    return total > options.maxBodyBytes ? null : out.toByteArray();
  }

  /** The service itself: checks the request, analyses the frame, builds the reply. */
  Answer search(String contentType, byte[] body) {
    String boundary = Multipart.boundaryOf(contentType);
    if (boundary == null) return Answer.error(400, "expected multipart/form-data with a boundary, got " + contentType);
    Multipart form;
    try {
      form = Multipart.parse(body, boundary);
    } catch (IllegalArgumentException e) {
      return Answer.error(400, "bad multipart body: " + e.getMessage());
    }
    byte[] jpeg = form.files.get("file");
    if (jpeg == null) return Answer.error(400, "missing file part \"file\"");
    String paramsText = form.fields.get("vsearch_params_json");
    if (paramsText == null) return Answer.error(400, "missing form field \"vsearch_params_json\"");
    Object params;
    try {
      params = Json.parse(paramsText);
    } catch (IllegalArgumentException e) {
      return Answer.error(400, "vsearch_params_json is not JSON: " + e.getMessage());
    }
    Object imageSlot = Json.member(Json.member(Json.member(params, "quillmark"), "file_list"), "p_img_1");
    if (!"file".equals(imageSlot)) {
      return Answer.error(400, "vsearch_params_json lacks quillmark.file_list.p_img_1 = \"file\"");
    }
    Object rotation = Json.member(Json.member(Json.member(params, "quillmark"), "params"), "rotation");

    BufferedImage image;
    try {
      image = decode(jpeg);
    } catch (IllegalArgumentException e) {
      return Answer.error(413, e.getMessage());
    } catch (IOException e) {
      return Answer.error(415, "file part is not a readable image: " + e.getMessage());
    }
    if (image == null) return Answer.error(415, "file part is not a readable image");

    long t0 = System.nanoTime();
    Recognizer.Match match = recognizer.find(image);
    long searchMs = (System.nanoTime() - t0) / 1_000_000;
    QuerySessions.Entry q = sessions.next(form.fields.get("lastQueryId"));
    List<Object> results = new ArrayList<>();
    if (match != null) results.add(productResult(match));

    Map<String, Object> meta = new LinkedHashMap<>();
    meta.put("finalAccumulation", q.isFinal);
    meta.put("accumulatedQueries", q.accumulated);
    Map<String, Object> quillmark = new LinkedHashMap<>();
    quillmark.put("searchResult", results);
    quillmark.put("resultMetadata", meta);
    Map<String, Object> doc = new LinkedHashMap<>();
    doc.put("queryId", q.queryId);
    doc.put("quillmark", quillmark);

    String found = match == null ? "no product" : String.format(Locale.ROOT, "%s (%d of %d matches agree)",
        match.product.id, match.inliers, match.matches);
    String note = String.format(Locale.ROOT, "%s session %d (%d/%d%s) %dx%d, %.1f KB image, rotation %s: %s, searched in %d ms",
        q.queryId, q.session, q.accumulated.size(), Math.max(1, options.accumulate), q.isFinal ? ", final" : "",
        image.getWidth(), image.getHeight(), jpeg.length / 1024.0, rotation, found, searchMs);
    return new Answer(200, "application/json", Json.write(doc), note);
  }

  /**
   * The reply's result for a recognised product: "PIDN" with the product id and its outline
   * (corners top-left, top-right, bottom-right, bottom-left of the product image, in frame
   * pixels), the search terms and the product's page nested under it.
   */
  static Map<String, Object> productResult(Recognizer.Match m) {
    String[] names = {"tlx", "tly", "trx", "try", "brx", "bry", "blx", "bly"};
    Map<String, Object> box = new LinkedHashMap<>();
    for (int i = 0; i < 8; i++) box.put(names[i], Math.round(m.corners[i] * 10) / 10.0);
    Map<String, Object> props = new LinkedHashMap<>();
    props.put("boundingBox", box);
    props.put("title", m.product.title);
    props.put("inliers", m.inliers);
    List<Object> sub = new ArrayList<>();
    sub.add(result(m.product.searchTerms, "SearchTerms", new LinkedHashMap<>()));
    if (m.product.url != null) {
      Map<String, Object> link = new LinkedHashMap<>();
      link.put("title", m.product.title);
      link.put("url", m.product.url);
      sub.add(result(m.product.url, "ExternalResult", link));
    }
    Map<String, Object> pidn = result(m.product.id, "PIDN", props);
    pidn.put("subContent", sub);
    return pidn;
  }

  private static Map<String, Object> result(String content, String type, Map<String, Object> props) {
    Map<String, Object> r = new LinkedHashMap<>();
    r.put("content", content);
    r.put("contentType", type);
    r.put("properties", props);
    return r;
  }

  /**
   * Decodes an image after checking its declared size, so that a small file that claims a huge
   * frame cannot exhaust memory. Returns null when no reader recognises the bytes.
   */
  static BufferedImage decode(byte[] bytes) throws IOException {
    try (ImageInputStream in = ImageIO.createImageInputStream(new ByteArrayInputStream(bytes))) {
      if (in == null) return null;
      Iterator<ImageReader> readers = ImageIO.getImageReaders(in);
      if (!readers.hasNext()) return null;
      ImageReader reader = readers.next();
      try {
        reader.setInput(in, true, true);
        long pixels = (long) reader.getWidth(0) * reader.getHeight(0);
        if (pixels > MAX_PIXELS) {
          throw new IllegalArgumentException("frame of " + reader.getWidth(0) + "x" + reader.getHeight(0) + " is too large");
        }
        return reader.read(0);
      } finally {
        reader.dispose();
      }
    }
  }

  // ---------------------------------------------------------------------------------------------
  // Command line

  static String usage() {
    return String.join("\n",
        "vsserver: a local reference visual search server",
        "",
        "usage: vsserver [--catalog DIR] [--host ADDR] [--port N] [--delay MS] [--fail 500|notjson] [--accumulate N] [--quiet]",
        "       vsserver --bench [--catalog DIR]",
        "",
        "  --catalog DIR     products to recognise: one PNG/JPEG per product (id = file name without",
        "                    extension), optional DIR/catalog.json {id: {title, searchTerms, url}};",
        "                    default: the built-in catalogue of five photographs",
        "  --bench           time indexing and queries on a 200-product catalogue (the catalogue's",
        "                    products plus distractors) and exit",
        "  --host ADDR       address to bind (default 127.0.0.1, loopback only; 0.0.0.0 exposes it to the network)",
        "  --port N          port to bind (default 0: a free port, printed at start)",
        "  --delay MS        wait MS milliseconds before every answer of /vsearch",
        "  --fail 500        make /vsearch answer 500; --fail notjson: answer 200 with a body that is not JSON",
        "  --accumulate N    queries per accumulation session (default 5); the N-th reply is final",
        "  --quiet           no log line per request",
        "  --help            this text",
        "",
        "POST /vsearch takes multipart/form-data: the JPEG frame as part \"file\", the field",
        "\"vsearch_params_json\" and the metadata fields (\"lastQueryId\" links queries into a session).",
        "It answers a JSON reply: for a recognised product a \"PIDN\" result (the product id, its",
        "outline in the frame as \"boundingBox\") holding \"SearchTerms\" and \"ExternalResult\";",
        "else an empty result list.",
        "Test hooks (POST): /test/500, /test/notjson, /test/slow/<ms>.",
        "/recognize does the product search alone for a server in another JVM (one given",
        "ORZAVS_RECOGNIZER=http://HOST:PORT/recognize): GET lists the products, POST",
        "?width=W&height=H with a frame's W x H luminance bytes answers the product seen.",
        "");
  }

  /** Parses command-line options; throws IllegalArgumentException with a message on bad input. */
  static Options parseArgs(String[] args, PrintStream out) {
    Options o = new Options();
    for (int i = 0; i < args.length; i++) {
      String a = args[i];
      switch (a) {
        case "--host": o.host = value(args, ++i, a); break;
        case "--port": o.port = intValue(args, ++i, a, 0, 65535); break;
        case "--delay": o.delayMs = intValue(args, ++i, a, 0, MAX_SLOW_MS); break;
        case "--accumulate": o.accumulate = intValue(args, ++i, a, 1, 1_000_000); break;
        case "--fail":
          o.fail = value(args, ++i, a);
          if (!o.fail.equals("500") && !o.fail.equals("notjson")) {
            throw new IllegalArgumentException("--fail takes 500 or notjson, not " + o.fail);
          }
          break;
        case "--quiet": o.log = null; break;
        case "--catalog":
          try {
            o.catalog = Catalog.load(new java.io.File(value(args, ++i, a)));
          } catch (IOException e) {
            throw new IllegalArgumentException(e.getMessage());
          }
          break;
        case "--bench": o.bench = true; break;
        case "--help":
        case "-h":
          return null;
        default:
          throw new IllegalArgumentException("unknown option " + a);
      }
    }
    if (o.log != null) o.log = out::println;
    return o;
  }

  static String value(String[] args, int i, String name) {
    if (i >= args.length) throw new IllegalArgumentException(name + " needs a value");
    return args[i];
  }

  static int intValue(String[] args, int i, String name, int min, int max) {
    String v = value(args, i, name);
    try {
      int n = Integer.parseInt(v);
      if (n < min || n > max) throw new IllegalArgumentException(name + " must be between " + min + " and " + max);
      return n;
    } catch (NumberFormatException e) {
      throw new IllegalArgumentException(name + " takes a number, not " + v);
    }
  }

  public static void main(String[] args) throws Exception {
    Options o;
    try {
      o = parseArgs(args, System.out);
    } catch (IllegalArgumentException e) {
      System.err.println("vsserver: " + e.getMessage());
      System.err.print(usage());
      System.exit(2);
      return;
    }
    if (o == null) {
      System.out.print(usage());
      return;
    }
    if (o.bench) {
      RecognitionBench.run(o.catalog, System.out);
      return;
    }
    ReferenceServer server = new ReferenceServer(o);
    try {
      server.start();
    } catch (UnsatisfiedLinkError e) {
      System.err.println("vsserver: " + e.getMessage());
      System.exit(1);
      return;
    } catch (IOException e) {
      System.err.println("vsserver: cannot start on " + o.host + ":" + o.port + ": " + e.getMessage());
      System.exit(1);
      return;
    }
    Runtime.getRuntime().addShutdownHook(new Thread(server::close));
    if (!InetAddress.getByName(o.host).isLoopbackAddress()) {
      System.out.println("vsserver: warning: listening beyond loopback (" + o.host + "): anyone on the network can reach it");
    }
    System.out.println("vsserver: listening on " + server.url()
        + (o.fail != null ? " (failing: " + o.fail + ")" : "") + (o.delayMs > 0 ? " (delay " + o.delayMs + " ms)" : ""));
    System.out.println("vsserver: test hooks " + server.baseUrl() + "/test/500, /test/notjson, /test/slow/<ms>; Ctrl-C stops");
    System.out.flush();
    Thread.currentThread().join(); // serve until killed
  }
}
