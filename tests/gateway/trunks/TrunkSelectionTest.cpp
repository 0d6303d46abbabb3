#include "trunks/TrunkSelection.h"

#include <gtest/gtest.h>

#include <ostream>

namespace {

using TrunkSelection::Candidate;

struct Case {
  char const* name;
  std::vector<Candidate> candidates;
  std::vector<bool> chosen;
};

void PrintTo(Case const& rule, std::ostream* out) {
  *out << rule.name;
}

class TrunkSelectionTest : public testing::TestWithParam<Case> {};

TEST_P(TrunkSelectionTest, ChoosesTheTrunksThatRegister) {
  EXPECT_EQ(TrunkSelection::select(GetParam().candidates), GetParam().chosen);
}

INSTANTIATE_TEST_SUITE_P(
    Rules,
    TrunkSelectionTest,
    testing::Values(
        Case{"BestAloneWhileItWorks",
             {{"a", 2, true, false}, {"a", 1, true, false}, {"a", 3, true, false}},
             {false, true, false}},
        Case{"NextOnceTheBestFailedWhichKeepsTrying",
             {{"a", 1, true, true}, {"a", 2, true, false}, {"a", 3, true, false}},
             {true, true, false}},
        Case{"EveryOneTriesWhenAllFailed", {{"a", 1, true, true}, {"a", 2, true, true}}, {true, true}},
        Case{"EqualPrioritiesRegisterTogether", {{"a", 7, true, false}, {"a", 7, true, false}}, {true, true}},
        Case{"UnwantedNeitherRegistersNorHoldsBack",
             {{"a", 1, false, false}, {"a", 2, true, false}},
             {false, true}},
        Case{"AccountsAreIndependent", {{"a", 1, true, false}, {"b", 2, true, false}}, {true, true}}),
    [](testing::TestParamInfo<Case> const& info) { return std::string(info.param.name); });

}  // namespace
