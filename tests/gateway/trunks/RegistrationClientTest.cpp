#include "trunks/RegistrationClient.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct Case {
  char const* viaParameters;  // after the branch of "Via: SIP/2.0/UDP 10.0.0.2:5070"
  char const* seen;           // null when the answer tells nothing
};

// The address the answer's top Via tells, printed; null when it tells none.
void expectSeen(Case const& c) {
  std::string const text = std::string("SIP/2.0 200 OK\r\n") +
                           "Via: SIP/2.0/UDP 10.0.0.2:5070;branch=z9hG4bK1" + c.viaParameters + "\r\n" +
                           "Via: SIP/2.0/UDP 10.0.0.3:5060;branch=z9hG4bK2;received=198.51.100.1;rport=9\r\n"
                           "From: <sip:trunk@carrier.example>;tag=1\r\n"
                           "To: <sip:trunk@carrier.example>;tag=2\r\n"
                           "Call-ID: a\r\n"
                           "CSeq: 1 REGISTER\r\n"
                           "Content-Length: 0\r\n\r\n";
  mbuf* const buffer = mbuf_alloc(text.size());
  ASSERT_EQ(mbuf_write_str(buffer, text.c_str()), 0);
  buffer->pos = 0;
  sip_msg* answer = nullptr;
  ASSERT_EQ(sip_msg_decode(&answer, buffer), 0) << c.viaParameters;
  sa seen;
  bool const told = RegistrationClient::addressSeenBy(*answer, seen);
  if (c.seen) {
    char printed[64];
    re_snprintf(printed, sizeof printed, "%J", &seen);
    EXPECT_TRUE(told) << c.viaParameters;
    EXPECT_STREQ(printed, c.seen) << c.viaParameters;
  } else {
    EXPECT_FALSE(told) << c.viaParameters;
  }
  mem_deref(answer);
  mem_deref(buffer);
}

}  // namespace

TEST(AddressSeenByTest, ReadsReceivedAndRportOfTheTopVia) {
  Case const cases[] = {{";received=192.0.2.7;rport=4444", "192.0.2.7:4444"},
                        {";rport=4444;received=192.0.2.7", "192.0.2.7:4444"},
                        // A NAT that kept the port, or a registrar without rport.
                        {";rport;received=192.0.2.7", "192.0.2.7:5070"},
                        {";received=192.0.2.7", "192.0.2.7:5070"},
                        {";rport=4444", "10.0.0.2:4444"},
                        {";received=2001:db8::7;rport=4444", "[2001:db8::7]:4444"},
                        // Nothing learnt: the request's own empty rport, no
                        // parameter, a received that is no address.
                        {";rport", nullptr},
                        {"", nullptr},
                        {";received=nat.example;rport=4444", nullptr}};
  for (Case const& c : cases)
    expectSeen(c);
}
