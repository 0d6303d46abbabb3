// Registrar: REGISTER as a registrar answers it. The To URI names the
// identity; the library gives the realms to challenge with and the passwords
// to check a digest response against; accepted contacts are recorded on the
// identity's own inbound-registration face (a dynamic one is created when it
// has none), each with a timer that removes it when its time runs out.
//
// Decisions, with their reasons:
// - Expiry: the contact's "expires" parameter, else the Expires header,
//   else the face's default lifetime; above the face's maximum it is cut to
//   the maximum; a non-zero value below the minimum gets 423 with
//   Min-Expires, and then no contact of the request is applied.
// - The 200 lists the identity's own bindings in effect (the ones this
//   gateway holds for it), each with its remaining seconds.
// - The identity is told it is registered when its first binding comes and
//   unregistered when its last one goes (removed, expired or shut down).
// - At most kMaximumContacts per request (400 beyond) and kMaximumBindings
//   per identity (403 beyond), so that no phone can grow the gateway's
//   memory at will; the "DEFAULT" group answers every unknown user.
// - A digest response to a nonce this process did not make counts as no
//   credentials (a fresh 401), one to an expired nonce gets 401 with
//   stale=true; only a wrong password on a valid nonce gets 403.
// - A registration whose Call-ID differs from the binding's replaces it; CSeq
//   ordering is not checked (libre's transactions already drop duplicates).
//
// Owns the bindings' timers: destroying the registrar removes every binding
// from its face first, so that the global count of registered contacts
// comes back to where it started. Everything runs on libre's thread.
#pragma once

#include <map>
#include <memory>
#include <string>

#include "CNameAddr.h"
#include "LS_IIdentity.h"
#include "LS_IRegistrationInbound.h"
#include "Libre.h"
#include "LibraryClock.h"
#include "NonceGenerator.h"
#include "RefPtr.h"

class Exchange;

class Registrar {
 public:
  static constexpr size_t kMaximumBindings = 32;
  static constexpr size_t kMaximumContacts = 16;

  explicit Registrar(LibraryClock& clock) : m_clock(clock) {}
  ~Registrar();
  Registrar(Registrar const&) = delete;
  Registrar& operator=(Registrar const&) = delete;

  void handle(Exchange& exchange);

 private:
  struct Bindings;
  struct Binding {
    Registrar* registrar;
    Bindings* owner;
    CNameAddr contact;
    std::string callId;
    uint64_t expiresAtMs;
    tmr timer;
  };
  // One identity's bindings, by contact text.
  struct Bindings {
    RefPtr<LS_IIdentity> identity;
    RefPtr<LS_IRegistrationInbound> face;
    std::map<std::string, std::unique_ptr<Binding>> byContact;
  };
  // One Contact of a REGISTER, checked and with its expiry worked out.
  struct ContactRequest {
    CNameAddr contact;
    std::string key;
    uint32_t expires;
  };

  // Whether the request carries valid credentials; answers 401 or 403
  // itself when not.
  bool authenticated(Exchange& exchange, LS_IIdentity* identity, CNameAddr const& to);
  void add(Bindings& bindings, ContactRequest const& request, std::string const& callId, CHostPort const& received);
  // Leaves telling the identity to the caller.
  void removeAll(Bindings& bindings);
  // Removes one binding from its face and the table; tells the identity when
  // it was its last. Invalidates binding.
  void remove(Binding& binding);
  // Tells the identity when its first binding came or its last went.
  void reportTransition(Bindings& bindings, size_t before);
  static std::string bindingHeaders(Bindings const& bindings);
  static void onExpiry(void* binding);

  LibraryClock& m_clock;
  NonceGenerator m_nonces;
  std::map<LS_IIdentity*, Bindings> m_bindings;
};
