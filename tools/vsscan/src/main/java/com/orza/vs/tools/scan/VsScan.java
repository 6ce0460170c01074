package com.orza.vs.tools.scan;

import com.orza.vs.mobile.library.http.VisualSearchHttpClient;
import com.orza.vs.tools.server.ReferenceServer;
import java.io.ByteArrayOutputStream;
import java.io.File;
import java.io.IOException;
import java.io.PrintStream;
import java.io.PrintWriter;
import java.net.MalformedURLException;
import java.net.URL;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.time.ZonedDateTime;
import java.time.format.DateTimeFormatter;
import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.LinkedHashMap;
import java.util.Locale;
import java.util.Map;
import java.util.concurrent.ExecutorService;
import java.util.concurrent.Executors;
import java.util.concurrent.TimeUnit;
import javax.imageio.IIOImage;
import javax.imageio.ImageIO;
import javax.imageio.ImageWriteParam;
import javax.imageio.ImageWriter;
import javax.imageio.stream.ImageOutputStream;

/**
 * vsscan: feeds frames through the library's Java API into the engine, with a visual search
 * server behind it (the built-in reference server unless {@code --server} names another), prints
 * results as they arrive and a summary at the end, and writes an HTML report.
 *
 * <p>Exit status: 0 when every request was answered with results, 1 when a request failed or
 * none was made, 2 for bad usage or unreadable input.
 */
public final class VsScan {
  /** Command-line settings. */
  static final class Options {
    String input;
    int[] size;
    int frames = -1;
    double fps = -1;
    int repeat = 1;
    boolean pace = true;
    String server;
    /** Extra time the built-in server takes to answer the engine: a phone network's round trip. */
    int latencyMs = 200;
    int connectTimeoutMs = 3000;
    int readTimeoutMs = 10000;
    File out = new File("scan-report");
    int orientation = 0;
    boolean verbose;
    boolean quiet;
    boolean progress = true;
  }

  static String usage() {
    return String.join("\n",
        "vsscan: scan frames through the visual search engine and report what comes back",
        "",
        "usage: vsscan [SOURCE] [options]",
        "",
        "SOURCE (none: the built-in scene, five products in turn before a hand-held camera)",
        "  DIR               PNG/JPEG images in name order (converted to NV21), one query each;",
        "                    with DIR/truth.json ({file: {product, corners}}) the scan measures recognition",
        "  FILE.png|.jpg     one image",
        "  FILE.y4m          a YUV4MPEG2 video, 4:2:0 or mono (fed as I420)",
        "  FILE              a raw NV21 stream, frames back to back (needs --size)",
        "",
        "options",
        "  --size WxH          frame size of a raw stream, or of the built-in scene (default 640x480)",
        "  --frames N          frames of the built-in scene (default 360), or at most N frames of SOURCE",
        "  --fps F             time stamps at F frames per second (default: the video's, 30, or 5 for images)",
        "  --repeat N          feed each image N times",
        "  --no-pace           feed frames as fast as possible instead of in real time",
        "  --server URL        send requests to URL instead of the built-in reference server",
        "  --latency MS        the built-in server answers MS later, as over a phone network (default 200;",
        "                      0: loopback speed, the engine then rarely holds a frame while it waits)",
        "  --connect-timeout MS, --read-timeout MS   transport timeouts (default 3000, 10000)",
        "  --orientation DEG   screen orientation sent with every frame (default 0)",
        "  --out DIR           report folder (default ./scan-report)",
        "  --no-progress       no progress line",
        "  --verbose           also print the reference server's log lines",
        "  --quiet             only the summary",
        "  --help              this text",
        "",
        "Exit status: 0 when every request was answered with results, 1 when one failed or none",
        "was made, 2 for bad usage or unreadable input.",
        "");
  }

