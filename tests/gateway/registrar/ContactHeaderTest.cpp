#include "registrar/ContactHeader.h"

#include <gtest/gtest.h>

namespace {

struct Case {
  char const* value;
  bool valid;
  char const* parameters;
  unsigned int q;
  long long expires;  // -1 when absent
  char const* instance;
  char const* regId;
};

class ContactHeaderTest : public testing::TestWithParam<Case> {};

TEST_P(ContactHeaderTest, KeepsParametersButExpires) {
  Case const& c = GetParam();
  pl value;
  pl_set_str(&value, c.value);
  ContactHeader contact;
  ASSERT_EQ(ContactHeader::parse(value, contact), c.valid) << c.value;
  if (!c.valid)
    return;
  EXPECT_EQ(contact.uri, "sip:alice@192.0.2.1:5062;transport=udp");
  EXPECT_EQ(contact.parameters, c.parameters);
  EXPECT_EQ(contact.q, c.q);
  EXPECT_EQ(contact.hasExpires, c.expires >= 0);
  if (c.expires >= 0) {
    EXPECT_EQ(contact.expires, static_cast<uint64_t>(c.expires));
  }
  EXPECT_EQ(contact.instance, c.instance);
  EXPECT_EQ(contact.regId, c.regId);
}

INSTANTIATE_TEST_SUITE_P(
    Contacts,
    ContactHeaderTest,
    testing::Values(
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>", true, "", 1000, -1, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=0.25;expires=60;methods=\"INVITE,MESSAGE\"", true,
             ";q=0.25;methods=\"INVITE,MESSAGE\"", 250, 60, "", ""},
        Case{"\"Alice\" <sip:alice@192.0.2.1:5062;transport=udp>;+sip.instance=\"<urn:uuid:1234>\";reg-id=2;"
             "EXPIRES=99999999999",
             true, ";+sip.instance=\"<urn:uuid:1234>\";reg-id=2", 1000, 4294967295, "<urn:uuid:1234>", "2"},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=1.000;x", true, ";q=1.000;x", 1000, -1, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=0", true, ";q=0", 0, -1, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=1.5", false, "", 0, 0, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=0.1234", false, "", 0, 0, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;q=high", false, "", 0, 0, "", ""},
        Case{"<sip:alice@192.0.2.1:5062;transport=udp>;expires=soon", false, "", 0, 0, "", ""}));

}  // namespace
