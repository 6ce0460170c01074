package com.orza.vs.tools.soak;

import com.sun.management.HotSpotDiagnosticMXBean;
import java.io.BufferedInputStream;
import java.io.DataInputStream;
import java.io.EOFException;
import java.io.File;
import java.io.FileInputStream;
import java.io.IOException;
import java.lang.management.ManagementFactory;
import java.nio.charset.StandardCharsets;
import java.nio.file.Files;
import java.nio.file.Paths;
import java.util.List;
import javax.management.MBeanServer;
import javax.management.ObjectName;

/**
 * What the soak measures of its own process: resident memory, Java heap, threads, JNI global
 * references and, when native memory tracking is on, the JVM's own native memory.
 */
final class Resources {
  private Resources() {}

  /**
   * Resident memory of this process in kB; -1 where there is no /proc. A 32-bit JVM counts the
   * mappings below 4 GiB (/proc/self/smaps): on a 32-bit system that is all of them, and under a
   * user-mode emulator on a 64-bit machine it leaves out the emulator's own memory above, whose
   * translation cache grows with every piece of code the JIT emits. Otherwise VmRSS.
   */
  static long rssKb() {
    if ("32".equals(System.getProperty("sun.arch.data.model"))) return rssBelow4GiBKb();
    try {
      List<String> lines = Files.readAllLines(Paths.get("/proc/self/status"), StandardCharsets.UTF_8);
      for (String line : lines) {
        if (line.startsWith("VmRSS:")) return Long.parseLong(line.replaceAll("[^0-9]", ""));
      }
    } catch (IOException | NumberFormatException e) {
      // fall through
    }
    return -1;
  }

  private static final java.util.regex.Pattern MAPPING = java.util.regex.Pattern.compile("[0-9a-f]+-[0-9a-f]+ ");

  private static long rssBelow4GiBKb() {
    try {
      long kb = 0;
      boolean counted = false;
      for (String line : Files.readAllLines(Paths.get("/proc/self/smaps"), StandardCharsets.UTF_8)) {
        if (MAPPING.matcher(line).lookingAt()) {  // "start-end perms ...": a mapping begins
          counted = Long.parseUnsignedLong(line.substring(0, line.indexOf('-')), 16) < (1L << 32);
        } else if (counted && line.startsWith("Rss:")) {
          kb += Long.parseLong(line.replaceAll("[^0-9]", ""));
        }
      }
      return kb;
    } catch (IOException | NumberFormatException e) {
      return -1;
    }
  }

  /** Collects garbage until the used heap stops shrinking (at most a few rounds). */
  static void gc() {
    long before = Long.MAX_VALUE;
    for (int i = 0; i < 4; ++i) {
      System.gc();
      long used = heapUsedKb();
      if (used >= before) break;
      before = used;
    }
  }

  static long heapUsedKb() {
    Runtime rt = Runtime.getRuntime();
    return (rt.totalMemory() - rt.freeMemory()) / 1024;
  }

  static int threadCount() {
    return ManagementFactory.getThreadMXBean().getThreadCount();
  }

  /**
   * JNI global references of the process, counted as the "JNI global" roots of a heap dump of
   * live objects (HPROF sub-record 0x01). The JVM has no other public counter for them. -1 when
   * the dump cannot be made or read.
   */
  static int jniGlobalRefs() {
    File file = null;
    try {
      file = File.createTempFile("soak-heap", ".hprof");
      if (!file.delete()) return -1;  // the dump refuses to overwrite an existing file
      HotSpotDiagnosticMXBean bean = ManagementFactory.getPlatformMXBean(HotSpotDiagnosticMXBean.class);
      bean.dumpHeap(file.getPath(), true);
      return countJniGlobalRoots(file);
    } catch (IOException | RuntimeException e) {
      System.err.println("soak: could not count JNI global references: " + e);
      return -1;
    } finally {
      if (file != null && file.exists() && !file.delete()) file.deleteOnExit();
    }
  }

  /** Walks an HPROF file's heap dump records and counts the JNI global roots. */
  static int countJniGlobalRoots(File hprof) throws IOException {
    try (DataInputStream in = new DataInputStream(new BufferedInputStream(new FileInputStream(hprof), 1 << 16))) {
      // Header: a NUL-terminated format name, the identifier size, a time stamp.
      while (in.readByte() != 0) {
        // format name
      }
      final int idSize = in.readInt();
      in.readLong();
      int count = 0;
      while (true) {
        int tag;
        try {
          tag = in.readUnsignedByte();
        } catch (EOFException end) {
          return count;
        }
        in.readInt();  // time offset
        long length = in.readInt() & 0xFFFFFFFFL;
        if (tag == 0x0C || tag == 0x1C) {
          count += countInSegment(in, length, idSize);
        } else {
          skipFully(in, length);
        }
      }
    }
  }

