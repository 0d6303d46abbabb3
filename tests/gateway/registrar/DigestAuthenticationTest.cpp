#include "registrar/DigestAuthentication.h"

#include <gtest/gtest.h>

#include "registrar/NonceGenerator.h"

namespace {

pl text(char const* value) {
  pl result;
  pl_set_str(&result, value);
  return result;
}

// A published example: an Authorization value of a GET with its password.
struct Vector {
  char const* name;
  char const* authorization;
  char const* password;
};

Vector const kVectors[] = {
    {"Rfc2617",
     "Digest username=\"Mufasa\", realm=\"testrealm@host.com\", "
     "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", "
     "uri=\"/dir/index.html\", qop=auth, nc=00000001, cnonce=\"0a4f113b\", "
     "response=\"6629fae49393a05397450978507c4ef1\", opaque=\"5ccc069c403ebaf9f0171e9517f40e41\"",
     "Circle Of Life"},
    {"Rfc7616Md5",
     "Digest username=\"Mufasa\", realm=\"http-auth@example.org\", uri=\"/dir/index.html\", algorithm=MD5, "
     "nonce=\"7ypf/xlj9XXwfDPEoM4URrv/xwf94BcCAzFZH4GiTo0v\", nc=00000001, "
     "cnonce=\"f2/wE4q74E6zIJEtWaHKaf5wv/H5QzzpXusqGemxURZJ\", qop=auth, "
     "response=\"8ca523f5e9506fed4657c9700eebdbec\", opaque=\"FQhe/qaU925kfnzjCev0ciny7QMkPqMAFRtzCUYo5tdS\"",
     "Circle of Life"},
};

class PublishedDigest : public testing::TestWithParam<Vector> {
 protected:
  void SetUp() override {
    pl const value = text(GetParam().authorization);
    ASSERT_EQ(0, httpauth_digest_response_decode(&m_response, &value));
  }
  httpauth_digest_resp m_response{};
  pl const m_get = text("GET");
};

TEST_P(PublishedDigest, MatchesItsPasswordOnly) {
  EXPECT_TRUE(digestResponseMatches(m_response, m_get, GetParam().password));
  // The two examples' passwords differ only in the case of one letter.
  EXPECT_FALSE(digestResponseMatches(m_response, m_get, "Circle of life"));
  EXPECT_FALSE(digestResponseMatches(m_response, text("POST"), GetParam().password));
}

TEST_P(PublishedDigest, RefusesAResponseWithoutQop) {
  m_response.qop = pl{};
  EXPECT_FALSE(digestResponseMatches(m_response, m_get, GetParam().password));
}

INSTANTIATE_TEST_SUITE_P(Vectors,
                         PublishedDigest,
                         testing::ValuesIn(kVectors),
                         [](testing::TestParamInfo<Vector> const& info) { return info.param.name; });

TEST(NonceGenerator, HoldsForItsRealmAndLifetimeOnly) {
  NonceGenerator nonces({1, 2, 3});
  pl const realm = text("example.com");
  std::string const made = nonces.make(realm, 1000);
  pl const nonce = text(made.c_str());
  EXPECT_EQ(NonceGenerator::Check::VALID, nonces.check(nonce, realm, 1000 + NonceGenerator::kLifetimeMs));
  EXPECT_EQ(NonceGenerator::Check::STALE, nonces.check(nonce, realm, 1001 + NonceGenerator::kLifetimeMs));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, text("example.org"), 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, NonceGenerator({4}).check(nonce, realm, 1000));
  // Another time under the same signature, or a nonce from the future.
  std::string forged = made;
  forged[15] = forged[15] == '0' ? '1' : '0';
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(text(forged.c_str()), realm, 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, realm, 999));
}

}  // namespace
