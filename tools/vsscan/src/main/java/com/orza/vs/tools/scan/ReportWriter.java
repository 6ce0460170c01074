package com.orza.vs.tools.scan;

import java.awt.AlphaComposite;
import java.awt.BasicStroke;
import java.awt.Color;
import java.awt.Graphics2D;
import java.awt.RenderingHints;
import java.awt.geom.Path2D;
import java.awt.image.BufferedImage;
import java.io.ByteArrayInputStream;
import java.io.ByteArrayOutputStream;
import java.io.File;
import java.io.IOException;
import java.io.OutputStreamWriter;
import java.io.Writer;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.util.ArrayList;
import java.util.Base64;
import java.util.List;
import java.util.Locale;
import java.util.Map;
import javax.imageio.ImageIO;

/**
 * Writes a scan's report: one annotated PNG per request (the JPEG the server received, with the
 * frame's interest points, the bounding boxes and labels drawn on it) in {@code frames/}, and
 * {@code index.html}, one self-contained page (styles, timeline and thumbnails inline) with the
 * summary, a timeline of frames, requests and replies, and a card per request.
 */
public final class ReportWriter {
  /** Requests beyond this many get no card and no PNG (the timeline still shows them). */
  static final int MAX_CARDS = 300;
  static final int THUMB_WIDTH = 360;

  private static final Color BOX = new Color(255, 64, 160);
  private static final Color POINT = new Color(40, 230, 90);

  /** What the report shows in its header besides the summary. */
  public static final class Info {
    public String title = "vsscan report";
    public String source = "";
    public String server = "";
    public String started = "";
    public String command = "";
    public double fps = 30;
  }

  private ReportWriter() {}

  /** Writes the report into {@code dir} (created if needed) and returns the HTML file. */
  /** Writes the report; {@code m} holds the recognition figures when the source had a truth, else null. */
  public static File write(File dir, ScanLog log, Summary summary, Measurements m, Info info) throws IOException {
    File framesDir = new File(dir, "frames");
    if (!framesDir.isDirectory() && !framesDir.mkdirs()) throw new IOException("cannot create " + framesDir);
    List<ScanLog.FrameEntry> frames = log.frames();
    List<ScanLog.RequestEntry> requests = log.requests();

    StringBuilder cards = new StringBuilder();
    int shown = 0;
    for (ScanLog.RequestEntry r : requests) {
      if (shown++ >= MAX_CARDS) break;
      ScanLog.FrameEntry frame = r.frameIndex >= 0 && r.frameIndex < frames.size() ? frames.get(r.frameIndex) : null;
      BufferedImage annotated = annotate(r, frame);
      String pngName = null;
      String thumb = null;
      if (annotated != null) {
        pngName = String.format(Locale.ROOT, "frames/request-%04d.png", r.number);
        ImageIO.write(annotated, "png", new File(dir, pngName));
        thumb = dataUri(scale(annotated, THUMB_WIDTH));
      }
      card(cards, r, frame, pngName, thumb);
    }

    File html = new File(dir, "index.html");
    try (Writer w = new OutputStreamWriter(Files.newOutputStream(html.toPath()), StandardCharsets.UTF_8)) {
      w.write(page(log, summary, m, info, frames, requests, cards.toString(), requests.size() > MAX_CARDS));
    }
    return html;
  }

  // ---------------------------------------------------------------------------------------------
  // Annotated frames

