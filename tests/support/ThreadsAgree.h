#ifndef ORZAVS_TESTS_SUPPORT_THREADSAGREE_H
#define ORZAVS_TESTS_SUPPORT_THREADSAGREE_H

#include <atomic>
#include <thread>
#include <vector>

namespace orzavs_test {

// Computes `compute(kind, 0)` for every kind on this thread, then `compute(kind, round)` from
// four threads at once, 30 rounds each with the kind rotating (so what each thread works on
// keeps changing under it). Returns how many threaded results differ from the single-threaded
// ones: code without shared state gives 0.
template <typename Compute>
int threadedMismatches(int kinds, Compute compute) {
  std::vector<decltype(compute(0, 0))> expected;
  for (int kind = 0; kind < kinds; ++kind) expected.push_back(compute(kind, 0));
  std::atomic<int> mismatches{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      for (int round = 0; round < 30; ++round) {
        const int kind = (t + round) % kinds;
        mismatches += compute(kind, round) == expected[static_cast<size_t>(kind)] ? 0 : 1;
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  return mismatches.load();
}

}  // namespace orzavs_test

#endif
