#ifndef ORZAVS_TESTS_SUPPORT_THREADS_H
#define ORZAVS_TESTS_SUPPORT_THREADS_H

#include <atomic>
#include <chrono>
#include <functional>
#include <thread>
#include <vector>

namespace orzavs_test {

using Clock = std::chrono::steady_clock;
using Ms = std::chrono::milliseconds;

// Polls `done` every millisecond; false once `timeout` has passed without it.
inline bool waitFor(const std::function<bool()>& done, Ms timeout = Ms(5000)) {
  for (const auto end = Clock::now() + timeout; !done(); std::this_thread::sleep_for(Ms(1))) {
    if (Clock::now() > end) return false;
  }
  return true;
}

// A one-shot gate: wait() blocks until open() (or until the timeout; returns whether it opened).
class Gate {
 public:
  void open() { open_ = true; }
  bool wait(Ms timeout = Ms(10000)) const { return waitFor([this] { return open_.load(); }, timeout); }

 private:
  std::atomic<bool> open_{false};
};

// Computes `compute(kind, 0)` for every kind here, then `compute(kind, round)` on four threads, 30
// rounds each with the kind rotating; returns how many threaded results differ (0 without shared state).
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
