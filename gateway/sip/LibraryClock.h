// LibraryClock: the gateway's CPU time and the share of it spent inside the
// library's calls, for --statistics, the statistics question and /metrics. Every call the gateway makes on
// the library goes through measure(), which reads a clock before and after it when the clock is on and reads
// nothing when it is off. The gateway runs on one thread, so the thread's CPU clock is the process's work.
//
// Decision: the calls are timed with the monotonic clock, not the thread's
// CPU clock. The CPU clock is a system call (about 1.3 us on the machines
// measured, against 26 ns), so timing with it inflated both the gateway's
// CPU time and the library's share by the measurement itself; a library call
// lasts microseconds, so the wall time inside it is its CPU time unless the
// thread is preempted during it, which is as rare as the call is short. The
// total is the thread's CPU clock, read once for the summary.
#pragma once

#include <string>
#include <utility>

class LibraryClock {
 public:
  explicit LibraryClock(bool on) : m_on(on) {}
  LibraryClock(LibraryClock const&) = delete;
  LibraryClock& operator=(LibraryClock const&) = delete;

  template <class Call>
  decltype(auto) measure(Call&& call) {
    if (!m_on)
      return std::forward<Call>(call)();
    Timing const timing(*this);
    return std::forward<Call>(call)();
  }

  // "CPU X.XXX s, in the library Y.YYY s (Z.Z%)" for the thread so far.
  std::string summary() const;
  // The calling thread's CPU time: the gateway's when called on its loop.
  static double cpuSeconds() { return threadSeconds(); }
  double librarySeconds() const { return m_librarySeconds; }

 private:
  // Adds the time between its construction and destruction.
  class Timing {
   public:
    explicit Timing(LibraryClock& clock) : m_clock(clock), m_start(monotonicSeconds()) {}
    ~Timing() { m_clock.m_librarySeconds += monotonicSeconds() - m_start; }

   private:
    LibraryClock& m_clock;
    double m_start;
  };

  static double threadSeconds();
  static double monotonicSeconds();

  bool m_on;
  double m_librarySeconds = 0;
};
