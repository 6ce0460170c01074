package com.orza.vs.mobile.library.session;

import com.orza.vs.mobile.library.impl.jni.ResponseStatus;

/**
 * What a {@link VisualSearchSession} reports. Every method has an empty default: implement the
 * ones you need. All values handed over are plain Java values that belong to the listener and
 * may be kept after the call.
 *
 * <p>Threads: {@link #onInterestPoints} runs on the thread that passed the frame in, inside
 * that call, while the engine holds its lock (do not call the session from it);
 * {@link #onResults} and {@link #onServerError} run on the transport's thread that delivered the
 * server's answer. Keep them short; hand work to your own threads.
 */
public interface SessionListener {
  /**
   * The interest points of one frame, as x0, y0, x1, y1, ... in frame pixels (at most 50
   * points). Only when this method is overridden are the points read at all.
   */
  default void onInterestPoints(float[] xy) {}

  /** The answer to a visual search query (the list may be empty). */
  default void onResults(SearchResults results) {}

  /**
   * A query failed: {@code status} says how, {@code responseCode} is the transport's code (the
   * HTTP status, or a negative code of the built-in HTTP transport when no answer came).
   */
  default void onServerError(ResponseStatus status, int responseCode) {}
}
