package com.orza.vs.tools.scan;

import com.orza.vs.tools.server.ReferenceServer;
import java.io.IOException;
import java.io.UncheckedIOException;

/** The suites' reference server: quiet, on loopback, three queries per session, started once. */
public final class TestServers {
  private static ReferenceServer shared;

  private TestServers() {}

  public static synchronized ReferenceServer shared() {
    if (shared != null) return shared;
    ReferenceServer.Options o = new ReferenceServer.Options();
    o.log = null;
    o.accumulate = 3;
    try {
      shared = new ReferenceServer(o).start();
    } catch (IOException e) {
      throw new UncheckedIOException(e);
    }
    return shared;
  }
}
