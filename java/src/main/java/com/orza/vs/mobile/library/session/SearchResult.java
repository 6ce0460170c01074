package com.orza.vs.mobile.library.session;

import com.orza.vs.mobile.library.impl.jni.ContentType;
import com.orza.vs.mobile.library.impl.jni.ObjectModuleID;
import java.util.Arrays;
import java.util.Collections;
import java.util.List;

/** One result of a visual search, copied out of the engine: immutable and safe to keep. */
public final class SearchResult {
  private final ObjectModuleID module;
  private final ContentType contentType;
  private final String content;
  private final String properties;
  private final float[] location;
  private final List<SearchResult> subResults;

  public SearchResult(ObjectModuleID module, ContentType contentType, String content, String properties,
                      float[] location, List<SearchResult> subResults) {
    this.module = module;
    this.contentType = contentType;
    this.content = content;
    this.properties = properties;
    this.location = location.clone();
    this.subResults = Collections.unmodifiableList(subResults);
  }

  /** The module that produced it (null for nested results and unknown values). */
  public ObjectModuleID module() {
    return module;
  }

  /** The kind: a product id, search terms, a directed or external result, a bounding box. */
  public ContentType contentType() {
    return contentType;
  }

  public String content() {
    return content;
  }

  /** The result's properties as compact JSON text. */
  public String properties() {
    return properties;
  }

  /** The outline in frame pixels as x0, y0, x1, y1, ... (empty when none); a copy. */
  public float[] location() {
    return location.clone();
  }

  /** Nested results, in the server's order. */
  public List<SearchResult> subResults() {
    return subResults;
  }

  @Override
  public String toString() {
    return contentType + " \"" + content + "\" " + properties
        + (location.length > 0 ? " at " + Arrays.toString(location) : "")
        + (subResults.isEmpty() ? "" : " " + subResults);
  }
}
