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

TEST(DriverName, KeepsEveryArgumentReadableAndReplacesWhatTheOutputHeld) {
  String name("left over");
  IDriver::BUILD_DRIVER_NAME(name, "master-location-service", 0, 0, 0xFFFFFFFF, "", "", "", "");
  EXPECT_EQ(name, String("master-location-service/0/0/4294967295////"));
}

// Each variant differs from the defaults in one argument; separators inside a text must not merge fields.
TEST(DriverName, DifferentArgumentsGiveDifferentNames) {
  std::vector<NameArguments> variants(6);
  variants[1].base = "master-authentication-service";
  variants[2].texts[0] = "a/b";
  variants[3].texts[0] = "a";
  variants[3].texts[1] = "b";
  variants[4].texts[0] = "a%2Fb";
  variants[5].base = "master-location-service/0";
  variants[5].numbers[0] = 0xFFFFFFFF;
  for (int i = 0; i < 3; ++i)
    variants.emplace_back().numbers[i] = 1;
  for (int i = 0; i < 4; ++i)
    variants.emplace_back().texts[i] = "x";
  std::set<std::string> names;
  for (NameArguments const& a : variants) {
    String name;
    IDriver::BUILD_DRIVER_NAME(name, a.base, a.numbers[0], a.numbers[1], a.numbers[2], a.texts[0], a.texts[1],
                               a.texts[2], a.texts[3]);
    names.insert(name.str());
  }
  EXPECT_EQ(names.size(), variants.size());
}

}  // namespace
