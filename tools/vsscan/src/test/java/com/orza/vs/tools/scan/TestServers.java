package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.BuiltInCatalog;
import com.orza.vs.tools.server.Recognizer;
import com.orza.vs.tools.server.ReferenceServer;
import java.io.IOException;

/** Reference servers for the suites, all sharing one index of the built-in catalogue. */
public final class TestServers {
  private static Recognizer recognizer;

  private TestServers() {}

  /** A quiet loopback server with {@code accumulate} queries per session. */
  public static synchronized ReferenceServer start(int accumulate) throws IOException {
    if (recognizer == null) recognizer = new Recognizer(BuiltInCatalog.load());
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.log = null;
    o.accumulate = accumulate;
    o.recognizer = recognizer;
    return new ReferenceServer(o).start();
  }
}
