package com.orza.vs.mobile.library.impl.jni;

/**
 * The base of the proxies of native records: the object's lifecycle ({@link NativeRef}) and
 * {@link #delete}/{@link #close}. An owning proxy frees its native object once, on
 * {@code delete()}, {@code close()} or when it is finalized; a view (a field of another
 * object, an element of a vector, a callback's argument) never frees and becomes unusable with
 * what it borrows from.
 */
public abstract class NativeObject implements NativeProxy {
  final NativeRef nref;

  NativeObject(long cPtr, boolean cMemoryOwn) {
    nref = new NativeRef(this, cPtr, cMemoryOwn);
  }

  /** A view that lives inside {@code parent}. */
  NativeObject(long cPtr, NativeRef parent) {
    nref = new NativeRef(this, cPtr, parent);
  }

  /**
   * The native address, for a native call.
   *
   * @throws IllegalStateException when the object has been deleted, or lives in something that
   *     is gone (a callback argument after its callback, a field of a deleted object)
   */
  protected final long swigCPtr() {
    return nref.get();
  }

  /** Frees the native object at {@code cPtr}; called at most once, only for an owned object. */
  abstract void deleteNative(long cPtr);

  @Override
  protected void finalize() {
    delete();
  }

  @Override
  public void delete() {
    nref.delete(this::deleteNative);
  }
}
