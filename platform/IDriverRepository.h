// IDriverRepository: finds a registered driver by its name and hands out
// one of its interfaces. Registering drivers belongs to the concrete
// repository (CDriverRepository); the process-wide repository is reached
// through SYSTEM::DRIVER_REPOSITORY().
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "String.h"
#include "UUID.h"
#include "XCode.h"

class LS_EXPORT IDriverRepository : public IUnknown {
 public:
  static UUID const& IID();

  // On success *out receives interface iid of the driver registered under
  // driverName, with a reference added; fails and stores null when no
  // driver has that name or the driver does not answer iid.
  virtual XCode getDriverIf(String const& driverName, UUID const& iid, void** out) = 0;

 protected:
  ~IDriverRepository() = default;
};
