// Autosave: keeps the configuration changed over the control socket in a file
// (--autosave FILE), written as the save command writes it, so that a
// gateway started on FILE rebuilds the same model.
//
// Decisions, with their reasons:
// - Atomic: the script goes to a temporary file in FILE's directory, which
//   is then renamed over FILE, so a crash leaves the old file or the new
//   one, never half of one.
// - At most once a second: changed() only marks the model; a timer writes
//   at most a second after the previous write, so a burst of lines costs
//   one write, and the last change of a burst is always written.
// - A script that did not change is not written again.
// - The script is made on the event loop, where the model is: at 100,000
//   subscribers that takes about 0.7 s, during which requests wait in the
//   socket buffers, hence the limit of one a second.
// - The file is made with mode 0600, as the save command's script holds
//   the passwords.
// - A failed write is reported on standard error and tried again at the
//   next change.
//
// Owned by the Gateway; dying writes a change still pending. Libre's thread only.
#pragma once

#include <string>

#include "ScriptSession.h"
#include "sip/Libre.h"

class Autosave {
 public:
  static constexpr uint64_t kIntervalMs = 1000;

  Autosave(ScriptSession& session, std::string file);
  ~Autosave();
  Autosave(Autosave const&) = delete;
  Autosave& operator=(Autosave const&) = delete;

  void changed();

 private:
  void write();
  static void onTimer(void* autosave);

  ScriptSession& m_session;
  std::string m_file;
  std::string m_written;
  bool m_pending = false;
  uint64_t m_lastWriteMs = 0;
  tmr m_timer;
};
