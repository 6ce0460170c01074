package com.orza.vs.tools.scan;

import java.io.Closeable;
import java.io.IOException;

/** A sequence of frames: a generated scene, a folder of images, a Y4M video or a raw NV21 stream. */
public interface FrameSource extends Closeable {
  /** The next frame, or null at the end. Throws IOException on unreadable input. */
  Frame next() throws IOException;

  /** Frames per second the source was captured at (time stamps follow it). */
  double fps();

  /** A short description for the summary and the report. */
  String describe();

  /** The number of frames if known in advance, else -1 (for the progress line). */
  default int expectedFrames() {
    return -1;
  }

  /**
   * True for still images: each deserves its own query, so the scan waits for the outcome of a
   * frame's request before it feeds the next frame.
   */
  default boolean stills() {
    return false;
  }

  @Override
  default void close() throws IOException {}
}
