package com.orza.vs.mobile.library.impl.jni;

import static org.junit.jupiter.api.Assertions.assertEquals;

import java.util.ArrayList;
import java.util.Arrays;
import java.util.List;
import org.junit.jupiter.api.Test;

/** The library's diagnostic lines reach a Java listener, on the thread that printed them. */
class DiagnosticsTest {
  @Test
  void aListenerReceivesTheLinesUntilItIsRemoved() {
    final List<String> lines = new ArrayList<String>();
    TovraStateEngineFacade engine = new TovraStateEngineFacade(new EventDelegateBase());
    ImageBuffer image = new ImageBuffer();
    ExtraFrameData extra = new ExtraFrameData();
    final Thread caller = Thread.currentThread();
    Diagnostics.setListener(new Diagnostics.Listener() {
      @Override
      public void onLine(String line) {
        lines.add((Thread.currentThread() == caller ? "" : "other thread: ") + line);
        throw new IllegalStateException("ignored by the library");
      }
    });
    try {
      engine.process(image, extra);  // not started
      engine.process(image, extra);
    } finally {
      Diagnostics.setListener(null);
    }
    engine.process(image, extra);  // to standard output again
    assertEquals(Arrays.asList("Skipped input frame: TSE not in RUNNING state",
        "Skipped input frame: TSE not in RUNNING state"), lines);
    extra.delete();
    image.delete();
    engine.delete();
  }
}
