package com.orza.vs.mobile.library.impl.jni;

/**
 * The lifecycle shared by the proxies of native records and containers: the native handle,
 * whether this proxy owns the native object, and (for a borrowed view) the parent that keeps
 * the native owner alive. An owning proxy frees its native object once, through
 * {@link #deleteNative}, on {@link #delete} or when it is finalized.
 */
abstract class NativeObject {
  /** The native address; 0 once deleted. */
  protected transient long swigCPtr;
  /** Whether this proxy frees the native object. */
  protected transient boolean swigCMemOwn;
  // The owner of a borrowed object (a field or element handed out by its parent); kept
  // reachable so that the parent cannot be finalized while this view is in use.
  private transient Object swigParent;

  protected NativeObject(long cPtr, boolean cMemoryOwn) {
    swigCMemOwn = cMemoryOwn;
    swigCPtr = cPtr;
  }

  /** A borrowed view that does not own its native object and keeps {@code parent} reachable. */
  protected NativeObject(long cPtr, Object parent) {
    this(cPtr, false);
    swigParent = parent;
  }

  /** Frees the native object at {@code cPtr}; called at most once, only for an owned object. */
  protected abstract void deleteNative(long cPtr);

  @Override
  protected void finalize() {
    delete();
  }

  /** Frees the native object if this proxy owns it; afterwards the proxy is unusable. */
  public synchronized void delete() {
    if (swigCPtr != 0) {
      if (swigCMemOwn) {
        swigCMemOwn = false;
        deleteNative(swigCPtr);
      }
      swigCPtr = 0;
    }
    swigParent = null;
  }
}
