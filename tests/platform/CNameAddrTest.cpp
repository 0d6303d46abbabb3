#include "CNameAddr.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>
#include <vector>

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

std::string text(CString const& s) {
  return std::string(s.c_str(), s.length());
}

// What a caller can read back: kind|display name|user|host|port for a SIP or SIPS URI,
// kind|display name|number[|phone context] for a TEL URI, kind|display name otherwise.
std::string parts(CNameAddr const& nameAddr) {
  static char const* const kKinds[] = {"none", "sip", "sips", "tel", "other"};
  std::string out = std::string(kKinds[nameAddr.GetUriKind()]) + "|" + text(nameAddr.GetDisplayName());
  if (CSipUri const* uri = nameAddr.GetSipUri()) {
    CHostPort const& hostPort = uri->GetHostPort();
    out += "|" + text(uri->GetUser()) + "|" + text(hostPort.GetHost()) + "|" +
           std::to_string(hostPort.GetPort());
  }
  if (CTelUri const* uri = nameAddr.GetTelUri()) {
    out += "|" + text(uri->GetNumber());
    if (uri->GetPhoneContext())
      out += "|" + text(*uri->GetPhoneContext());
  }
  return out;
}

using ParseCase = std::pair<std::string, std::string>;

class CNameAddrParse : public ::testing::TestWithParam<ParseCase> {};

TEST_P(CNameAddrParse, GivesKindAndParts) {
  CNameAddr nameAddr = parsed("\"previous\" <sip:previous@host>");
  ASSERT_TRUE(nameAddr.Parse(GetParam().first.data(), GetParam().first.size()));
  EXPECT_EQ(GetParam().second, parts(nameAddr));
}

INSTANTIATE_TEST_SUITE_P(
    Table,
    CNameAddrParse,
    ::testing::Values(ParseCase{"sip:alice@example.com", "sip||alice|example.com|0"},
                      ParseCase{"  <sip:alice@example.com:5060>\t", "sip||alice|example.com|5060"},
                      ParseCase{"\"Alice A.\" <sip:alice@h>", "sip|Alice A.|alice|h|0"},
                      ParseCase{"\"Alice\"<sip:alice@h>", "sip|Alice|alice|h|0"},
                      ParseCase{"\"Say \\\"hi\\\" \\\\o/\" <sip:a@h>", "sip|Say \"hi\" \\o/|a|h|0"},
                      ParseCase{"\"\" <sip:a@h>", "sip||a|h|0"},
                      ParseCase{"Alice  Smith <sip:a@h>", "sip|Alice  Smith|a|h|0"},
                      ParseCase{"J\xc3\xbcrgen <sip:j@h>", "sip|J\xc3\xbcrgen|j|h|0"},
                      ParseCase{"SIP:bob@h", "sip||bob|h|0"},
                      ParseCase{"sip:example.com", "sip|||example.com|0"},
                      ParseCase{"sip:alice:secret@h:5070", "sip||alice|h|5070"},
                      ParseCase{"sip:+49;phone-context=example.com@gw;user=phone",
                                "sip||+49;phone-context=example.com|gw|0"},
                      ParseCase{"sip:%61lice@h", "sip||%61lice|h|0"},
                      ParseCase{"sip:a%20b@h", "sip||a%20b|h|0"},
                      ParseCase{"sip:alice@[2001:db8::1]:5061;transport=tls?subject=hi&x=",
                                "sip||alice|[2001:db8::1]|5061"},
                      ParseCase{"<sip:[::1]>", "sip|||[::1]|0"},
                      ParseCase{"sips:alice@secure.example.com:5061", "sips||alice|secure.example.com|5061"},
                      ParseCase{"<SiPs:alice@h>", "sips||alice|h|0"},
                      ParseCase{"tel:+49-30-1234", "tel||+49-30-1234"},
                      ParseCase{"<tel:1234;phone-context=example.com>", "tel||1234|example.com"},
                      ParseCase{"TEL:*31#;Phone-Context=+4930", "tel||*31#|+4930"},
                      ParseCase{"tel:(030)1234;ext=5", "tel||(030)1234"},
                      ParseCase{"mailto:alice@example.com", "other|"},
                      ParseCase{"<http://example.com/a?b=c#d>", "other|"},
                      ParseCase{"urn:service:sos", "other|"}));

class CNameAddrMalformed : public ::testing::TestWithParam<std::string> {};

TEST_P(CNameAddrMalformed, FailsAndLeavesNoUri) {
  CNameAddr nameAddr = parsed("\"previous\" <sip:previous@host>");
  EXPECT_FALSE(nameAddr.Parse(GetParam().data(), GetParam().size()));
  EXPECT_EQ("none|", parts(nameAddr));
}

