// StopSignals: SIGINT and SIGTERM end libre's loop through a signalfd that
// the loop watches, not through a signal handler.
//
// libre installs its own handler with signal(), which its ISO C build gets
// with System V semantics (__sysv_signal): delivery resets the disposition
// to the default until the handler has installed itself again, so a second
// signal in that window killed the gateway in the middle of its shut-down
// now and then. Supervisors send two as a matter of course: timeout(1)
// signals the process and then its process group, and an operator presses
// Ctrl-C twice. Blocked and read from a descriptor, neither signal can ever
// take its default action.
//
// The first one read ends the loop (re_cancel) and closes the descriptor:
// a second one, sent while the gateway unregisters its trunks and ends its
// calls, stays pending unread and does not cut that short. Both signals
// stay blocked until the process ends.
//
// Made before any other thread exists, since a thread started earlier
// would keep the signals unblocked and take them with their default
// action. One per process; watch() and the reading run on libre's thread.
#pragma once

#include <string>

class StopSignals {
 public:
  // Blocks SIGINT and SIGTERM in the calling thread, and so in every
  // thread it starts later.
  StopSignals();
  ~StopSignals();
  StopSignals(StopSignals const&) = delete;
  StopSignals& operator=(StopSignals const&) = delete;

  // From now on the loop ends at the first signal; false with the reason
  // in error when the descriptor cannot be made or watched.
  bool watch(std::string& error);

 private:
  static void onReadable(int flags, void* self);
  void close();

  int m_descriptor = -1;
};
