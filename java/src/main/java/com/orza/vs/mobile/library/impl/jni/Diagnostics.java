package com.orza.vs.mobile.library.impl.jni;

import java.nio.charset.Charset;

/**
 * The library's diagnostic lines ("Skipped input frame: TSE not in RUNNING state" and the like).
 * By default the library writes them to standard output (and, on Android, to the log with the tag
 * {@code OrzaVSMobile}); an app that sets a listener receives them instead.
 *
 * <p>Lines arrive on the thread that produced them: a thread calling the engine, the engine's own
 * worker thread, or the thread that pushes a server reply. They arrive one at a time; the listener
 * must return quickly and must not call into the library.
 */
public final class Diagnostics {
  /** Receives one diagnostic line at a time, without its line terminator. */
  public interface Listener {
    void onLine(String line);
  }

  private static final Charset UTF_8 = Charset.forName("UTF-8");
  private static volatile Listener listener;

  static {
    // Loading the library binds setEnabled (registered when OrzaVSMobileJNI initialises).
    try {
      Class.forName(OrzaVSMobileJNI.class.getName(), true, Diagnostics.class.getClassLoader());
    } catch (ClassNotFoundException e) {
      throw new ExceptionInInitializerError(e);
    }
  }

  private Diagnostics() {}

  /**
   * Sends every later line to {@code newListener}; {@code null} restores the default output. Once
   * this returns, the previous listener receives no further line.
   */
  public static synchronized void setListener(Listener newListener) {
    listener = newListener;
    setEnabled(newListener != null);
  }

  private static native void setEnabled(boolean enabled);

  /** Called by the library with the bytes of one line. */
  private static void deliver(byte[] line) {
    Listener current = listener;
    if (current == null) {
      return;
    }
    try {
      current.onLine(new String(line, UTF_8));
    } catch (RuntimeException e) {
      // A failing listener must not disturb the engine operation that printed the line.
    }
  }
}
