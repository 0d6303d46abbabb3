// ResolutionExplainer: tells, step by step, how the identity of a name-addr
// is found: the user and host it splits into, each location service
// considered in each of the three passes with its exact or partial domain
// match, and whether the identity answers by its name, an alias name, an
// alias range, an alias expression or as the "DEFAULT" group. It retraces
// the lookup through the public interfaces only, the way a gateway engineer
// would by hand, and ends with the library's own answer, so that a
// difference between the two would show.
#pragma once

#include <ostream>

#include "CNameAddr.h"
#include "ScriptSession.h"

class ResolutionExplainer {
 public:
  ResolutionExplainer(ScriptSession& session, std::ostream& out) : m_session(session), m_out(out) {}

  // The identity found, or null.
  RefPtr<LS_IIdentity> explain(CNameAddr const& nameAddr);

 private:
  // The identity of user in service, by the lookup's three steps.
  RefPtr<LS_IIdentity> identityIn(LS_ILocationService* service, String const& user);
  // How identity answers user through its aliases.
  static std::string aliasMatch(LS_IIdentity* identity, String const& user);
  RefPtr<LS_ILocationService> serviceNamed(String const& name);

  ScriptSession& m_session;
  std::ostream& m_out;
};
