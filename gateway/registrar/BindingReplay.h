// BindingReplay: the store's bindings put back into the library, through the
// registrar as a REGISTER would put them: at start every binding not yet
// expired with its remaining lifetime, and later, where gateways share the
// store, what the others changed.
//
// Decisions, with their reasons:
// - A stored binding names its identity by service and name; one of a user
//   that only the "DEFAULT" group answers is marked dynamic and its
//   identity is created again. A binding whose identity the configuration
//   no longer has (or whose service is gone, or that is now a group) is
//   counted in one log line at start, and deleted from the store only when
//   the store is this gateway's alone: only then did this configuration own
//   it, and nothing could ever answer with it. On a store others share the
//   difference may be theirs or this gateway's, and this one cannot tell
//   which: the row is ignored, and runs out at its expiry unless a gateway
//   that has the identity refreshes it. Another gateway's binding for an
//   identity this one lacks is ignored likewise.
// - Restoring happens before the front-end listens, so the first request
//   already sees every binding.
//
// Owned by the Gateway beside the store and the registrar; everything on the
// loop.
#pragma once

#include <map>
#include <string>
#include <vector>

#include "LS_IIdentity.h"
#include "RefPtr.h"
#include "ScriptSession.h"
#include "registrar/Registrar.h"
#include "sip/LibraryClock.h"
#include "store/BindingStore.h"

class BindingReplay {
 public:
  BindingReplay(ScriptSession& session, Registrar& registrar, LibraryClock& clock)
      : m_session(session), m_registrar(registrar), m_clock(clock) {}
  BindingReplay(BindingReplay const&) = delete;
  BindingReplay& operator=(BindingReplay const&) = delete;

  // Loads the store into the registrar, then attaches the store to it and
  // starts the store with apply() as its update handler. False with error
  // when the store cannot be read.
  bool restore(BindingStore& store, std::string& error);

 private:
  using Grouped = std::map<BindingStore::IdentityName, std::vector<StoredBinding>>;

  void apply(BindingStore::Update const& update);
  // False when the identity cannot hold the bindings (see above).
  bool replace(BindingStore::IdentityName const& name, std::vector<StoredBinding> const& bindings);
  // The identity named, created when dynamic and absent (created set then).
  RefPtr<LS_IIdentity> identityFor(BindingStore::IdentityName const& name, bool dynamic, bool& created);
  static Grouped grouped(std::vector<StoredBinding> const& bindings);

  ScriptSession& m_session;
  Registrar& m_registrar;
  LibraryClock& m_clock;
};
