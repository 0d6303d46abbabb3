// LS_Interface<Identifiers>: the root of every interface of the system, an
// IUnknown that carries the interface's published identifiers, so that
// LS_IElement::IID() names the interface itself rather than IUnknown.
#pragma once

#include "IUnknown.h"

template <class Identifiers>
class LS_Interface : public IUnknown, public Identifiers {
 public:
  using Identifiers::IID;

 protected:
  ~LS_Interface() = default;
};
