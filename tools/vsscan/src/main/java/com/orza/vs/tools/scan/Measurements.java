package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.Json;
import java.util.ArrayList;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Locale;
import java.util.Map;

/**
 * How well a scan recognised what its frames show, when the source knows it: the engine's
 * requests against the truth, and the same server asked about every frame directly, which
 * tells what the engine's choice of frames is worth.
 */
public final class Measurements {
  /** One frame fed to the engine, and the server's direct answer for it. */
  public static final class FrameInfo {
    public final int index;
    public final Truth truth;
    public final String file;
    /** The engine's sharpness measure of the frame's luminance (the take rule's). */
    public final int sharpness;
    /** The frame, kept for the direct query; dropped once asked. */
    Frame frame;
    /** Product the server named when asked directly (null: none), and whether it was asked. */
    public String direct;
    public boolean asked;

    FrameInfo(int index, Truth truth, String file, int sharpness, Frame frame) {
      this.index = index;
      this.truth = truth;
      this.file = file;
      this.sharpness = sharpness;
      this.frame = frame;
    }

    boolean directRight() {
      return asked && sameProduct(direct, truth.product);
    }
  }

  /** Engine requests whose frame has a truth, right and wrong ones, and the median box IoU. */
  public final int requests;
  public final int right;
  public final int wrong;
  public final double medianIou;
  /** Frames asked directly, and how many of those were right. */
  public final int framesAsked;
  public final int framesRight;
  /** Frame index -> 1 right, -1 wrong, 0 no product named, for the engine's requests. */
  final Map<Integer, Integer> chosen = new LinkedHashMap<>();
  final List<FrameInfo> frames;

  public Measurements(List<FrameInfo> frames, List<ScanLog.RequestEntry> log) {
    this.frames = frames;
    int n = 0, k = 0, w = 0;
    List<Double> ious = new ArrayList<>();
    for (ScanLog.RequestEntry r : log) {
      if (r.frameIndex < 0 || r.frameIndex >= frames.size() || !r.reported) continue;
      Truth t = frames.get(r.frameIndex).truth;
      if (t == null) continue;
      n++;
      ScanLog.Result named = product(r.results);
      String id = named == null ? null : named.content;
      int verdict = 0;
      if (sameProduct(id, t.product)) {
        k++;
        verdict = 1;
        if (named != null && named.location != null && t.corners != null) {
          double[] box = new double[8];
          for (int i = 0; i < 8; i++) box[i] = named.location[i];
          ious.add(Truth.iou(box, t.corners));
        }
      } else if (id != null) {
        w++;
        verdict = -1;
      }
      chosen.put(r.frameIndex, verdict);
    }
    requests = n;
    right = k;
    wrong = w;
    medianIou = ious.isEmpty() ? Double.NaN : Summary.percentile(ious, 50);
    int asked = 0, ok = 0;
    for (FrameInfo f : frames) {
      if (f.truth == null || !f.asked) continue;
      asked++;
      if (f.directRight()) ok++;
    }
    framesAsked = asked;
    framesRight = ok;
  }

  /** Right means naming the frame's product, or naming none when it shows none. */
  static boolean sameProduct(String named, String truth) {
    return named == null ? truth == null : named.equals(truth);
  }

  /** The first "PIDN" result, or null. */
  static ScanLog.Result product(List<ScanLog.Result> results) {
    for (ScanLog.Result x : results) {
      if ("PIDN".equals(x.type)) return x;
    }
    return null;
  }

  /** The product id a reply document names (its first "PIDN" result), or null. */
  static String productInReply(String body) {
    Object list = Json.member(Json.member(Json.parse(body), "quillmark"), "searchResult");
    if (!(list instanceof List)) return null;
    for (Object x : (List<?>) list) {
      if ("PIDN".equals(Json.member(x, "contentType")) && Json.member(x, "content") instanceof String) {
        return (String) Json.member(x, "content");
      }
    }
    return null;
  }

  static double percent(int part, int whole) {
    return whole == 0 ? 0 : 100.0 * part / whole;
  }

