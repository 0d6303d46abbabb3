// LibraryClock: the gateway's CPU time and the share of it spent inside the
// library's calls, for --statistics. Every call the gateway makes on the
// library goes through measure(), which reads the thread's CPU clock before
// and after it when the clock is on and reads nothing when it is off. The
// gateway runs on one thread, so the thread's clock is the process's work.
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

 private:
  // Adds the CPU time between its construction and destruction.
  class Timing {
   public:
    explicit Timing(LibraryClock& clock) : m_clock(clock), m_start(threadSeconds()) {}
    ~Timing() { m_clock.m_librarySeconds += threadSeconds() - m_start; }

   private:
    LibraryClock& m_clock;
    double m_start;
  };

  static double threadSeconds();

  bool m_on;
  double m_librarySeconds = 0;
};
