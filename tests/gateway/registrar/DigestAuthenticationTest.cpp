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
  DigestAlgorithm algorithm;
};

Vector const kVectors[] = {
    {"Rfc2617",
     "Digest username=\"Mufasa\", realm=\"testrealm@host.com\", "
     "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", "
     "uri=\"/dir/index.html\", qop=auth, nc=00000001, cnonce=\"0a4f113b\", "
     "response=\"6629fae49393a05397450978507c4ef1\", opaque=\"5ccc069c403ebaf9f0171e9517f40e41\"",
     "Circle Of Life", DigestAlgorithm::MD5},
    {"Rfc7616Md5",
     "Digest username=\"Mufasa\", realm=\"http-auth@example.org\", uri=\"/dir/index.html\", algorithm=MD5, "
     "nonce=\"7ypf/xlj9XXwfDPEoM4URrv/xwf94BcCAzFZH4GiTo0v\", nc=00000001, "
     "cnonce=\"f2/wE4q74E6zIJEtWaHKaf5wv/H5QzzpXusqGemxURZJ\", qop=auth, "
     "response=\"8ca523f5e9506fed4657c9700eebdbec\", opaque=\"FQhe/qaU925kfnzjCev0ciny7QMkPqMAFRtzCUYo5tdS\"",
     "Circle of Life", DigestAlgorithm::MD5},
    {"Rfc7616Sha256",
     "Digest username=\"Mufasa\", realm=\"http-auth@example.org\", uri=\"/dir/index.html\", "
     "algorithm=\"SHA-256\", nonce=\"7ypf/xlj9XXwfDPEoM4URrv/xwf94BcCAzFZH4GiTo0v\", nc=00000001, "
     "cnonce=\"f2/wE4q74E6zIJEtWaHKaf5wv/H5QzzpXusqGemxURZJ\", qop=auth, "
     "response=\"753927fa0e85d155564e2e272a28d1802ca10daf4496794697cf8db5856cb6c1\", "
     "opaque=\"FQhe/qaU925kfnzjCev0ciny7QMkPqMAFRtzCUYo5tdS\"",
     "Circle of Life", DigestAlgorithm::SHA256},
};

class PublishedDigest : public testing::TestWithParam<Vector> {
 protected:
  void SetUp() override {
    pl const value = text(GetParam().authorization);
    ASSERT_TRUE(decodeDigestResponse(value, m_response));
  }
  DigestResponse m_response;
  DigestAuthentication m_digest;
  pl const m_get = text("GET");
};

TEST_P(PublishedDigest, MatchesItsPasswordOnly) {
  EXPECT_EQ(GetParam().algorithm, m_response.algorithm);
  EXPECT_TRUE(m_digest.matches(m_response, m_get, GetParam().password));
  // The examples' passwords differ only in the case of one letter.
  EXPECT_FALSE(m_digest.matches(m_response, m_get, "Circle of life"));
  EXPECT_FALSE(m_digest.matches(m_response, text("POST"), GetParam().password));
}

TEST_P(PublishedDigest, ComputedWithTheAlgorithmItNames) {
  m_response.algorithm =
      m_response.algorithm == DigestAlgorithm::MD5 ? DigestAlgorithm::SHA256 : DigestAlgorithm::MD5;
  EXPECT_FALSE(m_digest.matches(m_response, m_get, GetParam().password));
}

TEST_P(PublishedDigest, QopOtherThanAuthRefused) {
  m_response.fields.qop = text("auth-int");
  EXPECT_FALSE(m_digest.matches(m_response, m_get, GetParam().password));
}

INSTANTIATE_TEST_SUITE_P(Vectors,
                         PublishedDigest,
                         testing::ValuesIn(kVectors),
                         [](testing::TestParamInfo<Vector> const& info) { return info.param.name; });

// An RFC 2069 response (no qop) to the RFC 2617 example's challenge,
// computed with Python's hashlib.
TEST(DigestAuthentication, ResponseWithoutQopComputedWithoutCnonce) {
  DigestResponse response;
  ASSERT_TRUE(
      decodeDigestResponse(text("Digest username=\"Mufasa\", realm=\"testrealm@host.com\", "
                                "nonce=\"dcd98b7102dd2f0e8b11d0f600bfb0c093\", uri=\"/dir/index.html\", "
                                "response=\"670fd8c2df070c60b045671b8b24ff02\""),
                           response));
  EXPECT_TRUE(DigestAuthentication().matches(response, text("GET"), "Circle Of Life"));
}

TEST(DigestAuthentication, AlgorithmsOtherThanSha256AndMd5AreNoCredentials) {
  DigestResponse response;
  EXPECT_FALSE(decodeDigestResponse(text("Digest username=\"a\", realm=\"r\", nonce=\"n\", uri=\"u\", "
                                         "response=\"0\", algorithm=SHA-512-256"),
                                    response));
  EXPECT_FALSE(decodeDigestResponse(text("Digest username=\"a\", realm=\"r\", nonce=\"n\", uri=\"u\", "
                                         "response=\"0\", algorithm=MD5-sess"),
                                    response));
  ASSERT_TRUE(decodeDigestResponse(
      text("Digest username=\"a\", realm=\"r\", nonce=\"n\", uri=\"u\", response=\"0\""), response));
  EXPECT_EQ(DigestAlgorithm::MD5, response.algorithm);
}

