#include "registrar/NonceTable.h"

#include <gtest/gtest.h>

#include <string>

namespace {

pl text(std::string const& value) {
  pl result;
  result.p = value.data();
  result.l = value.size();
  return result;
}

TEST(NonceTable, CountMustIncreaseUnlessTheSameRequestComesAgain) {
  NonceTable table(64);
  std::string const nonce = "n1";
  EXPECT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonce), 10, 1, 100, 0));
  EXPECT_EQ(NonceTable::Use::REPEATED, table.use(text(nonce), 10, 1, 100, 0));
  // The captured header with another Contact or CSeq.
  EXPECT_EQ(NonceTable::Use::REPLAYED, table.use(text(nonce), 10, 1, 101, 0));
  EXPECT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonce), 10, 2, 101, 0));
  EXPECT_EQ(NonceTable::Use::REPLAYED, table.use(text(nonce), 10, 1, 100, 0));
  // Without qop: once.
  std::string const once = "n2";
  EXPECT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(once), 10, 0, 7, 0));
  EXPECT_EQ(NonceTable::Use::REPLAYED, table.use(text(once), 10, 0, 8, 0));
}

// The same request comes again as a retransmission only while its client
// transaction could still be sending it; later it is a replay.
TEST(NonceTable, SameRequestLaterThanARetransmissionIsReplayed) {
  NonceTable table(64);
  std::string const nonce = "n1";
  uint64_t const used = 1000;
  ASSERT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonce), 10, 1, 100, used));
  EXPECT_EQ(NonceTable::Use::REPEATED,
            table.use(text(nonce), 10, 1, 100, used + NonceTable::kRetransmissionMs));
  EXPECT_EQ(NonceTable::Use::REPLAYED,
            table.use(text(nonce), 10, 1, 100, used + NonceTable::kRetransmissionMs + 1));
  // The window runs from the count's first use, not the nonce's.
  ASSERT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonce), 10, 2, 101, used + 100000));
  EXPECT_EQ(NonceTable::Use::REPEATED, table.use(text(nonce), 10, 2, 101, used + 100001));
}

// One bucket: the fifth nonce pushes out the one made earliest, which is
// then forgotten rather than new again, and so is any unseen nonce made no
// later than it; a nonce made after it is still new.
TEST(NonceTable, NonceItCanNoLongerVouchForIsForgottenNeverAccepted) {
  NonceTable table(NonceTable::kWays);
  std::string const nonces[] = {"a", "b", "c", "d", "e", "f", "g"};
  uint64_t const made[] = {50, 20, 30, 40, 60, 20, 21};
  for (int i = 0; i < 5; ++i)
    ASSERT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonces[i]), made[i], 1, 0, 0)) << i;
  EXPECT_EQ(NonceTable::Use::FORGOTTEN, table.use(text(nonces[1]), made[1], 2, 0, 0));
  EXPECT_EQ(NonceTable::Use::FORGOTTEN, table.use(text(nonces[5]), made[5], 1, 0, 0));
  EXPECT_EQ(NonceTable::Use::FIRST_OR_NEWER, table.use(text(nonces[6]), made[6], 1, 0, 0));
  // The table stayed at its size: "c", made earliest now, went for "g".
  EXPECT_EQ(NonceTable::Use::FORGOTTEN, table.use(text(nonces[2]), made[2], 2, 0, 0));
  EXPECT_EQ(NonceTable::Use::REPLAYED, table.use(text(nonces[4]), made[4], 1, 1, 0));
}

}  // namespace
