package com.orza.vs.mobile.library.impl.jni;

import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertNpe;
import static com.orza.vs.mobile.library.impl.jni.RecordFamiliesTest.assertThrowsWithMessage;
import static org.junit.jupiter.api.Assertions.*;

import java.util.ArrayList;
import java.util.Arrays;
import java.util.Iterator;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;
import java.util.TreeMap;
import java.util.function.Function;
import java.util.function.Supplier;
import java.util.stream.Stream;
import org.junit.jupiter.api.Test;
import org.junit.jupiter.params.ParameterizedTest;
import org.junit.jupiter.params.provider.Arguments;
import org.junit.jupiter.params.provider.MethodSource;

class ContainerFamiliesTest {
  private static final String OUT_OF_RANGE = "vector index out of range";

  /** Each vector type with a way to make an element from an int and to read it back. */
  static Stream<Arguments> vectors() {
    return Stream.of(
        vector("VectorOfInt", VectorOfInt::new, i -> i, e -> e, 0),
        vector("VectorOfDouble", VectorOfDouble::new, i -> i + 0.5, e -> (int) (e - 0.5), 0.0),
        vector("VectorOfString", VectorOfString::new, i -> "s" + i,
            e -> e.isEmpty() ? 0 : Integer.parseInt(e.substring(1)), ""),
        vector("VectorOfPoint2f", VectorOfPoint2f::new, i -> new Point2f(i, -i),
            e -> (int) e.getX(), null),
        vector("VectorOfObjectInfo", VectorOfObjectInfo::new, i -> {
          ObjectInfo o = new ObjectInfo(ContentType.PIDN);
          o.setContent(Integer.toString(i));
          return o;
        }, e -> e.getContent().isEmpty() ? 0 : Integer.parseInt(e.getContent()), null));
  }

  static <E> Arguments vector(String name, Supplier<NativeList<E>> make, Function<Integer, E> element,
                              Function<E, Integer> read, E defaultValue) {
    return Arguments.of(name, make, element, read, defaultValue);
  }

  static <E> List<Integer> read(List<E> list, Function<E, Integer> read) {
    List<Integer> out = new ArrayList<Integer>();
    for (E e : list) out.add(read.apply(e));
    return out;
  }

