#!/usr/bin/env bash
# A small mutation run over the core: each mutant plants one plausible fault (a flipped
# comparison, an off-by-one bound, a wrong constant, a dropped lock, a missing state change, a
# wrong text or key) and the C++ unit tests must notice it.
#
#   scripts/mutate.sh [--tree DIR] [--work DIR] [--only ID,ID...] [--list]
#
#   --tree DIR   the source tree to mutate (default: the repository this script lives in)
#   --work DIR   where the persistent copy and its builds live (default: DIR/build-mutate)
#   --only IDS   run only these mutants
#   --list       print the mutants and exit
# Environment: MUTATE_TIMEOUT (seconds per test binary, default 120; a hang counts as killed),
# MUTATE_TSAN=0 to run the lock mutants' concurrency tests without ThreadSanitizer.
#
# A mutant is (id, file, test binaries, original snippet, replacement). The snippet must occur
# exactly once in the file, so a mutant keeps hitting the same code while the rest of the file
# changes; when it occurs zero or several times the mutant is reported "stale" and not run.
# The tree is copied once into WORK/src (later runs copy only what changed) and built in
# WORK/build with Ninja; each mutant edits one file of the copy, rebuilds only its test
# binaries, runs them and restores the file. Binaries written "tsan:NAME" run from a
# ThreadSanitizer build (WORK/build-tsan), which is what makes a dropped lock visible.
set -uo pipefail

tree="$(cd "$(dirname "$0")/.." && pwd)"
work=""
only=""
list=0
while [ $# -gt 0 ]; do
  case "$1" in
    --tree) tree="$(cd "${2:?--tree needs a folder}" && pwd)"; shift 2 ;;
    --work) work="${2:?--work needs a folder}"; shift 2 ;;
    --only) only=",${2:?--only needs ids},"; shift 2 ;;
    --list) list=1; shift ;;
    *) echo "mutate.sh: unknown argument '$1'" >&2; exit 2 ;;
  esac
done
work="${work:-$tree/build-mutate}"
mkdir -p "$work"
work="$(cd "$work" && pwd)"
src="$work/src"
timeout_s="${MUTATE_TIMEOUT:-120}"
use_tsan="${MUTATE_TSAN:-1}"

ids=() files=() bins=() origs=() repls=()
m() { ids+=("$1"); files+=("$2"); bins+=("$3"); origs+=("$4"); repls+=("$5"); }

# ---- engine/ -------------------------------------------------------------------------------
E=engine_tests
m take-interval-ge engine/TovraStateEngine.cpp "$E" \
  't - lastTakenTime_ > kMinTakeInterval' 't - lastTakenTime_ >= kMinTakeInterval'
m take-first-frame engine/TovraStateEngine.cpp "$E" \
  'take = lastTakenTime_ < 0 ||' 'take = lastTakenTime_ > 0 ||'
m take-interval-0.2 engine/TovraStateEngine.cpp "$E" \
  'kMinTakeInterval = 0.1;' 'kMinTakeInterval = 0.2;'
m held-age-0.5 engine/TovraStateEngine.cpp "$E" \
  'kMaxHeldAge = 0.4;' 'kMaxHeldAge = 0.5;'
m held-age-flipped engine/TovraStateEngine.cpp "$E" \
  't - heldRecord_->timeStamp > kMaxHeldAge' 't - heldRecord_->timeStamp < kMaxHeldAge'
m sharper-ge engine/TovraStateEngine.cpp "$E" \
  'sharpness(image) > heldRecord_->sharpness' 'sharpness(image) >= heldRecord_->sharpness'
m sharpness-margin-0.1 engine/TovraStateEngine.cpp "$E" \
  'kSharpnessMarginFactor = 0.09999999999999998;' 'kSharpnessMarginFactor = 0.1;'
m sharpness-row-bound engine/TovraStateEngine.cpp "$E" \
  'if (y < 1 || y > height - 2) continue;' 'if (y < 1 || y > height - 1) continue;'
m frame-key-separator engine/TovraStateEngine.cpp "$E" \
  "out << seconds << '-' << frameId;" "out << seconds << '_' << frameId;"
m pause-keeps-state engine/TovraStateEngine.cpp "$E" \
  $'reset();\n  state_ = PAUSED;' 'reset();'
m stop-keeps-state engine/TovraStateEngine.cpp "$E" \
  $'old.reset();\n  state_ = STOPPED;' 'old.reset();'
m start-only-stopped engine/TovraStateEngine.cpp "$E" \
  'if ((state_ | 2) != 2) return;' 'if (state_ != STOPPED) return;'
