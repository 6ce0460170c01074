package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.*;

import com.orza.vs.tools.server.BuiltInCatalog;
import com.orza.vs.tools.server.Json;
import java.io.ByteArrayOutputStream;
import java.io.File;
import java.io.IOException;
import java.io.PrintStream;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.Arrays;
import java.util.List;
import java.util.Locale;
import java.util.regex.Matcher;
import java.util.regex.Pattern;
import java.util.stream.Collectors;
import javax.imageio.ImageIO;
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
  void builtInSceneIsRecognisedMeasuredAndReported() throws IOException {
    Path out = tmp.resolve("report");
    Run r = run("--frames", "60", "--out", out.toString(), "--no-progress");
    assertEquals(0, r.status, r.out);
    assertTrue(r.out.contains("vsscan: started the reference server at http://127.0.0.1:"), r.out);
    assertEquals(60, figure(r.out, "frames in +(\\d+)"));
    int sent = figure(r.out, "requests +(\\d+) sent");
    assertEquals(sent, figure(r.out, "\\((\\d+) decoded"));
    assertEquals(sent, r.out.split("\\] #", -1).length - 1, "one line per request as it arrived: " + r.out);
    Matcher m = Pattern.compile("\n  recognition: (\\d+) of (\\d+) requests named the right product \\([0-9.]+%\\), (\\d+) wrong, "
        + "median box IoU (0\\.\\d+)\n  frame choice: engine-chosen frames [0-9.]+% right, all frames ([0-9.]+)% right\n").matcher(r.out);
    assertTrue(m.find(), r.out);
    assertEquals(sent, Integer.parseInt(m.group(2)));
    assertTrue(Integer.parseInt(m.group(1)) >= sent - 2 && m.group(3).equals("0"), "recognised: " + m.group());
    assertTrue(Double.parseDouble(m.group(4)) > 0.8 && Double.parseDouble(m.group(5)) > 80, m.group());

    String html = Files.readString(out.resolve("index.html"));
    assertTrue(html.contains("scan succeeded") && html.contains("Recognition and frame choice") && html.contains("frames/request-0001.png"));
    List<?> results = (List<?>) Json.parse(Files.readString(out.resolve("results.json")));
    assertEquals(sent, results.size());
    Object first = ((List<?>) Json.member(results.get(0), "results")).get(0);
    assertEquals("PIDN", Json.member(first, "contentType"));
    assertEquals(4, ((List<?>) Json.member(first, "corners")).size());
  }

  @Test
  void aFolderWithATruthIsMeasuredPerFile() throws IOException {
    File dir = Files.createDirectory(tmp.resolve("shots")).toFile();
    GeneratedSource scene = new GeneratedSource(640, 480, 10, 30); // two frames of each product
    StringBuilder truth = new StringBuilder("{");
    for (int i = 0; i < 10; i += 4) {
      ImageIO.write(scene.render(i), "png", new File(dir, "shot" + i + ".png"));
      double[] c = scene.truth(i).corners;
      truth.append(String.format(Locale.ROOT, "\"shot%d.png\": {\"product\": \"%s\", \"corners\": [%f,%f,%f,%f,%f,%f,%f,%f]},",
          i, scene.truth(i).product, c[0], c[1], c[2], c[3], c[4], c[5], c[6], c[7]));
    }
    Files.writeString(new File(dir, "truth.json").toPath(), truth.append("\"absent.png\": {}}").toString());
    ImageIO.write(BuiltInCatalog.background(), "png", new File(dir, "table.png")); // no product, not listed
    Path out = tmp.resolve("shots-report");
    Run r = run(dir.getPath(), "--out", out.toString(), "--quiet");
    assertEquals(0, r.status, r.out);
    assertTrue(r.out.contains("recognition: 4 of 4 requests named the right product (100.0%), 0 wrong, median box IoU 0."), r.out);
    assertTrue(r.out.contains("all frames 100.0% right"), r.out);
    List<?> results = (List<?>) Json.parse(Files.readString(out.resolve("results.json")));
    assertEquals(List.of("shot0.png", "shot4.png", "shot8.png", "table.png"), results.stream().map(e -> Json.member(e, "file")).collect(Collectors.toList()));
    assertEquals(List.of(), Json.member(results.get(3), "results"));
    Files.writeString(new File(dir, "truth.json").toPath(), "{\"shot0.png\": {\"corners\": [1, 2]}}");
    assertEquals(2, run(dir.getPath(), "--out", out.toString(), "--quiet").status, "a bad truth.json is bad input");
  }

  @Test
  void aTruncatedVideoIsScannedUpToTheDamage() throws IOException {
    GeneratedSource scene = new GeneratedSource(96, 64, 2, 10);
    byte[] f0 = scene.next().data, f1 = scene.next().data;
    File video = FrameSourcesTest.y4m(tmp, "YUV4MPEG2 W96 H64 F10:1 C420jpeg", f0, f1, Arrays.copyOf(f1, 100)); // the third is cut short
    Run r = run(video.getPath(), "--out", tmp.resolve("cut").toString(), "--no-progress");
    assertTrue(r.out.contains("truncated frame 2; the input ends here"), r.out);
    assertEquals(2, figure(r.out, "frames in +(\\d+)"));
    assertEquals(0, r.status, r.out);
    assertTrue(new File(tmp.resolve("cut").toFile(), "index.html").isFile());
  }

  @Test
  void exitStatusIsTwoForBadUsageOrInputAndOneWhenRequestsFail() {
    for (String[] args : new String[][] {{"--frames"}, {"--size", "12"}, {"--bogus"}, {"a", "b"}}) {
      assertEquals(2, run(args).status, String.join(" ", args));
    }
    Run missing = run(tmp.resolve("nothing-here").toString(), "--out", tmp.resolve("o").toString());
    assertEquals(2, missing.status);
    assertTrue(missing.out.contains("no such file or folder"), missing.out);
    Run help = run("--help");
    assertEquals(0, help.status);
    assertTrue(help.out.contains("usage: vsscan"));
    Run failed = run("--size", "160x120", "--frames", "8", "--no-pace", "--quiet", "--out", tmp.resolve("r").toString(),
        "--server", TestServers.shared().baseUrl() + "/test/500");
    assertEquals(1, failed.status, failed.out);
    assertTrue(failed.out.contains("vsscan: FAILED: "), failed.out);
    assertTrue(figure(failed.out, "(\\d+) errors") >= 1, failed.out);
  }
}
