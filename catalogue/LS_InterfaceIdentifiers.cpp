#include "LS_InterfaceIdentifiers.h"

#include "LS_MethodTable.h"

// Defines the three identifier accessors of Interface, each naming its
// constant: the interface by its own name, proxy and stub by the names the
// remote-call layer registered them under.
#define LS_DEFINE_INTERFACE_IDENTIFIERS(Interface, iid, proxy, proxyName, stub, stubName) \
  UUID const& Interface##Identifiers::IID() {                                             \
    static UUID const id(iid, #Interface);                                                \
    return id;                                                                            \
  }                                                                                       \
  UUID const& Interface##Identifiers::CID_PROXY() {                                       \
    static UUID const id(proxy, proxyName);                                               \
    return id;                                                                            \
  }                                                                                       \
  UUID const& Interface##Identifiers::CID_STUB() {                                        \
    static UUID const id(stub, stubName);                                                 \
    return id;                                                                            \
  }

// Defines Interface's MID::NAME over the rows that follow.
#define LS_DEFINE_METHOD_NAMES(Interface, ...)                      \
  char const* Interface##Identifiers::MID::NAME(Type id) {          \
    static LS_MethodName const kRows[] = {__VA_ARGS__};             \
    return LS_findMethodName(kRows, static_cast<unsigned int>(id)); \
  }

LS_DEFINE_INTERFACE_IDENTIFIERS(LS_IElement,
                                "192df9cc-169c-4a4e-9476-0f540f99c22c",
                                "f177d737-9a67-4936-8046-0278f27fc5b5",
                                "LS_CElementProxy",
                                "dcd21598-b973-4223-b90c-99a801395ac0",
                                "LS_CElementStub")
LS_DEFINE_METHOD_NAMES(LS_IElement,
                       {100, "addElementObserver"},
                       {101, "removeElementObserver"},
                       {102, "notifyChange"},
                       {103, "notifyDestroying"},
                       {200, "getBase"},
                       {201, "setBase"},
                       {300, "reset"},
                       {400, "create"},
                       {500, "setDynamic"},
                       {501, "isDynamic"})
