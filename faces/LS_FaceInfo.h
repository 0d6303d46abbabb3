// What the faces share in their diagnostic dumps: the rule that decides
// whether a row goes in, and the text a dump shows for a configured
// host-port. Which rows a face shows, and in what order, belongs to the face.
#pragma once

#include "CHostPort.h"
#include "InfoContainer.h"
#include "LS_AddressText.h"
#include "String.h"

// The rows of one getInfo call: a row at some level goes in only when that
// level is within maxLevel and the call's detail within maxDetail, so a dump
// cut at a level leaves out everything deeper, headings included.
class LS_FaceInfo {
 public:
  LS_FaceInfo(InfoContainer& info, unsigned int maxLevel, unsigned int maxDetail, unsigned int detail)
      : m_info(info), m_maxLevel(maxLevel), m_maxDetail(maxDetail), m_detail(detail) {}

  bool accepts(unsigned int level) const { return level <= m_maxLevel && m_detail <= m_maxDetail; }
  void add(unsigned int level, String const& key, String const& value) const {
    if (accepts(level))
      m_info.add(level, m_detail, key, value);
  }
  // A configured server and its TLS counterpart: the server's row, then the
  // TLS row only when the TLS port is one to be shown.
  void addServer(unsigned int level,
                 String const& key,
                 CHostPort const& server,
                 String const& tlsKey,
                 CHostPort const& tlsServer) const;

 private:
  InfoContainer& m_info;
  unsigned int m_maxLevel;
  unsigned int m_maxDetail;
  unsigned int m_detail;
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
