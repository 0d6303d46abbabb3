// StoredBinding: one registration binding as the binding store keeps it, and
// a change to the store. The fields are plain text and numbers, so that the
// record crosses to the store's writer thread without touching the library's
// objects, which belong to the event loop.
//
// The key of a binding is (service, identity, uri). The expiry is on the
// gateway's MonotonicClock: the store converts it to and from its own
// absolute clock at its boundary, so the registrar never sees wall-clock
// time and a gateway whose clock jumps keeps its bindings' lifetimes.
#pragma once

#include <cstdint>
#include <string>

struct StoredBinding {
  std::string service;   // the location service's name
  std::string identity;  // the identity's name in it
  std::string uri;       // the contact's URI: the binding's key in the identity
  // The Contact value as received with its parameters (q, +sip.instance,
  // reg-id), so that what a redirect returns survives a restart.
  std::string contact;
  std::string callId;
  uint32_t cseq = 0;
  std::string source;     // "ADDR:PORT" the REGISTER came from
  std::string transport;  // "udp", "tcp" or "tls"
  uint64_t expiresAtMs = 0;
  // The identity was created for the binding: a user that only the
  // "DEFAULT" group answers. Restoring the binding creates it again.
  bool dynamic = false;
};

// One change for the store to write. A removal needs only the key.
struct StoreChange {
  enum class Kind : uint8_t {
    ADDED,      // a binding the store did not have
    REFRESHED,  // a binding the store has, with a new expiry or Call-ID
    REMOVED,
    // Ran out here: removed only when the store's row has run out too, so
    // that a refresh another gateway wrote just before is not undone.
    EXPIRED,
  };
  bool removal() const { return kind == Kind::REMOVED || kind == Kind::EXPIRED; }
  Kind kind;
  StoredBinding binding;
};