m resume-no-readmit engine/TovraStateEngine.cpp "$E" \
  'if (executor_) executor_->resumeJobs();' ''
m module-id-check engine/TovraStateEngine.cpp "$E" \
  'if (id != VISUAL_SEARCH_SERVICE_MOD) return;' 'if (id == BARCODE_MOD) return;'
m process-no-lock engine/TovraStateEngine.cpp "$E tsan:engine_concurrency_tests" \
  $'MutexLock lock(mutex_);\n  if (state_ != RUNNING) {\n    reportLine("Skipped input frame: TSE not in RUNNING state");\n    dropLent' \
  $'if (state_ != RUNNING) {\n    reportLine("Skipped input frame: TSE not in RUNNING state");\n    dropLent'
m pool-slot-shared engine/FrameRecordManager.cpp "$E" \
  'slot && slot.use_count() == 1)' 'slot && slot.use_count() <= 2)'
m pool-first-id-1 engine/FrameRecordManager.cpp "$E" \
  'record->frameId = nextFrameId_++;' 'record->frameId = ++nextFrameId_;'
m pool-restart-text engine/FrameRecordManager.cpp "$E" \
  '"Unable to restart frame record manager () as' '"Unable to restart frame record manager as'
m pool-no-lock engine/FrameRecordManager.cpp "$E tsan:engine_concurrency_tests" \
  $'getNewSlot() {\n  MutexLock lock(mutex_);' 'getNewSlot() {'
m lend-rows-rounding engine/FrameRecord.cpp "$E" \
  'rows = (rows * 3) / 2;' 'rows = (rows * 3 + 1) / 2;'
m copy-capacity-le engine/FrameRecord.cpp "$E" \
  'available >= 0 && available < size' 'available >= 0 && available <= size'

# ---- types/ --------------------------------------------------------------------------------
T=types_tests
m yuv-formats-upto-3 types/ImageFormat.h "$T $E" \
  'static_cast<uint32_t>(format) < 3u' 'static_cast<uint32_t>(format) <= 3u'
m content-type-name types/EnumNames.cpp "$T" \
  '{NUM_CONTENT_TYPES, "NUM_CONTENT_TYPES"}' '{NUM_CONTENT_TYPES, "NUM_CONTENT_TYPE"}'
m module-name-missing types/EnumNames.cpp "$T" \
  '{NUM_OBJECT_MODS, "NUM_OBJECT_MODS"},' ''
m objectinfo-default-module types/ObjectInfo.h "$T" \
  ': srcObjectModule(UNSPECIFIED_OBJECT_MOD), contentType(type)' ': srcObjectModule(VISUAL_SEARCH_SERVICE_MOD), contentType(type)'
m metadata-clear-keeps-queries types/ResultMetadata.h "$T" \
  'accumulatedQueries.clear();' ''
m fill-ignores-capacity types/ImageBuffer.cpp "$T" \
  'const int32_t count = std::min(length, capacity());' 'const int32_t count = length;'
m fill-two-planes-overlap types/ImageBuffer.cpp "$T" \
  'std::memcpy(data + firstCount, second,' 'std::memcpy(data, second,'

# ---- server/ -------------------------------------------------------------------------------
S=server_tests
m pending-replaces-handler server/ServerDelegate.cpp "$S" \
  'pending_.emplace(request.id, request.responseHandler);' 'pending_[request.id] = request.responseHandler;'
m push-keeps-pending server/ServerDelegate.cpp "$S" \
  $'handler = it->second;\n    pending_.erase(it);' 'handler = it->second;'
m send-no-lock server/ServerDelegate.cpp "$S tsan:server_concurrency_tests" \
  $'{\n    MutexLock lock(mutex_);\n    // Registered before' $'{\n    // Registered before'
m response-code-default server/ServerResponse.h "$S" \
  'int32_t responseCode = 200;' 'int32_t responseCode = 0;'
m roundtrip-default server/ServerResponse.h "$S" \
  'double roundtripTime = -1.0;' 'double roundtripTime = 0.0;'

# ---- exec/ ---------------------------------------------------------------------------------
X=exec_tests
m add-after-cancel exec/TovraExecutionEngine.cpp "$X" \
  'if (stopping_ || job == nullptr || canceled_) return;' 'if (stopping_ || job == nullptr) return;'
m run-while-canceled exec/TovraExecutionEngine.cpp "$X" \
  'if (!stopping_ && !canceled_) job->run();' 'if (!stopping_) job->run();'
m queue-lifo exec/TovraExecutionEngine.cpp "$X" \
  'queue_.push_back(job);' 'queue_.push_front(job);'
