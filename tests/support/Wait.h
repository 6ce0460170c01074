#ifndef ORZAVS_TESTS_SUPPORT_WAIT_H
#define ORZAVS_TESTS_SUPPORT_WAIT_H

#include <atomic>
#include <chrono>
#include <functional>
#include <thread>

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
  bool isOpen() const { return open_; }

 private:
  std::atomic<bool> open_{false};
};

}  // namespace orzavs_test

#endif
