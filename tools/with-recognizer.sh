#!/bin/sh
# Runs a command with a reference server on this machine doing the product search for the
# reference servers the command starts (in a JVM that has no OpenCV, such as the armhf JVM under
# qemu-arm): the server is started on a free loopback port, its /recognize address is passed on
# as ORZAVS_RECOGNIZER, and the server is stopped when the command ends. The command's exit
# status is this script's.
#   tools/with-recognizer.sh <vsserver launcher> <command> [args...]
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
  url="$(sed -n 's|^vsserver: listening on \(http://[^ ]*\)/vsearch.*|\1/recognize|p' "$log")"
  [ -n "$url" ] && break
  if ! kill -0 "$server" 2>/dev/null || [ "$i" -ge 1200 ]; then
    echo "with-recognizer: the reference server did not start:" >&2
    cat "$log" >&2
    exit 1
  fi
  i=$((i + 1))
  sleep 0.1
done
echo "with-recognizer: product search at $url"
status=0
ORZAVS_RECOGNIZER="$url" "$@" || status=$?
exit "$status"
