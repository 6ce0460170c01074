package com.orza.vs.tools.server;

import java.util.ArrayList;
import java.util.Collection;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/**
 * A very small JSON reader and writer, enough for the visual search replies and parameter
 * documents: objects become {@code LinkedHashMap<String,Object>} (member order kept), arrays
 * {@code List<Object>}, numbers {@code Double}, and {@code true/false/null} their Java values.
 *
 * <p>The reader takes text from the network: it never recurses deeper than {@link #MAX_DEPTH}
 * and reports every malformed input as {@link IllegalArgumentException} with the offset.
 */
public final class Json {
  public static final int MAX_DEPTH = 64;

  private Json() {}

  // ---------------------------------------------------------------------------------------------
  // Writing

  /** Serialises maps, collections, strings, numbers, booleans and null compactly. */
  public static String write(Object value) {
    StringBuilder out = new StringBuilder();
    write(out, value);
    return out.toString();
  }

  private static void write(StringBuilder out, Object value) {
    if (value == null) {
      out.append("null");
    } else if (value instanceof String) {
      quote(out, (String) value);
    } else if (value instanceof Boolean) {
      out.append(value.toString());
    } else if (value instanceof Double || value instanceof Float) {
      double d = ((Number) value).doubleValue();
      if (Double.isNaN(d) || Double.isInfinite(d)) {
        out.append("null"); // JSON has no NaN or infinity
      } else if (d == Math.rint(d) && Math.abs(d) < 1e15) {
        out.append((long) d);
      } else {
        out.append(d);
      }
    } else if (value instanceof Number) {
      out.append(((Number) value).longValue());
    } else if (value instanceof Map) {
      out.append('{');
      boolean first = true;
      for (Map.Entry<?, ?> e : ((Map<?, ?>) value).entrySet()) {
        if (!first) out.append(',');
        first = false;
        quote(out, String.valueOf(e.getKey()));
        out.append(':');
        write(out, e.getValue());
      }
      out.append('}');
    } else if (value instanceof Collection) {
      out.append('[');
      boolean first = true;
      for (Object o : (Collection<?>) value) {
        if (!first) out.append(',');
        first = false;
        write(out, o);
      }
      out.append(']');
    } else {
      quote(out, value.toString());
    }
  }

  /** Appends {@code s} as a JSON string literal. */
  public static void quote(StringBuilder out, String s) {
    out.append('"');
    for (int i = 0; i < s.length(); i++) {
      char c = s.charAt(i);
      switch (c) {
        case '"': out.append("\\\""); break;
        case '\\': out.append("\\\\"); break;
        case '\n': out.append("\\n"); break;
        case '\r': out.append("\\r"); break;
        case '\t': out.append("\\t"); break;
        default:
          if (c < 0x20 || c == 0x2028 || c == 0x2029) {
            out.append(String.format("\\u%04x", (int) c));
          } else {
            out.append(c);
          }
      }
    }
    out.append('"');
  }

  // ---------------------------------------------------------------------------------------------
  // Reading

  /** Parses one JSON document; trailing non-blank text is an error. */
  public static Object parse(String text) {
    Reader r = new Reader(text);
    r.skipBlanks();
    Object v = r.value(0);
    r.skipBlanks();
    if (r.pos != text.length()) throw r.error("trailing text");
    return v;
  }

  /** Member {@code key} of {@code obj} if it is an object, else null. */
  public static Object member(Object obj, String key) {
    return obj instanceof Map ? ((Map<?, ?>) obj).get(key) : null;
  }

  private static final class Reader {
    final String s;
    int pos;

    Reader(String s) {
      this.s = s;
    }

    IllegalArgumentException error(String what) {
      return new IllegalArgumentException("JSON: " + what + " at offset " + pos);
    }

    void skipBlanks() {
      while (pos < s.length()) {
        char c = s.charAt(pos);
        if (c != ' ' && c != '\t' && c != '\n' && c != '\r') break;
        pos++;
      }
    }

    Object value(int depth) {
      if (depth > MAX_DEPTH) throw error("nesting deeper than " + MAX_DEPTH);
      if (pos >= s.length()) throw error("unexpected end");
      char c = s.charAt(pos);
      switch (c) {
        case '{': return object(depth);
        case '[': return array(depth);
        case '"': return string();
        case 't': return literal("true", Boolean.TRUE);
        case 'f': return literal("false", Boolean.FALSE);
        case 'n': return literal("null", null);
        default:
          if (c == '-' || (c >= '0' && c <= '9')) return number();
          throw error("unexpected character '" + c + "'");
      }
    }

    Object literal(String word, Object v) {
      if (!s.startsWith(word, pos)) throw error("bad literal");
      pos += word.length();
      return v;
    }

    Map<String, Object> object(int depth) {
      Map<String, Object> m = new LinkedHashMap<>();
      pos++; // '{'
      skipBlanks();
      if (pos < s.length() && s.charAt(pos) == '}') {
        pos++;
        return m;
      }
      while (true) {
        skipBlanks();
        if (pos >= s.length() || s.charAt(pos) != '"') throw error("expected member name");
        String key = string();
        skipBlanks();
        expect(':');
        skipBlanks();
        m.put(key, value(depth + 1));
        skipBlanks();
        if (pos >= s.length()) throw error("unexpected end in object");
        char c = s.charAt(pos++);
        if (c == '}') return m;
        if (c != ',') throw error("expected ',' or '}'");
      }
    }

    List<Object> array(int depth) {
      List<Object> list = new ArrayList<>();
      pos++; // '['
      skipBlanks();
      if (pos < s.length() && s.charAt(pos) == ']') {
        pos++;
        return list;
      }
      while (true) {
        skipBlanks();
        list.add(value(depth + 1));
        skipBlanks();
        if (pos >= s.length()) throw error("unexpected end in array");
        char c = s.charAt(pos++);
        if (c == ']') return list;
        if (c != ',') throw error("expected ',' or ']'");
      }
    }

    void expect(char c) {
      if (pos >= s.length() || s.charAt(pos) != c) throw error("expected '" + c + "'");
      pos++;
    }

    String string() {
      pos++; // opening quote
      StringBuilder out = new StringBuilder();
      while (true) {
        if (pos >= s.length()) throw error("unterminated string");
        char c = s.charAt(pos++);
        if (c == '"') return out.toString();
        if (c < 0x20) throw error("control character in string");
        if (c != '\\') {
          out.append(c);
          continue;
        }
        if (pos >= s.length()) throw error("unterminated escape");
        char e = s.charAt(pos++);
        switch (e) {
          case '"': out.append('"'); break;
          case '\\': out.append('\\'); break;
          case '/': out.append('/'); break;
          case 'b': out.append('\b'); break;
          case 'f': out.append('\f'); break;
          case 'n': out.append('\n'); break;
          case 'r': out.append('\r'); break;
          case 't': out.append('\t'); break;
          case 'u':
            if (pos + 4 > s.length()) throw error("short \\u escape");
            try {
              out.append((char) Integer.parseInt(s.substring(pos, pos + 4), 16));
            } catch (NumberFormatException ex) {
              throw error("bad \\u escape");
            }
            pos += 4;
            break;
          default:
            throw error("bad escape");
        }
      }
    }

    Double number() {
      int start = pos;
      if (s.charAt(pos) == '-') pos++;
      while (pos < s.length() && "0123456789.eE+-".indexOf(s.charAt(pos)) >= 0) pos++;
      try {
        return Double.valueOf(s.substring(start, pos));
      } catch (NumberFormatException ex) {
        pos = start;
        throw error("bad number");
      }
    }
  }
}
