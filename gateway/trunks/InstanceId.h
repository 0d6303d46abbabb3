// InstanceId: the gateway's instance URN, the +sip.instance of the Contact
// its trunks register with flows (RFC 5626 section 4.1), kept in a file so
// that it stays the same across restarts, as RFC 5626 asks: a registrar
// then replaces the bindings the gateway made before it restarted instead
// of keeping them beside the new ones until they expire.
//
// Decisions, with their reasons:
// - One URN for the gateway, not one per trunk: the instance names the user
//   agent, and a registrar keys the bindings by address of record, instance
//   and reg-id, so trunks registering at the same registrar do not collide.
// - A UUID (RFC 4122 version 4, urn:uuid form) drawn at random the first
//   time and written beside the store (Gateway decides the file): two
//   gateways sharing a PostgreSQL store are two user agents and each keeps
//   its own file; deriving it from the host name or an address would give
//   two gateways on one machine the same instance.
#pragma once

#include <string>

namespace InstanceId {

// The URN in path, made and written there (mode 0600) when there is no
// file yet; false with the reason in error when it can be neither read nor
// made, or the file holds no urn:uuid.
bool load(std::string const& path, std::string& urn, std::string& error);

}  // namespace InstanceId
