#include "LS_CCallInbound.h"
#include "LS_CCallOutbound.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "FaceValueFamilies.h"
#include "support/LogCapture.h"

namespace {

DumpRows operator+(DumpRows rows, DumpRows const& more) {
  rows.insert(rows.end(), more.begin(), more.end());
  return rows;
}

// What tells the two call faces apart: their base face, their texts, and one
// setting of their base face with the dump rows it gives at level 1.
template <class Face>
struct CallFaceTraits;

template <>
struct CallFaceTraits<LS_CCallInbound> {
  using Base = LS_CInbound;
  static constexpr char const* NAME = "LS_CCallInbound";
  static constexpr char const* HEADING = "Inbound Call";
  static void configureBaseFace(LS_CCallInbound& face) {
    face.insertConfigFilterRule(0, LS_FilterType::ACCEPT, IpAddress());
  }
  static DumpRows baseFaceRows() { return {"1|Filter|", "2|accept any|"}; }
};

template <>
struct CallFaceTraits<LS_CCallOutbound> {
  using Base = LS_COutbound;
  static constexpr char const* NAME = "LS_CCallOutbound";
  static constexpr char const* HEADING = "Outbound Call";
  static void configureBaseFace(LS_CCallOutbound& face) { face.setConfigNonInviteTransactionTimeout(0); }
  static DumpRows baseFaceRows() { return {"1|Invite transaction timeout|32"}; }
};

// The profiles of one call face, as value families: an empty text is a value
// of its own that hides the inherited one.
template <class Made>
std::vector<FaceValueFamily> profileFamilies() {
  using Face = LS_CCallFace<Made, typename CallFaceTraits<Made>::Base>;
  return FaceValueFamilies<Face, Made>()
      .FACE_VALUE_FAMILY(VoipProfile, "voip-profile", String("voip%s"), String(), "")
      .FACE_VALUE_FAMILY(ToneSetProfile, "tone-set-profile", String("tones"), String(), "")
      .FACE_VALUE_FAMILY(SipProfile, "sip-profile", String("sip"), String(), "")
      .rows();
}

INSTANTIATE_TEST_SUITE_P(CallInbound,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(profileFamilies<LS_CCallInbound>()),
                         rowName<FaceValueFamily>);
INSTANTIATE_TEST_SUITE_P(CallOutbound,
                         FaceValueFamilyTest,
                         ::testing::ValuesIn(profileFamilies<LS_CCallOutbound>()),
                         rowName<FaceValueFamily>);

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

TYPED_TEST(CallFaceTest, SettersRemoversAndLifetimeWriteTheirLinesAndGettersNone) {
  char const* const name = TestFixture::Traits::NAME;
  LogCapture log;
  RefPtr<TypeParam> made = adoptRef(new TypeParam);
  void const* const self = static_cast<LS_IElement*>(made.get());
  std::vector<std::string> expected{formatted("%s(%p)::%s()\n", name, self, name)};
  for (FaceValueFamily const& family : profileFamilies<TypeParam>()) {
    family.set(*made, false);
    family.configured(*made);
    family.effective(*made);
    family.remove(*made);
    expected.push_back(
        formatted("%s(%p)::setConfig%s(%s)\n", name, self, family.name.c_str(), family.firstText.c_str()));
    expected.push_back(formatted("%s(%p)::removeConfig%s()\n", name, self, family.name.c_str()));
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
