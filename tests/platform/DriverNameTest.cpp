#include "IDriver.h"

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <vector>

namespace {

struct NameArguments {
  String base = "master-location-service";
  unsigned int numbers[3] = {0, 0, 0xFFFFFFFF};
  String texts[4];
};

String build(NameArguments const& a) {
  String name;
  IDriver::BUILD_DRIVER_NAME(name, a.base, a.numbers[0], a.numbers[1], a.numbers[2], a.texts[0], a.texts[1],
                             a.texts[2], a.texts[3]);
  return name;
}

TEST(DriverName, SameArgumentsGiveTheSameName) {
  EXPECT_EQ(build(NameArguments()), build(NameArguments()));
  String reused("left over");
  IDriver::BUILD_DRIVER_NAME(reused, "master-location-service", 0, 0, 0xFFFFFFFF, "", "", "", "");
  EXPECT_EQ(reused, build(NameArguments()));
}

TEST(DriverName, EachDifferingArgumentGivesADifferentName) {
  std::vector<NameArguments> variants(1);
  variants.emplace_back().base = "master-authentication-service";
  for (int i = 0; i < 3; ++i)
    variants.emplace_back().numbers[i] = 1;
  for (int i = 0; i < 4; ++i)
    variants.emplace_back().texts[i] = "x";
  std::set<std::string> names;
  for (NameArguments const& variant : variants)
    names.insert(build(variant).str());
  EXPECT_EQ(names.size(), variants.size());
}

TEST(DriverName, SeparatorsInsideTextsDoNotMergeFields) {
  std::vector<NameArguments> variants(4);
  variants[0].texts[0] = "a/b";
  variants[1].texts[0] = "a";
  variants[1].texts[1] = "b";
  variants[2].texts[0] = "a%2Fb";
  variants[3].base = "master-location-service/0";
  variants[3].numbers[0] = 0xFFFFFFFF;
  std::set<std::string> names;
  for (NameArguments const& variant : variants)
    names.insert(build(variant).str());
  names.insert(build(NameArguments()).str());
  EXPECT_EQ(names.size(), variants.size() + 1);
}

TEST(DriverName, KeepsEveryArgumentReadable) {
  EXPECT_EQ(build(NameArguments()), String("master-location-service/0/0/4294967295////"));
}

}  // namespace
