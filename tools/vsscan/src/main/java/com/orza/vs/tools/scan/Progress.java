package com.orza.vs.tools.scan;

import java.io.PrintStream;
import java.util.Locale;

/**
 * The progress display: one line rewritten in place on a terminal, a plain line every few
 * seconds otherwise. Other output goes through {@link #println} so that it does not mix with the
 * line being rewritten. Thread-safe.
 */
final class Progress {
  private final PrintStream out;
  private final boolean enabled;
  private final boolean tty;
  private final long periodNanos;
  private long lastNanos;
  private String shown = "";

  Progress(PrintStream out, boolean enabled, boolean tty) {
    this.out = out;
    this.enabled = enabled;
    this.tty = tty;
    this.periodNanos = tty ? 100_000_000L : 2_000_000_000L;
    this.lastNanos = System.nanoTime();
  }

  /** Whether an update is due now (the caller then computes the figures). */
  synchronized boolean due() {
    return enabled && System.nanoTime() - lastNanos >= periodNanos;
  }

  synchronized void update(int frames, int total, Summary s) {
    lastNanos = System.nanoTime();
    String text = String.format(Locale.ROOT, "vsscan: frame %d%s  points %.0f avg  requests %d  replies %d  results %d  errors %d",
        frames, total > 0 ? "/" + total : "", s.meanPoints, s.requests, s.replies, s.results, s.errors);
    if (tty) {
      out.print("\r" + pad(text));
      out.flush();
      shown = text;
    } else {
      out.println(text);
    }
  }

  synchronized void println(String line) {
    if (tty && !shown.isEmpty()) {
      out.print("\r" + pad("") + "\r");
      out.println(line);
      out.print(shown);
      out.flush();
    } else {
      out.println(line);
    }
  }

  synchronized void clear() {
    if (tty && !shown.isEmpty()) {
      out.print("\r" + pad("") + "\r");
      out.flush();
      shown = "";
    }
  }

  private String pad(String s) {
    StringBuilder b = new StringBuilder(s);
    while (b.length() < Math.max(shown.length(), 1)) b.append(' ');
    return b.toString();
  }
}
