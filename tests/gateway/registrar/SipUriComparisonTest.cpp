#include "registrar/SipUriComparison.h"

#include <gtest/gtest.h>

namespace {

struct Case {
  char const* a;
  char const* b;
  bool equal;
};

class SipUriComparisonTest : public testing::TestWithParam<Case> {};

TEST_P(SipUriComparisonTest, ComparesAsRfc3261Section19_1_4) {
  Case const& c = GetParam();
  pl a;
  pl b;
  pl_set_str(&a, c.a);
  pl_set_str(&b, c.b);
  EXPECT_EQ(SipUriComparison::equal(a, b), c.equal) << c.a << " vs " << c.b;
  EXPECT_EQ(SipUriComparison::equal(b, a), c.equal) << c.b << " vs " << c.a;
}

// The section's own examples first, then the rules they leave implicit.
INSTANTIATE_TEST_SUITE_P(
    Rfc3261,
    SipUriComparisonTest,
    testing::Values(Case{"sip:%61lice@atlanta.com;transport=TCP", "sip:alice@AtLanTa.CoM;Transport=tcp",
                         true},
                    Case{"sip:carol@chicago.com", "sip:carol@chicago.com;newparam=5", true},
                    Case{"sip:carol@chicago.com;security=on", "sip:carol@chicago.com;newparam=5", true},
                    Case{"sip:biloxi.com;transport=tcp;method=REGISTER?to=sip:bob%40biloxi.com",
                         "sip:biloxi.com;method=REGISTER;transport=tcp?to=sip:bob%40biloxi.com", true},
                    Case{"sip:alice@atlanta.com?subject=project%20x&priority=urgent",
                         "sip:alice@atlanta.com?priority=urgent&subject=project%20x", true},
                    Case{"SIP:ALICE@AtLanTa.CoM;Transport=udp", "sip:alice@AtLanTa.CoM;Transport=UDP", false},
                    Case{"sip:bob@biloxi.com", "sip:bob@biloxi.com:5060", false},
                    Case{"sip:bob@biloxi.com", "sip:bob@biloxi.com;transport=udp", true},
                    Case{"sip:bob@biloxi.com", "sip:bob@biloxi.com:6000;transport=tcp", false},
                    Case{"sip:carol@chicago.com", "sip:carol@chicago.com?Subject=next%20meeting", false},
                    Case{"sip:bob@phone21.boxesbybob.com", "sip:bob@192.0.2.4", false},
                    Case{"sip:carol@chicago.com;security=on", "sip:carol@chicago.com;security=off", false},
                    Case{"sip:alice@atlanta.com", "sips:alice@atlanta.com", false},
                    Case{"sip:alice@atlanta.com", "sip:alice@atlanta.com;maddr=239.255.255.1", false},
                    Case{"sip:alice@atlanta.com", "sip:alice@atlanta.com;user=phone", false},
                    Case{"sip:alice@192.168.1.10:5062", "sip:alice@192.168.1.10:5062", true},
                    Case{"sip:alice:secret@atlanta.com", "sip:alice:SECRET@atlanta.com", false},
                    Case{"tel:+15551234", "tel:+15551234", false}));

}  // namespace