m zero-threads-text exec/TovraExecutionEngine.cpp "$X" \
  '"Initialized TovraExecutionEngine with invalid number of threads"' '"Initialized TovraExecutionEngine with invalid thread count"'
m add-error-text exec/TovraExecutionEngine.cpp "$X" \
  '"Error: Adding job to stopped/canceled execution engine"' '"Error: adding job to stopped/canceled execution engine"'

# ---- vsearch/ ------------------------------------------------------------------------------
V=vsearch_tests
m jpeg-quality-75 vsearch/VisualSearchServiceJob.cpp "$V" \
  'kJpegQuality = 50;' 'kJpegQuality = 75;'
m quality-clamp-top vsearch/JpegEncoder.cpp "$V" \
  'if (quality >= 100) return 100;' 'if (quality >= 100) return 99;'
# Equivalent: the library itself reads quality 0 as 1, so the tables do not change.
m quality-clamp-bottom vsearch/JpegEncoder.cpp "$V" \
  'if (quality <= 0) return 0;' 'if (quality <= 0) return 1;'
m chroma-order vsearch/JpegEncoder.cpp "$V" \
  'const bool cbFirst = frame.format == OrzaVSMobile::NV12;' 'const bool cbFirst = frame.format == OrzaVSMobile::NV21;'
m chroma-tail vsearch/JpegDeinterleave.cpp "$V" \
  'second[i] = src[2 * i + 1];' 'second[i] = src[2 * i];'
m rotation-mod-180 vsearch/VisualSearchRequest.cpp "$V" \
  '+ 90) % 360' '+ 90) % 180'
m roundtrip-key vsearch/VisualSearchRequest.cpp "$V" \
  '"lastQueryRoundTripTime";' '"lastQueryRoundtripTime";'
m request-id-prefix vsearch/VisualSearchRequest.cpp "$V" \
  'kRequestIdPrefix = "TovraStateEngine-";' 'kRequestIdPrefix = "TovraStateEngine_";'
# Equivalent while the insertion stays guarded by the "not there yet" test around it.
m params-json-rewritten vsearch/VisualSearchRequest.cpp "$V" \
  'request.params.emplace(kParamsJsonField, visualSearchParamsJson(info.rotation));' \
  'request.params[kParamsJsonField] = visualSearchParamsJson(info.rotation);'
m last-query-always vsearch/VisualSearchRequest.cpp "$V" \
  'if (!lastQueryId.empty()) {' 'if (true) {'
m corner-xy-swapped vsearch/VisualSearchResponseParser.cpp "$V" \
  'cornerValue(b.at("tlx")), cornerValue(b.at("tly"))' 'cornerValue(b.at("tly")), cornerValue(b.at("tlx"))'
m corner-order vsearch/VisualSearchResponseParser.cpp "$V" \
  'cornerValue(b.at("trx")), cornerValue(b.at("try"))' 'cornerValue(b.at("brx")), cornerValue(b.at("bry"))'
m content-type-text vsearch/VisualSearchResponseParser.cpp "$V" \
  'if (name == "DirectedResult")' 'if (name == "DirectedResults")'
m final-key vsearch/VisualSearchResponseParser.cpp "$V" \
  'resultMetadata["finalAccumulation"]' 'resultMetadata["isFinalAccumulation"]'
m reply-code-lt-400 vsearch/VisualSearchServiceJob.cpp "$V" \
  'if (response.responseCode == 200) {' 'if (response.responseCode < 400) {'
m unspecified-kept vsearch/VisualSearchServiceJob.cpp "$V" \
  'return info.contentType == UNSPECIFIED_CONTENT_TYPE;' 'return false;'
m source-module-unset vsearch/VisualSearchServiceJob.cpp "$V" \
  'for (ObjectInfo& info : results) info.srcObjectModule = VISUAL_SEARCH_SERVICE_MOD;' ''
m awaiting-finished vsearch/VisualSearchServiceJob.cpp "$V" \
  'if (state_.load() != AwaitingReply) state_.store(Finished);' 'state_.store(Finished);'
m server-error-text vsearch/VisualSearchServiceJob.cpp "$V" \
  '"VSS SERVER ERROR: response: %s"' '"VSS SERVER ERROR: %s"'

# ---- features/ -----------------------------------------------------------------------------
F=features_tests
m arc-of-8 features/Fast9Scalar.cpp "$F" \
  'a &= mm >> 8;' ''
m score-arc-of-8 features/Fast9Scalar.cpp "$F" \
  'std::min(std::min(a4[k], a4[(k + 4) & 15]), e[(k + 8) & 15])' 'std::min(a4[k], a4[(k + 4) & 15])'
