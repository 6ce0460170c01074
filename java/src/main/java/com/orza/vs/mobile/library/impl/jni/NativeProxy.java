package com.orza.vs.mobile.library.impl.jni;

/**
 * A Java proxy of a native object. An owning proxy frees its native object once, on
 * {@link #delete} or {@link #close} (or when it is finalized); afterwards, and for a view whose
 * owner is gone, any use throws {@link IllegalStateException}.
 */
public interface NativeProxy extends AutoCloseable {
  /** Frees the native object if this proxy owns it; afterwards any use throws IllegalStateException. */
  void delete();

  /** Same as {@link #delete()}, for try-with-resources. */
  @Override
  default void close() {
    delete();
  }
}
