#include "ScriptLine.h"

#include <gtest/gtest.h>

namespace {

// Words joined by "|", each quoted one marked with a leading '"'.
std::string wordsOf(std::string const& text) {
  std::string joined;
  ScriptLine const line(text);
  for (ScriptWord const& word : line.words())
    joined += (joined.empty() ? "" : "|") + std::string(word.quoted ? "\"" : "") + word.text + "@" +
              std::to_string(word.column);
  return joined;
}

struct Cut {
  char const* text;
  char const* words;
};

class ScriptLineCutTest : public ::testing::TestWithParam<Cut> {};

TEST_P(ScriptLineCutTest, CutsIntoWordsWithColumns) {
  EXPECT_EQ(wordsOf(GetParam().text), GetParam().words);
}

INSTANTIATE_TEST_SUITE_P(Lines,
                         ScriptLineCutTest,
                         ::testing::Values(Cut{"", ""},
                                           Cut{"  # all comment", ""},
                                           Cut{"a\tbb  c", "a@1|bb@3|c@7"},
                                           Cut{"set \"two words\" x", "set@1|\"two words@5|x@17"},
                                           Cut{"say \"a \\\"b\\\" \\\\ \\n\"", "say@1|\"a \"b\" \\ \\n@5"},
                                           Cut{"x \"\" y", "x@1|\"@3|y@6"},
                                           Cut{"a b#c # rest", "a@1|b#c@3"},
                                           Cut{"\"#\" x", "\"#@1|x@5"}));

struct Refusal {
  std::string text;
  size_t column;
  char const* message;
};

class ScriptLineRefusalTest : public ::testing::TestWithParam<Refusal> {};

TEST_P(ScriptLineRefusalTest, PointsAtTheFault) {
  try {
    ScriptLine line(GetParam().text);
    FAIL() << "accepted";
  } catch (CommandError const& error) {
    EXPECT_EQ(error.column(), GetParam().column);
    EXPECT_EQ(std::string(error.what()).find(GetParam().message), 0u) << error.what();
  }
}

INSTANTIATE_TEST_SUITE_P(
    Lines,
    ScriptLineRefusalTest,
    ::testing::Values(Refusal{"set \"open", 5, "unterminated quote"},
                      Refusal{"set \"a\\\"", 5, "unterminated quote"},
                      Refusal{"set \"a\"b", 8, "expected a blank after the closing quote"},
                      Refusal{std::string(ScriptLine::kMaximumLength + 1, 'x'), ScriptLine::kMaximumLength + 1,
                              "line of 65537 bytes is longer than the limit of 65536 bytes"},
                      Refusal{std::string(1024 * 1024, 'x'), ScriptLine::kMaximumLength + 1,
                              "line of 1048576 bytes"}));

TEST(ScriptLineTest, TakesALineOfTheMaximumLength) {
  EXPECT_EQ(ScriptLine(std::string(ScriptLine::kMaximumLength, 'x')).words().size(), 1u);
}

}  // namespace

class ScriptWordTest : public ::testing::TestWithParam<std::string> {};

// What the writer makes of a text, read back in the middle of a line, is
// the text again, as one word.
TEST_P(ScriptWordTest, ReadsBackAsTheSameText) {
  ScriptLine const line("set " + scriptWord(GetParam()) + " x");
  ASSERT_EQ(line.words().size(), 3u);
  EXPECT_EQ(line.words()[1].text, GetParam());
}

INSTANTIATE_TEST_SUITE_P(Texts,
                         ScriptWordTest,
                         ::testing::Values("plain",
                                           "",
                                           "two words",
                                           "\"quoted\"",
                                           "ends in \\",
                                           "\\\"",
                                           "#7",
                                           "a#b",
                                           "tab\there",
                                           "cr\rhere",
                                           std::string("nul\0here", 8),
                                           "J\xc3\xbcrgen"));
