package com.orza.vs.mobile.library.impl.jni;

import static org.junit.jupiter.api.Assertions.assertEquals;

import java.nio.ByteBuffer;
import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;
import org.junit.jupiter.api.Test;

/** The library's diagnostic lines reach a Java listener, on the thread that printed them. */
class DiagnosticsTest {
  @Test
  void aListenerReceivesLinesFromCallersAndFromTheEnginesWorker() throws InterruptedException {
    final LinkedBlockingQueue<String> lines = new LinkedBlockingQueue<String>();
    final Thread caller = Thread.currentThread();
    ServerDelegate failing = new ServerDelegate() {
      @Override
      public boolean sendServerRequestImpl(ServerRequest request) {
        throw new IllegalStateException("no network");
      }
    };
    TovraStateEngineFacade engine = new TovraStateEngineFacade(new EventDelegateBase());
    engine.addObjectModule(ObjectModuleID.VISUAL_SEARCH_SERVICE_MOD, failing);
    ImageBuffer image = new ImageBuffer();
    ExtraFrameData extra = new ExtraFrameData();
    Diagnostics.setListener(line -> {
      lines.add((Thread.currentThread() == caller ? "caller: " : "worker: ") + line);
      throw new IllegalStateException("a failing listener is ignored");
    });
    try {
      engine.process(image, extra);  // not started
      assertEquals("caller: Skipped input frame: TSE not in RUNNING state", lines.poll());
      engine.startEngine();
      image.setFormat(ImageFormat.GRAY);
      image.setWidth(64);
      image.setHeight(48);
      image.setWidthStep(64);
      image.allocateBuffer(64 * 48);
      image.fillBufferWithByteBuffer(ByteBuffer.allocateDirect(64 * 48), 64 * 48);
      // Sent from the worker, where the transport throws: the line comes from that native
      // thread, which the listener's call has to attach to the VM.
      engine.process(image, extra);
      assertEquals("worker: Visual search request failed: no network", lines.poll(20, TimeUnit.SECONDS));
    } finally {
      Diagnostics.setListener(null);
    }
    engine.stopEngine();
    engine.process(image, extra);  // to standard output again
    assertEquals(null, lines.poll());
    extra.delete();
    image.delete();
    engine.delete();
    failing.delete();
  }
}
