#ifndef ORZAVS_TYPES_MUTEX_H
#define ORZAVS_TYPES_MUTEX_H

#include <mutex>

// A mutex that clang's thread-safety analysis (-Wthread-safety) understands. Fields are marked
// ORZAVS_GUARDED_BY(mutex) and functions that expect the caller to hold a lock
// ORZAVS_REQUIRES(mutex); clang then proves at every build that each access happens under the
// lock. With other compilers the attributes expand to nothing and the classes are plain wrappers
// around std::mutex and std::unique_lock.

#if defined(__clang__)
#define ORZAVS_THREAD_ANNOTATION(x) __attribute__((x))
#else
#define ORZAVS_THREAD_ANNOTATION(x)
#endif

#define ORZAVS_CAPABILITY(name) ORZAVS_THREAD_ANNOTATION(capability(name))
#define ORZAVS_SCOPED_CAPABILITY ORZAVS_THREAD_ANNOTATION(scoped_lockable)
#define ORZAVS_GUARDED_BY(m) ORZAVS_THREAD_ANNOTATION(guarded_by(m))
#define ORZAVS_PT_GUARDED_BY(m) ORZAVS_THREAD_ANNOTATION(pt_guarded_by(m))
#define ORZAVS_REQUIRES(...) ORZAVS_THREAD_ANNOTATION(requires_capability(__VA_ARGS__))
#define ORZAVS_EXCLUDES(...) ORZAVS_THREAD_ANNOTATION(locks_excluded(__VA_ARGS__))
#define ORZAVS_ACQUIRE(...) ORZAVS_THREAD_ANNOTATION(acquire_capability(__VA_ARGS__))
#define ORZAVS_RELEASE(...) ORZAVS_THREAD_ANNOTATION(release_capability(__VA_ARGS__))
#define ORZAVS_NO_THREAD_SAFETY_ANALYSIS ORZAVS_THREAD_ANNOTATION(no_thread_safety_analysis)

namespace Tovra {

class ORZAVS_CAPABILITY("mutex") Mutex {
 public:
  Mutex() = default;
  Mutex(const Mutex&) = delete;
  Mutex& operator=(const Mutex&) = delete;

  void lock() ORZAVS_ACQUIRE() { mutex_.lock(); }
  void unlock() ORZAVS_RELEASE() { mutex_.unlock(); }

  // The underlying mutex, for std::condition_variable waits (through UniqueLock::native()).
  std::mutex& native() { return mutex_; }

 private:
  std::mutex mutex_;
};

// Holds `mutex` for the scope (std::lock_guard).
class ORZAVS_SCOPED_CAPABILITY MutexLock {
 public:
  explicit MutexLock(Mutex& mutex) ORZAVS_ACQUIRE(mutex) : mutex_(mutex) { mutex_.lock(); }
  ~MutexLock() ORZAVS_RELEASE() { mutex_.unlock(); }
  MutexLock(const MutexLock&) = delete;
  MutexLock& operator=(const MutexLock&) = delete;

 private:
  Mutex& mutex_;
};

// Holds `mutex` for the scope, may release it early (std::unique_lock), and can be waited on by
// a std::condition_variable. A wait releases and retakes the lock inside the call, so to the
// analysis the lock is held throughout; write the wait as a loop around wait(native()) so that
// the condition is checked under the lock in this function.
class ORZAVS_SCOPED_CAPABILITY UniqueLock {
 public:
  explicit UniqueLock(Mutex& mutex) ORZAVS_ACQUIRE(mutex) : lock_(mutex.native()) {}
  ~UniqueLock() ORZAVS_RELEASE() {}
  UniqueLock(const UniqueLock&) = delete;
  UniqueLock& operator=(const UniqueLock&) = delete;

  void unlock() ORZAVS_RELEASE() { lock_.unlock(); }
  std::unique_lock<std::mutex>& native() { return lock_; }

 private:
  std::unique_lock<std::mutex> lock_;
};

}  // namespace Tovra

#endif