m bright-not-strict features/Fast9Scalar.cpp "$F" \
  'static_cast<uint32_t>(d[k] > b) << k;' 'static_cast<uint32_t>(d[k] >= b) << k;'
m suppress-left-gt features/Fast9.cpp "$F" \
  'scores[i - 1] >= v) continue;' 'scores[i - 1] > v) continue;'
m suppress-above-narrow features/Fast9.cpp "$F" \
  'corners[j].y == y - 1 && corners[j].x <= x + 1' 'corners[j].y == y - 1 && corners[j].x < x + 1'
m border-rows features/Fast9.cpp "$F" \
  $'for (int y = 3; y < height - 3; ++y) {\n    const int n = k.detect' $'for (int y = 3; y < height - 2; ++y) {\n    const int n = k.detect'
m threshold-40 features/InterestPoints.cpp "$F" \
  'kThreshold = 50;' 'kThreshold = 40;'
m max-points-51 features/InterestPoints.cpp "$F" \
  'kMaxPoints = 50;' 'kMaxPoints = 51;'
# Equivalent: with exactly 50 corners the selection leaves them in their row-major order.
m fifty-selected features/InterestPoints.cpp "$F" \
  'if (n <= kMaxPoints) {' 'if (n < kMaxPoints) {'
m best-scores-flipped features/InterestPoints.cpp "$F" \
  'return scores[static_cast<size_t>(a)] > scores[static_cast<size_t>(b)];' 'return scores[static_cast<size_t>(a)] < scores[static_cast<size_t>(b)];'

# ---- jni/ (what its C++ tests reach without a JVM) ----------------------------------------------
J=jni_tests
m exception-class-name jni/SwigRuntime.cpp "$J" \
  '{JavaIndexOutOfBoundsException, "java/lang/IndexOutOfBoundsException"},' '{JavaIndexOutOfBoundsException, "java/lang/IndexOutOfBoundsError"},'
m unknown-exception-text jni/JniCall.cpp "$J" \
  '"unknown native exception"' '"unknown exception"'

# ---- the run ----------------------------------------------------------------------------------
selected() { [ -z "$only" ] || [[ "$only" == *",$1,"* ]]; }

# Copies the tree into $src, rewriting only files whose content differs (their new mtime makes
# Ninja rebuild them) and removing files that the tree no longer has.
sync_tree() {
  mkdir -p "$src"
  local f
  while IFS= read -r -d '' f; do
    if ! cmp -s "$tree/$f" "$src/$f"; then
      mkdir -p "$(dirname "$src/$f")"
      cp "$tree/$f" "$src/$f"
    fi
  done < <(cd "$tree" && find . \( -name .git -o -path './build*' \) -prune -o -type f -print0)
  while IFS= read -r -d '' f; do
    [ -e "$tree/$f" ] || rm -f "$src/$f"
  done < <(cd "$src" && find . -type f -print0)
}

# Number of occurrences of $2 in $1, counting no further than 2.
occurrences() {
  local text="$1" n=0
  while [ "$n" -lt 2 ] && [[ "$text" == *"$2"* ]]; do text="${text#*"$2"}"; n=$((n + 1)); done
  echo "$n"
}

read_file() { local c; c="$(cat "$1"; printf x)"; printf '%s' "${c%x}"; }

if [ "$list" = 1 ]; then
  for i in "${!ids[@]}"; do
    n=0
    [ -f "$tree/${files[$i]}" ] && n="$(occurrences "$(read_file "$tree/${files[$i]}")" "${origs[$i]}")"
    [ "$n" = 1 ] && state=ok || state=stale
    printf '%-26s %-5s %-40s %s\n' "${ids[$i]}" "$state" "${files[$i]}" "${bins[$i]}"
  done
  echo "${#ids[@]} mutants"
  exit 0
fi

build_dir() { case "$1" in tsan:*) echo "$work/build-tsan" ;; *) echo "$work/build" ;; esac; }
bin_name() { echo "${1#tsan:}"; }
bin_path() {
  local dir name
  dir="$(build_dir "$1")"; name="$(bin_name "$1")"
  if [ -x "$dir/tests/$name" ]; then echo "$dir/tests/$name"; else echo "$dir/tests/jni/$name"; fi
}

