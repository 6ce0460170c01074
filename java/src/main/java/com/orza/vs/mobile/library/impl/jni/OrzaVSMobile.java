package com.orza.vs.mobile.library.impl.jni;

/**
 * Free functions of the library, and where exceptions from callbacks go when no Java caller can
 * receive them.
 *
 * <p>An exception thrown by a callback (an {@link EventDelegateBase} or {@link ServerDelegate}
 * override) never unwinds through the engine. When the callback ran inside a call from Java
 * into the library ({@code process}, {@code pushServerResponse}, a direct call of a delegate),
 * that call throws the very same exception object when it returns. When it ran on a thread
 * where no such call is waiting (the engine's worker thread), it goes to the handler set with
 * {@link #setCallbackExceptionHandler}; by default to the thread's uncaught-exception handler
 * (which prints it with its stack trace unless the application has set a default handler).
 */
public class OrzaVSMobile {
  private OrzaVSMobile() {}

  private static volatile Thread.UncaughtExceptionHandler callbackExceptionHandler;

  /**
   * Receives the exceptions of callbacks that no Java caller can receive; null restores the
   * default (the current thread's uncaught-exception handler).
   */
  public static void setCallbackExceptionHandler(Thread.UncaughtExceptionHandler handler) {
    callbackExceptionHandler = handler;
  }

  /** The handler set with {@link #setCallbackExceptionHandler}, or null for the default. */
  public static Thread.UncaughtExceptionHandler getCallbackExceptionHandler() {
    return callbackExceptionHandler;
  }

  static void reportUncaught(Throwable thrown) {
    Thread thread = Thread.currentThread();
    Thread.UncaughtExceptionHandler handler = callbackExceptionHandler;
    if (handler == null) handler = thread.getUncaughtExceptionHandler();
    try {
      handler.uncaughtException(thread, thrown);
    } catch (Throwable failed) {
      // The handler itself failed: one line, so the exception is not lost silently.
      System.err.println("Exception from a library callback on " + thread.getName() + ": " + thrown
          + " (its handler failed: " + failed + ")");
    }
  }

  /** True exactly for I420, NV21 and NV12 (the value taken as unsigned, so negatives are not). */
  public static boolean isYUVFormat(int format) {
    return OrzaVSMobileJNI.isYUVFormat(format);
  }

  public static boolean isYUVFormat(ImageFormat format) {
    return OrzaVSMobileJNI.isYUVFormat(format.swigValue());
  }
}
