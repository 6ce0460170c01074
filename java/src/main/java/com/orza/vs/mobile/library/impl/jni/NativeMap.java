package com.orza.vs.mobile.library.impl.jni;

import java.util.AbstractMap;
import java.util.AbstractSet;
import java.util.Iterator;
import java.util.Map;
import java.util.NoSuchElementException;
import java.util.Set;

/**
 * A native ordered map ({@code std::map} keyed by string) as a {@link java.util.Map}: keys
 * iterate in ascending order, {@link #get(Object)} of an absent key returns null, {@code put}
 * and {@code remove} return the previous value, and entries write through. Keys are never null
 * (a null key raises NullPointerException "null string").
 *
 * <p>{@link #at(String)} and {@link #del(String)} are the native map's own operations: an
 * absent key raises IndexOutOfBoundsException "key not found".
 *
 * <p>A map inside another object (a request's parameters) lives only as long as that object;
 * one owned by Java is freed by {@link #delete}/{@link #close} (or when it is collected).
 *
 * @param <V> the value type
 */
public abstract class NativeMap<V> extends AbstractMap<String, V> implements NativeProxy {
  final NativeRef nref;

  NativeMap(long cPtr, boolean cMemoryOwn) {
    nref = new NativeRef(this, cPtr, cMemoryOwn);
  }

  /** A view of a map that lives inside {@code parent}. */
  NativeMap(long cPtr, NativeRef parent) {
    nref = new NativeRef(this, cPtr, parent);
  }

  // The native family behind the map; each gets the map's checked address.
  abstract int nativeSize(long cPtr);

  abstract boolean nativeEmpty(long cPtr);

  abstract void nativeClear(long cPtr);

  abstract V nativeGet(long cPtr, String key);

  abstract void nativeSet(long cPtr, String key, V value);

  abstract void nativeDel(long cPtr, String key);

  abstract boolean nativeHasKey(long cPtr, String key);

  /** A new vector (owned by the caller) of every key in ascending order. */
  abstract long nativeKeys(long cPtr);

  abstract void deleteNative(long cPtr);

  @Override
  public int size() {
    return nativeSize(nref.get());
  }

  /** True when the map holds no entry (same as {@link #isEmpty()}). */
  public boolean empty() {
    return nativeEmpty(nref.get());
  }

  @Override
  public boolean isEmpty() {
    return empty();
  }

  @Override
  public void clear() {
    nativeClear(nref.get());
  }

  /** True when {@code key} is present; NullPointerException "null string" for a null key. */
  public boolean has_key(String key) {
    return nativeHasKey(nref.get(), key);
  }

  @Override
  public boolean containsKey(Object key) {
    return key instanceof String && has_key((String) key);
  }

  /** The value for {@code key}, or null when it is absent (or not a string). */
  @Override
  public V get(Object key) {
    if (!containsKey(key)) return null;
    return nativeGet(nref.get(), (String) key);
  }

  /** The value for {@code key}; IndexOutOfBoundsException "key not found" when it is absent. */
  public V at(String key) {
    return nativeGet(nref.get(), key);
  }

  /** Inserts or overwrites. */
  public void set(String key, V value) {
    nativeSet(nref.get(), key, value);
  }

  /** Inserts or overwrites; returns the previous value or null. */
  @Override
  public V put(String key, V value) {
    V previous = get(key);
    set(key, value);
    return previous;
  }

  /** Erases {@code key}; IndexOutOfBoundsException "key not found" when it is absent. */
  public void del(String key) {
    nativeDel(nref.get(), key);
  }

  /** Erases {@code key} if present; returns its value or null. */
  @Override
  public V remove(Object key) {
    V previous = get(key);
    if (previous != null) del((String) key);
    return previous;
  }

  /** Every key in ascending order, as a new vector owned by the caller. */
  public VectorOfString getKeys() {
    return new VectorOfString(nativeKeys(nref.get()), true);
  }

  // The keys at this moment, as Java strings.
  private String[] keySnapshot() {
    VectorOfString keys = getKeys();
    try {
      return keys.toArray(new String[0]);
    } finally {
      keys.delete();
    }
  }

  @Override
  public Set<Map.Entry<String, V>> entrySet() {
    return new AbstractSet<Map.Entry<String, V>>() {
      @Override
      public int size() {
        return NativeMap.this.size();
      }

      @Override
      public Iterator<Map.Entry<String, V>> iterator() {
        final String[] keys = keySnapshot();
        return new Iterator<Map.Entry<String, V>>() {
          private int next;

          @Override
          public boolean hasNext() {
            return next < keys.length;
          }

          @Override
          public Map.Entry<String, V> next() {
            if (next >= keys.length) throw new NoSuchElementException();
            final String key = keys[next++];
            return new AbstractMap.SimpleEntry<String, V>(key, at(key)) {
              private static final long serialVersionUID = 1L;

              @Override
              public V setValue(V value) {
                set(key, value);
                return super.setValue(value);
              }
            };
          }

          @Override
          public void remove() {
            if (next == 0) throw new IllegalStateException();
            NativeMap.this.remove(keys[next - 1]);
          }
        };
      }
    };
  }

  @Override
  protected void finalize() {
    delete();
  }

  @Override
  public void delete() {
    nref.delete(this::deleteNative);
  }
}
