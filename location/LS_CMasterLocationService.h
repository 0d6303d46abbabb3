// LS_CMasterLocationService: the root of the location-service model and the
// driver through which the rest of the gateway finds it. The driver host
// constructs it and registers it in the driver repository; it never
// registers itself. It keeps the registry of location services by the name
// each was created with, creates and removes them, and tells its observers.
//
// Ownership: counted. The master holds one reference to each of its
// location services. Each identity holds its location service back, so the
// master cuts those links whenever it lets a service go: on
// removeLocationService, before it announces the removal, and when the
// master itself is destroyed, silently. Without the second cut the last
// release of the master would leave every service that still has
// identities alive, held by its own identities.
//
// Re-entrancy: an observer may drop the last outside reference to the
// master while it is being told; the master holds itself across its
// broadcasts. Threading: no lock (the driver is made with a null lock); the
// host serialises configuration against lookups.
// Finding the service responsible for a host belongs to the lookups.
#pragma once

#include "Export.h"

#include "CDriver.h"
#include "CInherit.h"
#include "IInfo.h"
#include "LS_ILocationService.h"
#include "LS_IMasterLocationService.h"
#include "LS_IMasterLocationServiceSubject.h"
#include "ObserverContainer.h"
#include "StringHashTable.h"

class LS_EXPORT LS_CMasterLocationService : public CInherit<LS_CMasterLocationService,
                                                  CDriver,
                                                  LS_IMasterLocationService,
                                                  LS_IMasterLocationServiceSubject,
                                                  IInfo> {
 public:
  // Identified by DID_MasterLocationService() and named by
  // IDriver::BUILD_DRIVER_NAME from "master-location-service", 0, 0,
  // 0xFFFFFFFF and four empty texts, the name the lookups build too.
  LS_CMasterLocationService();
  ~LS_CMasterLocationService() override;

  // LS_IMasterLocationService
  XCode getLocationServiceIf(String const& name, UUID const& iid, void** out) override;
  XCode createLocationServiceIf(String const& name, UUID const& iid, void** out) override;
  void removeLocationService(String const& name) override;
  void getLocationServices(Vector<String>& names) const override;

  // LS_IMasterLocationServiceSubject
  void addMasterLocationServiceObserver(LS_IMasterLocationServiceObserver* observer,
                                        unsigned int priority) override;
  void removeMasterLocationServiceObserver(LS_IMasterLocationServiceObserver* observer) override;

  // IInfo: the heading (prefix, then "Location-Services"), then one line
  // per location service with its own name, or "(none)". The services'
  // own dumps are not included.
  InfoContainer& getInfo(InfoContainer& info,
                         unsigned int maxLevel,
                         unsigned int level,
                         unsigned int maxDetail,
                         unsigned int detail,
                         String const& prefix) const override;

 private:
  // Cuts the link of every identity back to the service, removed ones
  // included, for good.
  static void detachIdentities(RefPtr<LS_ILocationService> const& service);
  void notifyLocationServiceAdded(LS_ILocationService* service);
  void notifyLocationServiceRemoved(LS_ILocationService* service);

  ObserverContainer<LS_IMasterLocationService, LS_IMasterLocationServiceObserver> m_observers;
  StringHashTable<RefPtr<LS_ILocationService>> m_locationServices{32};
};
