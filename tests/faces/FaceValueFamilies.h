// A shared suite for the value families of the outbound faces: a setter, a
// config getter, an effective getter and a remover over one key. Each face
// instantiates FaceValueFamilyTest with its own table (the tests themselves
// live in LS_COutboundTest.cpp). Values are compared as text, NONE standing
// for a getter that failed.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <ostream>
#include <string>
#include <vector>

#include "LS_AddressText.h"
#include "LS_COutbound.h"

inline std::string const NONE = "<none>";

template <class T>
std::string valueText(T const& value) {
  return std::to_string(static_cast<unsigned long long>(value));
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

struct FaceValueFamily {
  std::string name;
  std::string key;          // the element key of the value
  std::string defaultText;  // effective value when nothing is set anywhere
  std::string firstText;
  std::string secondText;
  std::function<RefPtr<LS_COutbound>()> make;
  std::function<void(LS_COutbound&, bool second)> set;
  std::function<std::string(LS_COutbound const&)> configured;
  std::function<std::string(LS_COutbound const&)> effective;
  std::function<void(LS_COutbound&)> remove;
  std::vector<FaceValueFamily> const* siblings = nullptr;  // the face's whole table
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
    auto const as = [](LS_COutbound const& face) -> Face const& { return static_cast<Face const&>(face); };
    m_rows.push_back(FaceValueFamily{name, key, defaultText, valueText(first), valueText(second),
                                     [] { return RefPtr<LS_COutbound>(adoptRef(new Made)); },
                                     [=](LS_COutbound& face, bool useSecond) {
                                       (static_cast<Face&>(face).*set)(useSecond ? second : first);
                                     },
                                     [=](LS_COutbound const& face) { return readText(as(face), configured); },
                                     [=](LS_COutbound const& face) { return readText(as(face), effective); },
                                     [=](LS_COutbound& face) { (static_cast<Face&>(face).*remove)(); }});
    return *this;
  }

  std::vector<FaceValueFamily> const& rows() {
    for (FaceValueFamily& row : m_rows)
      row.siblings = &m_rows;
    return m_rows;
  }

 private:
  std::vector<FaceValueFamily> m_rows;
};

// Failure messages name the family instead of dumping its bytes.
inline void PrintTo(FaceValueFamily const& family, std::ostream* out) {
  *out << family.name;
}

inline std::string familyName(::testing::TestParamInfo<FaceValueFamily> const& info) {
  return info.param.name;
}

// A face and a base face of the same class, as an identity's face and its
// base identity's face.
class FaceValueFamilyTest : public ::testing::TestWithParam<FaceValueFamily> {
 protected:
  FaceValueFamilyTest() { face->setBase(base.get()); }
  FaceValueFamily const& family() const { return GetParam(); }

  RefPtr<LS_COutbound> base = GetParam().make();
  RefPtr<LS_COutbound> face = GetParam().make();
};
