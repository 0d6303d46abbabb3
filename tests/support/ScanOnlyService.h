// ScanOnlyService: the run-time view of a real location service without its
// alias index, so that the lookups find no LS_CLocationService behind it and
// ask every identity in turn; and the comparison of a service's answer with
// that reference, which the alias index's differential test and the
// configuration fuzzer make.
#pragma once

#include <utility>

#include "CInherit.h"
#include "LS_ILocationService.h"
#include "LS_IdentityResolution.h"

class ScanOnlyService : public CInherit<ScanOnlyService, CObject, LS_ILocationService> {
 public:
  explicit ScanOnlyService(RefPtr<LS_ILocationService> target) : m_target(std::move(target)) {}

  String getName() const override { return m_target->getName(); }
  LS_Imperative::Type getImperative() const override { return m_target->getImperative(); }
  bool isResponsible(CHostPort const& hostPort,
                     Vector<CHostPort> const& localHostPorts,
                     LS_Imperative::Type imperative,
                     bool& exact) const override {
    return m_target->isResponsible(hostPort, localHostPorts, imperative, exact);
  }
  unsigned int getNumberOfDomains() const override { return m_target->getNumberOfDomains(); }
  CHostPort getDomain(unsigned int index) const override { return m_target->getDomain(index); }
  bool getDefaultDomain() const override { return m_target->getDefaultDomain(); }
  XCode getIdentityIf(String const& name, UUID const& iid, void** out) override {
    return m_target->getIdentityIf(name, iid, out);
  }
  XCode createDynamicIdentityIf(String const& name, UUID const& iid, void** out) override {
    return m_target->createDynamicIdentityIf(name, iid, out);
  }
  void removeDynamicIdentity(String const& name) override { m_target->removeDynamicIdentity(name); }
  void getIdentities(Vector<String>& names) const override { m_target->getIdentities(names); }

 private:
  RefPtr<LS_ILocationService> const m_target;
};

// True when service answers user as asking each of its identities in turn
// does: the same identity, or none from both. The two answers are handed out.
inline bool answersAsTheScan(RefPtr<LS_ILocationService> const& service,
                             String const& user,
                             bool useDefault,
                             RefPtr<LS_IIdentity>& fromIndex,
                             RefPtr<LS_IIdentity>& fromScan) {
  RefPtr<LS_ILocationService> const scanned = adoptRef(new ScanOnlyService(service));
  bool const foundIndexed = LS_getIdentityOrAliasIf(service, user, useDefault, fromIndex).isSuccess();
  bool const foundScanned = LS_getIdentityOrAliasIf(scanned, user, useDefault, fromScan).isSuccess();
  return foundIndexed == foundScanned && fromIndex.get() == fromScan.get();
}
