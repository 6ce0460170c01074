package com.orza.vs.mobile.library.session;

import java.util.Collections;
import java.util.List;

/** The answer to one visual search query, copied out of the engine: immutable and safe to keep. */
public final class SearchResults {
  private final List<SearchResult> results;
  private final String queryId;
  private final boolean finalAccumulation;
  private final List<String> accumulatedQueries;

  public SearchResults(List<SearchResult> results, String queryId, boolean finalAccumulation,
                       List<String> accumulatedQueries) {
    this.results = Collections.unmodifiableList(results);
    this.queryId = queryId;
    this.finalAccumulation = finalAccumulation;
    this.accumulatedQueries = Collections.unmodifiableList(accumulatedQueries);
  }

  /** The results in the server's order (may be empty). */
  public List<SearchResult> results() {
    return results;
  }

  /** The server's id for this query. */
  public String queryId() {
    return queryId;
  }

  /** Whether the server says no further answer will refine this one. */
  public boolean isFinal() {
    return finalAccumulation;
  }

  /** The ids of the earlier queries the server merged into this answer. */
  public List<String> accumulatedQueries() {
    return accumulatedQueries;
  }

  @Override
  public String toString() {
    return "query " + queryId + (finalAccumulation ? " (final)" : "") + ": " + results;
  }
}