TEST(DigestAuthentication, ChallengeListsParsed) {
  std::vector<DigestAlgorithm> algorithms;
  ASSERT_TRUE(parseDigestAlgorithms("md5,SHA-256", algorithms));
  EXPECT_EQ((std::vector<DigestAlgorithm>{DigestAlgorithm::MD5, DigestAlgorithm::SHA256}), algorithms);
  EXPECT_FALSE(parseDigestAlgorithms("", algorithms));
  EXPECT_FALSE(parseDigestAlgorithms("MD5,", algorithms));
  EXPECT_FALSE(parseDigestAlgorithms("SHA-1", algorithms));
}

TEST(NonceGenerator, HoldsForItsRealmCallIdSourceAndLifetimeOnly) {
  NonceGenerator nonces({1, 2, 3}, 1);
  pl const realm = text("example.com");
  pl const callId = text("a@b");
  std::string const source = "udp 192.0.2.1";
  std::string const made = nonces.make(realm, callId, source, 1000);
  pl const nonce = text(made.c_str());
  // Two challenges of one registration within a millisecond differ, and
  // the table orders the later one after.
  std::string const next = nonces.make(realm, callId, source, 1000);
  EXPECT_NE(made, next);
  EXPECT_LT(NonceGenerator::madeAt(nonce), NonceGenerator::madeAt(text(next.c_str())));
  EXPECT_EQ(NonceGenerator::Check::VALID,
            nonces.check(nonce, realm, callId, source, 1000 + NonceGenerator::kLifetimeMs));
  EXPECT_EQ(NonceGenerator::Check::STALE,
            nonces.check(nonce, realm, callId, source, 1001 + NonceGenerator::kLifetimeMs));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, text("example.org"), callId, source, 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, realm, text("a@c"), source, 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, realm, callId, "udp 192.0.2.2", 1000));
  // The realm's end cannot move into the Call-ID, nor the Call-ID's into
  // the source.
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN,
            nonces.check(nonce, text("example.coma"), text("@b"), source, 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(nonce, realm, text("a@bu"), "dp 192.0.2.1", 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN, NonceGenerator({4}, 1).check(nonce, realm, callId, source, 1000));
  // Another time or issuer under the same signature.
  for (size_t digit : {15, 31}) {
    std::string forged = made;
    forged[digit] = forged[digit] == '0' ? '1' : '0';
    EXPECT_EQ(NonceGenerator::Check::UNKNOWN, nonces.check(text(forged.c_str()), realm, callId, source, 1000))
        << digit;
  }
}

// The wall clock may step back a little between challenge and answer; a
// nonce from further ahead is authentic, so it is stale, never unknown.
TEST(NonceGenerator, ToleratesSmallClockStepsBack) {
  NonceGenerator nonces({1, 2, 3}, 1);
  uint64_t const madeMs = 1700000000000;
  std::string const made = nonces.make(text("r"), text("c"), "udp 192.0.2.1", madeMs);
  pl const nonce = text(made.c_str());
  EXPECT_EQ(NonceGenerator::Check::VALID,
            nonces.check(nonce, text("r"), text("c"), "udp 192.0.2.1", madeMs - NonceGenerator::kSkewMs));
  EXPECT_EQ(NonceGenerator::Check::STALE,
            nonces.check(nonce, text("r"), text("c"), "udp 192.0.2.1", madeMs - NonceGenerator::kSkewMs - 1));
}

// Another gateway holding the same key (or this one before a restart)
// made it: authentic, but not this process's to vouch for.
TEST(NonceGenerator, SameKeyAnotherIssuerIsForeign) {
  NonceGenerator here({1, 2, 3}, 1);
  NonceGenerator there({1, 2, 3}, 2);
  std::string const made = there.make(text("r"), text("c"), "udp 192.0.2.1", 1000);
  EXPECT_EQ(NonceGenerator::Check::FOREIGN,
            here.check(text(made.c_str()), text("r"), text("c"), "udp 192.0.2.1", 1000));
  EXPECT_EQ(NonceGenerator::Check::UNKNOWN,
            here.check(text(made.c_str()), text("r"), text("c"), "udp 192.0.2.2", 1000));
  // A shared key installed later makes the nonces that follow checkable.
  NonceGenerator restarted({9}, 3);
  restarted.useKey({1, 2, 3});
  std::string const after = restarted.make(text("r"), text("c"), "udp 192.0.2.1", 1000);
  EXPECT_EQ(NonceGenerator::Check::FOREIGN,
            here.check(text(after.c_str()), text("r"), text("c"), "udp 192.0.2.1", 1000));
}

}  // namespace
