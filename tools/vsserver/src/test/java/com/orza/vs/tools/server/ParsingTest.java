package com.orza.vs.tools.server;

import static org.junit.jupiter.api.Assertions.*;

import java.nio.charset.StandardCharsets;
import java.util.Arrays;
import java.util.LinkedHashMap;
import java.util.Map;
import org.junit.jupiter.api.Test;

/** The reader side of the server: JSON documents and multipart bodies from the network. */
class ParsingTest {
  @Test
  void jsonRoundTripKeepsStructureAndEscapesAndReadsNumbersAndBlanks() {
    Map<String, Object> inner = new LinkedHashMap<>();
    inner.put("tlx", 12);
    inner.put("ratio", 0.25);
    inner.put("text", "quote \" backslash \\ newline \n tab \t ctl \u0001 \u00e9");
    Map<String, Object> doc = new LinkedHashMap<>();
    doc.put("list", Arrays.asList(1, "two", true, null, inner));
    doc.put("empty", new LinkedHashMap<>());
    String text = Json.write(doc);
    assertEquals("{\"list\":[1,\"two\",true,null,{\"tlx\":12,\"ratio\":0.25,\"text\":"
        + "\"quote \\\" backslash \\\\ newline \\n tab \\t ctl \\u0001 \u00e9\"}],\"empty\":{}}", text);
    assertEquals(Arrays.asList(1.0, "two", true, null, Map.of("tlx", 12.0, "ratio", 0.25, "text", inner.get("text"))),
        Json.member(Json.parse(text), "list"));

    Object v = Json.parse(" {\"a\" : [ -1.5e2 , 0 ] , \"b\":\"\\u0041\\/\"}\n");
    assertEquals(Arrays.asList(-150.0, 0.0), Json.member(v, "a"));
    assertEquals("A/", Json.member(v, "b"));
    assertNull(Json.member("not an object", "a"));
  }

  @Test
  void jsonRejectsMalformedAndOverlyDeepInput() {
    for (String bad : new String[] {"", "{", "{\"a\":}", "[1,]", "{\"a\" 1}", "\"open", "tru", "1 2", "{\"a\":1,}",
        "<html>", "\"\\x\"", "\"\\u12\"", "-", "{'a':1}"}) {
      assertThrows(IllegalArgumentException.class, () -> Json.parse(bad), bad);
    }
    IllegalArgumentException e = assertThrows(IllegalArgumentException.class, () -> Json.parse("[".repeat(10_000)));
    assertTrue(e.getMessage().contains("nesting"), e.getMessage());
    // Exactly at the limit is fine.
    Json.parse("[".repeat(Json.MAX_DEPTH + 1) + "]".repeat(Json.MAX_DEPTH + 1));
  }

  private static byte[] bytes(String s) {
    return s.getBytes(StandardCharsets.ISO_8859_1);
  }

  @Test
  void multipartSeparatesFieldsAndFilesWithBinaryContentAndFindsItsBoundary() {
    byte[] jpeg = {(byte) 0xff, (byte) 0xd8, '\r', '\n', '-', '-', 'x', (byte) 0xff, (byte) 0xd9};
    byte[] body = bytes("--XyZ\r\nContent-Disposition: form-data; name=\"vsearch_params_json\"\r\n\r\n{\"a\":1}\r\n"
        + "--XyZ\r\nContent-Disposition: form-data; name=\"orientation\"\r\nContent-Type: text/plain\r\n\r\n90\r\n"
        + "--XyZ\r\ncontent-disposition: form-data; name=\"file\"; filename=\"a;b.jpg\"\r\n\r\n"
        + new String(jpeg, StandardCharsets.ISO_8859_1) + "\r\n--XyZ--\r\n");
    Multipart m = Multipart.parse(body, Multipart.boundaryOf("multipart/form-data; boundary=\"XyZ\""));
    assertEquals(Map.of("vsearch_params_json", "{\"a\":1}", "orientation", "90"), m.fields);
    assertArrayEquals(jpeg, m.files.get("file"));

    assertEquals("abc", Multipart.boundaryOf("multipart/form-data; boundary=abc"));
    assertEquals("abc", Multipart.boundaryOf("Multipart/Form-Data;charset=utf-8;BOUNDARY=abc"));
    for (String none : new String[] {"application/json", "multipart/form-data", null, "multipart/form-data; boundary=" + "b".repeat(71)}) {
      assertNull(Multipart.boundaryOf(none), none);
    }
  }

  @Test
  void multipartRejectsTruncatedOrMalformedBodies() {
    String ok = "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv\r\n--B--";
    assertEquals("v", Multipart.parse(bytes(ok), "B").fields.get("a"));
    String[] bad = {
        "",                                                              // no boundary at all
        "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv",     // part never closed
        "--B\r\nContent-Disposition: form-data; name=\"a\"",             // headers never end
        "--B\r\nContent-Type: text/plain\r\n\r\nv\r\n--B--",             // part without a name
        "--Bjunk",                                                       // bad delimiter line
        "--B\r\nContent-Disposition: form-data; name=\"a\"\r\n\r\nv\r\n--B", // body ends after a delimiter
    };
    for (String b : bad) {
      assertThrows(IllegalArgumentException.class, () -> Multipart.parse(bytes(b), "B"), b);
    }
    assertThrows(IllegalArgumentException.class, () -> Multipart.parse(bytes(ok), null));
  }
}