  static Options parse(String[] args) {
    Options o = new Options();
    for (int i = 0; i < args.length; i++) {
      String a = args[i];
      switch (a) {
        case "--size": o.size = parseSize(value(args, ++i, a)); break;
        case "--frames": o.frames = (int) number(args, ++i, a, 1, 1_000_000); break;
        case "--fps": o.fps = number(args, ++i, a, 0.01, 1000); break;
        case "--repeat": o.repeat = (int) number(args, ++i, a, 1, 10_000); break;
        case "--no-pace": o.pace = false; break;
        case "--server": o.server = value(args, ++i, a); break;
        case "--latency": o.latencyMs = (int) number(args, ++i, a, 0, 60_000); break;
        case "--connect-timeout": o.connectTimeoutMs = (int) number(args, ++i, a, 1, 600_000); break;
        case "--read-timeout": o.readTimeoutMs = (int) number(args, ++i, a, 1, 600_000); break;
        case "--orientation": o.orientation = (int) number(args, ++i, a, -360, 360); break;
        case "--out": o.out = new File(value(args, ++i, a)); break;
        case "--no-progress": o.progress = false; break;
        case "--verbose": o.verbose = true; break;
        case "--quiet": o.quiet = true; o.progress = false; break;
        case "--help": case "-h": return null;
        default:
          if (a.startsWith("-")) throw new IllegalArgumentException("unknown option " + a);
          if (o.input != null) throw new IllegalArgumentException("one SOURCE only (got " + o.input + " and " + a + ")");
          o.input = a;
      }
    }
    return o;
  }

  static String value(String[] args, int i, String name) {
    if (i >= args.length) throw new IllegalArgumentException(name + " needs a value");
    return args[i];
  }

  static double number(String[] args, int i, String name, double min, double max) {
    String v = value(args, i, name);
    double d;
    try {
      d = Double.parseDouble(v);
    } catch (NumberFormatException e) {
      throw new IllegalArgumentException(name + " takes a number, not " + v);
    }
    if (!(d >= min && d <= max)) throw new IllegalArgumentException(name + " must be between " + min + " and " + max);
    return d;
  }

  static int[] parseSize(String v) {
    String[] p = v.toLowerCase(Locale.ROOT).split("x");
    try {
      if (p.length == 2) {
        int w = Integer.parseInt(p[0]);
        int h = Integer.parseInt(p[1]);
        if (w > 0 && h > 0 && w <= 8192 && h <= 8192) return new int[] {w, h};
      }
    } catch (NumberFormatException ignored) {
      // reported below
    }
    throw new IllegalArgumentException("--size takes WxH with sizes from 1 to 8192, not " + v);
  }

  public static void main(String[] args) {
    System.exit(run(args, System.out));
  }

  /** Runs a scan; returns the exit status. */
  public static int run(String[] args, PrintStream out) {
    Options o;
    try {
      o = parse(args);
    } catch (IllegalArgumentException e) {
      out.println("vsscan: " + e.getMessage());
      out.print(usage());
      return 2;
    }
    if (o == null) {
      out.print(usage());
      return 0;
    }
    try {
      return new VsScan(o, out).scan(String.join(" ", args));
    } catch (IOException | IllegalArgumentException | UnsatisfiedLinkError e) {
      out.println("vsscan: " + e.getMessage());
      return 2;
    }
  }

  private final Options o;
  private final PrintStream out;
  private final Progress progress;

  private VsScan(Options o, PrintStream out) {
    this.o = o;
    this.out = out;
    boolean tty = System.console() != null && out == System.out;
    this.progress = new Progress(out, o.progress, tty);
  }

  private FrameSource openSource() throws IOException {
    if (o.input == null) {
      int[] size = o.size != null ? o.size : new int[] {640, 480};
      return new GeneratedSource(size[0] & ~1, size[1] & ~1, o.frames > 0 ? o.frames : 360, o.fps > 0 ? o.fps : 30);
    }
    return FileSources.open(new File(o.input), o.size, o.fps, o.repeat);
  }