# Builds the given binaries (grouped by build folder); returns non-zero when any build fails.
build_bins() {
  local plain=() tsan=() b
  for b in "$@"; do
    case "$b" in tsan:*) tsan+=("${b#tsan:}") ;; *) plain+=("$b") ;; esac
  done
  if [ ${#plain[@]} -gt 0 ]; then nice ninja -C "$work/build" "${plain[@]}" >>"$log" 2>&1 || return 1; fi
  if [ ${#tsan[@]} -gt 0 ]; then nice ninja -C "$work/build-tsan" "${tsan[@]}" >>"$log" 2>&1 || return 1; fi
}

# Runs the binaries in order; prints the first that fails ("" when all pass).
run_bins() {
  local b
  for b in "$@"; do
    if ! TSAN_OPTIONS="halt_on_error=1:${TSAN_OPTIONS:-}" \
         timeout "$timeout_s" nice "$(bin_path "$b")" --gtest_brief=1 >>"$log" 2>&1; then
      echo "$b"
      return
    fi
  done
}

log="$work/mutate.log"
: >"$log"
echo "mutate.sh: tree $tree, work $work"
sync_tree

all_bins=()
for i in "${!ids[@]}"; do
  selected "${ids[$i]}" || continue
  for b in ${bins[$i]}; do
    if [ "$use_tsan" = 0 ]; then b="${b#tsan:}"; fi
    [[ " ${all_bins[*]:-} " == *" $b "* ]] || all_bins+=("$b")
  done
done
[ ${#all_bins[@]} -gt 0 ] || { echo "mutate.sh: no mutant selected" >&2; exit 2; }

cmake -S "$src" -B "$work/build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo >>"$log" 2>&1 ||
  { echo "mutate.sh: configuring failed (see $log)" >&2; exit 1; }
if [[ " ${all_bins[*]} " == *" tsan:"* ]]; then
  cmake -S "$src" -B "$work/build-tsan" -G Ninja -DORZAVS_SANITIZE=thread \
    -DCMAKE_BUILD_TYPE=RelWithDebInfo >>"$log" 2>&1 ||
    { echo "mutate.sh: configuring the ThreadSanitizer build failed (see $log)" >&2; exit 1; }
fi
echo "mutate.sh: building ${all_bins[*]}"
build_bins "${all_bins[@]}" || { echo "mutate.sh: the unmutated tree does not build (see $log)" >&2; exit 1; }
failed="$(run_bins "${all_bins[@]}")"
if [ -n "$failed" ]; then
  echo "mutate.sh: the unmutated tree fails $failed (see $log)" >&2
  exit 1
fi

current="" original=""
restore() { if [ -n "$current" ]; then printf '%s' "$original" >"$current"; current=""; fi; }
trap 'restore' EXIT
trap 'restore; exit 130' INT TERM

killed=0 survived=0 stale=0 broken=0 total=0
survivors=()
for i in "${!ids[@]}"; do
  id="${ids[$i]}"
  selected "$id" || continue
  file="$src/${files[$i]}"
  if [ ! -f "$file" ]; then
    printf '%-26s stale (no file %s)\n' "$id" "${files[$i]}"; stale=$((stale + 1)); continue
  fi
  # Read with a sentinel: a bare command substitution would drop the final newline, and the
  # restored file would then differ from the tree's and be rebuilt on every later run.
  text="$(cat "$file"; printf x)"; text="${text%x}"
  n="$(occurrences "$text" "${origs[$i]}")"
  if [ "$n" != 1 ]; then
    [ "$n" = 0 ] && why="snippet not found" || why="snippet occurs more than once"
    printf '%-26s stale (%s in %s)\n' "$id" "$why" "${files[$i]}"; stale=$((stale + 1)); continue
  fi
  mbins=()
  for b in ${bins[$i]}; do
    if [ "$use_tsan" = 0 ]; then b="${b#tsan:}"; fi
    mbins+=("$b")
  done
  echo "=== $id" >>"$log"
  current="$file"; original="$text"
  printf '%s%s%s' "${text%%"${origs[$i]}"*}" "${repls[$i]}" "${text#*"${origs[$i]}"}" >"$file"
  if ! build_bins "${mbins[@]}"; then
    printf '%-26s does not build (see %s)\n' "$id" "$log"; broken=$((broken + 1))
    restore; continue
  fi
  failed="$(run_bins "${mbins[@]}")"
  restore
  total=$((total + 1))
  if [ -n "$failed" ]; then
    printf '%-26s killed by %s\n' "$id" "$failed"; killed=$((killed + 1))
  else
    printf '%-26s SURVIVED (%s)\n' "$id" "${files[$i]}"; survived=$((survived + 1)); survivors+=("$id")
  fi
done
[ ${#survivors[@]} -eq 0 ] || echo "survivors: ${survivors[*]}"
echo "killed $killed of $total ($survived survived, $stale stale, $broken did not build)"