  public List<String> lines() {
    List<String> out = new ArrayList<>();
    out.add(String.format(Locale.ROOT, "recognition: %d of %d requests named the right product (%.1f%%), %d wrong, median box IoU %s",
        right, requests, percent(right, requests), wrong, Double.isNaN(medianIou) ? "-" : String.format(Locale.ROOT, "%.3f", medianIou)));
    out.add(String.format(Locale.ROOT, "frame choice: engine-chosen frames %.1f%% right, all frames %.1f%% right",
        percent(right, requests), percent(framesRight, framesAsked)));
    return out;
  }

  /**
   * The engine's sharpness measure of a frame's first plane: a sparse sum of absolute Laplacian
   * responses over a band of consecutive rows (the margins use the double just below 0.1, as
   * the engine does).
   */
  static int sharpness(Frame f) {
    double k = 0.09999999999999998;
    int top = (int) Math.round(f.width * k), left = (int) Math.round(f.height * k);
    int sum = 0;
    int row = top + 1;
    for (int r = top; r < f.height - top; r += 5, row++) {
      if (row < 1 || row >= f.height - 1) continue;
      for (int x = Math.max(1, left); x < f.width - left && x < f.width - 1; x += 5) {
        int o = row * f.width + x;
        int c = f.data[o] & 255;
        int n = 0;
        for (int dy = -1; dy <= 1; dy++) {
          for (int dx = -1; dx <= 1; dx++) {
            if (dx != 0 || dy != 0) n += f.data[o + dy * f.width + dx] & 255;
          }
        }
        sum += Math.abs(8 * c - n);
      }
    }
    return sum;
  }

  /**
   * An SVG plot over the frames: each frame's sharpness as a bar coloured by the direct
   * answer (right, wrong, none), and a marker above the frames the engine took, coloured by
   * its answer.
   */
  String plot() {
    int width = 960, left = 70, plotW = width - left - 20, barsTop = 30, barsH = 120, laneY = 8;
    int height = barsTop + barsH + 36;
    int max = 1;
    for (FrameInfo f : frames) max = Math.max(max, f.sharpness);
    double step = (double) plotW / Math.max(1, frames.size());
    StringBuilder b = new StringBuilder();
    b.append(String.format(Locale.ROOT, "<svg class=\"timeline\" viewBox=\"0 0 %d %d\" role=\"img\" aria-label=\"frame choice\">", width, height));
    b.append(String.format(Locale.ROOT, "<text x=\"%d\" y=\"%d\" class=\"ax\" text-anchor=\"end\">taken</text>", left - 8, laneY + 12));
    b.append(String.format(Locale.ROOT, "<text x=\"%d\" y=\"%d\" class=\"ax\" text-anchor=\"end\">sharpness</text>", left - 8, barsTop + barsH / 2));
    for (FrameInfo f : frames) {
      double x = left + f.index * step;
      double h = barsH * (double) f.sharpness / max;
      String cls = !f.asked || f.truth == null ? "pts" : f.directRight() ? "ok" : f.direct != null ? "error" : "open";
      b.append(String.format(Locale.ROOT, "<rect class=\"%s\" x=\"%.1f\" y=\"%.1f\" width=\"%.1f\" height=\"%.1f\"><title>frame %d: sharpness %d, asked directly: %s</title></rect>",
          cls, x, barsTop + barsH - h, Math.max(1, step - 0.5), h, f.index, f.sharpness, f.asked ? (f.direct == null ? "no product" : f.direct) : "-"));
      Integer v = chosen.get(f.index);
      if (v != null) {
        b.append(String.format(Locale.ROOT, "<circle class=\"%s\" cx=\"%.1f\" cy=\"%d\" r=\"5\"><title>frame %d taken by the engine: %s</title></circle>",
            v > 0 ? "ok" : v < 0 ? "error" : "open", x + step / 2, laneY + 8, f.index, v > 0 ? "right" : v < 0 ? "wrong product" : "no product"));
      }
    }
    int axisY = barsTop + barsH;
    b.append(String.format(Locale.ROOT, "<line class=\"base\" x1=\"%d\" y1=\"%d\" x2=\"%d\" y2=\"%d\"/>", left, axisY, left + plotW, axisY));
    for (int i = 0; i < frames.size(); i += Math.max(1, frames.size() / 10)) {
      b.append(String.format(Locale.ROOT, "<text class=\"ax\" x=\"%.1f\" y=\"%d\" text-anchor=\"middle\">%d</text>", left + i * step, axisY + 18, i));
    }
    b.append("</svg>");
    return b.toString();
  }
}
