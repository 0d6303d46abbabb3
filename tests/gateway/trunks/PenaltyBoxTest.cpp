#include "trunks/PenaltyBox.h"

#include <gtest/gtest.h>

namespace {

constexpr char kProxy[] = "sip:192.0.2.1:5060;transport=udp";
constexpr uint64_t kFailedAtMs = 1000;

TEST(PenaltyBoxTest, FailedProxyIsBoxedForTheBoxTimeOnly) {
  PenaltyBox box;
  box.failed(kProxy, kFailedAtMs);
  EXPECT_TRUE(box.isBoxed(kProxy, kFailedAtMs + PenaltyBox::kBoxMs - 1));
  EXPECT_FALSE(box.isBoxed("sip:192.0.2.1:5060;transport=tls", kFailedAtMs));
  EXPECT_FALSE(box.isBoxed(kProxy, kFailedAtMs + PenaltyBox::kBoxMs));
  // Out for good, not only while asked at a later time.
  EXPECT_FALSE(box.isBoxed(kProxy, kFailedAtMs));
}

TEST(PenaltyBoxTest, AnswerLetsABoxedProxyOutAtOnce) {
  PenaltyBox box;
  box.failed(kProxy, kFailedAtMs);
  box.answered(kProxy);
  EXPECT_FALSE(box.isBoxed(kProxy, kFailedAtMs));
}

}  // namespace
