#include "registrar/BindingReplay.h"

#include <algorithm>
#include <chrono>
#include <iomanip>
#include <iostream>

#include "LS_IMasterLocationService.h"
#include "LS_IdentityType.h"

bool BindingReplay::restore(BindingStore& store, std::string& error) {
  auto const start = std::chrono::steady_clock::now();
  std::vector<StoredBinding> loaded;
  if (!store.load(loaded, error))
    return false;
  size_t restored = 0;
  size_t unknown = 0;
  bool const shared = store.shared();
  for (auto const& entry : grouped(loaded)) {
    if (replace(entry.first, entry.second)) {
      restored += entry.second.size();
      continue;
    }
    unknown += entry.second.size();
    if (shared)
      continue;
    for (StoredBinding const& binding : entry.second)
      store.record(StoreChange::Kind::REMOVED, binding);
  }
  std::chrono::duration<double> const took = std::chrono::steady_clock::now() - start;
  std::cerr << "location-gateway: " << restored << (restored == 1 ? " binding" : " bindings")
            << " restored from the store in " << std::fixed << std::setprecision(2) << took.count() << " s"
            << std::endl;
  if (unknown && !shared)
    std::cerr << "location-gateway: " << unknown << (unknown == 1 ? " stored binding" : " stored bindings")
              << " of identities no longer configured deleted" << std::endl;
  if (unknown && shared)
    std::cerr << "location-gateway: " << unknown << (unknown == 1 ? " stored binding" : " stored bindings")
              << " of identities not configured here ignored; the store is shared, so they stay for the "
                 "gateways that have them"
              << std::endl;
  m_registrar.setStore(&store);
  store.start([this](BindingStore::Update const& update) { apply(update); });
  return true;
}

void BindingReplay::apply(BindingStore::Update const& update) {
  if (!update.everything) {
    replace(update.identity, update.bindings);
    return;
  }
  Grouped const wanted = grouped(update.bindings);
  for (auto const& entry : wanted)
    if (!update.untouched.count(entry.first))
      replace(entry.first, entry.second);
  for (BindingStore::IdentityName const& name : m_registrar.boundIdentities())
    if (!wanted.count(name) && !update.untouched.count(name))
      replace(name, {});
}

bool BindingReplay::replace(BindingStore::IdentityName const& name,
                            std::vector<StoredBinding> const& bindings) {
  bool const dynamic = std::any_of(bindings.begin(), bindings.end(),
                                   [](StoredBinding const& binding) { return binding.dynamic; });
  bool created = false;
  RefPtr<LS_IIdentity> const identity = identityFor(name, dynamic, created);
  return identity && m_registrar.replace(identity, created, bindings);
}

RefPtr<LS_IIdentity> BindingReplay::identityFor(BindingStore::IdentityName const& name,
                                                bool dynamic,
                                                bool& created) {
  return m_clock.measure([&] {
    RefPtr<LS_ILocationService> service;
    String const serviceName(name.first.c_str());
    String const identityName(name.second.c_str());
    adoptInterface(service, [&](UUID const& iid, void** raw) {
      return m_session.locationMaster()->getLocationServiceIf(serviceName, iid, raw);
    });
    if (!service)
      return RefPtr<LS_IIdentity>();
    RefPtr<LS_IIdentity> identity;
    LS_getIdentityIf(service.get(), identityName, identity);
    if (!identity && dynamic) {
      adoptInterface(identity, [&](UUID const& iid, void** raw) {
        return service->createDynamicIdentityIf(identityName, iid, raw);
      });
      created = identity != nullptr;
    }
    // A group never holds bindings of its own (the registrar refuses it).
    if (identity && identity->getIdentityType() == LS_IdentityType::IDENTITY_GROUP)
      return RefPtr<LS_IIdentity>();
    return identity;
  });
}

BindingReplay::Grouped BindingReplay::grouped(std::vector<StoredBinding> const& bindings) {
  Grouped result;
  for (StoredBinding const& binding : bindings)
    result[BindingStore::IdentityName(binding.service, binding.identity)].push_back(binding);
  return result;
}
