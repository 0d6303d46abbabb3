#include "registrar/CredentialMask.h"

#include <gtest/gtest.h>

#include <sstream>

namespace {

struct Case {
  char const* line;
  char const* shown;
};

class CredentialLines : public testing::TestWithParam<Case> {};

TEST_P(CredentialLines, ShowNoPassword) {
  EXPECT_EQ(GetParam().shown, maskCredentials(GetParam().line));
}

INSTANTIATE_TEST_SUITE_P(
    Lines,
    CredentialLines,
    testing::Values(Case{"> authentication-service users credentials set alice secret\n",
                         "> authentication-service users credentials set alice ****\n"},
                    Case{"> authentication-service users credentials set \"a b\" \"two words\"\n",
                         "> authentication-service users credentials set \"a b\" ****\n"},
                    Case{"debug: LS_CAuthenticationService(0x61)::createCredentials(alice, se, cret)\n",
                         "debug: LS_CAuthenticationService(0x61)::createCredentials(alice, ****\n"},
                    Case{"Authorization: Digest username=\"alice\", response=\"abc\"\r\n",
                         "Authorization:****\r\n"},
                    Case{"> authentication-service users credentials remove alice\n",
                         "> authentication-service users credentials remove alice\n"}));

// Standard error flushes after every insertion: a password written in two
// pieces must still leave masked.
TEST(CredentialMask, LineWrittenInPiecesLeavesMaskedWhole) {
  std::ostringstream sink;
  {
    CredentialMask const mask(sink);
    sink << "> x credentials set alice " << std::flush << "sec" << std::flush;
    EXPECT_EQ("", sink.rdbuf()->str());
    sink << "ret\nnext" << std::flush;
    EXPECT_EQ("> x credentials set alice ****\n", sink.rdbuf()->str());
  }
  EXPECT_EQ("> x credentials set alice ****\nnext", sink.str());
}

}  // namespace
