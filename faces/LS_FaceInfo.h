// What the faces share in their diagnostic dumps: the rows of servers, and
// the text a dump shows for a configured host-port. Which rows a face shows,
// and in what order, belongs to the face.
#pragma once

#include "CHostPort.h"
#include "InfoContainer.h"
#include "LS_AddressText.h"
#include "LS_InfoRows.h"
#include "String.h"

// The rows of one face's getInfo call, with the row that faces with servers
// share.
class LS_FaceInfo : public LS_InfoRows {
 public:
  using LS_InfoRows::LS_InfoRows;

  // A configured server and its TLS counterpart: the server's row, then the
  // TLS row only when the TLS port is one to be shown.
  void addServer(unsigned int level,
                 String const& key,
                 CHostPort const& server,
                 String const& tlsKey,
                 CHostPort const& tlsServer) const;
};

// The host alone when the port is the stack's do-not-output marker, else
// hostPortStr. The two tests coincide while the marker is 0, but the dumps
// are written against the marker.
inline String LS_faceHostPortText(CHostPort const& hostPort) {
  if (hostPort.GetPort() == CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT)
    return String(hostPort.GetHost().c_str(), hostPort.GetHost().length());
  return hostPortStr(hostPort);
}

inline void LS_FaceInfo::addServer(unsigned int level,
                                   String const& key,
                                   CHostPort const& server,
                                   String const& tlsKey,
                                   CHostPort const& tlsServer) const {
  add(level, key, LS_faceHostPortText(server));
  if (tlsServer.GetPort() != CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT)
    add(level, tlsKey, hostPortStr(tlsServer));
}