  private int scan(String commandLine) throws IOException {
    if (!o.out.isDirectory() && !o.out.mkdirs()) throw new IOException("cannot create report folder " + o.out);
    List<String> serverLog = Collections.synchronizedList(new ArrayList<>());
    ReferenceServer server = null;
    String url = o.server;
    String started = ZonedDateTime.now().format(DateTimeFormatter.RFC_1123_DATE_TIME);
    ScanLog log = new ScanLog();
    List<Measurements.FrameInfo> truthFrames = new ArrayList<>();
    int limit = o.frames > 0 && o.input != null ? o.frames : Integer.MAX_VALUE;

    try (FrameSource source = openSource()) {
      if (url == null) {
        ReferenceServer.Options so = new ReferenceServer.Options();
        so.delayMs = o.latencyMs;
        so.log = line -> {
          serverLog.add(line);
          if (o.verbose) progress.println(line);
        };
        server = new ReferenceServer(so).start();
        url = server.url();
        if (!o.quiet) out.println("vsscan: started the reference server at " + url);
      }
      if (!o.quiet) out.println("vsscan: " + source.describe());

      ScanEngine engine;
      try {
        engine = new ScanEngine(log, url, o.connectTimeoutMs, o.readTimeoutMs, this::printOutcome);
      } catch (UnsatisfiedLinkError | NoClassDefFoundError e) {
        out.println("vsscan: cannot load the native library: " + e.getMessage());
        out.println("vsscan: run the launcher from the build (build/bin/vsscan) or set -Dorzavs.library.path");
        return 2;
      }
      double fps = source.fps();
      int total = source.expectedFrames() < 0 ? -1 : Math.min(source.expectedFrames(), limit);
      long startNanos = System.nanoTime();
      log.markStart();
      try {
        int n = 0;
        while (n < limit) {
          Frame f;
          try {
            f = source.next();
          } catch (IOException e) {
            // A damaged file (a truncated dump, say): scan what was readable and report it.
            progress.println("vsscan: " + e.getMessage() + "; the input ends here");
            break;
          }
          if (f == null) break;
          double t = n / fps;
          if (o.pace && !source.stills()) sleepUntil(startNanos + (long) (t * 1e9));
          engine.feed(f, t, o.orientation);
          if (f.truth != null || f.file != null) {
            truthFrames.add(new Measurements.FrameInfo(f.index, f.truth, f.file, Measurements.sharpness(f),
                f.truth != null ? f : null));
          }
          n++;
          if (source.stills()) engine.awaitOutcomes(o.connectTimeoutMs + o.readTimeoutMs + 2000L);
          Summary now = null;
          if (progress.due()) now = new Summary(log);
          if (now != null) progress.update(n, total, now);
        }
        // Let the last request come back before stopping.
        if (!engine.awaitOutcomes(o.connectTimeoutMs + o.readTimeoutMs + 2000L)) {
          progress.println("vsscan: gave up waiting for the last replies");
        }
        if (engine.refusedFrames() > 0) {
          progress.println("vsscan: " + engine.refusedFrames() + " frames could not borrow engine memory and were copied");
        }
      } finally {
        engine.close();
        progress.clear();
      }
      askEveryFrame(url, truthFrames);
    } catch (InterruptedException e) {
      Thread.currentThread().interrupt();
      out.println("vsscan: interrupted");
      return 1;
    } finally {
      if (server != null) server.close();
    }

    Summary s = new Summary(log);
    Measurements m = truthFrames.isEmpty() || truthFrames.get(0).truth == null ? null : new Measurements(truthFrames, log.requests());
    List<String> lines = new ArrayList<>(s.lines());
    if (m != null) lines.addAll(m.lines());
    out.println("vsscan: summary");
    for (String line : lines) out.println("  " + line);
    ResultsFile.write(new File(o.out, "results.json"), log.requests(), truthFrames);
    if (!serverLog.isEmpty()) {
      Files.write(new File(o.out, "server.log").toPath(), serverLog, StandardCharsets.UTF_8);
    }
    ReportWriter.Info info = new ReportWriter.Info();
    info.source = o.input == null ? "built-in scene" : o.input;
    info.server = url + (o.server == null ? " (built-in reference server)" : "");
    info.started = started;
    info.command = "vsscan " + commandLine;
    File html = ReportWriter.write(o.out, log, s, m, info);
    try (PrintWriter w = new PrintWriter(new File(o.out, "summary.txt"), "UTF-8")) {
      for (String line : lines) w.println(line);
    }
    out.println("vsscan: report " + html.getAbsolutePath());
    if (!s.ok()) {
      out.println("vsscan: FAILED: " + (s.requests == 0 ? "the engine made no request"
          : s.errors + " request(s) failed, " + s.unanswered + " unanswered"));
      return 1;
    }
    return 0;
  }

