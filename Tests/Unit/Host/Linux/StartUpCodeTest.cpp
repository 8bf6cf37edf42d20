#include "Host/Linux/StartUpCode.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

TEST(StartUpCode, ComesBackWhenItIsUsed) {
    std::vector<std::string> names{"c", "a", "b"};
    releaseStartUpCode();
    std::sort(names.begin(), names.end());
    EXPECT_EQ(names, (std::vector<std::string>{"a", "b", "c"}));
    EXPECT_EQ(std::cos(0.0), 1.0);
    releaseStartUpCode();
    EXPECT_EQ(std::to_string(std::strtod("2.5", nullptr)), "2.500000");
}

} // namespace
} // namespace ZorvaTouch::Linux
