// IInfo: the interface through which an object writes its diagnostic dump.
// The lines and their rendering belong to InfoContainer.
#pragma once

#include "Export.h"

#include "IUnknown.h"
#include "InfoContainer.h"
#include "String.h"
#include "UUID.h"

class LS_EXPORT IInfo : public IUnknown {
 public:
  static UUID const& IID();

  // Appends the object's lines to info and returns info. A line of depth n
  // below the object's heading goes in at level + n, and only when
  // level + n <= maxLevel and detail <= maxDetail; prefix is written in
  // front of the heading key. Nested objects are dumped at level + 1.
  virtual InfoContainer& getInfo(InfoContainer& info,
                                 unsigned int maxLevel,
                                 unsigned int level,
                                 unsigned int maxDetail,
                                 unsigned int detail,
                                 String const& prefix) const = 0;

 protected:
  ~IInfo() = default;
};