INSTANTIATE_TEST_SUITE_P(DisplayNameAndBrackets,
                         CNameAddrMalformed,
                         ::testing::ValuesIn(std::vector<std::string>(
                             {"", "   ", "<>", "<sip:a@h", "sip:a@h>", "<sip:a@h>>", "<sip:a@h>;tag=1",
                              "\"Alice <sip:a@h>", "\"Alice\" sip:a@h", "\"Alice\\", "Al\"ice <sip:a@h>",
                              "Alice, Bob <sip:a@h>", "alice@example.com", ":alice@h", "1sip:a@h"})));

INSTANTIATE_TEST_SUITE_P(SipUri,
                         CNameAddrMalformed,
                         ::testing::ValuesIn(std::vector<std::string>(
                             {"sip:", "sip:@h", "sip:a@", "sip:a@b@h", "sip:a b@h", "sip:%6@h", "sip:%zz@h",
                              "sip:a@h:99999", "sip:a@[::1", "sip:a@[zz::1]", "sip:a@h;=x",
                              "sip:a@h;x=", "sip:a@h?novalue", "sip:a@h\r\n", "sip:a@*.example.com"})));

INSTANTIATE_TEST_SUITE_P(TelAndOtherUris,
                         CNameAddrMalformed,
                         ::testing::ValuesIn(std::vector<std::string>(
                             {"tel:", "tel:+", "tel:+49a", "tel:12 34", "tel:1234;phone-context=",
                              "tel:1234;phone-context", "tel:1234;phone-context=a;phone-context=b",
                              "tel:1234;phone-context=*.example.com", "tel:1234;phone-context=+",
                              "mailto:", "mailto:a b", "<mailto:<a>>"})));

INSTANTIATE_TEST_SUITE_P(NulBytesAndLength,
                         CNameAddrMalformed,
                         ::testing::Values(std::string("sip:a@h\0x", 9),
                                           std::string("\"A\0\" <sip:a@h>", 14),
                                           std::string(64 * 1024, '<')));

TEST(CNameAddr, ParsesA64KiBUser) {
  std::string const text = "sip:" + std::string(64 * 1024, 'u') + "@h";
  EXPECT_EQ(64u * 1024u, parsed(text).GetSipUri()->GetUser().length());
}

TEST(CNameAddr, NullTextFails) {
  CNameAddr nameAddr = parsed("sip:a@h");
  EXPECT_FALSE(nameAddr.Parse(nullptr, 3));
  EXPECT_EQ("none|", parts(nameAddr));
}

TEST(CNameAddr, SerializesTheDisplayNameQuotedAndTheUriAsWritten) {
  std::pair<std::string, std::string> const rows[] = {
      {"sip:a@h", "<sip:a@h>"},
      {" <SIP:a@h:5060;lr> ", "<SIP:a@h:5060;lr>"},
      {"Alice <sip:a@h>", "\"Alice\" <sip:a@h>"},
      {"\"Say \\\"hi\\\" \\\\\" <tel:1>", "\"Say \\\"hi\\\" \\\\\" <tel:1>"},
      {"\"\" <mailto:a@h>", "<mailto:a@h>"},
  };
  for (auto const& [text, expected] : rows)
    EXPECT_EQ(expected, serialized(parsed(text))) << text;
}

TEST(CNameAddr, SerializeAppendsToTheBufferAndWritesNothingWithoutUri) {
  CBlob blob;
  unsigned char const prefix[] = {'X'};
  blob.Insert(0, prefix, 1);
  parsed("sip:a@h").Serialize(blob);
  CNameAddr().Serialize(blob);
  EXPECT_EQ("X<sip:a@h>", std::string(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize()));
}

TEST(CNameAddr, EqualityIgnoresTheDisplayNameButComparesTheUriAsWritten) {
  EXPECT_EQ(parsed("\"Alice\" <sip:a@h>"), parsed("sip:a@h"));
  EXPECT_EQ(CNameAddr(), CNameAddr());
  for (char const* different : {"sip:a@H", "sips:a@h", "sip:a@h;lr"})
    EXPECT_NE(parsed("sip:a@h"), parsed(different)) << different;
  EXPECT_NE(parsed("sip:a@h"), CNameAddr());
}

TEST(CNameAddr, CopyAnswersFromItsOwnUriAfterTheOriginalIsGone) {
  CNameAddr copy;
  {
    CNameAddr const original = parsed("tel:1234;phone-context=example.com");
    copy = original;
  }
  EXPECT_EQ("tel||1234|example.com", parts(copy));
}

TEST(CNameAddr, ParsesTextThatPointsIntoItself) {
  CNameAddr nameAddr = parsed("\"sip:x@h\" <sip:a@h>");
  CString const& display = nameAddr.GetDisplayName();
  EXPECT_TRUE(nameAddr.Parse(display.c_str(), display.length()));
  EXPECT_EQ(parsed("sip:x@h"), nameAddr);
}

}  // namespace
