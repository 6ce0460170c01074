package com.orza.vs.tools.scan;

import static org.junit.jupiter.api.Assertions.*;

import java.awt.image.BufferedImage;
import java.io.File;
import java.io.IOException;
import java.nio.file.Files;
import java.nio.file.Path;
import java.util.ArrayList;
import java.util.List;
import java.util.Map;
import javax.imageio.ImageIO;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.api.io.TempDir;

/** Bookkeeping of a scan, its summary figures and its report, without the engine. */
class ScanLogTest {
  @TempDir
  Path tmp;

  @Test
  void requestsFindTheirFrameAndReportsGoToTheRequestAnsweredOnTheSameThread() throws Exception {
    assertEquals(17, ScanLog.frameIdOf("TovraStateEngine-1700000000-17"));
    for (String none : new String[] {"no-number-here-x", "plain", null}) assertEquals(-1, ScanLog.frameIdOf(none), none);
    ScanLog log = new ScanLog();
    log.frameIn(0, 0.0, 64, 48, 5);
    log.points(new float[] {1, 2, 3, 4});
    log.frameIn(1, 0.033, 64, 48, 6);
    ScanLog.RequestEntry a = log.requestSent("TovraStateEngine-1-5", Map.of(), new byte[0]);
    ScanLog.RequestEntry b = log.requestSent("TovraStateEngine-1-6", Map.of(), new byte[0]);
    assertEquals(List.of(0, 1), List.of(a.frameIndex, b.frameIndex));
    assertEquals(List.of(2, 0), List.of(log.frames().get(0).pointCount(), log.frames().get(1).pointCount()));

    // b is answered first on another thread: its report must not land on the older a.
    Thread t = new Thread(() -> {
      log.answered("TovraStateEngine-1-6", 500, "boom", 0.010);
      log.serverError(1, 500);
    });
    t.start();
    t.join();
    assertTrue(b.isError());
    assertEquals(500, b.errorCode);
    assertFalse(a.reported);
    // A report with no answer on this thread goes to the oldest open request.
    assertSame(a, log.decoded(List.of(), "q1", true, List.of("q1")));
    assertEquals(0, log.openRequests());
    // A report with nothing open is counted, not attributed.
    log.serverError(2, 200);
    assertEquals(1, log.reportsWithoutRequest());
  }

  @Test
  void reportShowsAnnotatedFramesAndEscapesServerText() throws IOException {
    byte[] jpeg = VsScan.jpeg(Yuv.toNv21(new BufferedImage(160, 120, BufferedImage.TYPE_INT_RGB), 0));
    ScanLog log = new ScanLog();
    log.frameIn(0, 0, 160, 120, 3);
    log.points(new float[] {10, 10, 50, 60});
    log.requestSent("TovraStateEngine-9-3", Map.of("orientation", "90"), jpeg);
    log.answered("TovraStateEngine-9-3", 200, "{}", 0.012);
    float[] box = {20, 30, 100, 30, 100, 90, 20, 90};
    log.decoded(List.of(new ScanLog.Result("BoundingBox", "<script>alert(1)</script>", "{}", box, null)), "q-1", true, List.of("q-0", "q-1"));
    log.requestSent("TovraStateEngine-9-4", Map.of(), new byte[] {1, 2, 3}); // not a JPEG
    log.answered("TovraStateEngine-9-4", -1, "transport: no answer", 0.001);
    log.serverError(1, -1);

    File dir = tmp.toFile();
    File html = ReportWriter.write(dir, log, new Summary(log), null, new ReportWriter.Info());
    String page = Files.readString(html.toPath());
    assertFalse(page.contains("<script>alert"), "server text must be escaped");
    for (String part : new String[] {"&lt;script&gt;alert(1)&lt;/script&gt;", "frames/request-0001.png", "data:image/jpeg;base64,",
        "error: status 1, code -1", "<svg class=\"timeline\"", "scan had problems"}) {
      assertTrue(page.contains(part), part);
    }

    BufferedImage annotated = ImageIO.read(new File(dir, "frames/request-0001.png"));
    assertEquals(160, annotated.getWidth());
    // The box outline is drawn in its colour on the left edge of the box.
    int rgb = annotated.getRGB(20, 60) & 0xffffff;
    assertTrue(((rgb >> 16) & 0xff) > 150 && (rgb & 0xff) > 80 && ((rgb >> 8) & 0xff) < 120, Integer.toHexString(rgb));
    assertFalse(new File(dir, "frames/request-0002.png").exists(), "no PNG for an unreadable JPEG");
  }

  @Test
  void recognitionCountsRightWrongAndMissedRequestsAgainstTheTruth() {
    double[] square = {10, 10, 30, 10, 30, 30, 10, 30};
    List<Measurements.FrameInfo> frames = new ArrayList<>();
    ScanLog log = new ScanLog();
    // frame: truth, what the engine's request got, what the direct query got.
    Object[][] table = {
        {"cup", "cup", "cup"}, {"cup", "cat", null}, {"cup", null, "cup"}, {null, null, null}, {"cat", "cat", "cat"}};
    for (int i = 0; i < table.length; i++) {
      Measurements.FrameInfo f = new Measurements.FrameInfo(i, new Truth((String) table[i][0], square), null, 0, null);
      f.direct = (String) table[i][2];
      f.asked = true;
      frames.add(f);
      log.frameIn(i, i * 0.2, 64, 48, i);
      log.requestSent("TovraStateEngine-1-" + i, Map.of(), new byte[0]);
      float[] box = {10, 10, 30, 10, 30, i == 4 ? 20 : 30, 10, i == 4 ? 20 : 30}; // the cat's box covers half
      List<ScanLog.Result> got = table[i][1] == null ? List.of()
          : List.of(new ScanLog.Result("PIDN", (String) table[i][1], "{}", box, null));
      log.decoded(got, "q" + i, false, List.of());
    }
    assertEquals(0.5, Summary.percentile(List.of(1.0, 0.5), 50));
    assertEquals(List.of("recognition: 3 of 5 requests named the right product (60.0%), 1 wrong, median box IoU 0.500",
        "frame choice: engine-chosen frames 60.0% right, all frames 80.0% right"), new Measurements(frames, log.requests()).lines());
  }
}
