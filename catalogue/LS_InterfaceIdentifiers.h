// The published identity of every interface of the system: its interface
// identifier, the class identifiers of its remote-call proxy and stub, and
// its method-identifier table.
//
// Each interface class derives from its record here (LS_IElement from
// LS_IElementIdentifiers, ...), so callers write LS_IElement::IID() and
// LS_IElement::MID::NAME(...). Every accessor returns a function-local
// constant made on first use (thread-safe) and never destroyed, so every
// call returns the same object. The operations of the interfaces live with
// the classes that implement them, not here.
#pragma once

#include <cstdint>

#include "UUID.h"

#define LS_INTERFACE_IDENTIFIER_ACCESSORS \
  static UUID const& IID();               \
  static UUID const& CID_PROXY();         \
  static UUID const& CID_STUB()

struct LS_IElementIdentifiers {
  LS_INTERFACE_IDENTIFIER_ACCESSORS;
  struct MID {
    enum Type : uint32_t {
      addElementObserver = 100,
      removeElementObserver = 101,
      notifyChange = 102,
      notifyDestroying = 103,
      getBase = 200,
      setBase = 201,
      reset = 300,
      create = 400,
      setDynamic = 500,
      isDynamic = 501,
    };
    static char const* NAME(Type id);
  };
};
