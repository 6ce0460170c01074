#!/usr/bin/env bash
# Builds the libFuzzer targets with clang (AddressSanitizer + UndefinedBehaviorSanitizer) in
# build-fuzz/ and runs each one for a bounded time on a copy of its seed corpus in fuzz/corpus/.
# Prints the executions of every target and fails if any target reports a crash, a sanitizer
# error, a failed check, a time-out or running out of memory.
#   scripts/fuzz.sh            30 seconds a target (what CI runs)
#   scripts/fuzz.sh 600        ten minutes a target, for a real search by hand
# Findings are kept in build-fuzz/findings/<target>/; replay one with
#   build-fuzz/fuzz/<target> build-fuzz/findings/<target>/crash-...
# (ORZAVS_FUZZ_VERBOSE=1 makes the encoder and engine targets say what the input stands for).
set -euo pipefail
cd "$(dirname "$0")/.."

seconds="${1:-30}"
case "$seconds" in ''|*[!0-9]*) echo "fuzz.sh: seconds must be a whole number" >&2; exit 2 ;; esac

scripts/install-deps.sh

dir=build-fuzz
cmake -S . -B "$dir" -G Ninja -DCMAKE_C_COMPILER=clang -DCMAKE_CXX_COMPILER=clang++ \
  -DCMAKE_BUILD_TYPE=RelWithDebInfo -DORZAVS_BUILD_FUZZ=ON -DORZAVS_BUILD_TESTS=OFF \
  -DORZAVS_SANITIZE=address,undefined -DORZAVS_WERROR=ON >/dev/null
cmake --build "$dir" -j 2 --target orzavs_fuzzers

# target:corpus folder (under fuzz/corpus)[:dictionary (under fuzz)]
targets=(
  image_buffer_fuzzer:image_buffer
  response_parser_fuzzer:response_parser:response_parser.dict
  jpeg_encoder_fuzzer:jpeg_encoder
  fast9_fuzzer:fast9
  engine_fuzzer:engine
)

export ASAN_OPTIONS="abort_on_error=1:detect_leaks=1:${ASAN_OPTIONS:-}"
export UBSAN_OPTIONS="print_stacktrace=1:halt_on_error=1:${UBSAN_OPTIONS:-}"

failed=()
summary=()
for entry in "${targets[@]}"; do
  IFS=: read -r target corpus dict <<<"$entry"
  work="$dir/corpus-work/$target"
  findings="$dir/findings/$target"
  log="$dir/findings/$target.log"
  rm -rf "$work"
  mkdir -p "$work" "$findings"
  if [ -d "fuzz/corpus/$corpus" ]; then cp -R "fuzz/corpus/$corpus/." "$work/"; fi
  args=(-max_total_time="$seconds" -timeout=25 -rss_limit_mb=2048 -close_fd_mask=1
        -print_final_stats=1 -artifact_prefix="$findings/")
  if [ -n "${dict:-}" ]; then args+=(-dict="fuzz/$dict"); fi
  echo "--- $target: ${seconds} s on $(find "$work" -type f | wc -l) seed inputs"
  status=0
  "$dir/fuzz/$target" "${args[@]}" "$work" >"$log" 2>&1 || status=$?
  runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  rate=$(sed -n 's/^stat::average_exec_per_sec: *//p' "$log" | tail -1)
  if [ "$status" -ne 0 ]; then
    failed+=("$target")
    summary+=("$(printf '%-24s %12s executions %8s/s   FAILED (exit %d)' "$target" "${runs:-?}" "${rate:-?}" "$status")")
    echo "$target FAILED; the report:"
    grep -E -A40 'ERROR:|FUZZ_CHECK|runtime error|deadly signal|out-of-memory|timeout' "$log" | head -80 || tail -40 "$log"
    echo "input kept in $findings/"
  else
    summary+=("$(printf '%-24s %12s executions %8s/s   ok' "$target" "${runs:-?}" "$rate")")
  fi
done

echo
echo "=== fuzzing, ${seconds} s a target"
printf '%s\n' "${summary[@]}"
if [ ${#failed[@]} -ne 0 ]; then
  echo "fuzz.sh: findings in ${failed[*]}" >&2
  exit 1
fi
