package com.orza.vs.mobile.library.impl.jni;

import static org.junit.jupiter.api.Assertions.assertNotNull;

import java.util.concurrent.LinkedBlockingQueue;
import java.util.concurrent.TimeUnit;

/**
 * The tests' transport: notes each request in {@link #sent} ("id|body is a JPEG|has
 * vsearch_params_json|thread") and answers it as {@link #mode} says; throws {@link #fail} when set.
 */
public class TestTransport extends ServerDelegate {
  /** Two results (the first with a nested one, the second an outline) and one the engine drops. */
  public static final String REPLY = "{\"queryId\":\"q-1\",\"quillmark\":{\"searchResult\":["
      + "{\"content\":\"shoe\",\"contentType\":\"PIDN\",\"properties\":{\"brand\":\"x\"},"
      + "\"subContent\":[{\"content\":\"lace\",\"contentType\":\"SearchTerms\",\"properties\":{}}]},"
      + "{\"content\":\"\",\"contentType\":\"BoundingBox\",\"properties\":{\"boundingBox\":"
      + "{\"tlx\":10,\"tly\":20,\"trx\":110,\"try\":20,\"brx\":110,\"bry\":90,\"blx\":10,\"bly\":90}}},"
      + "{\"content\":\"dropped\",\"contentType\":\"Unknown\",\"properties\":{}}],"
      + "\"resultMetadata\":{\"finalAccumulation\":true,\"accumulatedQueries\":[\"q-0\"]}}}";

  /** Who answers: the test, or the transport with REPLY (on the sending thread, or on one of its own). */
  enum Mode { BY_TEST, PUSHED_AT_ONCE, THROUGH_HANDLER_AT_ONCE, PUSHED_FROM_OWN_THREAD }

  volatile Mode mode = Mode.BY_TEST;
  volatile RuntimeException fail;
  volatile ServerRequest last;
  final LinkedBlockingQueue<String> sent = new LinkedBlockingQueue<String>();
  private final LinkedBlockingQueue<Object[]> unanswered = new LinkedBlockingQueue<Object[]>();

  @Override
  public boolean sendServerRequestImpl(ServerRequest request) {
    last = request;
    if (fail != null) throw fail;
    // The request is borrowed: copy what is kept.
    String id = request.getId();
    byte[] body = request.getData().getData();
    boolean jpeg = body.length > 2 && (body[0] & 0xff) == 0xff && (body[1] & 0xff) == 0xd8;
    sent.add(id + "|" + jpeg + "|" + request.getParams().has_key("vsearch_params_json") + "|"
        + Thread.currentThread().getName());
    if (mode == Mode.PUSHED_AT_ONCE) {
      pushServerResponse(response(id, 200, REPLY));
    } else if (mode == Mode.THROUGH_HANDLER_AT_ONCE) {
      request.getResponseHandler().handleServerResponse(response(id, 200, REPLY));
    } else if (mode == Mode.PUSHED_FROM_OWN_THREAD) {
      new Thread(() -> pushServerResponse(response(id, 200, REPLY)), "transport").start();
    } else {
      unanswered.add(new Object[] {id, body});
    }
    return true;
  }

  /** Answers the oldest request still unanswered; returns the body it carried. */
  public byte[] answer(int code, String body) throws InterruptedException {
    Object[] request = unanswered.poll(20, TimeUnit.SECONDS);
    assertNotNull(request, "the engine sent a request");
    try (ServerResponse response = response((String) request[0], code, body)) {
      pushServerResponse(response);
    }
    return (byte[]) request[1];
  }

  static ServerResponse response(String id, int code, String body) {
    ServerResponse response = new ServerResponse();
    response.setId(id);
    response.setResponseCode(code);
    response.setResponseStr(body);
    return response;
  }
}
