#include "ControlAnswer.h"

#include <gtest/gtest.h>

namespace {

struct Answer {
  char const* name;
  std::string printed;
  bool failed;
  size_t column;
  char const* message;
};

void PrintTo(Answer const& answer, std::ostream* out) {
  *out << answer.name;
}

class ControlAnswerRoundTrip : public ::testing::TestWithParam<Answer> {};

// Fed a byte at a time, as a slow socket may deliver it, the reader gives
// back exactly what was encoded.
TEST_P(ControlAnswerRoundTrip, ReadsBackWhatWasEncodedWhateverTheChunks) {
  Answer const& answer = GetParam();
  LineOutcome sent;
  sent.printed = answer.printed;
  if (answer.failed)
    sent.failure = CommandError(answer.column, answer.message);
  std::string const bytes = ControlAnswer::encode(sent, 7);
  ControlAnswer::Reader reader;
  LineOutcome received;
  for (size_t i = 0; i < bytes.size(); ++i) {
    EXPECT_FALSE(reader.next(received)) << "complete before byte " << i;
    reader.feed(&bytes[i], 1);
  }
  ASSERT_TRUE(reader.next(received));
  EXPECT_EQ(received.printed, answer.printed);
  ASSERT_EQ(received.failure.has_value(), answer.failed);
  if (answer.failed) {
    EXPECT_EQ(received.failure->column(), answer.column);
    EXPECT_STREQ(received.failure->what(), answer.message);
  }
  EXPECT_FALSE(reader.next(received));
}

INSTANTIATE_TEST_SUITE_P(Answers,
                         ControlAnswerRoundTrip,
                         ::testing::Values(Answer{"Silent", "", false, 0, ""},
                                           Answer{"Output", "identity example.com/alice\n", false, 0, ""},
                                           // Output that looks like a terminator's text is still output.
                                           Answer{"OutputThatReadsOk", "ok\nfailed\n", false, 0, ""},
                                           Answer{"FailedSilently", "", true, 12, "no identity \"x\""},
                                           // A message holding ": " and the connection's name.
                                           Answer{"FailedWithOutput", "event: a\nevent: b\n", true, 1,
                                                  "control:9:9: cannot write f: x"}),
                         [](::testing::TestParamInfo<Answer> const& info) { return info.param.name; });

TEST(ControlAnswer, ReplacesNulInOutputSoThatTheAnswerEndsWhereItShould) {
  LineOutcome sent;
  sent.printed = std::string("a\0", 2) + "ok\n";
  ControlAnswer::Reader reader;
  std::string const bytes = ControlAnswer::encode(sent, 1) + ControlAnswer::encode(LineOutcome(), 2);
  reader.feed(bytes.data(), bytes.size());
  LineOutcome received;
  ASSERT_TRUE(reader.next(received));
  EXPECT_EQ(received.printed, "a?ok\n");
  ASSERT_TRUE(reader.next(received));
  EXPECT_EQ(received.printed, "");
}

TEST(ControlAnswer, EventLinesBetweenAnswersAreTakenWholeLinesOnly) {
  ControlAnswer::Reader reader;
  std::string const events = "event: one\nevent: tw";
  reader.feed(events.data(), events.size());
  EXPECT_EQ(reader.takeLines(), "event: one\n");
  reader.feed("o\n", 2);
  EXPECT_EQ(reader.takeLines(), "event: two\n");
  EXPECT_EQ(reader.takeLines(), "");
}

}  // namespace
