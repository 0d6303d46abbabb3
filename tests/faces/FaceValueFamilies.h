// Shared pieces of the face tests: the value-family suite (a setter, a config
// getter, an effective getter and a remover over one key; each face
// instantiates FaceValueFamilyTest with its own table, the tests live in
// FaceValueFamilyTest.cpp) and the readers that turn values, dumps and log
// lines into text. NONE stands for a getter that failed.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "DumpRows.h"
#include "LS_AddressText.h"
#include "LS_COutbound.h"

inline std::string const NONE = "<none>";
unsigned short const NO_PORT = CHostPort::ms_uUSE_SIP_DEFAULT_DONT_OUTPUT_PORT;

template <class T>
std::string valueText(T const& value) {
  return std::to_string(static_cast<unsigned long long>(value));
}
inline std::string valueText(String const& text) {
  return text.str();
}
inline std::string valueText(CHostPort const& hostPort) {
  return LS_hostPortToString(hostPort).str();
}
inline std::string valueText(LS_ForcedDestination const& destination) {
  return std::string(LS_ForcedDestination::NAME(destination.type)) + " " +
         valueText(destination.udpTcpAddress);
}

// Both shapes of getter: returning the value, or returning XCode.
template <class Face, class T>
std::string readText(Face const& face, T (Face::*getter)() const) {
  return valueText((face.*getter)());
}
template <class Face, class T>
std::string readText(Face const& face, XCode (Face::*getter)(T&) const) {
  T value{};
  return (face.*getter)(value).isSuccess() ? valueText(value) : NONE;
}

// A server and its TLS counterpart as "server tls".
template <class Face>
std::string pairText(Face const& face, XCode (Face::*getter)(CHostPort&, CHostPort&) const) {
  CHostPort server;
  CHostPort tls;
  return (face.*getter)(server, tls).isSuccess() ? valueText(server) + " " + valueText(tls) : NONE;
}

// Level 1 with room to spare: the rows of the settings go in at level 2.
inline DumpRows dumpOf(LS_COutbound const& face,
                       String const& prefix = String(),
                       unsigned int maxLevel = 9,
                       unsigned int maxDetail = 5) {
  InfoContainer info;
  face.getInfo(info, maxLevel, 1, maxDetail, 2, prefix);
  return dumpRows(info);
}

// The face as its log lines print it.
inline void const* logAddressOf(LS_COutbound* face) {
  return static_cast<void const*>(static_cast<LS_IElement*>(face));
}

// Log lines without those of the element model underneath the face.
inline std::vector<std::string> faceLines(std::vector<std::string> const& lines) {
  std::vector<std::string> kept;
  for (std::string const& line : lines) {
    if (line.rfind("LS_CData(", 0) != 0 && line.rfind("LS_CElement(", 0) != 0)
      kept.push_back(line);
  }
  return kept;
}

struct FaceValueFamily {
  std::string name;
  std::string key;          // the element key of the value
  std::string defaultText;  // effective value when nothing is set anywhere
  std::string firstText;
  std::string secondText;
  std::function<RefPtr<LS_CContainer>()> make;
  std::function<void(LS_CContainer&, bool second)> set;
  std::function<std::string(LS_CContainer const&)> configured;
  std::function<std::string(LS_CContainer const&)> effective;
  std::function<void(LS_CContainer&)> remove;
};

// The table of one face class: Face declares the operations, Made is the
// concrete class the rows make.
template <class Face, class Made = Face>
class FaceValueFamilies {
 public:
  template <class T, class SetArg, class Effective>
  FaceValueFamilies& add(std::string name,
                         std::string key,
                         T first,
                         T second,
                         void (Face::*set)(SetArg),
                         XCode (Face::*configured)(T&) const,
                         Effective effective,
                         std::string defaultText,
                         void (Face::*remove)()) {
    auto const as = [](LS_CContainer const& face) -> Face const& { return static_cast<Face const&>(face); };
    m_rows.push_back(
        FaceValueFamily{name, key, defaultText, valueText(first), valueText(second),
                        [] { return RefPtr<LS_CContainer>(adoptRef(new Made)); },
                        [=](LS_CContainer& face, bool useSecond) {
                          (static_cast<Face&>(face).*set)(useSecond ? second : first);
                        },
                        [=](LS_CContainer const& face) { return readText(as(face), configured); },
                        [=](LS_CContainer const& face) { return readText(as(face), effective); },
                        [=](LS_CContainer& face) { (static_cast<Face&>(face).*remove)(); }});
    return *this;
  }

  std::vector<FaceValueFamily> rows() const { return m_rows; }

 private:
  std::vector<FaceValueFamily> m_rows;
};

// A row for a family named the usual way (setConfigX, getConfigX, getX,
// removeConfigX) on the face class Face of the calling scope.
#define FACE_VALUE_FAMILY(X, key, first, second, defaultText)                                       \
  add(#X, key, first, second, &Face::setConfig##X, &Face::getConfig##X, &Face::get##X, defaultText, \
      &Face::removeConfig##X)

template <class Row>
std::string rowName(::testing::TestParamInfo<Row> const& info) {
  return info.param.name;
}

// A face and a base face of the same class, as an identity's face and its
// base identity's face.
class FaceValueFamilyTest : public ::testing::TestWithParam<FaceValueFamily> {
 protected:
  FaceValueFamilyTest() { face->setBase(base.get()); }
  FaceValueFamily const& family() const { return GetParam(); }
  // The configured and the effective value.
  std::vector<std::string> seen() const { return {family().configured(*face), family().effective(*face)}; }

  RefPtr<LS_CContainer> base = GetParam().make();
  RefPtr<LS_CContainer> face = GetParam().make();
};