  @ParameterizedTest(name = "{0}")
  @MethodSource("vectors")
  <E> void vectorsAreLists(String name, Supplier<NativeList<E>> make, Function<Integer, E> element,
                           Function<E, Integer> read, E defaultValue) throws ReflectiveOperationException {
    try (NativeList<E> v = make.get()) {
      assertTrue(v.isEmpty());
      v.reserve(10);
      assertTrue(v.capacity() >= 10);
      for (int i = 1; i <= 3; i++) v.add(element.apply(i));
      v.add(0, element.apply(0));
      v.add(2, element.apply(9));
      v.add(v.size(), element.apply(7));
      assertEquals(Arrays.asList(0, 1, 9, 2, 3, 7), read(v, read));
      assertEquals(9, (int) read.apply(v.remove(2)));
      assertEquals(1, (int) read.apply(v.set(1, element.apply(5))));
      v.add(1, v.get(3));  // an element of the vector itself, inserted before its own position
      assertEquals(Arrays.asList(0, 3, 5, 2, 3, 7), read(v, read));
      Iterator<E> it = v.iterator();
      it.next();
      it.remove();
      v.subList(3, 5).clear();
      assertEquals(Arrays.asList(3, 5, 2), read(v, read));
      for (int bad : new int[] {-1, v.size()}) {
        assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE, () -> v.get(bad));
        assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE, () -> v.remove(bad));
        assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE,
            () -> v.set(bad, element.apply(1)));
      }
      assertThrowsWithMessage(IndexOutOfBoundsException.class, OUT_OF_RANGE,
          () -> v.add(v.size() + 1, element.apply(1)));
      assertEquals(3, v.size());

      // Copies stand on their own: the vector may change or go.
      List<E> copy = new ArrayList<E>(v);
      NativeList<E> again = make.get();
      again.addAll(copy);
      if (defaultValue != null) {  // values: List equality; records compare by identity
        assertEquals(copy, v);
        assertEquals(v, again);
        assertEquals(v.hashCode(), again.hashCode());
        assertEquals(defaultValue, v.getClass().getConstructor(int.class).newInstance(2).get(1));
      }
      v.clear();
      assertEquals(0, v.size());
      assertEquals(Arrays.asList(3, 5, 2), read(copy, read));
      assertEquals(Arrays.asList(3, 5, 2), read(again, read));
      assertThrows(IllegalArgumentException.class, () -> v.reserve(-1));
      v.delete();
      assertThrows(IllegalStateException.class, v::size);
    }
  }

  @Test
  void argumentChecksAndViewsOfRecordVectors() {
    assertThrows(IllegalArgumentException.class, () -> new VectorOfInt(-1));
    VectorOfString s = new VectorOfString(Arrays.asList("x", "\u00fc\u00df", ""));
    assertNpe("null string", () -> s.add(null));
    assertNpe("null string", () -> s.set(0, null));
    assertEquals(Arrays.asList("x", "\u00fc\u00df", ""), s);
    assertNpe("std::vector< OrzaVSMobile::Point2< float > >::value_type const & reference is null",
        () -> new VectorOfPoint2f().add(null));
    assertNpe("std::vector< Tovra::ObjectInfo >::value_type const & reference is null",
        () -> new VectorOfObjectInfo(1).set(0, null));

    // A record element is a view: it writes into the vector, and dies when the vector grows.
    VectorOfPoint2f points = new VectorOfPoint2f();
    Point2f p = new Point2f(1, 2);
    points.add(p);
    p.setX(100);  // the vector holds its own copy
    Point2f view = points.get(0);
    view.setY(5);
    assertEquals(1f, points.get(0).getX());
    assertEquals(5f, points.get(0).getY());
    points.add(new Point2f());
    IllegalStateException stale = assertThrows(IllegalStateException.class, view::getX);
    assertTrue(stale.getMessage().contains("VectorOfPoint2f it was taken from has changed"), stale.getMessage());
  }

  @Test
  void nestedResultsCopyTheWholeTree() {
    ObjectInfo root = new ObjectInfo(ContentType.PIDN);
    ObjectInfo child = new ObjectInfo(ContentType.SEARCH_TERMS);
    ObjectInfo grandChild = new ObjectInfo(ContentType.EXTERNAL_RESULT);
    grandChild.setContent("deep");
    child.getSubContents().add(grandChild);
    root.getSubContents().add(child);
    VectorOfObjectInfo list = new VectorOfObjectInfo();
    list.add(root);
    ObjectInfo copy = list.get(0).copy();
    root.getSubContents().get(0).getSubContents().get(0).setContent("changed");
    VectorOfObjectInfo nested = list.get(0).getSubContents();
    assertEquals("deep", nested.get(0).getSubContents().get(0).getContent());
    list.delete();
    // Views of a deleted vector, down to the nested ones, refuse to be used.
    assertThrows(IllegalStateException.class, nested::size);
    assertEquals("deep", copy.getSubContents().get(0).getSubContents().get(0).getContent());
    assertEquals(ContentType.PIDN, copy.getContentType());
  }

  /** Each map type with a value made from an int (named by the message of a null copy). */
  static Stream<Arguments> maps() {
    return Stream.of(map("std::string", MapOfStringToString::new, i -> "v" + i),
        map("unsigned int", MapOfStringToUInt::new, i -> (long) i),
        map("double", MapOfStringToDouble::new, i -> i + 0.25));
  }

  static <V> Arguments map(String valueType, Supplier<NativeMap<V>> make, Function<Integer, V> value) {
    return Arguments.of("std::map< std::string," + valueType + " > const & reference is null", make, value);
  }

  @ParameterizedTest(name = "{0}")
  @MethodSource("maps")
  @SuppressWarnings("unchecked")
  <V> void mapsAreMaps(String nullCopyMessage, Supplier<NativeMap<V>> make, Function<Integer, V> value)
      throws ReflectiveOperationException {
    NativeMap<V> map = make.get();
    assertTrue(map.empty());
    assertNull(map.put("b", value.apply(2)));
    map.put("a", value.apply(1));
    assertEquals(value.apply(2), map.put("b", value.apply(3)));
    map.set("c", value.apply(4));
    Map<String, V> expected = new TreeMap<String, V>();
    expected.put("a", value.apply(1));
    expected.put("b", value.apply(3));
    expected.put("c", value.apply(4));
    assertEquals(expected, map);
    assertEquals(map, expected);
    assertEquals(expected.hashCode(), map.hashCode());
    assertEquals(Arrays.asList("a", "b", "c"), new ArrayList<String>(map.keySet()));
    assertEquals(Arrays.asList("a", "b", "c"), map.getKeys());
    assertNull(map.get("none"));
    assertNull(map.get(7));
    assertFalse(map.containsKey("none"));
    assertNull(map.remove("none"));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, "key not found", () -> map.at("none"));
    assertThrowsWithMessage(IndexOutOfBoundsException.class, "key not found", () -> map.del("none"));
    assertNpe("null string", () -> map.at(null));
    assertNpe("null string", () -> map.put(null, value.apply(1)));

    Map.Entry<String, V> first = map.entrySet().iterator().next();
    first.setValue(value.apply(8));
    assertEquals(value.apply(8), map.at("a"));
    map.entrySet().removeIf(e -> e.getKey().equals("b"));
    assertEquals(value.apply(4), map.remove("c"));
    assertEquals(1, map.size());

    Class<?> type = map.getClass();
    NativeMap<V> copy = (NativeMap<V>) type.getConstructor(type).newInstance(map);
    NativeMap<V> fromJava = (NativeMap<V>) type.getConstructor(Map.class).newInstance(expected);
    map.clear();
    assertTrue(map.isEmpty());
    assertTrue(map.getKeys().isEmpty());
    assertEquals(value.apply(8), copy.get("a"));
    assertEquals(expected, fromJava);
    assertNotEquals(map, copy);
    Throwable e = assertThrows(java.lang.reflect.InvocationTargetException.class,
        () -> type.getConstructor(type).newInstance((Object) null));
    assertEquals(nullCopyMessage, e.getCause().getMessage());
    copy.close();
    assertThrows(IllegalStateException.class, copy::size);
  }

  @Test
  void numberMapsKeepTheirNativeRange() {
    MapOfStringToUInt counts = new MapOfStringToUInt(new LinkedHashMap<String, Long>());
    counts.set("max", 4294967295L);
    counts.set("wrapped", 4294967296L + 7);  // taken modulo 2^32
    assertEquals(4294967295L, (long) counts.at("max"));
    assertEquals(7L, (long) counts.get("wrapped"));
    assertEquals(Arrays.asList("max", "wrapped"), counts.getKeysForIntMap());
    assertTrue(new MapOfStringToDouble().getKeysForDoubleMap().isEmpty());
  }
}