  /**
   * Sends every frame that has a truth to the server directly, outside the engine, and notes
   * the product each reply names: what choosing frames at random would get. Four requests are
   * in flight at a time, so the server's latency does not make this phase four times longer.
   */
  private void askEveryFrame(String url, List<Measurements.FrameInfo> frames) throws InterruptedException {
    if (frames.isEmpty() || frames.get(0).frame == null) return;
    if (!o.quiet) progress.println("vsscan: asking the server about each of the " + frames.size() + " frames directly");
    VisualSearchHttpClient client;
    try {
      client = new VisualSearchHttpClient(new URL(url), o.connectTimeoutMs, o.readTimeoutMs);
    } catch (MalformedURLException e) {
      return;
    }
    Map<String, String> params = Collections.singletonMap("vsearch_params_json",
        "{\"quillmark\":{\"file_list\":{\"p_img_1\":\"file\"},\"params\":{\"rotation\":\"90\"}}}");
    ExecutorService pool = Executors.newFixedThreadPool(4);
    try {
      for (Measurements.FrameInfo f : frames) {
        pool.execute(() -> {
          byte[] jpeg;
          try {
            jpeg = jpeg(f.frame);
          } catch (IOException e) {
            return; // the frame stays unasked
          } finally {
            f.frame = null;
          }
          VisualSearchHttpClient.Exchange x = client.post("vsscan-direct-" + f.index, params, new LinkedHashMap<>(), jpeg);
          if (x.code != 200) return;
          try {
            f.direct = Measurements.productInReply(x.body);
            f.asked = true;
          } catch (IllegalArgumentException e) {
            // not JSON: the frame stays unasked
          }
        });
      }
    } finally {
      pool.shutdown();
      // Every request ends within its timeouts; the wait covers them all with room to spare.
      pool.awaitTermination((long) frames.size() * (o.connectTimeoutMs + o.readTimeoutMs) + 10_000L, TimeUnit.MILLISECONDS);
      client.close();
    }
  }

  /** The frame as a JPEG of quality 50, as the engine encodes its frames. */
  static byte[] jpeg(Frame f) throws IOException {
    ImageWriter w = ImageIO.getImageWritersByFormatName("jpeg").next();
    ByteArrayOutputStream bytes = new ByteArrayOutputStream();
    try (ImageOutputStream ios = ImageIO.createImageOutputStream(bytes)) {
      w.setOutput(ios);
      ImageWriteParam p = w.getDefaultWriteParam();
      p.setCompressionMode(ImageWriteParam.MODE_EXPLICIT);
      p.setCompressionQuality(0.5f);
      w.write(null, new IIOImage(Yuv.toImage(f), null, null), p);
    } finally {
      w.dispose();
    }
    return bytes.toByteArray();
  }

  private static void sleepUntil(long deadlineNanos) throws InterruptedException {
    long wait = deadlineNanos - System.nanoTime();
    if (wait > 0) Thread.sleep(wait / 1_000_000, (int) (wait % 1_000_000));
  }

  /** Prints one request's outcome as it arrives (transport thread). */
  private void printOutcome(ScanLog.RequestEntry r) {
    if (o.quiet) return;
    StringBuilder b = new StringBuilder();
    b.append(String.format(Locale.ROOT, "[%6.2f s] #%d frame %s ", r.sentAt, r.number, r.frameIndex >= 0 ? r.frameIndex : "?"));
    if (r.decoded) {
      b.append(String.format(Locale.ROOT, "%s in %.0f ms:", r.queryId.isEmpty() ? "(no query id)" : r.queryId, r.roundTrip * 1000));
      if (r.results.isEmpty()) b.append(" no results");
      for (ScanLog.Result x : r.results) {
        b.append(' ').append(x.type);
        if (x.location != null) {
          b.append(String.format(Locale.ROOT, " (%.0f,%.0f)-(%.0f,%.0f)", x.location[0], x.location[1], x.location[4], x.location[5]));
        }
        if (!x.content.isEmpty()) b.append(" \"").append(ReportWriter.truncate(x.content, 90)).append('"');
        b.append(';');
      }
      if (r.finalAccumulation) b.append(" [final]");
    } else {
      b.append(String.format(Locale.ROOT, "server error: status %d, code %d: %s", r.errorStatus, r.errorCode,
          ReportWriter.truncate(r.body == null ? "" : r.body.replace('\n', ' '), 120)));
    }
    progress.println(b.toString());
  }
}
