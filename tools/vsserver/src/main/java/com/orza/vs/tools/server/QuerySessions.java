package com.orza.vs.tools.server;

import java.util.ArrayList;
import java.util.Collections;
import java.util.LinkedHashMap;
import java.util.List;
import java.util.Map;

/**
 * Query ids and accumulation sessions.
 *
 * <p>A session is a chain of queries linked by the "lastQueryId" each request carries: a request
 * whose lastQueryId is the id of the latest query of an open session continues that session;
 * any other request (no lastQueryId, an unknown one, or one from a closed session) opens a new
 * session. The reply to the session's {@code limit}-th query is marked final and closes it, so
 * the next request of the same client starts a new session. accumulatedQueries lists every query
 * id of the session so far, the current one last.
 */
public final class QuerySessions {
  /** How many chains the server remembers; older ones are forgotten first. */
  static final int MAX_REMEMBERED = 4096;

  /** The bookkeeping of one answered query. */
  public static final class Entry {
    public final String queryId;
    public final int session;
    public final List<String> accumulated;
    public final boolean isFinal;

    Entry(String queryId, int session, List<String> accumulated, boolean isFinal) {
      this.queryId = queryId;
      this.session = session;
      this.accumulated = accumulated;
      this.isFinal = isFinal;
    }
  }

  private static final class Session {
    final int number;
    final List<String> queries = new ArrayList<>();

    Session(int number) {
      this.number = number;
    }
  }

  private final String runTag;
  private final int limit;
  private int queryCounter;
  private int sessionCounter;
  /** Latest query id of each open session -> that session (insertion-ordered for eviction). */
  private final Map<String, Session> openByLatest = new LinkedHashMap<String, Session>(16, 0.75f, false) {
    private static final long serialVersionUID = 1L;

    @Override
    protected boolean removeEldestEntry(Map.Entry<String, Session> eldest) {
      return size() > MAX_REMEMBERED;
    }
  };

  /**
   * @param runTag text that makes this server run's ids differ from another run's
   * @param limit number of queries after which a session's reply is final (at least 1)
   */
  public QuerySessions(String runTag, int limit) {
    this.runTag = runTag;
    this.limit = Math.max(1, limit);
  }

  /** Assigns a fresh query id and accounts it to the session that {@code lastQueryId} names. */
  public synchronized Entry next(String lastQueryId) {
    Session s = lastQueryId == null || lastQueryId.isEmpty() ? null : openByLatest.remove(lastQueryId);
    if (s == null) s = new Session(++sessionCounter);
    String id = String.format("q%s-%05d", runTag, ++queryCounter);
    s.queries.add(id);
    boolean isFinal = s.queries.size() >= limit;
    if (!isFinal) openByLatest.put(id, s);
    return new Entry(id, s.number, Collections.unmodifiableList(new ArrayList<>(s.queries)), isFinal);
  }
}
