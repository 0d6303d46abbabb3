#include "CNameAddr.h"

#include <gtest/gtest.h>

#include <string>

namespace {

std::string serialized(CNameAddr const& nameAddr) {
  CBlob blob;
  nameAddr.Serialize(blob);
  return std::string(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize());
}

CNameAddr parsed(std::string const& text) {
  CNameAddr nameAddr;
  EXPECT_TRUE(nameAddr.Parse(text.data(), text.size())) << text;
  return nameAddr;
}

// One row per input. user and host describe a SIP or SIPS URI, number and
// phoneContext a TEL URI (phoneContext null when absent).
struct NameAddrCase {
  std::string text;
  bool valid;
  unsigned int kind;
  char const* display;
  char const* user;
  char const* host;
  unsigned short port;
  char const* number;
  char const* phoneContext;
};

void PrintTo(NameAddrCase const& c, std::ostream* os) {
  *os << '"' << c.text << '"';
}

NameAddrCase sip(std::string text,
                 char const* display,
                 char const* user,
                 char const* host,
                 unsigned short port) {
  return {std::move(text), true, CNameAddr::URI_SIP, display, user, host, port, "", nullptr};
}

NameAddrCase sips(std::string text, char const* user, char const* host, unsigned short port) {
  return {std::move(text), true, CNameAddr::URI_SIPS, "", user, host, port, "", nullptr};
}

NameAddrCase tel(std::string text, char const* number, char const* phoneContext) {
  return {std::move(text), true, CNameAddr::URI_TEL, "", "", "", 0, number, phoneContext};
}

NameAddrCase other(std::string text) {
  return {std::move(text), true, CNameAddr::URI_OTHER, "", "", "", 0, "", nullptr};
}

NameAddrCase invalid(std::string text) {
  return {std::move(text), false, CNameAddr::URI_NONE, "", "", "", 0, "", nullptr};
}

class CNameAddrParse : public ::testing::TestWithParam<NameAddrCase> {};

TEST_P(CNameAddrParse, GivesKindAndPartsOrFailsWithoutUri) {
  NameAddrCase const& c = GetParam();
  CNameAddr nameAddr = parsed("<sip:previous@host>");
  EXPECT_EQ(c.valid, nameAddr.Parse(c.text.data(), c.text.size()));
  EXPECT_EQ(c.kind, nameAddr.GetUriKind());
  EXPECT_EQ(CString(c.display), nameAddr.GetDisplayName());

  CSipUri const* sipUri = nameAddr.GetSipUri();
  ASSERT_EQ(c.kind == CNameAddr::URI_SIP || c.kind == CNameAddr::URI_SIPS, sipUri != nullptr);
  if (sipUri) {
    EXPECT_EQ(CString(c.user), sipUri->GetUser());
    EXPECT_EQ(CHostPort(CString(c.host), c.port), sipUri->GetHostPort());
  }
  CTelUri const* telUri = nameAddr.GetTelUri();
  ASSERT_EQ(c.kind == CNameAddr::URI_TEL, telUri != nullptr);
  if (telUri) {
    EXPECT_EQ(CString(c.number), telUri->GetNumber());
    ASSERT_EQ(c.phoneContext != nullptr, telUri->GetPhoneContext() != nullptr);
    if (c.phoneContext) {
      EXPECT_EQ(CString(c.phoneContext), *telUri->GetPhoneContext());
    }
  }
}

INSTANTIATE_TEST_SUITE_P(
    Sip,
    CNameAddrParse,
    ::testing::Values(
        sip("sip:alice@example.com", "", "alice", "example.com", 0),
        sip("<sip:alice@example.com:5060>", "", "alice", "example.com", 5060),
        sip("  <sip:alice@example.com>\t", "", "alice", "example.com", 0),
        sip("\"Alice A.\" <sip:alice@h>", "Alice A.", "alice", "h", 0),
        sip("\"Alice\"<sip:alice@h>", "Alice", "alice", "h", 0),
        sip("\"Say \\\"hi\\\" \\\\o/\" <sip:a@h>", "Say \"hi\" \\o/", "a", "h", 0),
        sip("\"\" <sip:a@h>", "", "a", "h", 0),
        sip("Alice  Smith <sip:a@h>", "Alice  Smith", "a", "h", 0),
        sip("J\xc3\xbcrgen <sip:j@h>", "J\xc3\xbcrgen", "j", "h", 0),
        sip("SIP:bob@h", "", "bob", "h", 0),
        sip("sip:example.com", "", "", "example.com", 0),
        sip("sip:alice:secret@h:5070", "", "alice", "h", 5070),
        sip("sip:+4930123;phone-context=example.com@gw.example.com;user=phone",
            "",
            "+4930123;phone-context=example.com",
            "gw.example.com",
            0),
        sip("sip:%61lice@h", "", "%61lice", "h", 0),
        sip("sip:a%20b@h", "", "a%20b", "h", 0),
        sip("sip:alice@[2001:db8::1]:5061;transport=tls?subject=hi&x=", "", "alice", "[2001:db8::1]", 5061),
        sip("<sip:[::1]>", "", "", "[::1]", 0),
        sip("sip:a@h;lr", "", "a", "h", 0),
        sips("sips:alice@secure.example.com:5061", "alice", "secure.example.com", 5061),
        sips("<SiPs:alice@h>", "alice", "h", 0)));

INSTANTIATE_TEST_SUITE_P(Tel,
                         CNameAddrParse,
                         ::testing::Values(tel("tel:+49-30-1234", "+49-30-1234", nullptr),
                                           tel("<tel:1234;phone-context=example.com>", "1234", "example.com"),
                                           tel("TEL:*31#;Phone-Context=+4930", "*31#", "+4930"),
                                           tel("tel:(030)1234;ext=5", "(030)1234", nullptr)));

INSTANTIATE_TEST_SUITE_P(OtherSchemes,
                         CNameAddrParse,
                         ::testing::Values(other("mailto:alice@example.com"),
                                           other("<http://example.com/a?b=c#d>"),
                                           other("urn:service:sos")));

INSTANTIATE_TEST_SUITE_P(Malformed,
                         CNameAddrParse,
                         ::testing::Values(invalid(""),
                                           invalid("   "),
                                           invalid("<>"),
                                           invalid("<sip:a@h"),
                                           invalid("sip:a@h>"),
                                           invalid("<sip:a@h>>"),
                                           invalid("<sip:a@h>;tag=1"),
                                           invalid("\"Alice <sip:a@h>"),
                                           invalid("\"Alice\" sip:a@h"),
                                           invalid("\"Alice\\"),
                                           invalid("Al\"ice <sip:a@h>"),
                                           invalid("Alice, Bob <sip:a@h>"),
                                           invalid("alice@example.com"),
                                           invalid(":alice@h"),
                                           invalid("1sip:a@h"),
                                           invalid("sip:"),
                                           invalid("sip:@h"),
                                           invalid("sip:a@"),
                                           invalid("sip:a@b@h"),
                                           invalid("sip:a b@h"),
                                           invalid("sip:%6@h"),
                                           invalid("sip:%zz@h"),
                                           invalid("sip:a@h:99999"),
                                           invalid("sip:a@[::1"),
                                           invalid("sip:a@[zz::1]"),
                                           invalid("sip:a@h;=x"),
                                           invalid("sip:a@h;x="),
                                           invalid("sip:a@h?novalue"),
                                           invalid("sip:a@h\r\n"),
                                           invalid(std::string("sip:a@h\0x", 9)),
                                           invalid(std::string("\"A\0\" <sip:a@h>", 14)),
                                           invalid("tel:"),
                                           invalid("tel:+"),
                                           invalid("tel:+49a"),
                                           invalid("tel:12 34"),
                                           invalid("tel:1234;phone-context="),
                                           invalid("tel:1234;phone-context"),
                                           invalid("tel:1234;phone-context=a;phone-context=b"),
                                           invalid("mailto:"),
                                           invalid("mailto:a b"),
                                           invalid("<mailto:<a>>")));

TEST(CNameAddr, ParsesA64KiBUserOrFailsCleanly) {
  std::string const valid = "sip:" + std::string(64 * 1024, 'u') + "@h";
  CNameAddr nameAddr;
  ASSERT_TRUE(nameAddr.Parse(valid.data(), valid.size()));
  EXPECT_EQ(64u * 1024u, nameAddr.GetSipUri()->GetUser().length());
  std::string const unbalanced(64 * 1024, '<');
  EXPECT_FALSE(nameAddr.Parse(unbalanced.data(), unbalanced.size()));
  EXPECT_EQ(nullptr, nameAddr.GetSipUri());
}

TEST(CNameAddr, NullTextFails) {
  CNameAddr nameAddr = parsed("sip:a@h");
  EXPECT_FALSE(nameAddr.Parse(nullptr, 3));
  EXPECT_EQ(CNameAddr::URI_NONE, nameAddr.GetUriKind());
}

struct SerializeCase {
  std::string text;
  std::string expected;
};

void PrintTo(SerializeCase const& c, std::ostream* os) {
  *os << '"' << c.text << '"';
}

class CNameAddrSerialize : public ::testing::TestWithParam<SerializeCase> {};

TEST_P(CNameAddrSerialize, WritesDisplayNameAndUriAsParsed) {
  EXPECT_EQ(GetParam().expected, serialized(parsed(GetParam().text)));
}

INSTANTIATE_TEST_SUITE_P(Table,
                         CNameAddrSerialize,
                         ::testing::Values(SerializeCase{"sip:a@h", "<sip:a@h>"},
                                           SerializeCase{" <SIP:a@h:5060;lr> ", "<SIP:a@h:5060;lr>"},
                                           SerializeCase{"Alice <sip:a@h>", "\"Alice\" <sip:a@h>"},
                                           SerializeCase{"\"Say \\\"hi\\\" \\\\\" <tel:1>",
                                                         "\"Say \\\"hi\\\" \\\\\" <tel:1>"},
                                           SerializeCase{"\"\" <mailto:a@h>", "<mailto:a@h>"}));

TEST(CNameAddr, SerializedTextParsesToAnEqualValueWithTheSameDisplayName) {
  CNameAddr const original = parsed("\"A \\\"B\\\"\" <sip:+49;phone-context=x@h:1>");
  CNameAddr const again = parsed(serialized(original));
  EXPECT_EQ(original, again);
  EXPECT_EQ(original.GetDisplayName(), again.GetDisplayName());
}

TEST(CNameAddr, SerializesNothingWithoutUri) {
  CBlob blob;
  CNameAddr().Serialize(blob);
  EXPECT_EQ(0u, blob.GetSize());
}

TEST(CNameAddr, SerializeAppendsToWhatTheBufferHolds) {
  CBlob blob;
  unsigned char const prefix[] = {'X'};
  blob.Insert(0, prefix, 1);
  parsed("sip:a@h").Serialize(blob);
  EXPECT_EQ("X<sip:a@h>", std::string(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize()));
}

TEST(CNameAddr, EqualityIgnoresTheDisplayName) {
  EXPECT_EQ(parsed("\"Alice\" <sip:a@h>"), parsed("sip:a@h"));
  EXPECT_EQ(CNameAddr(), CNameAddr());
}

TEST(CNameAddr, EqualityComparesTheUriAsWritten) {
  EXPECT_NE(parsed("sip:a@h"), parsed("sip:a@H"));
  EXPECT_NE(parsed("sip:a@h"), parsed("sips:a@h"));
  EXPECT_NE(parsed("sip:a@h"), parsed("sip:a@h;lr"));
  EXPECT_NE(parsed("sip:a@h"), CNameAddr());
}

TEST(CNameAddr, CopyAnswersFromItsOwnUriAfterTheOriginalIsGone) {
  CNameAddr copy;
  {
    CNameAddr const original = parsed("tel:1234;phone-context=example.com");
    copy = original;
  }
  ASSERT_NE(nullptr, copy.GetTelUri());
  ASSERT_NE(nullptr, copy.GetTelUri()->GetPhoneContext());
  EXPECT_EQ(CString("example.com"), *copy.GetTelUri()->GetPhoneContext());
}

TEST(CNameAddr, ParsesTextThatPointsIntoItself) {
  CNameAddr nameAddr = parsed("\"sip:x@h\" <sip:a@h>");
  CString const& display = nameAddr.GetDisplayName();
  EXPECT_TRUE(nameAddr.Parse(display.c_str(), display.length()));
  EXPECT_EQ(parsed("sip:x@h"), nameAddr);
}

}  // namespace
