#include "LS_CCallInbound.h"
#include "LS_CCallOutbound.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "DumpRows.h"
#include "support/ElementRecorders.h"
#include "support/LogCapture.h"

namespace {

DumpRows operator+(DumpRows rows, DumpRows const& more) {
  rows.insert(rows.end(), more.begin(), more.end());
  return rows;
}

// What tells the two call faces apart: their texts, and one setting of their
// base face with the dump rows it gives at level 1.
template <class Face>
struct CallFaceTraits;

template <>
struct CallFaceTraits<LS_CCallInbound> {
  static constexpr char const* NAME = "LS_CCallInbound";
  static constexpr char const* HEADING = "Inbound Call";
  static void configureBaseFace(LS_CCallInbound& face) {
    face.insertConfigFilterRule(0, LS_FilterType::ACCEPT, IpAddress());
  }
  static DumpRows baseFaceRows() { return {"1|Filter|", "2|accept any|"}; }
};

template <>
struct CallFaceTraits<LS_CCallOutbound> {
  static constexpr char const* NAME = "LS_CCallOutbound";
  static constexpr char const* HEADING = "Outbound Call";
  static void configureBaseFace(LS_CCallOutbound& face) { face.setConfigNonInviteTransactionTimeout(0); }
  static DumpRows baseFaceRows() { return {"1|Invite transaction timeout|32"}; }
};

// One profile family: its method stem, its element key and its operations.
struct ProfileFamily {
  char const* stem;
  char const* key;
  void (LS_ICallConfig::*set)(String const&);
  XCode (LS_ICallConfig::*getConfig)(String&) const;
  void (LS_ICallConfig::*remove)();
  String (LS_ICall::*get)() const;
};

using Config = LS_ICallConfig;
ProfileFamily const FAMILIES[] = {
    {"VoipProfile", "voip-profile", &Config::setConfigVoipProfile, &Config::getConfigVoipProfile,
     &Config::removeConfigVoipProfile, &LS_ICall::getVoipProfile},
    {"ToneSetProfile", "tone-set-profile", &Config::setConfigToneSetProfile, &Config::getConfigToneSetProfile,
     &Config::removeConfigToneSetProfile, &LS_ICall::getToneSetProfile},
    {"SipProfile", "sip-profile", &Config::setConfigSipProfile, &Config::getConfigSipProfile,
     &Config::removeConfigSipProfile, &LS_ICall::getSipProfile},
};

// The family on a face as "configured|effective", the configured text being
// "<none>" when the config getter fails.
template <class Face>
std::string profileState(Face const& face, ProfileFamily const& family) {
  String text;
  std::string const configured = (face.*family.getConfig)(text).isSuccess() ? text.str() : "<none>";
  return configured + "|" + (face.*family.get)().str();
}

// A face whose base is the same face of the base identity.
template <class Face>
class CallFaceTest : public ::testing::Test {
 protected:
  using Traits = CallFaceTraits<Face>;

  void SetUp() override { face->setBase(base.get()); }

  DumpRows dump() const {
    InfoContainer info;
    face->getInfo(info, 10, 0, 1, 1, "* ");
    return dumpRows(info);
  }

  RefPtr<Face> base = adoptRef(new Face);
  RefPtr<Face> face = adoptRef(new Face);
};

using CallFaces = ::testing::Types<LS_CCallInbound, LS_CCallOutbound>;
TYPED_TEST_SUITE(CallFaceTest, CallFaces);

TYPED_TEST(CallFaceTest, EachProfileIsInheritedUntilSetOnTheFaceEvenToAnEmptyText) {
  TypeParam& own = *this->face;
  TypeParam& inherited = *this->base;
  for (ProfileFamily const& family : FAMILIES) {
    SCOPED_TRACE(family.stem);
    (inherited.*family.set)("inherited");
    EXPECT_EQ(profileState(own, family), "<none>|inherited");
    (own.*family.set)("own");
    EXPECT_EQ(profileState(own, family), "own|own");
    (own.*family.set)("");
    EXPECT_EQ(profileState(own, family), "|");
    (own.*family.remove)();
    EXPECT_EQ(profileState(own, family), "<none>|inherited");
    (inherited.*family.remove)();
    EXPECT_EQ(profileState(own, family), "<none>|");
  }
}

TYPED_TEST(CallFaceTest, DumpShowsPrefixedHeadingThenTheBaseFaceRowsThenTheNonEmptyProfilesInEffect) {
  using Traits = typename TestFixture::Traits;
  Traits::configureBaseFace(*this->base);
  this->base->setConfigSipProfile("sip-inherited");
  this->face->setConfigVoipProfile("voip%s-own");
  this->face->setConfigToneSetProfile("tones-own");
  DumpRows const head = DumpRows{std::string("0|* ") + Traits::HEADING + "|"} + Traits::baseFaceRows();

  EXPECT_EQ(this->dump(), head + DumpRows({"1|VoIP Profile|voip%s-own", "1|Tone-Set Profile|tones-own",
                                           "1|SIP Profile|sip-inherited"}));
  this->face->setConfigSipProfile("");
  this->face->removeConfigVoipProfile();
  EXPECT_EQ(this->dump(), head + DumpRows{"1|Tone-Set Profile|tones-own"});
}

TYPED_TEST(CallFaceTest, ChangingAProfileIsAnnouncedAsOneChangeOfItsKey) {
  TypeParam& face = *this->face;
  for (ProfileFamily const& family : FAMILIES) {
    (face.*family.set)("first");
    Journal journal;
    ContainerWatch watch(&face, journal, "face");

    (face.*family.set)("second");
    (face.*family.set)("second");

    EXPECT_EQ(journal, (Journal{std::string("face:change:") + family.key, "face:change"}));
  }
}

TYPED_TEST(CallFaceTest, SettersRemoversAndLifetimeWriteTheirLinesAndGettersNone) {
  char const* const name = TestFixture::Traits::NAME;
  LogCapture log;
  RefPtr<TypeParam> made = adoptRef(new TypeParam);
  TypeParam& face = *made;
  void const* const self = static_cast<LS_IElement*>(made.get());
  std::vector<std::string> expected{formatted("%s(%p)::%s()\n", name, self, name)};
  for (ProfileFamily const& family : FAMILIES) {
    (face.*family.set)("p");
    profileState(face, family);
    (face.*family.remove)();
    expected.push_back(formatted("%s(%p)::setConfig%s(p)\n", name, self, family.stem));
    expected.push_back(formatted("%s(%p)::removeConfig%s()\n", name, self, family.stem));
  }
  made = nullptr;
  expected.push_back(formatted("%s(%p)::~%s()\n", name, self, name));

  std::vector<std::string> ownLines;
  for (std::string const& line : log.lines()) {
    if (line.rfind(std::string(name) + "(", 0) == 0)
      ownLines.push_back(line);
  }
  EXPECT_EQ(ownLines, expected);
}

}  // namespace
