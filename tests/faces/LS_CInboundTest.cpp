#include "LS_CInbound.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "DumpRows.h"
#include "support/ElementRecorders.h"

namespace {

// The inbound face leaves create() to the concrete faces.
class TestInbound : public LS_CInbound {
 public:
  XCode create(RefPtr<LS_IElement>& element) override { return LS_makeElement<TestInbound>(element); }
};

IpAddress address(char const* text, char const* netMask = "") {
  IpAddress result;
  EXPECT_TRUE(result.set(text, netMask)) << text << " " << netMask;
  return result;
}

using Rules = std::vector<std::string>;

// The face's own rules (config) or the rules in effect, as "deny 10.0.0.0/255.0.0.0".
Rules rules(LS_CInbound const& face, bool config) {
  Rules listed;
  unsigned int const count = config ? face.getNumberOfConfigFilterRules() : face.getNumberOfFilterRules();
  for (unsigned int index = 0; index < count; ++index) {
    LS_FilterType::Type type = LS_FilterType::ACCEPT;
    IpAddress rule;
    EXPECT_TRUE((config ? face.getConfigFilterRule(index, type, rule) : face.getFilterRule(index, type, rule))
                    .isSuccess());
    String ip;
    String mask;
    rule.getIpAddrAsString(ip);
    rule.getNetMaskAsString(mask);
    listed.push_back(std::string(LS_FilterType::NAME(type)) + " " + ip.str() + "/" + mask.str());
  }
  return listed;
}

// A face whose base is the same face of the base identity.
class InboundFaceTest : public ::testing::Test {
 protected:
  void SetUp() override { face->setBase(base.get()); }

  RefPtr<TestInbound> base = adoptRef(new TestInbound);
  RefPtr<TestInbound> face = adoptRef(new TestInbound);
  Journal journal;
};

TEST_F(InboundFaceTest, InheritedRulesApplyUntilTheFaceHasItsOwnAndAgainAfterItsLastIsRemoved) {
  InfoContainer info;
  EXPECT_TRUE(face->getInfo(info, 10, 0, 5, 0, "").isEmpty()) << "no rules anywhere, no dump rows";
  base->insertConfigFilterRule(0, LS_FilterType::DENY, address("10.0.0.0", "255.0.0.0"));
  EXPECT_EQ(rules(*face, true), Rules{});
  EXPECT_EQ(rules(*face, false), Rules{"deny 10.0.0.0/255.0.0.0"});

  ASSERT_TRUE(face->insertConfigFilterRule(5, LS_FilterType::ACCEPT, address("192.168.1.1")).isSuccess());
  EXPECT_EQ(rules(*face, true), Rules{"accept 192.168.1.1/255.255.255.255"});
  EXPECT_EQ(rules(*face, false), rules(*face, true)) << "the own list hides the inherited one";

  face->removeConfigFilterRule(0);
  EXPECT_FALSE(face->containsElement("filter", LS_Strategy::LOCAL_ONLY));
  EXPECT_EQ(rules(*face, false), Rules{"deny 10.0.0.0/255.0.0.0"});
}

// One edit of the face's own list [A, B, C] with N, and its outcome.
struct FilterEdit {
  char const* name;
  enum { INSERT, MODIFY, REMOVE } operation;
  unsigned int index;
  bool succeeds;
  Rules rules;
};

std::string const A = "accept 10.0.0.1/255.255.255.255";
std::string const B = "deny 10.0.0.2/255.255.255.255";
std::string const C = "accept 10.0.0.3/255.255.255.255";
std::string const N = "deny 192.168.0.0/255.255.0.0";

class FilterEditTest : public InboundFaceTest, public ::testing::WithParamInterface<FilterEdit> {};

TEST_P(FilterEditTest, FollowsTheIndexRulesAndAnnouncesOnlyRealChanges) {
  for (char const* host : {"10.0.0.1", "10.0.0.3"})
    face->insertConfigFilterRule(9, LS_FilterType::ACCEPT, address(host));
  face->insertConfigFilterRule(1, LS_FilterType::DENY, address("10.0.0.2"));
  ContainerWatch watch(face.get(), journal, "face");
  FilterEdit const& edit = GetParam();
  IpAddress const added = address("192.168.0.0", "255.255.0.0");

  bool succeeded = true;
  if (edit.operation == FilterEdit::INSERT)
    succeeded = face->insertConfigFilterRule(edit.index, LS_FilterType::DENY, added).isSuccess();
  if (edit.operation == FilterEdit::MODIFY)
    succeeded = face->modifyConfigFilterRule(edit.index, LS_FilterType::DENY, added).isSuccess();
  if (edit.operation == FilterEdit::REMOVE)
    face->removeConfigFilterRule(edit.index);

  EXPECT_EQ(succeeded, edit.succeeds);
  EXPECT_EQ(rules(*face, true), edit.rules);
  Journal const announced =
      edit.rules == Rules{A, B, C} ? Journal{} : Journal{"face:change:filter", "face:change"};
  EXPECT_EQ(journal, announced);
}

INSTANTIATE_TEST_SUITE_P(
    InboundFace,
    FilterEditTest,
    ::testing::Values(FilterEdit{"InsertAtFront", FilterEdit::INSERT, 0, true, {N, A, B, C}},
                      FilterEdit{"InsertInTheMiddle", FilterEdit::INSERT, 1, true, {A, N, B, C}},
                      FilterEdit{"InsertAtTheLength", FilterEdit::INSERT, 3, true, {A, B, C, N}},
                      FilterEdit{"InsertPastTheEndAppends", FilterEdit::INSERT, 9, true, {A, B, C, N}},
                      FilterEdit{"ModifyLast", FilterEdit::MODIFY, 2, true, {A, B, N}},
                      FilterEdit{"ModifyPastTheEndFails", FilterEdit::MODIFY, 3, false, {A, B, C}},
                      FilterEdit{"RemoveFirst", FilterEdit::REMOVE, 0, true, {B, C}},
                      FilterEdit{"RemoveLast", FilterEdit::REMOVE, 2, true, {A, B}},
                      FilterEdit{"RemovePastTheEndDoesNothing", FilterEdit::REMOVE, 3, true, {A, B, C}}),
    [](::testing::TestParamInfo<FilterEdit> const& info) { return std::string(info.param.name); });

}  // namespace
