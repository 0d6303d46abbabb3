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

// One profile family: its method stem and its operations.
struct ProfileFamily {
  char const* stem;
  void (LS_ICallConfig::*set)(String const&);
  XCode (LS_ICallConfig::*getConfig)(String&) const;
  void (LS_ICallConfig::*remove)();
  String (LS_ICall::*get)() const;
};

ProfileFamily const FAMILIES[] = {
    {"VoipProfile", &LS_ICallConfig::setConfigVoipProfile, &LS_ICallConfig::getConfigVoipProfile,
     &LS_ICallConfig::removeConfigVoipProfile, &LS_ICall::getVoipProfile},
    {"ToneSetProfile", &LS_ICallConfig::setConfigToneSetProfile, &LS_ICallConfig::getConfigToneSetProfile,
     &LS_ICallConfig::removeConfigToneSetProfile, &LS_ICall::getToneSetProfile},
    {"SipProfile", &LS_ICallConfig::setConfigSipProfile, &LS_ICallConfig::getConfigSipProfile,
     &LS_ICallConfig::removeConfigSipProfile, &LS_ICall::getSipProfile},
};

// The family's operations on a face, through its two interfaces.
struct Profile {
  LS_ICallConfig& config;
  LS_ICall& call;
  ProfileFamily const& family;

  void set(String const& text) { (config.*family.set)(text); }
  void remove() { (config.*family.remove)(); }
  // The config getter's text, or "<none>" when it fails.
  std::string configured() const {
    String text = "<none>";
    return (config.*family.getConfig)(text).isSuccess() ? text.str() : "<none>";
  }
  std::string effective() const { return (call.*family.get)().str(); }
};

// A face whose base is the same face of the base identity.
template <class Face>
class CallFaceTest : public ::testing::Test {
 protected:
  using Traits = CallFaceTraits<Face>;

  void SetUp() override { face->setBase(base.get()); }

  static Profile profile(Face& target, ProfileFamily const& family) { return {target, target, family}; }
  DumpRows dump(String const& prefix) const {
    InfoContainer info;
    face->getInfo(info, 10, 0, 1, 1, prefix);
    return dumpRows(info);
  }

  RefPtr<Face> base = adoptRef(new Face);
  RefPtr<Face> face = adoptRef(new Face);
};

using CallFaces = ::testing::Types<LS_CCallInbound, LS_CCallOutbound>;
TYPED_TEST_SUITE(CallFaceTest, CallFaces);

TYPED_TEST(CallFaceTest, EachProfileIsInheritedUntilSetOnTheFaceAndEmptyWhenSetNowhere) {
  for (ProfileFamily const& family : FAMILIES) {
    SCOPED_TRACE(family.stem);
    Profile own = this->profile(*this->face, family);
    Profile inherited = this->profile(*this->base, family);
    inherited.set("inherited");
    EXPECT_EQ(own.configured(), "<none>");
    EXPECT_EQ(own.effective(), "inherited");

    own.set("own");
    EXPECT_EQ(own.configured(), "own");
    EXPECT_EQ(own.effective(), "own");

    own.remove();
    EXPECT_EQ(own.effective(), "inherited");
    inherited.remove();
    EXPECT_EQ(own.effective(), "");
  }
}

TYPED_TEST(CallFaceTest, AnEmptyProfileIsStoredAndHidesTheInheritedOneAndItsDumpRow) {
  TestFixture::Traits::configureBaseFace(*this->base);
  for (ProfileFamily const& family : FAMILIES) {
    SCOPED_TRACE(family.stem);
    this->profile(*this->base, family).set("inherited");
    Profile own = this->profile(*this->face, family);
    own.set("");

    EXPECT_EQ(own.configured(), "");
    EXPECT_EQ(own.effective(), "");
  }
  DumpRows const expected = DumpRows{std::string("0|") + TestFixture::Traits::HEADING + "|"};
  EXPECT_EQ(this->dump(""), expected + TestFixture::Traits::baseFaceRows());
}

TYPED_TEST(CallFaceTest, DumpShowsPrefixedHeadingThenTheBaseFaceRowsThenTheProfilesInEffect) {
  TestFixture::Traits::configureBaseFace(*this->base);
  this->base->setConfigSipProfile("sip-inherited");
  this->face->setConfigVoipProfile("voip-own");
  this->face->setConfigToneSetProfile("tones-own");

  DumpRows expected{std::string("0|* ") + TestFixture::Traits::HEADING + "|"};
  expected =
      expected + TestFixture::Traits::baseFaceRows() +
      DumpRows{"1|VoIP Profile|voip-own", "1|Tone-Set Profile|tones-own", "1|SIP Profile|sip-inherited"};
  EXPECT_EQ(this->dump("* "), expected);
}

TYPED_TEST(CallFaceTest, AChangedProfileReachesObserversAsOneChangeOfItsKey) {
  Journal journal;
  this->face->setConfigToneSetProfile("first");
  ContainerWatch watch(this->face.get(), journal, "face");

  this->face->setConfigToneSetProfile("second");
  this->face->setConfigToneSetProfile("second");

  EXPECT_EQ(journal, (Journal{"face:change:tone-set-profile", "face:change"}));
}

TYPED_TEST(CallFaceTest, SettersRemoversAndLifetimeWriteTheirLinesAndGettersNone) {
  char const* const name = TestFixture::Traits::NAME;
  LogCapture log;
  RefPtr<TypeParam> made = adoptRef(new TypeParam);
  void const* const self = static_cast<LS_IElement*>(made.get());
  std::vector<std::string> expected{formatted("%s(%p)::%s()\n", name, self, name)};
  for (ProfileFamily const& family : FAMILIES) {
    Profile profile = this->profile(*made, family);
    profile.set("p");
    profile.configured();
    profile.effective();
    profile.remove();
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
