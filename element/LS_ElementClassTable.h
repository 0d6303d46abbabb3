// LS_ElementClassTable: the classes that a container's creating helpers make
// by class identifier.
//
// The element layer cannot name the classes of the layers above it (faces,
// identity), so each of those classes supplies its own maker: a static
// LS_ElementClassRegistration in the class's source file adds it when the
// library is loaded. The table is filled before any thread can use the
// library and only read afterwards. Data values and append lists are made by
// their own helpers, not through this table.
#pragma once

#include "LS_IElement.h"
#include "RefPtr.h"
#include "UUID.h"
#include "XCode.h"

class LS_ElementClassTable {
 public:
  // Makes a new, empty element (count 1, adopted into element).
  using Maker = XCode (*)(RefPtr<LS_IElement>& element);

  // A later registration of the same class identifier replaces the maker.
  static void registerClass(UUID const& cid, Maker maker);
  // A new object of class cid; failure, and element null, for a class
  // identifier nobody supplied.
  static XCode create(UUID const& cid, RefPtr<LS_IElement>& element);
};

struct LS_ElementClassRegistration {
  LS_ElementClassRegistration(UUID const& cid, LS_ElementClassTable::Maker maker) {
    LS_ElementClassTable::registerClass(cid, maker);
  }
};

// The maker of an element class whose default constructor makes an empty
// instance: LS_makeElement<LS_CInbound...>.
template <class Class>
XCode LS_makeElement(RefPtr<LS_IElement>& element) {
  element = adoptRef(static_cast<LS_IElement*>(new Class));
  return XCode::success();
}
