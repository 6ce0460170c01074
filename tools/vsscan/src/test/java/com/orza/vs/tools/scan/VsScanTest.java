package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.assertEquals;
import static org.junit.jupiter.api.Assertions.assertTrue;

import com.orza.vs.tools.server.ReferenceServer;
import java.io.ByteArrayOutputStream;
import java.io.File;
import java.io.IOException;
import java.io.PrintStream;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.regex.Matcher;
import java.util.regex.Pattern;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** The command-line tool from end to end, as a person runs it. */
class VsScanTest {
  @TempDir
  Path tmp;

  static final class Run {
    int status;
    String out;
  }

  static Run run(String... args) {
    ByteArrayOutputStream buf = new ByteArrayOutputStream();
    Run r = new Run();
    try (PrintStream ps = new PrintStream(buf, true, StandardCharsets.UTF_8)) {
      r.status = VsScan.run(args, ps);
    }
    r.out = buf.toString(StandardCharsets.UTF_8);
    return r;
  }

  static int figure(String out, String regex) {
    Matcher m = Pattern.compile(regex).matcher(out);
    assertTrue(m.find(), "no match for " + regex + " in\n" + out);
    return Integer.parseInt(m.group(1));
  }

  @Test
  void builtInSceneWithBuiltInServerSucceedsAndWritesTheReport() throws IOException {
    File out = tmp.resolve("report").toFile();
    Run r = run("--size", "320x240", "--frames", "60", "--out", out.getPath(), "--no-progress");
    assertEquals(0, r.status, r.out);
    assertTrue(r.out.contains("vsscan: started the reference server at http://127.0.0.1:"), r.out);
    int frames = figure(r.out, "frames in +(\\d+)");
    int sent = figure(r.out, "requests +(\\d+) sent");
    int replies = figure(r.out, "sent, (\\d+) replies");
    int decoded = figure(r.out, "\\((\\d+) decoded");
    int boxes = figure(r.out, "\\((\\d+) with a bounding box\\)");
    assertEquals(60, frames);
    assertTrue(sent >= 2, r.out);
    assertEquals(sent, replies);
    assertEquals(sent, decoded);
    assertEquals(sent, boxes);
    assertTrue(r.out.matches("(?s).*latency +p50 [0-9.]+ ms, p90 [0-9.]+ ms, max [0-9.]+ ms.*"), r.out);
    // One line per result as it arrived.
    assertEquals(sent, r.out.split("BoundingBox \\(", -1).length - 1, r.out);

    String html = new String(Files.readAllBytes(new File(out, "index.html").toPath()), StandardCharsets.UTF_8);
    assertTrue(html.contains("scan succeeded"));
    for (int i = 1; i <= sent; i++) {
      assertTrue(new File(out, String.format("frames/request-%04d.png", i)).isFile(), "annotated frame " + i);
      assertTrue(html.contains(String.format("frames/request-%04d.png", i)));
    }
    assertTrue(new File(out, "server.log").isFile());
    assertTrue(r.out.contains("vsscan: report " + new File(out, "index.html").getAbsolutePath()), r.out);
  }

  @Test
  void failingServerMakesTheToolFail() throws IOException {
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.log = null;
    try (ReferenceServer server = new ReferenceServer(o).start()) {
      Run r = run("--size", "160x120", "--frames", "8", "--no-pace", "--quiet", "--out", tmp.resolve("r").toString(),
          "--server", server.baseUrl() + "/test/500");
      assertEquals(1, r.status, r.out);
      assertTrue(r.out.contains("vsscan: FAILED: "), r.out);
      assertTrue(figure(r.out, "(\\d+) errors") >= 1, r.out);
    }
  }

  @Test
  void aTruncatedVideoIsScannedUpToTheDamage() throws IOException {
    int w = 96, h = 64;
    java.util.Random rnd = new java.util.Random(9);
    ByteArrayOutputStream y4m = new ByteArrayOutputStream();
    y4m.writeBytes(("YUV4MPEG2 W" + w + " H" + h + " F10:1 C420jpeg\n").getBytes(StandardCharsets.US_ASCII));
    for (int i = 0; i < 3; i++) {
      byte[] frame = new byte[w * h * 3 / 2];
      for (int k = 0; k < w * h; k++) frame[k] = (byte) (rnd.nextBoolean() ? 20 : 230);
      java.util.Arrays.fill(frame, w * h, frame.length, (byte) 128);
      y4m.writeBytes("FRAME\n".getBytes(StandardCharsets.US_ASCII));
      y4m.writeBytes(i < 2 ? frame : java.util.Arrays.copyOf(frame, 100)); // the third is cut short
    }
    File video = tmp.resolve("cut.y4m").toFile();
    Files.write(video.toPath(), y4m.toByteArray());
    Run r = run(video.getPath(), "--out", tmp.resolve("cut").toString(), "--no-progress");
    assertTrue(r.out.contains("truncated frame 2; the input ends here"), r.out);
    assertEquals(2, figure(r.out, "frames in +(\\d+)"));
    assertEquals(0, r.status, r.out);
    assertTrue(new File(tmp.resolve("cut").toFile(), "index.html").isFile());
  }

  @Test
  void badUsageAndInputsExitWithStatusTwo() {
    assertEquals(2, run("--frames").status);
    assertEquals(2, run("--size", "12").status);
    assertEquals(2, run("--bogus").status);
    assertEquals(2, run("a", "b").status);
    Run missing = run(tmp.resolve("nothing-here").toString(), "--out", tmp.resolve("o").toString());
    assertEquals(2, missing.status);
    assertTrue(missing.out.contains("no such file or folder"), missing.out);
    Run help = run("--help");
    assertEquals(0, help.status);
    assertTrue(help.out.contains("usage: vsscan"));
  }
}