  /** The request's JPEG with points, boxes and labels drawn; null if the JPEG is unreadable. */
  static BufferedImage annotate(ScanLog.RequestEntry r, ScanLog.FrameEntry frame) {
    BufferedImage src;
    try {
      src = r.jpeg == null || r.jpeg.length == 0 ? null : ImageIO.read(new ByteArrayInputStream(r.jpeg));
    } catch (IOException e) {
      src = null;
    }
    if (src == null) return null;
    int w = src.getWidth(), h = src.getHeight();
    BufferedImage img = new BufferedImage(w, h, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = img.createGraphics();
    g.drawImage(src, 0, 0, null);
    g.setRenderingHint(RenderingHints.KEY_ANTIALIASING, RenderingHints.VALUE_ANTIALIAS_ON);
    float scale = Math.max(1f, Math.min(w, h) / 480f);

    if (frame != null && frame.points != null) {
      g.setStroke(new BasicStroke(1.6f * scale));
      float rad = 3.5f * scale;
      for (int i = 0; i + 1 < frame.points.length; i += 2) {
        float x = frame.points[i], y = frame.points[i + 1];
        g.setColor(new Color(0, 0, 0, 140));
        g.drawOval(Math.round(x - rad - 1), Math.round(y - rad - 1), Math.round(2 * rad + 2), Math.round(2 * rad + 2));
        g.setColor(POINT);
        g.drawOval(Math.round(x - rad), Math.round(y - rad), Math.round(2 * rad), Math.round(2 * rad));
      }
    }

    // Labels and banners use the built-in pixel font: two font pixels per image pixel at
    // 640x480, more for larger frames, so that they stay legible in the thumbnails.
    int ts = Math.max(1, Math.round(Math.min(w, h) / 240f));
    for (ScanLog.Result res : r.results) {
      if (res.location == null) continue;
      Path2D.Float quad = new Path2D.Float();
      quad.moveTo(res.location[0], res.location[1]);
      for (int i = 2; i < 8; i += 2) quad.lineTo(res.location[i], res.location[i + 1]);
      quad.closePath();
      g.setStroke(new BasicStroke(5f * scale));
      g.setColor(new Color(0, 0, 0, 110));
      g.draw(quad);
      g.setStroke(new BasicStroke(2.5f * scale));
      g.setColor(BOX);
      g.draw(quad);
    }
    // Header: request number, frame, outcome. Footer: the search terms.
    String head = String.format(Locale.ROOT, "#%d  frame %s  %s", r.number, r.frameIndex >= 0 ? String.valueOf(r.frameIndex) : "?",
        outcome(r));
    int headHeight = banner(img, g, head, true, ts);
    StringBuilder terms = new StringBuilder();
    for (ScanLog.Result res : r.results) {
      if (res.location == null && !res.content.isEmpty()) {
        if (terms.length() > 0) terms.append("  |  ");
        terms.append(res.type).append(": ").append(res.content);
      }
    }
    if (terms.length() > 0) banner(img, g, terms.toString(), false, ts);

    // Box labels last, so that no outline or banner covers them, and kept clear of the header.
    for (ScanLog.Result res : r.results) {
      if (res.location == null) continue;
      String label = res.type + (res.content.isEmpty() ? "" : ": " + res.content);
      label(img, g, label, res.location[0], res.location[1], headHeight, ts);
    }
    g.dispose();
    return img;
  }

  /**
   * A filled tag in the box colour just above (x, y), or just below it when that would reach
   * above {@code minY}. The corner comes from the server and may lie anywhere.
   */
  private static void label(BufferedImage img, Graphics2D g, String text, float x, float y, int minY, int ts) {
    int imgWidth = img.getWidth();
    int pad = 3 * ts;
    String t = BitmapFont.fit(text, imgWidth - 2 * pad, ts);
    int tw = BitmapFont.width(t, ts) + 2 * pad;
    int th = BitmapFont.height(ts) + 4 * ts;
    int lx = Math.max(0, Math.min(Math.round(x), imgWidth - tw));
    int ly = Math.round(y) - th - 2;
    if (ly < minY) ly = Math.max(minY, Math.round(y) + 2);
    ly = Math.min(ly, img.getHeight() - th);
    g.setColor(BOX);
    g.fillRect(lx, ly, tw, th);
    BitmapFont.draw(img, t, lx + pad, ly + 3 * ts, ts, 0xFFFFFF);
  }

  /**
   * A darkened strip across the top or bottom of the frame with up to two lines of text;
   * returns its height.
   */
  private static int banner(BufferedImage img, Graphics2D g, String text, boolean top, int ts) {
    int width = img.getWidth();
    int pad = 3 * ts;
    List<String> lines = BitmapFont.wrap(text, width - 2 * pad, ts, 2);
    if (lines.isEmpty()) return 0;
    int lineH = BitmapFont.height(ts) + 2 * ts;
    int th = lines.size() * lineH + 2 * ts;
    int y = top ? 0 : img.getHeight() - th;
    g.setComposite(AlphaComposite.getInstance(AlphaComposite.SRC_OVER, 0.62f));
    g.setColor(Color.BLACK);
    g.fillRect(0, y, width, th);
    g.setComposite(AlphaComposite.SrcOver);
    for (int i = 0; i < lines.size(); i++) {
      BitmapFont.draw(img, lines.get(i), pad, y + 3 * ts + i * lineH, ts, 0xFFFFFF);
    }
    return th;
  }

  static BufferedImage scale(BufferedImage src, int width) {
    if (src.getWidth() <= width) return src;
    int height = Math.max(1, Math.round((float) src.getHeight() * width / src.getWidth()));
    BufferedImage out = new BufferedImage(width, height, BufferedImage.TYPE_INT_RGB);
    Graphics2D g = out.createGraphics();
    g.setRenderingHint(RenderingHints.KEY_INTERPOLATION, RenderingHints.VALUE_INTERPOLATION_BILINEAR);
    g.setRenderingHint(RenderingHints.KEY_RENDERING, RenderingHints.VALUE_RENDER_QUALITY);
    g.drawImage(src, 0, 0, width, height, null);
    g.dispose();
    return out;
  }

  private static String dataUri(BufferedImage img) throws IOException {
    ByteArrayOutputStream out = new ByteArrayOutputStream();
    // JPEG keeps the inline thumbnails small; the full-size annotated frames are PNG files.
    ImageIO.write(img, "jpg", out);
    return "data:image/jpeg;base64," + Base64.getEncoder().encodeToString(out.toByteArray());
  }

  static String outcome(ScanLog.RequestEntry r) {
    if (!r.reported) return r.answeredAt >= 0 ? "answered " + r.code + ", not reported" : "no answer";
    if (r.decoded) {
      return String.format(Locale.ROOT, "%d result%s in %.0f ms", r.results.size(), r.results.size() == 1 ? "" : "s",
          r.roundTrip * 1000);
    }
    return "error: status " + r.errorStatus + ", code " + r.errorCode;
  }

  // ---------------------------------------------------------------------------------------------
  // HTML

  static String esc(String s) {
    if (s == null) return "";
    StringBuilder b = new StringBuilder(s.length() + 16);
    for (int i = 0; i < s.length(); i++) {
      char c = s.charAt(i);
      switch (c) {
        case '<': b.append("&lt;"); break;
        case '>': b.append("&gt;"); break;
        case '&': b.append("&amp;"); break;
        case '"': b.append("&quot;"); break;
        case '\'': b.append("&#39;"); break;
        default: b.append(c);
      }
    }
    return b.toString();
  }

  private static String status(ScanLog.RequestEntry r) {
    if (!r.reported) return "open";
    if (!r.decoded) return "error";
    for (ScanLog.Result x : r.results) {
      if (x.location != null) return "box";
    }
    return "ok";
  }

  private static void card(StringBuilder b, ScanLog.RequestEntry r, ScanLog.FrameEntry frame, String png, String thumb) {
    String st = status(r);
    b.append("<article class=\"card ").append(st).append("\" id=\"r").append(r.number).append("\">\n");
    if (thumb != null) {
      b.append("<a href=\"").append(esc(png)).append("\"><img src=\"").append(thumb).append("\" alt=\"request ")
          .append(r.number).append("\"></a>\n");
    } else {
      b.append("<div class=\"noimg\">no image</div>\n");
    }
    b.append("<div class=\"meta\"><b>#").append(r.number).append("</b> frame ")
        .append(r.frameIndex >= 0 ? String.valueOf(r.frameIndex) : "?");
    if (frame != null) b.append(" &middot; ").append(frame.pointCount()).append(" points");
    b.append(String.format(Locale.ROOT, " &middot; sent %.2f s", r.sentAt));
    if (r.answeredAt >= 0) b.append(String.format(Locale.ROOT, " &middot; %.0f ms", r.roundTrip * 1000));
    b.append("</div>\n");
    b.append("<div class=\"status ").append(st).append("\">").append(esc(outcome(r))).append("</div>\n");
    if (r.decoded) {
      b.append("<ul class=\"results\">\n");
      for (ScanLog.Result x : r.results) result(b, x);
      if (r.results.isEmpty()) b.append("<li class=\"muted\">no results</li>\n");
      b.append("</ul>\n");
      b.append("<div class=\"q\">query <code>").append(esc(r.queryId)).append("</code>");
      if (!r.accumulated.isEmpty()) b.append(" &middot; ").append(r.accumulated.size()).append(" accumulated");
      if (r.finalAccumulation) b.append(" &middot; <b>final</b>");
      b.append("</div>\n");
    } else if (r.reported) {
      b.append("<pre class=\"body\">").append(esc(truncate(r.body, 400))).append("</pre>\n");
    }
    b.append("<details><summary>request</summary><div class=\"q\">id <code>").append(esc(r.id)).append("</code></div><table>");
    for (Map.Entry<String, String> e : r.metadata.entrySet()) {
      b.append("<tr><td>").append(esc(e.getKey())).append("</td><td><code>").append(esc(truncate(e.getValue(), 120)))
          .append("</code></td></tr>");
    }
    b.append(String.format(Locale.ROOT, "<tr><td>JPEG</td><td>%.1f KB</td></tr>", r.jpeg.length / 1024.0));
    b.append("</table></details>\n</article>\n");
  }

  private static void result(StringBuilder b, ScanLog.Result x) {
    b.append("<li><span class=\"type\">").append(esc(x.type)).append("</span> ").append(esc(x.content));
    if (x.location != null) {
      b.append(String.format(Locale.ROOT, " <span class=\"muted\">(%.0f,%.0f)&ndash;(%.0f,%.0f)</span>", x.location[0],
          x.location[1], x.location[4], x.location[5]));
    }
    if (!x.subContents.isEmpty()) {
      b.append("<ul>");
      for (ScanLog.Result s : x.subContents) result(b, s);
      b.append("</ul>");
    }
    b.append("</li>\n");
  }

  static String truncate(String s, int n) {
    if (s == null) return "";
    return s.length() <= n ? s : s.substring(0, n) + "...";
  }

  private static String page(ScanLog log, Summary s, Measurements m, Info info, List<ScanLog.FrameEntry> frames,
                             List<ScanLog.RequestEntry> requests, String cards, boolean capped) {
    StringBuilder b = new StringBuilder(cards.length() + 16384);
    b.append("<!DOCTYPE html>\n<html lang=\"en\"><head><meta charset=\"utf-8\">\n<title>").append(esc(info.title))
        .append("</title>\n<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n<style>\n").append(CSS)
        .append("</style></head><body>\n");
    b.append("<header><h1>").append(esc(info.title)).append("</h1>\n<p class=\"verdict ")
        .append(s.ok() ? "good\">scan succeeded" : "bad\">scan had problems").append("</p>\n");
    b.append("<dl class=\"facts\">");
    fact(b, "source", info.source);
    fact(b, "server", info.server);
    fact(b, "started", info.started);
    if (!info.command.isEmpty()) fact(b, "command", info.command);
    b.append("</dl></header>\n");

    b.append("<section class=\"tiles\">\n");
    tile(b, String.valueOf(s.frames), "frames in");
    tile(b, String.format(Locale.ROOT, "%d / %.1f / %d", s.minPoints, s.meanPoints, s.maxPoints), "points per frame (min / mean / max)");
    tile(b, s.requests + " &rarr; " + s.replies, "requests &rarr; replies");
    tile(b, String.valueOf(s.decoded), "decoded");
    tile(b, String.valueOf(s.errors + s.unanswered), "errors / unanswered", s.errors + s.unanswered > 0 ? "bad" : "");
    tile(b, s.results + " (" + s.boxes + " boxes)", "results");
    tile(b, Double.isNaN(s.p50Ms) ? "-" : String.format(Locale.ROOT, "%.0f / %.0f / %.0f ms", s.p50Ms, s.p90Ms, s.maxMs),
        "latency p50 / p90 / max", "wide");
    b.append("</section>\n");

    b.append("<section><h2>Timeline</h2>\n").append(timeline(frames, requests)).append("\n");
    b.append("<p class=\"legend\"><span class=\"sw pts\"></span>interest points per frame "
        + "<span class=\"sw box\"></span>reply with a box <span class=\"sw ok\"></span>reply without a box "
        + "<span class=\"sw error\"></span>error <span class=\"sw open\"></span>unanswered</p></section>\n");

    if (m != null) {
      b.append("<section><h2>Recognition and frame choice</h2>\n");
      for (String line : m.lines()) b.append("<p><b>").append(esc(line)).append("</b></p>\n");
      b.append(m.plot()).append("\n");
      b.append("<p class=\"legend\">bars: each frame's sharpness, coloured by the server's answer when asked about "
          + "that frame directly; dots: the frames the engine took, coloured by the answer it got. "
          + "<span class=\"sw ok\"></span>right product <span class=\"sw error\"></span>wrong product "
          + "<span class=\"sw open\"></span>no product named</p></section>\n");
    }
    b.append("<section><h2>Requests</h2>\n");
    if (requests.isEmpty()) b.append("<p class=\"muted\">The engine sent no request.</p>\n");
    if (capped) b.append("<p class=\"muted\">Only the first ").append(MAX_CARDS).append(" requests are shown.</p>\n");
    b.append("<div class=\"grid\">\n").append(cards).append("</div></section>\n");
    b.append("<footer>Generated by vsscan. Annotated full-size frames are in <code>frames/</code>; "
        + "green circles are the engine's interest points, pink outlines the bounding boxes of the replies.</footer>\n");
    b.append("</body></html>\n");
    return b.toString();
  }

  private static void fact(StringBuilder b, String k, String v) {
    b.append("<dt>").append(esc(k)).append("</dt><dd>").append(esc(v)).append("</dd>");
  }

  private static void tile(StringBuilder b, String value, String label) {
    tile(b, value, label, "");
  }

  private static void tile(StringBuilder b, String value, String label, String cls) {
    b.append("<div class=\"tile ").append(cls).append("\"><div class=\"v\">").append(value).append("</div><div class=\"l\">")
        .append(label).append("</div></div>\n");
  }

  /** An inline SVG: points per frame as bars, each request as a bar from sent to answered. */
  static String timeline(List<ScanLog.FrameEntry> frames, List<ScanLog.RequestEntry> requests) {
    double end = 0.001;
    for (ScanLog.FrameEntry f : frames) end = Math.max(end, f.fedAt);
    for (ScanLog.RequestEntry r : requests) end = Math.max(end, Math.max(r.sentAt, r.answeredAt));
    end *= 1.02;
    int width = 1100, left = 70, right = 16, plotW = width - left - right;
    int pointsH = 70, lanes = 3, laneH = 18, top = 12;
    int reqTop = top + pointsH + 24;
    int height = reqTop + lanes * laneH + 34;
    StringBuilder b = new StringBuilder();
    b.append(String.format(Locale.ROOT, "<svg class=\"timeline\" viewBox=\"0 0 %d %d\" role=\"img\" aria-label=\"timeline\">", width, height));
    int maxPts = 1;
    for (ScanLog.FrameEntry f : frames) maxPts = Math.max(maxPts, f.pointCount());
    b.append(String.format(Locale.ROOT, "<text x=\"%d\" y=\"%d\" class=\"ax\" text-anchor=\"end\">points</text>", left - 8, top + pointsH / 2 + 4));
    b.append(String.format(Locale.ROOT, "<text x=\"%d\" y=\"%d\" class=\"ax\" text-anchor=\"end\">requests</text>", left - 8, reqTop + laneH + 4));
    double barW = Math.max(1.0, Math.min(6.0, plotW / Math.max(1.0, frames.size()) * 0.8));
    for (ScanLog.FrameEntry f : frames) {
      double x = left + f.fedAt / end * plotW;
      double h = (double) f.pointCount() / maxPts * pointsH;
      b.append(String.format(Locale.ROOT, "<rect class=\"pts\" x=\"%.1f\" y=\"%.1f\" width=\"%.1f\" height=\"%.1f\"><title>frame %d: %d points</title></rect>",
          x, top + pointsH - h, barW, h, f.index, f.pointCount()));
    }
    b.append(String.format(Locale.ROOT, "<line class=\"base\" x1=\"%d\" y1=\"%d\" x2=\"%d\" y2=\"%d\"/>", left, top + pointsH, left + plotW, top + pointsH));
    for (ScanLog.RequestEntry r : requests) {
      double x0 = left + r.sentAt / end * plotW;
      double x1 = left + (r.answeredAt >= 0 ? r.answeredAt : end) / end * plotW;
      int lane = (r.number - 1) % lanes;
      b.append(String.format(Locale.ROOT, "<a href=\"#r%d\"><rect class=\"%s\" x=\"%.1f\" y=\"%d\" width=\"%.1f\" height=\"%d\" rx=\"2\">"
              + "<title>#%d frame %d: %s</title></rect></a>", r.number, status(r), x0, reqTop + lane * laneH,
          Math.max(2.0, x1 - x0), laneH - 4, r.number, r.frameIndex, esc(outcome(r))));
    }
    int axisY = reqTop + lanes * laneH + 8;
    b.append(String.format(Locale.ROOT, "<line class=\"base\" x1=\"%d\" y1=\"%d\" x2=\"%d\" y2=\"%d\"/>", left, axisY, left + plotW, axisY));
    double step = niceStep(end);
    for (double t = 0; t <= end; t += step) {
      double x = left + t / end * plotW;
      b.append(String.format(Locale.ROOT, "<line class=\"tick\" x1=\"%.1f\" y1=\"%d\" x2=\"%.1f\" y2=\"%d\"/>", x, top, x, axisY + 4));
      b.append(String.format(Locale.ROOT, "<text class=\"ax\" x=\"%.1f\" y=\"%d\" text-anchor=\"middle\">%s s</text>", x, axisY + 18,
          step < 1 ? String.format(Locale.ROOT, "%.1f", t) : String.format(Locale.ROOT, "%.0f", t)));
    }
    b.append("</svg>");
    return b.toString();
  }

  static double niceStep(double span) {
    double[] steps = {0.1, 0.2, 0.5, 1, 2, 5, 10, 20, 30, 60, 120, 300, 600};
    for (double s : steps) {
      if (span / s <= 12) return s;
    }
    return Math.ceil(span / 12 / 600) * 600;
  }

  private static final String CSS = String.join("\n",
      ":root{--ink:#1d2430;--muted:#6a7384;--line:#dde2ea;--bg:#f5f7fa;--box:#e0307f;--ok:#2f9e62;--err:#d64541;--open:#9aa3b2;--pts:#3a7bd5}",
      "*{box-sizing:border-box}",
      "body{margin:0;padding:24px 32px;font:14px/1.45 -apple-system,'Segoe UI',Roboto,'DejaVu Sans',sans-serif;color:var(--ink);background:var(--bg)}",
      "h1{margin:0 0 4px;font-size:24px}h2{font-size:17px;margin:28px 0 10px}",
      ".verdict{display:inline-block;margin:4px 0 10px;padding:2px 10px;border-radius:12px;font-weight:600;color:#fff}",
      ".verdict.good{background:var(--ok)}.verdict.bad{background:var(--err)}",
      ".facts{display:grid;grid-template-columns:max-content 1fr;gap:2px 14px;margin:0;color:var(--muted)}",
      ".facts dt{font-weight:600}.facts dd{margin:0;color:var(--ink);word-break:break-all}",
      ".tiles{display:grid;grid-template-columns:repeat(auto-fill,minmax(170px,1fr));gap:10px;margin-top:18px}",
      ".tile{background:#fff;border:1px solid var(--line);border-radius:8px;padding:10px 12px}",
      ".tile.wide{grid-column:span 2}.tile .v{font-size:20px;font-weight:650}.tile .l{color:var(--muted);font-size:12px}.tile.bad .v{color:var(--err)}",
      ".timeline{width:100%;height:auto;background:#fff;border:1px solid var(--line);border-radius:8px}",
      ".timeline .pts{fill:var(--pts);opacity:.75}.timeline .base{stroke:#b8c0cc}.timeline .tick{stroke:#eef1f5}",
      ".timeline .ax{font-size:11px;fill:var(--muted)}",
      ".timeline .box{fill:var(--box)}.timeline .ok{fill:var(--ok)}.timeline .error{fill:var(--err)}.timeline .open{fill:var(--open)}",
      ".legend{color:var(--muted);font-size:12px}.sw{display:inline-block;width:10px;height:10px;border-radius:2px;margin:0 4px 0 12px;vertical-align:-1px}",
      ".sw.pts{background:var(--pts)}.sw.box{background:var(--box)}.sw.ok{background:var(--ok)}.sw.error{background:var(--err)}.sw.open{background:var(--open)}",
      ".grid{display:grid;grid-template-columns:repeat(auto-fill,minmax(360px,1fr));gap:14px}",
      ".card{background:#fff;border:1px solid var(--line);border-left:4px solid var(--ok);border-radius:8px;padding:10px;overflow:hidden}",
      ".card.box{border-left-color:var(--box)}.card.error{border-left-color:var(--err)}.card.open{border-left-color:var(--open)}",
      ".card img{width:100%;height:auto;display:block;border-radius:4px;background:#000}",
      ".noimg{height:120px;display:flex;align-items:center;justify-content:center;background:#eef1f5;color:var(--muted);border-radius:4px}",
      ".meta{margin-top:8px;color:var(--muted)}.meta b{color:var(--ink)}",
      ".status{font-weight:600;margin:2px 0}.status.error{color:var(--err)}.status.box{color:var(--box)}.status.open{color:var(--open)}",
      ".results{margin:4px 0;padding-left:18px}.results li{margin:2px 0}",
      ".type{display:inline-block;font-size:11px;font-weight:700;padding:0 6px;border-radius:8px;background:#eef1f5}",
      ".q{color:var(--muted);font-size:12px;word-break:break-all}",
      "pre.body{white-space:pre-wrap;word-break:break-all;background:#fbeaea;padding:6px;border-radius:4px;font-size:12px}",
      "details{margin-top:6px;font-size:12px}details table{border-collapse:collapse;margin-top:4px}",
      "details td{padding:1px 8px 1px 0;vertical-align:top}code{font-size:12px}",
      ".muted{color:var(--muted)}",
      "footer{margin-top:30px;color:var(--muted);font-size:12px}",
      "");
}
