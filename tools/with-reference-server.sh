#!/bin/sh
# Runs a command with a reference server beside it, on a free loopback port, and stops the server
# when the command ends; the command's exit status is this script's. The command finds the
# server's service address in ORZAVS_SERVER (for vsscan --server) and its product search in
# ORZAVS_RECOGNIZER, which reference servers started in a JVM without OpenCV (the armhf JVM under
# qemu-arm) search through.
#   tools/with-reference-server.sh <vsserver launcher> <command> [args...]
set -eu
launcher="$1"
shift
log="$(mktemp "${TMPDIR:-/tmp}/recognizer.XXXXXX")"
"$launcher" --quiet >"$log" 2>&1 &
server=$!
stop() {
  kill "$server" 2>/dev/null || true
  wait "$server" 2>/dev/null || true
  rm -f "$log"
}
trap stop EXIT
trap 'exit 130' INT TERM

# The server prints "vsserver: listening on http://127.0.0.1:PORT/vsearch" once it serves.
url=
i=0
while [ -z "$url" ]; do
  url="$(sed -n 's|^vsserver: listening on \(http://[^ ]*\)/vsearch.*|\1|p' "$log")"
  [ -n "$url" ] && break
  if ! kill -0 "$server" 2>/dev/null || [ "$i" -ge 1200 ]; then
    echo "with-reference-server: the reference server did not start:" >&2
    cat "$log" >&2
    exit 1
  fi
  i=$((i + 1))
  sleep 0.1
done
echo "with-reference-server: $url/vsearch, product search at $url/recognize"
status=0
ORZAVS_SERVER="$url/vsearch" ORZAVS_RECOGNIZER="$url/recognize" "$@" || status=$?
exit "$status"
