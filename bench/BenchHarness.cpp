#include "bench/BenchHarness.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>

namespace orzavs_bench {
namespace {

struct Settings {
  int reps = 0;  // 0 = adaptive
  int warmup = 3;
};

Settings& settings() {
  static Settings s;
  return s;
}

std::map<std::string, SectionFn>& sections() {
  static std::map<std::string, SectionFn> table;
  return table;
}

using Clock = std::chrono::steady_clock;

double elapsedMs(Clock::time_point a, Clock::time_point b) {
  return std::chrono::duration<double, std::milli>(b - a).count();
}

volatile uintptr_t g_sink;

int usage(const char* argv0) {
  std::printf("usage: %s [--frames TEXT] [--reps N] [--warmup N] [--list] [section...]\n", argv0);
  return 2;
}

Timing summarize(std::vector<double>& times) {
  std::sort(times.begin(), times.end());
  Timing t;
  t.reps = static_cast<int>(times.size());
  t.minMs = times.front();
  const size_t n = times.size();
  t.medianMs = (n % 2) ? times[n / 2] : 0.5 * (times[n / 2 - 1] + times[n / 2]);
  return t;
}

// Runs `step(i)` for i = 0, 1, ... until the repetition rule of the command line is met;
// `step` returns the milliseconds it timed.
template <class Step>
void repeat(Step&& step) {
  const Settings& s = settings();
  const int minReps = s.reps > 0 ? s.reps : 15;
  const int maxReps = s.reps > 0 ? s.reps : 400;
  const double budgetMs = s.reps > 0 ? 0.0 : 500.0;
  double total = 0;
  for (int i = 0; i < maxReps && (i < minReps || total < budgetMs); ++i) total += step(i);
}

double timeOnce(const std::function<void()>& fn) {
  const Clock::time_point a = Clock::now();
  fn();
  return elapsedMs(a, Clock::now());
}

}  // namespace

void keep(const void* p) { g_sink = g_sink + reinterpret_cast<uintptr_t>(p); }

bool registerSection(const char* name, SectionFn fn) {
  sections()[name] = fn;
  return true;
}

Timing measure(const std::function<void()>& fn) {
  for (int i = 0; i < settings().warmup; ++i) fn();
  std::vector<double> times;
  repeat([&](int) {
    times.push_back(timeOnce(fn));
    return times.back();
  });
  return summarize(times);
}

TimingPair measurePair(const std::function<void()>& a, const std::function<void()>& b) {
  for (int i = 0; i < settings().warmup; ++i) {
    a();
    b();
  }
  std::vector<double> ta, tb;
  repeat([&](int i) {
    // Alternate which goes first so neither always runs on a cache the other warmed.
    if (i % 2 == 0) {
      ta.push_back(timeOnce(a));
      tb.push_back(timeOnce(b));
    } else {
      tb.push_back(timeOnce(b));
      ta.push_back(timeOnce(a));
    }
    return ta.back() + tb.back();
  });
  return TimingPair{summarize(ta), summarize(tb)};
}

void printHeading(const std::string& title) {
  std::printf("\n== %s\n", title.c_str());
  std::printf("  %-18s %-34s %10s %10s %6s\n", "frame", "case", "median ms", "min ms", "reps");
}

void printTiming(const std::string& frame, const std::string& what, const Timing& t) {
  std::printf("  %-18s %-34s %10.3f %10.3f %6d\n", frame.c_str(), what.c_str(), t.medianMs, t.minMs, t.reps);
  std::fflush(stdout);
}

void printRatio(const std::string& frame, const std::string& what, const Timing& ours, const Timing& peer) {
  const double med = peer.medianMs > 0 ? ours.medianMs / peer.medianMs : 0.0;
  const double mn = peer.minMs > 0 ? ours.minMs / peer.minMs : 0.0;
  std::printf("  %-18s %-34s ratio %.2fx (median), %.2fx (min)\n", frame.c_str(), what.c_str(), med, mn);
  std::fflush(stdout);
}

}  // namespace orzavs_bench

int main(int argc, char** argv) {
  using namespace orzavs_bench;
  std::string filter;
  std::vector<std::string> wanted;
  for (int i = 1; i < argc; ++i) {
    const char* a = argv[i];
    if (std::strcmp(a, "--frames") == 0 && i + 1 < argc) {
      filter = argv[++i];
    } else if (std::strcmp(a, "--reps") == 0 && i + 1 < argc) {
      settings().reps = std::max(1, std::atoi(argv[++i]));
    } else if (std::strcmp(a, "--warmup") == 0 && i + 1 < argc) {
      settings().warmup = std::max(0, std::atoi(argv[++i]));
    } else if (std::strcmp(a, "--list") == 0) {
      for (const auto& s : sections()) std::printf("%s\n", s.first.c_str());
      return 0;
    } else if (a[0] == '-') {
      return usage(argv[0]);
    } else {
      wanted.push_back(a);
    }
  }
  for (const std::string& w : wanted) {
    if (sections().find(w) == sections().end()) {
      std::printf("unknown section '%s' (see --list)\n", w.c_str());
      return 2;
    }
  }
  const std::vector<const BenchFrame*> frames = selectFrames(filter);
  if (frames.empty()) {
    std::printf("no frame matches '%s'\n", filter.c_str());
    return 2;
  }
  std::printf("orzavs_bench: %zu frames, %s repetitions, %d warm-up calls\n", frames.size(),
              settings().reps > 0 ? std::to_string(settings().reps).c_str() : "adaptive", settings().warmup);
  for (const auto& s : sections()) {
    if (wanted.empty() || std::find(wanted.begin(), wanted.end(), s.first) != wanted.end()) s.second(frames);
  }
  return 0;
}
