package com.orza.vs.mobile.library.impl.jni;

/** Native helpers that call delegates the way the engine does (see tests/jni/hooks). */
final class NativeTestHooks {
  static {
    // The binding first, so that its classes and module state exist.
    OrzaVSMobileJNI.class.getName();
    new FrameROI().delete();
    System.load(System.getProperty("orzavs.testhooks.path"));
  }

  private NativeTestHooks() {}

  /** showMessage on a new native thread; a report such as "detached-before;called;detached-after". */
  static native String showMessageOnNativeThread(long delegate, String message);

  /** didDecode with {@code count} results on a new native thread. */
  static native String didDecodeOnNativeThread(long delegate, int count, String queryId);

  /** sendServerRequest of a request with {@code id} on a new native thread. */
  static native String sendRequestOnNativeThread(long delegate, String id);

  /** showMessage on this thread; true when the thread is still attached with nothing pending. */
  static native boolean showMessageOnThisThread(long delegate, String message);
}
