#include "ResolutionExplainer.h"

#include "CString.h"
#include "LS_AddressText.h"
#include "LS_IdentityResolution.h"
#include "RegEx.h"
#include "ScriptLine.h"

namespace {

bool isIdentityOfType(LS_IIdentity* identity, LS_IdentityType::Type type) {
  return identity && identity->getIdentityType() == type;
}

std::string quoted(String const& text) {
  return quotedWord(text.str());
}

}  // namespace

RefPtr<LS_ILocationService> ResolutionExplainer::serviceNamed(String const& name) {
  RefPtr<LS_ILocationService> service;
  LS_getLocationServiceIf(m_session.locationMaster(), name, service);
  if (!service)
    m_out << "    " << quoted(name) << ": no such location service, skipped\n";
  return service;
}

std::string ResolutionExplainer::aliasMatch(LS_IIdentity* identity, String const& user) {
  if (identity->getName() == user)
    return "its name " + quoted(user);
  String text;
  String to;
  for (unsigned int i = 0; i < identity->getNumberOfAliasNames(); ++i)
    if (identity->getAliasName(i, text).isSuccess() && text == user)
      return "alias name " + quoted(text);
  for (unsigned int i = 0; i < identity->getNumberOfAliasRanges(); ++i)
    if (identity->getAliasRange(i, text, to).isSuccess() && text <= user && user <= to)
      return "alias range " + quoted(text) + " to " + quoted(to);
  for (unsigned int i = 0; i < identity->getNumberOfAliasExpressions(); ++i) {
    if (identity->getAliasExpression(i, text).isFailure())
      continue;
    RefPtr<RegEx::Pattern> const pattern = RegEx::COMPILE_EXPRESSION(text);
    if (pattern && pattern->match(user, 0).isSuccess())
      return "alias expression " + quoted(text);
  }
  return "its aliases";
}

RefPtr<LS_IIdentity> ResolutionExplainer::identityIn(LS_ILocationService* service, String const& user) {
  std::string const where = "      in " + service->getName().str() + ": ";
  RefPtr<LS_IIdentity> identity;
  LS_getIdentityIf(service, user, identity);
  if (isIdentityOfType(identity.get(), LS_IdentityType::IDENTITY)) {
    m_out << where << "identity " << quoted(user) << " by name\n";
    return identity;
  }
  if (identity)
    m_out << where << quoted(user) << " is an identity group, which never answers by name\n";
  Vector<String> names;
  service->getIdentities(names);
  for (String const& name : names) {
    RefPtr<LS_IIdentity> candidate;
    if (LS_getIdentityIf(service, name, candidate).isFailure() || !candidate->isResponsible(user) ||
        !isIdentityOfType(candidate.get(), LS_IdentityType::IDENTITY))
      continue;
    m_out << where << "identity " << quoted(name) << " by " << aliasMatch(candidate.get(), user) << "\n";
    return candidate;
  }
  if (m_session.stack().useDefault) {
    RefPtr<LS_IIdentity> group;
    LS_getIdentityIf(service, "DEFAULT", group);
    if (isIdentityOfType(group.get(), LS_IdentityType::IDENTITY_GROUP)) {
      m_out << where << "no identity by name or alias; the \"DEFAULT\" group answers\n";
      return group;
    }
  }
  m_out << where << "no identity by name or alias"
        << (m_session.stack().useDefault ? " and no \"DEFAULT\" group\n" : " (\"DEFAULT\" not used)\n");
  return nullptr;
}

RefPtr<LS_IIdentity> ResolutionExplainer::explain(CNameAddr const& nameAddr) {
  ScriptSession::StackSettings const& stack = m_session.stack();
  String error;
  String user;
  CHostPort host;
  if (LS_splitNameAddr(error, user, host, nameAddr).isFailure()) {
    m_out << "  cannot split the name-addr" << (error.isEmpty() ? std::string() : ": " + error.str()) << "\n";
    return nullptr;
  }
  m_out << "  user " << quoted(user) << ", host " << quoted(hostPortStr(host)) << "\n";
  if (host.GetHost().equalsIgnoringCase(CString("local-host"))) {
    if (stack.localHostPorts.isEmpty()) {
      m_out << "  host \"local-host\" and the gateway has no own host-ports: NO LOCAL DOMAINS\n";
      return nullptr;
    }
    host = stack.localHostPorts[0];
    m_out << "  \"local-host\" stands for the first own host-port, " << quoted(hostPortStr(host)) << "\n";
  }
  Vector<String> names = stack.services;
  if (names.isEmpty())
    m_session.locationMaster()->getLocationServices(names);

  m_out << "  pass 1: the location service responsible for the host (imperative "
        << LS_Imperative::NAME(stack.imperative) << ")\n";
  RefPtr<LS_ILocationService> chosen;
  RefPtr<LS_ILocationService> partial;
  for (String const& name : names) {
    RefPtr<LS_ILocationService> const service = serviceNamed(name);
    if (!service)
      continue;
    bool exact = false;
    bool const responsible = service->isResponsible(host, Vector<CHostPort>(), stack.imperative, exact);
    m_out << "    " << name.str() << ": "
          << (!responsible ? "not responsible" : exact ? "exact domain match" : "partial domain match") << "\n";
    if (responsible && exact) {
      chosen = service;
      break;
    }
    if (responsible)
      partial = service;
  }
  if (chosen || partial) {
    m_out << "    " << (chosen ? chosen : partial)->getName().str()
          << (chosen ? " decides alone (exact match)\n" : " decides alone (the last partial match)\n");
    return identityIn((chosen ? chosen : partial).get(), user);
  }

  m_out << "  pass 2: location services that match any domain\n";
  bool anyDefaultDomain = false;
  for (String const& name : names) {
    RefPtr<LS_ILocationService> const service = serviceNamed(name);
    if (!service || !service->getDefaultDomain())
      continue;
    anyDefaultDomain = true;
    m_out << "    " << name.str() << ": matches any domain\n";
    if (RefPtr<LS_IIdentity> found = identityIn(service.get(), user))
      return found;
  }
  if (!anyDefaultDomain)
    m_out << "    none\n";

  bool isOwnHost = false;
  for (CHostPort const& own : stack.localHostPorts)
    isOwnHost = isOwnHost || own.GetHost().equalsIgnoringCase(host.GetHost());
  if (!isOwnHost) {
    m_out << "  pass 3 skipped: " << quoted(host.GetHost().c_str()) << " is none of the gateway's own hosts\n";
    return nullptr;
  }
  m_out << "  pass 3: the host is the gateway's own; every location service\n";
  for (String const& name : names) {
    RefPtr<LS_ILocationService> const service = serviceNamed(name);
    if (!service)
      continue;
    if (RefPtr<LS_IIdentity> found = identityIn(service.get(), user))
      return found;
  }
  return nullptr;
}
