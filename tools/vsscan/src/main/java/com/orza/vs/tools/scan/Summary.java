package com.orza.vs.tools.scan;

import java.util.ArrayList;
import java.util.Collections;
import java.util.List;
import java.util.Locale;

/** The figures of a finished scan, computed from its {@link ScanLog}. */
public final class Summary {
  public final int frames;
  public final int minPoints;
  public final double meanPoints;
  public final int maxPoints;
  public final int requests;
  /** Answers that came back from the transport (any code). */
  public final int replies;
  public final int decoded;
  public final int errors;
  /** Requests with neither results nor an error when the scan ended. */
  public final int unanswered;
  public final int results;
  public final int boxes;
  /** Round trips of the answered requests, in milliseconds; NaN when there are none. */
  public final double p50Ms;
  public final double p90Ms;
  public final double maxMs;

  public Summary(ScanLog log) {
    List<ScanLog.FrameEntry> fs = log.frames();
    frames = fs.size();
    int min = Integer.MAX_VALUE, max = 0;
    long sum = 0;
    for (ScanLog.FrameEntry f : fs) {
      int n = f.pointCount();
      min = Math.min(min, n);
      max = Math.max(max, n);
      sum += n;
    }
    minPoints = fs.isEmpty() ? 0 : min;
    maxPoints = max;
    meanPoints = fs.isEmpty() ? 0 : (double) sum / fs.size();

    List<ScanLog.RequestEntry> rs = log.requests();
    requests = rs.size();
    int rep = 0, dec = 0, err = 0, open = 0, res = 0, box = 0;
    List<Double> latencies = new ArrayList<>();
    for (ScanLog.RequestEntry r : rs) {
      if (r.answeredAt >= 0) {
        rep++;
        latencies.add(r.roundTrip * 1000.0);
      }
      if (!r.reported) open++;
      else if (r.decoded) dec++;
      else err++;
      res += r.results.size();
      for (ScanLog.Result x : r.results) {
        if (x.location != null) box++;
      }
    }
    replies = rep;
    decoded = dec;
    errors = err;
    unanswered = open;
    results = res;
    boxes = box;
    p50Ms = percentile(latencies, 50);
    p90Ms = percentile(latencies, 90);
    maxMs = percentile(latencies, 100);
  }

  /** Nearest-rank percentile; NaN for an empty list. */
  public static double percentile(List<Double> values, double p) {
    if (values.isEmpty()) return Double.NaN;
    List<Double> sorted = new ArrayList<>(values);
    Collections.sort(sorted);
    int rank = (int) Math.ceil(p / 100.0 * sorted.size());
    return sorted.get(Math.max(0, Math.min(sorted.size() - 1, rank - 1)));
  }

  static String ms(double v) {
    return Double.isNaN(v) ? "-" : String.format(Locale.ROOT, "%.1f ms", v);
  }

  /** The summary lines printed at the end of a scan. */
  public List<String> lines() {
    List<String> out = new ArrayList<>();
    out.add(String.format(Locale.ROOT, "frames in        %d", frames));
    out.add(String.format(Locale.ROOT, "interest points  min %d, mean %.1f, max %d per frame", minPoints, meanPoints, maxPoints));
    out.add(String.format(Locale.ROOT, "requests         %d sent, %d replies (%d decoded, %d errors, %d unanswered)",
        requests, replies, decoded, errors, unanswered));
    out.add(String.format(Locale.ROOT, "results          %d (%d with a bounding box)", results, boxes));
    out.add(String.format(Locale.ROOT, "latency          p50 %s, p90 %s, max %s", ms(p50Ms), ms(p90Ms), ms(maxMs)));
    return out;
  }

  /** True when the scan worked: frames went in, requests were made, and each was decoded. */
  public boolean ok() {
    return frames > 0 && requests > 0 && errors == 0 && unanswered == 0;
  }
}
