// IDriver: what every driver of the driver framework answers: its driver
// identifier, its name, and the repository it is registered in. Finding a
// driver by name belongs to IDriverRepository; the common implementation
// to CDriver.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "String.h"
#include "UUID.h"

class IDriverRepository;

class LS_EXPORT IDriver : public IUnknown {
 public:
  static UUID const& IID();

  virtual UUID const& getDID() const = 0;
  virtual String const& getDriverName() const = 0;
  // The repository the driver is registered in, or null. Borrowed: the
  // repository owns its drivers, not the other way round.
  virtual IDriverRepository* getDriverRepository() const = 0;
  virtual void setDriverRepository(IDriverRepository* repository) = 0;

  // Builds the name a driver is registered under. A pure function of its
  // arguments, and distinct arguments give distinct names: the fields are
  // joined by "/" in argument order, numbers in decimal, and in each text
  // "%" is written "%25" and "/" is written "%2F", so a text cannot run
  // into the next field. From ("master", 0, 0, 0xFFFFFFFF, "", "", "", "")
  // it builds "master/0/0/4294967295////". out is replaced.
  static void BUILD_DRIVER_NAME(String& out,
                                String const& base,
                                unsigned int number1,
                                unsigned int number2,
                                unsigned int number3,
                                String const& text1,
                                String const& text2,
                                String const& text3,
                                String const& text4);

 protected:
  ~IDriver() = default;
};
