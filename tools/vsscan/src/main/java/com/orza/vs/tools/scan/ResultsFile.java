package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.Json;
import java.io.File;
import java.io.IOException;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.util.ArrayList;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/**
 * results.json in the report folder: one entry per request the engine sent, in order, with the
 * frame index, the source image's file name (folder sources), the outcome and every result the
 * engine reported (content type, content, corners, and sub-contents the same way).
 */
final class ResultsFile {
  private ResultsFile() {}

  static void write(File file, List<ScanLog.RequestEntry> requests, List<Measurements.FrameInfo> frames) throws IOException {
    List<Object> out = new ArrayList<>();
    for (ScanLog.RequestEntry r : requests) {
      Map<String, Object> e = new LinkedHashMap<>();
      e.put("request", r.number);
      e.put("frame", r.frameIndex);
      if (r.frameIndex >= 0 && r.frameIndex < frames.size() && frames.get(r.frameIndex).file != null) {
        e.put("file", frames.get(r.frameIndex).file);
      }
      e.put("outcome", !r.reported ? "unanswered" : r.decoded ? "decoded" : "error " + r.errorStatus + "/" + r.errorCode);
      e.put("results", results(r.results));
      out.add(e);
    }
    Files.write(file.toPath(), (Json.write(out) + "\n").getBytes(StandardCharsets.UTF_8));
  }

  private static List<Object> results(List<ScanLog.Result> results) {
    List<Object> out = new ArrayList<>();
    for (ScanLog.Result x : results) {
      Map<String, Object> e = new LinkedHashMap<>();
      e.put("contentType", x.type);
      e.put("content", x.content);
      List<Object> corners = null;
      if (x.location != null) {
        corners = new ArrayList<>();
        for (int i = 0; i < 8; i += 2) corners.add(List.of(Math.round(x.location[i] * 10) / 10.0, Math.round(x.location[i + 1] * 10) / 10.0));
      }
      e.put("corners", corners);
      if (!x.subContents.isEmpty()) e.put("subContents", results(x.subContents));
      out.add(e);
    }
    return out;
  }
}