  private static int countInSegment(DataInputStream in, long length, int idSize) throws IOException {
    int count = 0;
    long left = length;
    while (left > 0) {
      int sub = in.readUnsignedByte();
      long used = 1;
      switch (sub) {
        case 0xFF: used += skip(in, idSize); break;                   // root unknown
        case 0x01: used += skip(in, 2L * idSize); ++count; break;     // root JNI global
        case 0x02: used += skip(in, idSize + 8L); break;              // root JNI local
        case 0x03: used += skip(in, idSize + 8L); break;              // root Java frame
        case 0x04: used += skip(in, idSize + 4L); break;              // root native stack
        case 0x05: used += skip(in, idSize); break;                   // root sticky class
        case 0x06: used += skip(in, idSize + 4L); break;              // root thread block
        case 0x07: used += skip(in, idSize); break;                   // root monitor used
        case 0x08: used += skip(in, idSize + 8L); break;              // root thread object
        case 0x20: used += classDump(in, idSize); break;
        case 0x21: {                                                   // instance dump
          used += skip(in, idSize + 4L + idSize);
          long n = in.readInt() & 0xFFFFFFFFL;
          used += 4 + skip(in, n);
          break;
        }
        case 0x22: {                                                   // object array dump
          used += skip(in, idSize + 4L);
          long n = in.readInt() & 0xFFFFFFFFL;
          used += 4 + skip(in, idSize + n * idSize);
          break;
        }
        case 0x23: {                                                   // primitive array dump
          used += skip(in, idSize + 4L);
          long n = in.readInt() & 0xFFFFFFFFL;
          int type = in.readUnsignedByte();
          used += 5 + skip(in, n * typeSize(type, idSize));
          break;
        }
        default:
          throw new IOException("unknown heap dump record 0x" + Integer.toHexString(sub));
      }
      left -= used;
    }
    return count;
  }

  private static long classDump(DataInputStream in, int idSize) throws IOException {
    long used = skip(in, idSize + 4L + 6L * idSize + 4L);
    int constants = in.readUnsignedShort();
    used += 2;
    for (int i = 0; i < constants; ++i) {
      in.readUnsignedShort();
      int type = in.readUnsignedByte();
      used += 3 + skip(in, typeSize(type, idSize));
    }
    int statics = in.readUnsignedShort();
    used += 2;
    for (int i = 0; i < statics; ++i) {
      used += skip(in, idSize);
      int type = in.readUnsignedByte();
      used += 1 + skip(in, typeSize(type, idSize));
    }
    int fields = in.readUnsignedShort();
    used += 2 + skip(in, fields * (idSize + 1L));
    return used;
  }

  private static long typeSize(int type, int idSize) throws IOException {
    switch (type) {
      case 2: return idSize;  // object
      case 4: case 8: return 1;  // boolean, byte
      case 5: case 9: return 2;  // char, short
      case 6: case 10: return 4;  // float, int
      case 7: case 11: return 8;  // double, long
      default: throw new IOException("unknown basic type " + type);
    }
  }

  private static long skip(DataInputStream in, long n) throws IOException {
    skipFully(in, n);
    return n;
  }

  private static void skipFully(DataInputStream in, long n) throws IOException {
    long left = n;
    while (left > 0) {
      long s = in.skip(left);
      if (s <= 0) {
        in.readByte();
        s = 1;
      }
      left -= s;
    }
  }

  /**
   * "Total: reserved=..., committed=..." of the JVM's native memory tracking, or null when the
   * JVM runs without -XX:NativeMemoryTracking. Counts the JVM's own allocations, not the
   * library's (those show in the resident memory).
   */
  static String nativeMemoryTotal() {
    try {
      MBeanServer server = ManagementFactory.getPlatformMBeanServer();
      ObjectName name = new ObjectName("com.sun.management:type=DiagnosticCommand");
      Object out = server.invoke(name, "vmNativeMemory", new Object[] {new String[] {"summary"}},
          new String[] {String[].class.getName()});
      for (String line : String.valueOf(out).split("\n")) {
        if (line.startsWith("Total:")) return line.substring("Total:".length()).trim();
      }
    } catch (Exception e) {
      // not available
    }
    return null;
  }
}
