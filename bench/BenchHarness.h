#ifndef ORZAVS_BENCH_BENCHHARNESS_H
#define ORZAVS_BENCH_BENCHHARNESS_H

// A small timing harness for the benchmark program.
//
// Each bench file registers a section at namespace scope:
//
//   static void runFastBench(const std::vector<const orzavs_bench::BenchFrame*>& frames);
//   ORZAVS_BENCH_SECTION("fast", runFastBench);
//
// `orzavs_bench` runs every section in name order, or only the sections named on its command
// line (`orzavs_bench fast jpeg`). Options:
//   --frames TEXT   only frames whose name contains TEXT (e.g. "1280x720" or "texture")
//   --reps N        timed repetitions per measurement (default: adaptive, 15 to 400)
//   --warmup N      untimed calls before each measurement (default 3)
//   --list          print the section names and exit
//
// A measurement calls the function `warmup` times untimed, then times each of N calls
// separately with a monotonic clock and reports the median and the minimum per call. With the
// adaptive count, N grows until the timed calls cover at least half a second (at least 15, at
// most 400 calls). Comparisons with a peer use measurePair, which interleaves the two. Figures
// are printed, never checked: benchmarks do not fail.

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "bench/BenchFrames.h"

namespace orzavs_bench {

struct Timing {
  double medianMs = 0;
  double minMs = 0;
  int reps = 0;
};

// Times `fn` as described above, using the command line's --reps/--warmup.
Timing measure(const std::function<void()>& fn);

// Times two functions side by side for a fair ratio on a busy machine: the calls alternate
// (a, b, b, a, a, b, ...), so that load from elsewhere falls on both alike. The adaptive count
// covers half a second for the pair.
struct TimingPair {
  Timing a;
  Timing b;
};
TimingPair measurePair(const std::function<void()>& a, const std::function<void()>& b);

// One table row: "  <frame>  <what>  median  min  reps", aligned.
void printTiming(const std::string& frame, const std::string& what, const Timing& t);
// "  <frame>  <what>  ratio X.XXx (median), X.XXx (min)" where ratio = ours / peer.
void printRatio(const std::string& frame, const std::string& what, const Timing& ours, const Timing& peer);
// A section heading line and the column headings of printTiming.
void printHeading(const std::string& title);

// Keeps the compiler from discarding a computed value.
void keep(const void* p);
inline void keep(uint64_t v) { keep(&v); }

using SectionFn = void (*)(const std::vector<const BenchFrame*>& frames);

// Adds a section; used by ORZAVS_BENCH_SECTION. Returns true.
bool registerSection(const char* name, SectionFn fn);

}  // namespace orzavs_bench

#define ORZAVS_BENCH_CONCAT2(a, b) a##b
#define ORZAVS_BENCH_CONCAT(a, b) ORZAVS_BENCH_CONCAT2(a, b)
#define ORZAVS_BENCH_SECTION(name, fn)                                                   \
  static const bool ORZAVS_BENCH_CONCAT(orzavsBenchSection_, __LINE__) [[maybe_unused]] = \
      ::orzavs_bench::registerSection(name, fn)

#endif
